// hostile_files: opens damaged and odd catalog files, each in a child process, and reports what went wrong.
// Usage: hostile_files [--seed S] [--timeout-seconds T] [--verbose]

#include <iostream>

#include "CommandLine.hpp"
#include "HostileFilesRunner.hpp"

namespace {

// Random damage and garbage are drawn from this seed unless one is given.
constexpr long long kDefaultSeed = 20240611;
// A case that has not finished after this long counts as a hang. Opening a catalog whose -wal and -shm are
// garbage is slow but bounded: SQLite retries a log index it cannot trust for up to about ten seconds per
// read, longer under the sanitizers.
constexpr long long kDefaultTimeoutSeconds = 60;

}  // namespace

int main(int argc, char** argv) {
  long long seed = kDefaultSeed;
  long long timeoutSeconds = kDefaultTimeoutSeconds;
  bool verbose = false;
  try {
    reliability::CommandLine line(argc, argv);
    seed = line.integer("--seed").value_or(seed);
    timeoutSeconds = line.integer("--timeout-seconds").value_or(timeoutSeconds);
    verbose = line.flag("--verbose");
    line.requireAllRead();
  } catch (const std::exception& error) {
    std::cerr << "hostile_files: " << error.what()
              << "\nusage: hostile_files [--seed S] [--timeout-seconds T] [--verbose]\n";
    return 2;
  }
  return reliability::HostileFilesRunner(static_cast<uint64_t>(seed), std::chrono::seconds(timeoutSeconds),
                                         verbose)
      .run();
}
