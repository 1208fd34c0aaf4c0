#pragma once

#include <string>
#include <vector>

namespace reliability {

// What went wrong in one crash trial, counted by kind, with a line for each problem.
struct TrialVerdict {
  int integrityFailures = 0;
  int lostWrites = 0;
  int partialCalls = 0;
  std::vector<std::string> problems;

  void addIntegrityFailure(const std::string& problem);
  void addLostWrite(const std::string& problem);
  void addPartialCall(const std::string& problem);
  void add(const TrialVerdict& other);
  bool passed() const { return problems.empty(); }
};

}  // namespace reliability
