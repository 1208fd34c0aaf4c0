#include "OpeningCases.hpp"

#include "CaseFiles.hpp"

namespace reliability {

namespace {

const std::wstring kNul(1, L'\0');

}  // namespace

std::vector<HostileCase> OpeningCases::make(const HostileSources& sources) {
  const auto nothing = [](const std::filesystem::path&) {};
  return {
      withFile("valid catalog", sources.catalog(), {0}),
      withFile("another application's database", sources.otherDatabase(), {3}),
      withFile("text file", std::string(200, 't') + "\nnot a database\n", {2}),
      HostileCase{"missing file in a folder", nothing, {1}},
      HostileCase{"folder",
                  nothing,
                  {2},
                  false,
                  [](const std::filesystem::path& folder) { return folder.wstring(); }},
      nulInPath(sources, "NUL in the path after a catalog's name",
                [](const std::filesystem::path& folder) {
                  return CaseFiles::catalog(folder).wstring() + kNul + L".x";
                }),
      nulInPath(sources, "NUL in the path of a new file",
                [](const std::filesystem::path& folder) {
                  return (folder / "new").wstring() + kNul + L".krcatalog";
                }),
      nulInPath(sources, "NUL in the path after the folder's name",
                [](const std::filesystem::path& folder) {
                  return folder.wstring() + kNul + L"/catalog.krcatalog";
                }),
  };
}

HostileCase OpeningCases::withFile(const std::string& name, const std::string& bytes,
                                   const std::set<int>& answers) {
  return HostileCase{name,
                     [bytes](const std::filesystem::path& folder) { CaseFiles::writeCatalog(folder, bytes); },
                     answers};
}

HostileCase OpeningCases::nulInPath(const HostileSources& sources, const std::string& name,
                                    const HostileCase::OpenPath& path) {
  const auto prepare = [&sources](const std::filesystem::path& folder) {
    CaseFiles::writeCatalog(folder, sources.catalog());
  };
  return HostileCase{name, prepare, {2}, false, path};
}

}  // namespace reliability
