#include "ChildStatus.hpp"

#include <cstring>

namespace reliability {

std::string ChildStatus::describe() const {
  if (timedOut) return "did not finish in time";
  if (signal != 0)
    return std::string("killed by signal ") + std::to_string(signal) + " (" + strsignal(signal) + ")";
  return "exited with status " + std::to_string(exitCode);
}

}  // namespace reliability
