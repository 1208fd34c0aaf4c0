#pragma once

#include <sys/types.h>

#include <chrono>
#include <functional>
#include <optional>
#include <string>

#include "ChildStatus.hpp"

namespace reliability {

// A forked child that runs one function and exits with its result, without running the parent's exit
// handlers. The child may report lines on a pipe; the parent waits with a deadline or kills it.
class ChildProcess {
 public:
  // The child's function gets the pipe to report on and returns the child's exit code.
  using Body = std::function<int(int reportFd)>;

  explicit ChildProcess(const Body& body);
  // Kills and reaps a child still running.
  ~ChildProcess();
  ChildProcess(const ChildProcess&) = delete;
  ChildProcess& operator=(const ChildProcess&) = delete;

  // Waits for the child; kills it with SIGKILL when the timeout passes first.
  ChildStatus wait(std::chrono::milliseconds timeout);
  // Ends the child with SIGKILL now (unless it already ended) and reaps it.
  ChildStatus kill();

  // Writes one line (its line breaks made spaces) on the report pipe; for use in the child.
  static void report(int reportFd, const std::string& line);

 private:
  static int runChild(const Body& body, int reportFd);
  ChildStatus reap(bool timedOut);
  bool readReport();
  void waitForReport(std::chrono::milliseconds slice);

  pid_t pid_ = -1;
  // The child's wait status once reaped.
  std::optional<int> status_;
  int reportFd_ = -1;
  std::string report_;
};

}  // namespace reliability
