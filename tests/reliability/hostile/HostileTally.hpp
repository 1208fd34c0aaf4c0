#pragma once

#include <string>

#include "HostileVerdict.hpp"

namespace reliability {

// The counts of the hostile-files summary: cases run, and the cases failing in each way.
class HostileTally {
 public:
  void add(const HostileVerdict& verdict);

  int cases() const { return cases_; }
  bool failed() const;
  std::string summary() const;

 private:
  int cases_ = 0;
  int crashes_ = 0;
  int hangs_ = 0;
  int foreignExceptions_ = 0;
  int refusedFilesChanged_ = 0;
  int intactFilesCorrupted_ = 0;
};

}  // namespace reliability
