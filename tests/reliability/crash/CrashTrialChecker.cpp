#include "CrashTrialChecker.hpp"

#include <set>

#include "CatalogFormat.hpp"
#include "CrashTrialWriter.hpp"
#include "ObservedCatalog.hpp"
#include "RawDatabase.hpp"
#include "dbstrings.hpp"

namespace reliability {

namespace {

int openAnswer(const std::filesystem::path& file) {
  dbcore::DBReactor reactor(kAppInfo);
  return reactor.Open(dbcore::s2ws(file.string()), L"");
}

std::set<long long> groupIds(const std::map<long long, GroupState>& observed,
                             const CatalogExpectation& acknowledged, const CatalogExpectation& completed) {
  std::set<long long> ids;
  for (const auto* groups : {&observed, &acknowledged.groups(), &completed.groups()})
    for (const auto& entry : *groups) ids.insert(entry.first);
  return ids;
}

}  // namespace

CrashTrialChecker::CrashTrialChecker(const std::filesystem::path& directory)
    : directory_(directory), history_(LoggedHistory::read(directory)) {}

TrialVerdict CrashTrialChecker::check() {
  CatalogExpectation acknowledged;
  for (const auto& operation : history_.operations()) {
    if (operation.kind == CrashOperationKind::kBackup) checkBackup(operation, acknowledged);
    if (history_.acknowledged(operation)) acknowledged.apply(operation);
  }
  CatalogExpectation completed = acknowledged;
  if (const auto inFlight = history_.inFlight()) completed.apply(*inFlight);
  checkCatalog(acknowledged, completed);
  return verdict_;
}

bool CrashTrialChecker::initialized() const {
  const auto& operations = history_.operations();
  return !operations.empty() && history_.acknowledged(operations.front());
}

void CrashTrialChecker::checkCatalog(const CatalogExpectation& acknowledged,
                                     const CatalogExpectation& completed) {
  const std::filesystem::path catalog = directory_ / CrashTrialWriter::kCatalogName;
  if (!std::filesystem::exists(catalog)) {
    if (initialized()) verdict_.addIntegrityFailure("the catalog file is missing");
    return;
  }
  long long schemaEntries = 0;
  {
    RawDatabase database(catalog);
    const std::string problems = database.integrityProblems();
    if (!problems.empty()) verdict_.addIntegrityFailure("catalog: " + problems);
    schemaEntries = database.integer("SELECT count(*) FROM sqlite_schema");
  }
  checkOpenAnswer(catalog, initialized(), schemaEntries);
  if (schemaEntries == 0) return checkGroups("catalog", {}, acknowledged, completed);
  RawDatabase database(catalog);
  checkGroups("catalog", ObservedCatalog::read(database), acknowledged, completed);
}

// An initialized catalog is current; a file whose Initialize did not return may also be new, but then
// without any schema.
void CrashTrialChecker::checkOpenAnswer(const std::filesystem::path& catalog, bool initialized,
                                        long long schemaEntries) {
  const int answer = openAnswer(catalog);
  if (answer == dbcore::kDBOpenCurrent) return;
  if (answer != dbcore::kDBOpenNeedsUpdate || initialized) {
    verdict_.addIntegrityFailure("catalog: Open answered " + std::to_string(answer));
  } else if (schemaEntries > 0) {
    verdict_.addPartialCall("catalog: Open answers 1 with " + std::to_string(schemaEntries) +
                            " schema entries in the file: Initialize applied in part");
  }
}

void CrashTrialChecker::checkBackup(const CrashOperation& operation, const CatalogExpectation& expected) {
  const std::filesystem::path backup = directory_ / operation.backupName();
  const std::string name = operation.backupName();
  if (!std::filesystem::exists(backup)) {
    if (history_.acknowledged(operation)) verdict_.addLostWrite(name + " is missing");
    return;
  }
  {
    RawDatabase database(backup);
    const std::string problems = database.integrityProblems();
    if (!problems.empty()) return verdict_.addIntegrityFailure(name + ": " + problems);
  }
  const int answer = openAnswer(backup);
  if (answer != dbcore::kDBOpenCurrent)
    return verdict_.addIntegrityFailure(name + ": Open answered " + std::to_string(answer));
  RawDatabase database(backup);
  checkGroups(name, ObservedCatalog::read(database), expected, expected);
}

void CrashTrialChecker::checkGroups(const std::string& file, const std::map<long long, GroupState>& observed,
                                    const CatalogExpectation& acknowledged,
                                    const CatalogExpectation& completed) {
  for (const long long id : groupIds(observed, acknowledged, completed)) {
    const auto found = observed.find(id);
    const GroupState state = found == observed.end() ? GroupState{} : found->second;
    if (state == acknowledged.group(id) || state == completed.group(id)) continue;
    std::string problem = file + ": group " + CrashOperation::marker(id) + " holds " + state.describe() +
                          "; expected " + acknowledged.group(id).describe();
    if (!(completed.group(id) == acknowledged.group(id))) problem += " or " + completed.group(id).describe();
    if (state.isPartial(completed.size(id))) {
      verdict_.addPartialCall(problem);
    } else {
      verdict_.addLostWrite(problem);
    }
  }
}

}  // namespace reliability
