#pragma once

#include <chrono>
#include <functional>
#include <string>

#include "ProbeOutcome.hpp"
#include "dbreactor.hpp"

namespace reliability {

// Opens a file in a child process: Open, then, when it answers 0 or 1, Initialize where the file needs it
// and a few reads. The child reports each step on its pipe; the parent kills it at the timeout.
class HostileProbe {
 public:
  static ProbeOutcome run(const std::wstring& path, std::chrono::milliseconds timeout);

 private:
  static int probe(const std::wstring& path, int reportFd);
  // Runs one step, reporting a DBException it throws; other exceptions leave the child.
  static void attempt(int reportFd, const std::function<void()>& step);
  static void readBack(dbcore::DBReactor& reactor);
  static ProbeOutcome parse(const ChildStatus& status);
};

}  // namespace reliability
