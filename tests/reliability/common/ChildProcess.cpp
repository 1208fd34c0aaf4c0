#include "ChildProcess.hpp"

#include <fcntl.h>
#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <stdexcept>

namespace reliability {

ChildProcess::ChildProcess(const Body& body) {
  int fds[2];
  if (pipe(fds) != 0) throw std::runtime_error("cannot make a pipe");
  std::fflush(nullptr);
  pid_ = fork();
  if (pid_ < 0) throw std::runtime_error("cannot fork");
  if (pid_ == 0) {
    close(fds[0]);
    _exit(runChild(body, fds[1]));
  }
  close(fds[1]);
  reportFd_ = fds[0];
  fcntl(reportFd_, F_SETFL, fcntl(reportFd_, F_GETFL) | O_NONBLOCK);
}

ChildProcess::~ChildProcess() {
  if (!status_) kill();
  if (reportFd_ >= 0) close(reportFd_);
}

int ChildProcess::runChild(const Body& body, int reportFd) {
  try {
    return body(reportFd);
  } catch (const std::exception& error) {
    report(reportFd, std::string("uncaught exception: ") + error.what());
  } catch (...) {
    report(reportFd, "uncaught exception of an unknown type");
  }
  return ChildStatus::kUncaughtExceptionExit;
}

void ChildProcess::report(int reportFd, const std::string& line) {
  std::string text = line;
  std::replace(text.begin(), text.end(), '\n', ' ');
  text += '\n';
  size_t written = 0;
  while (written < text.size()) {
    const ssize_t result = ::write(reportFd, text.data() + written, text.size() - written);
    if (result <= 0) return;
    written += static_cast<size_t>(result);
  }
}

ChildStatus ChildProcess::wait(std::chrono::milliseconds timeout) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  while (std::chrono::steady_clock::now() < deadline) {
    int status = 0;
    if (waitpid(pid_, &status, WNOHANG) == pid_) {
      status_ = status;
      return reap(false);
    }
    waitForReport(std::chrono::milliseconds(5));
  }
  ::kill(pid_, SIGKILL);
  return reap(true);
}

ChildStatus ChildProcess::kill() {
  if (!status_) ::kill(pid_, SIGKILL);
  return reap(false);
}

// Collects the exit status, waiting for it unless waitpid already answered, and the rest of the report.
ChildStatus ChildProcess::reap(bool timedOut) {
  int status = status_.value_or(0);
  if (!status_) waitpid(pid_, &status, 0);
  status_ = status;
  while (readReport()) waitForReport(std::chrono::milliseconds(100));
  ChildStatus result;
  result.timedOut = timedOut;
  result.signal = WIFSIGNALED(status) ? WTERMSIG(status) : 0;
  result.exitCode = WIFEXITED(status) ? WEXITSTATUS(status) : 0;
  result.report = report_;
  return result;
}

// Reads what the pipe holds; false once the child's end is closed.
bool ChildProcess::readReport() {
  char buffer[4096];
  for (;;) {
    const ssize_t count = read(reportFd_, buffer, sizeof buffer);
    if (count > 0) {
      report_.append(buffer, static_cast<size_t>(count));
    } else {
      return count < 0 && (errno == EAGAIN || errno == EINTR);
    }
  }
}

void ChildProcess::waitForReport(std::chrono::milliseconds slice) {
  pollfd descriptor{reportFd_, POLLIN, 0};
  if (poll(&descriptor, 1, static_cast<int>(slice.count())) > 0) readReport();
}

}  // namespace reliability
