#pragma once

#include <filesystem>
#include <functional>
#include <set>
#include <string>

namespace reliability {

// One damaged or odd file for the engine to open: how to make it in an empty folder, the path Open gets
// and the answers docs/catalog-format.md allows for it.
struct HostileCase {
  using Prepare = std::function<void(const std::filesystem::path& folder)>;
  using OpenPath = std::function<std::wstring(const std::filesystem::path& folder)>;

  HostileCase(std::string name, Prepare prepare, std::set<int> documentedAnswers, bool foreignSidecar = false,
              OpenPath openPath = {});

  std::string name;
  Prepare prepare;
  std::set<int> documentedAnswers;
  // Sidecars beside the catalog that belong to no catalog or to another database: opening may not change
  // the catalog's content.
  bool foreignSidecar = false;
  // Empty: the folder's catalog file (CaseFiles::catalog).
  OpenPath openPath;

  std::wstring pathIn(const std::filesystem::path& folder) const;
};

}  // namespace reliability
