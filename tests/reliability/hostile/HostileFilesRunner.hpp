#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <vector>

#include "HostileCase.hpp"
#include "HostileSources.hpp"
#include "HostileVerdict.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace reliability {

// Makes every hostile case in a folder of its own, opens it with HostileProbe and judges the outcome.
// Prints a line for each failing case (for every case when verbose) and one summary line.
class HostileFilesRunner {
 public:
  HostileFilesRunner(uint64_t seed, std::chrono::milliseconds timeout, bool verbose);

  // 0 when no case failed, 1 otherwise.
  int run();

 private:
  std::vector<HostileCase> cases(const HostileSources& sources) const;
  HostileVerdict runCase(const HostileCase& hostileCase, const std::filesystem::path& folder) const;
  std::filesystem::path scratch() const;

  uint64_t seed_;
  std::chrono::milliseconds timeout_;
  bool verbose_;
  KRTemporaryDirectory directory_;
};

}  // namespace reliability
