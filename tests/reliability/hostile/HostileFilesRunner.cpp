#include "HostileFilesRunner.hpp"

#include <iostream>

#include "CatalogHealth.hpp"
#include "DamageCases.hpp"
#include "FileSetSnapshot.hpp"
#include "HostileJudge.hpp"
#include "HostileProbe.hpp"
#include "HostileSources.hpp"
#include "HostileTally.hpp"
#include "OpeningCases.hpp"
#include "SchemaCases.hpp"
#include "SidecarCases.hpp"
#include "Text.hpp"

namespace reliability {

namespace {

void printCase(const std::string& name, const std::vector<std::string>& lines) {
  std::cout << name << ": " << Text::join(lines, "; ") << '\n';
}

// What a passing case did: Open's answer and the DBExceptions of the later calls.
std::vector<std::string> passedLines(const ProbeOutcome& outcome) {
  std::vector<std::string> lines{"passed, Open answered " + (outcome.openAnswer
                                                                 ? std::to_string(*outcome.openAnswer)
                                                                 : std::string("nothing"))};
  for (const auto& message : outcome.engineExceptions) lines.push_back("DBException: " + message);
  return lines;
}

}  // namespace

HostileFilesRunner::HostileFilesRunner(uint64_t seed, std::chrono::milliseconds timeout, bool verbose)
    : seed_(seed), timeout_(timeout), verbose_(verbose) {}

int HostileFilesRunner::run() {
  const HostileSources sources(directory_.path() / "sources");
  HostileTally tally;
  for (const auto& hostileCase : cases(sources)) {
    const std::filesystem::path folder = directory_.path() / ("case-" + std::to_string(tally.cases()));
    tally.add(runCase(hostileCase, folder));
  }
  std::cout << tally.summary() << std::endl;
  return tally.failed() ? 1 : 0;
}

std::vector<HostileCase> HostileFilesRunner::cases(const HostileSources& sources) const {
  std::vector<HostileCase> all = OpeningCases::make(sources);
  for (auto&& group :
       {DamageCases::make(sources, seed_), SidecarCases::make(sources, seed_), SchemaCases::make(sources)})
    all.insert(all.end(), group.begin(), group.end());
  return all;
}

HostileVerdict HostileFilesRunner::runCase(const HostileCase& hostileCase,
                                           const std::filesystem::path& folder) const {
  std::filesystem::create_directories(folder);
  hostileCase.prepare(folder);
  const FileSetSnapshot before = FileSetSnapshot::of(folder);
  const CatalogHealth healthBefore = CatalogHealth::of(before, scratch(), false);
  const ProbeOutcome outcome = HostileProbe::run(hostileCase.pathIn(folder), timeout_);
  const FileSetSnapshot after = FileSetSnapshot::of(folder);
  HostileVerdict verdict = HostileJudge(hostileCase, outcome, before, after, healthBefore).verdict(scratch());
  if (verdict.failed()) {
    printCase(hostileCase.name, verdict.problems);
  } else if (verbose_) {
    printCase(hostileCase.name, passedLines(outcome));
  }
  std::filesystem::remove_all(folder);
  return verdict;
}

std::filesystem::path HostileFilesRunner::scratch() const { return directory_.path() / "scratch"; }

}  // namespace reliability
