#include "CaseFiles.hpp"

#include "FileBytes.hpp"
#include "RawDatabase.hpp"

namespace reliability {

std::filesystem::path CaseFiles::catalog(const std::filesystem::path& folder) {
  return folder / kCatalogName;
}

std::filesystem::path CaseFiles::sidecar(const std::filesystem::path& folder, const std::string& suffix) {
  return folder / (std::string(kCatalogName) + suffix);
}

void CaseFiles::writeCatalog(const std::filesystem::path& folder, const std::string& bytes) {
  FileBytes::write(catalog(folder), bytes);
}

void CaseFiles::editCatalog(const std::filesystem::path& folder, const std::string& sql) {
  RawDatabase(catalog(folder)).exec(sql);
}

std::string CaseFiles::randomBytes(std::mt19937_64& random, size_t count) {
  std::string bytes(count, '\0');
  for (auto& byte : bytes) byte = static_cast<char>(random() & 0xff);
  return bytes;
}

}  // namespace reliability
