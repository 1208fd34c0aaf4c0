// crash_trials: kills a catalog writer at random moments and checks what it leaves behind.
// Usage: crash_trials [--trials N] [--seconds S] [--seed S] [--first-trial T] [--max-delay-ms D]

#include <chrono>
#include <iostream>
#include <random>
#include <stdexcept>

#include "CommandLine.hpp"
#include "CrashTrialRunner.hpp"

namespace {

uint64_t freshSeed() {
  std::random_device device;
  return (static_cast<uint64_t>(device()) << 32) ^ device() ^
         static_cast<uint64_t>(std::chrono::steady_clock::now().time_since_epoch().count());
}

reliability::CrashTrialOptions readOptions(reliability::CommandLine& line) {
  reliability::CrashTrialOptions options;
  const auto seed = line.value("--seed");
  options.seed = seed ? std::stoull(*seed) : freshSeed();
  options.firstTrial = line.integer("--first-trial").value_or(options.firstTrial);
  options.trials = line.integer("--trials").value_or(options.trials);
  options.seconds = line.integer("--seconds").value_or(options.seconds);
  options.maxDelayMs = line.integer("--max-delay-ms").value_or(options.maxDelayMs);
  line.requireAllRead();
  if (options.maxDelayMs < 0 || options.trials < 0 || options.seconds < 0)
    throw std::invalid_argument("counts and durations cannot be negative");
  return options;
}

}  // namespace

int main(int argc, char** argv) {
  reliability::CrashTrialOptions options;
  try {
    reliability::CommandLine line(argc, argv);
    options = readOptions(line);
  } catch (const std::exception& error) {
    std::cerr << "crash_trials: " << error.what() << "\nusage: crash_trials [--trials N] [--seconds S] "
              << "[--seed S] [--first-trial T] [--max-delay-ms D]\n";
    return 2;
  }
  return reliability::CrashTrialRunner(options).run();
}
