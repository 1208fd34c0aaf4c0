#include "dbbackuptemporaries.hpp"

#include <signal.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <vector>

namespace dbcore {

namespace {

const char* const kSidecars[] = {"", "-journal", "-wal", "-shm"};

// The number at the start of the text and the rest after it; no number when it does not start with a digit.
bool leadingNumber(const std::string& text, unsigned long long& number, std::string& rest) {
  size_t digits = 0;
  while (digits < text.size() && digits < 19 && text[digits] >= '0' && text[digits] <= '9') ++digits;
  if (digits == 0) return false;
  number = std::stoull(text.substr(0, digits));
  rest = text.substr(digits);
  return true;
}

bool isSidecarSuffix(const std::string& text) {
  for (const char* suffix : kSidecars) {
    if (text == suffix) return true;
  }
  return false;
}

}  // namespace

DBBackupTemporaries::DBBackupTemporaries(std::string destination) : destination_(std::move(destination)) {}

std::string DBBackupTemporaries::prefix() const {
  return std::filesystem::path(destination_).filename().string() + ".backup-";
}

std::string DBBackupTemporaries::next() const {
  static std::atomic<unsigned> counter{0};
  return destination_ + ".backup-" + std::to_string(getpid()) + "-" + std::to_string(counter++);
}

pid_t DBBackupTemporaries::writerOf(const std::string& name) const {
  const std::string start = prefix();
  if (name.compare(0, start.size(), start) != 0) return 0;
  unsigned long long pid = 0;
  unsigned long long sequence = 0;
  std::string rest;
  if (!leadingNumber(name.substr(start.size()), pid, rest) || rest.empty() || rest[0] != '-') return 0;
  if (!leadingNumber(rest.substr(1), sequence, rest) || !isSidecarSuffix(rest)) return 0;
  return pid > 0 && pid <= static_cast<unsigned long long>(INT32_MAX) ? static_cast<pid_t>(pid) : 0;
}

void DBBackupTemporaries::removeStale() const {
  std::filesystem::path folder = std::filesystem::path(destination_).parent_path();
  if (folder.empty()) folder = ".";
  std::error_code error;
  std::vector<std::filesystem::path> stale;
  for (const auto& entry : std::filesystem::directory_iterator(folder, error)) {
    const pid_t writer = writerOf(entry.path().filename().string());
    if (writer != 0 && !processExists(writer)) stale.push_back(entry.path());
  }
  for (const auto& path : stale) std::filesystem::remove(path, error);
}

void DBBackupTemporaries::remove(const std::string& temporary) {
  for (const char* suffix : kSidecars) std::remove((temporary + suffix).c_str());
}

// A process that exists but belongs to another user answers EPERM: it is alive.
bool DBBackupTemporaries::processExists(pid_t pid) { return kill(pid, 0) == 0 || errno != ESRCH; }

}  // namespace dbcore
