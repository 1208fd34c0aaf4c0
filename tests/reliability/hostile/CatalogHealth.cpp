#include "CatalogHealth.hpp"

#include "CaseFiles.hpp"
#include "FileBytes.hpp"
#include "RawDatabase.hpp"

namespace reliability {

CatalogHealth CatalogHealth::of(const FileSetSnapshot& files, const std::filesystem::path& scratch,
                                bool withSidecars) {
  CatalogHealth health;
  const auto catalog = files.file(CaseFiles::kCatalogName);
  if (!catalog) return health;
  std::filesystem::remove_all(scratch);
  std::filesystem::create_directories(scratch);
  FileBytes::write(CaseFiles::catalog(scratch), *catalog);
  for (const std::string suffix : {"-wal", "-shm", "-journal"}) {
    const auto sidecar = files.file(CaseFiles::kCatalogName + suffix);
    if (withSidecars && sidecar) FileBytes::write(CaseFiles::sidecar(scratch, suffix), *sidecar);
  }
  health.inspect(CaseFiles::catalog(scratch));
  std::filesystem::remove_all(scratch);
  return health;
}

void CatalogHealth::inspect(const std::filesystem::path& file) {
  exists_ = true;
  try {
    RawDatabase database(file);
    problems_ = database.integrityProblems();
    if (problems_.empty()) content_ = database.contentText();
  } catch (const std::exception& error) {
    problems_ = error.what();
  }
}

}  // namespace reliability
