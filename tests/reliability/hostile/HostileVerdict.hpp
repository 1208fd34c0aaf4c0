#pragma once

#include <string>
#include <vector>

namespace reliability {

// The failures of one hostile case, by kind, with a line for each.
struct HostileVerdict {
  bool crash = false;
  bool hang = false;
  bool foreignException = false;
  bool refusedFileChanged = false;
  bool intactFileCorrupted = false;
  std::vector<std::string> problems;

  bool failed() const { return !problems.empty(); }
};

}  // namespace reliability
