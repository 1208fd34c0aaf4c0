#include "CrashTrialRunner.hpp"

#include <csignal>
#include <iostream>
#include <random>
#include <thread>

#include "ChildProcess.hpp"
#include "CrashTrialChecker.hpp"
#include "CrashTrialWriter.hpp"

namespace reliability {

namespace {

// SplitMix64: well-spread seeds from consecutive trial numbers.
uint64_t trialSeed(uint64_t seed, long long trial) {
  uint64_t z = seed + static_cast<uint64_t>(trial) * 0x9E3779B97F4A7C15ull;
  z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
  z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
  return z ^ (z >> 31);
}

}  // namespace

CrashTrialRunner::CrashTrialRunner(const CrashTrialOptions& options) : options_(options) {}

int CrashTrialRunner::run() {
  std::cout << "seed " << options_.seed << " (replay trial T with --seed " << options_.seed
            << " --first-trial T --trials 1)" << std::endl;
  const auto start = std::chrono::steady_clock::now();
  TrialVerdict total;
  long long done = 0;
  for (; moreTrials(done, start); ++done) {
    const long long trial = options_.firstTrial + done;
    const TrialVerdict verdict = runTrial(trial);
    printProblems(trial, verdict);
    total.add(verdict);
  }
  std::cout << "crash trials: " << done << " trials, " << total.integrityFailures << " integrity failures, "
            << total.lostWrites << " lost acknowledged writes, " << total.partialCalls << " partial calls"
            << std::endl;
  return total.passed() ? 0 : 1;
}

bool CrashTrialRunner::moreTrials(long long done, std::chrono::steady_clock::time_point start) const {
  if (options_.trials > 0 && done >= options_.trials) return false;
  return options_.seconds <= 0 ||
         std::chrono::steady_clock::now() - start < std::chrono::seconds(options_.seconds);
}

TrialVerdict CrashTrialRunner::runTrial(long long trial) {
  const std::filesystem::path directory = directory_.path() / ("trial-" + std::to_string(trial));
  std::filesystem::create_directories(directory);
  TrialVerdict verdict;
  try {
    verdict = killWriter(directory, trialSeed(options_.seed, trial));
    verdict.add(CrashTrialChecker(directory).check());
  } catch (const std::exception& error) {
    verdict.addIntegrityFailure(std::string("the check failed: ") + error.what());
  }
  std::filesystem::remove_all(directory);
  return verdict;
}

// Starts the writer, lets it work for a random delay and kills it.
TrialVerdict CrashTrialRunner::killWriter(const std::filesystem::path& directory, uint64_t seed) {
  std::mt19937_64 random(seed);
  const std::chrono::milliseconds delay(
      static_cast<long long>(random() % static_cast<uint64_t>(options_.maxDelayMs + 1)));
  const uint64_t writerSeed = random();
  ChildProcess writer([&](int reportFd) { return CrashTrialWriter(directory, writerSeed).run(reportFd); });
  std::this_thread::sleep_for(delay);
  const ChildStatus status = writer.kill();
  TrialVerdict verdict;
  if (status.signal != SIGKILL)
    verdict.addIntegrityFailure("the writer stopped before it was killed: " + status.describe() + ": " +
                                status.report);
  return verdict;
}

void CrashTrialRunner::printProblems(long long trial, const TrialVerdict& verdict) const {
  for (const auto& problem : verdict.problems) std::cout << "trial " << trial << ": " << problem << '\n';
}

}  // namespace reliability
