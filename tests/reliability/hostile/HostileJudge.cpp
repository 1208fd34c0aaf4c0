#include "HostileJudge.hpp"

#include "Text.hpp"
#include "dbreactor.hpp"

namespace reliability {

namespace {

std::string answers(const std::set<int>& documented) {
  std::vector<std::string> texts;
  for (const int answer : documented) texts.push_back(std::to_string(answer));
  return Text::join(texts, " or ");
}

bool accepted(int answer) { return answer == dbcore::kDBOpenCurrent || answer == dbcore::kDBOpenNeedsUpdate; }

}  // namespace

HostileJudge::HostileJudge(const HostileCase& hostileCase, const ProbeOutcome& outcome,
                           const FileSetSnapshot& before, const FileSetSnapshot& after,
                           const CatalogHealth& healthBefore)
    : case_(hostileCase),
      outcome_(outcome),
      after_(after),
      healthBefore_(healthBefore),
      changes_(Text::join(before.differences(after), ", ")) {}

HostileVerdict HostileJudge::verdict(const std::filesystem::path& scratch) const {
  HostileVerdict verdict;
  judgeChild(verdict);
  judgeAnswer(verdict);
  judgeRefusedFile(verdict);
  judgeIntactFile(verdict, scratch);
  return verdict;
}

void HostileJudge::judgeChild(HostileVerdict& verdict) const {
  const ChildStatus& status = outcome_.status;
  if (status.timedOut) {
    verdict.hang = true;
    verdict.problems.push_back("hang: " + status.describe());
  } else if (status.signal != 0 ||
             (status.exitCode != 0 && status.exitCode != ChildStatus::kUncaughtExceptionExit)) {
    verdict.crash = true;
    verdict.problems.push_back("crash: " + status.describe());
  }
  if (!outcome_.foreignExceptions.empty()) {
    verdict.foreignException = true;
    verdict.problems.push_back("foreign exception: " + Text::join(outcome_.foreignExceptions, "; "));
  }
}

void HostileJudge::judgeAnswer(HostileVerdict& verdict) const {
  const auto& answer = outcome_.openAnswer;
  if (!answer || case_.documentedAnswers.count(*answer)) return;
  verdict.foreignException = true;
  verdict.problems.push_back("undocumented outcome: Open answered " + std::to_string(*answer) +
                             ", documented " + answers(case_.documentedAnswers) +
                             (changes_.empty() ? "" : " (" + changes_ + ")"));
}

void HostileJudge::judgeRefusedFile(HostileVerdict& verdict) const {
  const auto& answer = outcome_.openAnswer;
  if (!answer || accepted(*answer) || changes_.empty()) return;
  verdict.refusedFileChanged = true;
  verdict.problems.push_back("refused file changed: Open answered " + std::to_string(*answer) + ", yet " +
                             changes_);
}

// A sound file must stay sound, and a foreign sidecar must not change what a catalog holds. Nothing to
// judge when no byte changed: the files are as the case made them.
void HostileJudge::judgeIntactFile(HostileVerdict& verdict, const std::filesystem::path& scratch) const {
  if (!healthBefore_.sound() || changes_.empty()) return;
  const CatalogHealth after = CatalogHealth::of(after_, scratch, true);
  std::string problem;
  if (!after.exists()) {
    problem = "the catalog file is gone";
  } else if (!after.sound()) {
    problem = after.problems();
  } else if (case_.foreignSidecar && outcome_.openAnswer != dbcore::kDBOpenNeedsUpdate &&
             after.content() != healthBefore_.content()) {
    problem = "its content changed";
  }
  if (problem.empty()) return;
  verdict.intactFileCorrupted = true;
  const std::string answer = outcome_.openAnswer ? std::to_string(*outcome_.openAnswer) : "nothing";
  verdict.problems.push_back("intact file corrupted: Open answered " + answer + ", then " + problem + " (" +
                             changes_ + ")");
}

}  // namespace reliability
