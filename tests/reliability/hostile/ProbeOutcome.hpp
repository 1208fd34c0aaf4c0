#pragma once

#include <optional>
#include <string>
#include <vector>

#include "ChildStatus.hpp"

namespace reliability {

// What the child that opened a case's file did: how it ended, what Open answered and which exceptions the
// later calls threw.
struct ProbeOutcome {
  ChildStatus status;
  std::optional<int> openAnswer;
  // DBException messages: documented failures.
  std::vector<std::string> engineExceptions;
  // Anything else thrown.
  std::vector<std::string> foreignExceptions;
};

}  // namespace reliability
