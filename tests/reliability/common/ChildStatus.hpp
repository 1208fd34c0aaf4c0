#pragma once

#include <string>

namespace reliability {

// How a forked child ended, and what it reported on its pipe before it did.
struct ChildStatus {
  // The exit code of a child whose function let an exception escape.
  static constexpr int kUncaughtExceptionExit = 70;

  bool timedOut = false;
  // The signal that ended the child; 0 when it exited.
  int signal = 0;
  int exitCode = 0;
  std::string report;

  bool exited() const { return !timedOut && signal == 0; }
  std::string describe() const;
};

}  // namespace reliability
