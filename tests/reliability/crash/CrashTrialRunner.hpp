#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>

#include "CrashTrialOptions.hpp"
#include "TrialVerdict.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace reliability {

// Runs crash trials: in each, a writer process works on a new catalog until it is killed with SIGKILL
// after a random delay, then the checker examines what it left. Prints the seed, a line for each problem
// and one summary line.
class CrashTrialRunner {
 public:
  explicit CrashTrialRunner(const CrashTrialOptions& options);

  // 0 when every trial passed, 1 otherwise.
  int run();

 private:
  bool moreTrials(long long done, std::chrono::steady_clock::time_point start) const;
  TrialVerdict runTrial(long long trial);
  TrialVerdict killWriter(const std::filesystem::path& directory, uint64_t seed);
  void printProblems(long long trial, const TrialVerdict& verdict) const;

  CrashTrialOptions options_;
  KRTemporaryDirectory directory_;
};

}  // namespace reliability
