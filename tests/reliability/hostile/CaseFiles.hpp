#pragma once

#include <filesystem>
#include <random>
#include <string>

namespace reliability {

// The files of a case: the catalog file in the case's folder and the sidecars SQLite keeps beside it.
class CaseFiles {
 public:
  static constexpr const char* kCatalogName = "catalog.krcatalog";

  static std::filesystem::path catalog(const std::filesystem::path& folder);
  // The catalog's name with a suffix: "-wal", "-shm" or "-journal".
  static std::filesystem::path sidecar(const std::filesystem::path& folder, const std::string& suffix);
  static void writeCatalog(const std::filesystem::path& folder, const std::string& bytes);
  // Runs SQL on the folder's catalog with plain SQLite.
  static void editCatalog(const std::filesystem::path& folder, const std::string& sql);
  static std::string randomBytes(std::mt19937_64& random, size_t count);
};

}  // namespace reliability
