#pragma once

#include <filesystem>
#include <map>
#include <string>

#include "CatalogExpectation.hpp"
#include "GroupState.hpp"
#include "LoggedHistory.hpp"
#include "TrialVerdict.hpp"

namespace reliability {

// Checks the files a killed writer left against its log: the catalog and every backup must pass SQLite's
// integrity and foreign-key checks and open as current catalogs; every acknowledged call must be in the
// catalog and the call in flight either whole or not at all; a backup must hold the catalog as it was
// when the backup was made.
class CrashTrialChecker {
 public:
  explicit CrashTrialChecker(const std::filesystem::path& directory);

  TrialVerdict check();

 private:
  void checkCatalog(const CatalogExpectation& acknowledged, const CatalogExpectation& completed);
  void checkOpenAnswer(const std::filesystem::path& catalog, bool initialized, long long schemaEntries);
  void checkBackup(const CrashOperation& operation, const CatalogExpectation& expected);
  // Each group must be as `acknowledged` or as `completed` (the call in flight applied) says.
  void checkGroups(const std::string& file, const std::map<long long, GroupState>& observed,
                   const CatalogExpectation& acknowledged, const CatalogExpectation& completed);
  bool initialized() const;

  std::filesystem::path directory_;
  LoggedHistory history_;
  TrialVerdict verdict_;
};

}  // namespace reliability
