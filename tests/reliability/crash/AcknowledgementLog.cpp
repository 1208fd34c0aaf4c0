#include "AcknowledgementLog.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <stdexcept>

namespace reliability {

AcknowledgementLog::AcknowledgementLog(const std::filesystem::path& directory)
    : fd_(open((directory / kFileName).c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0644)) {
  if (fd_ < 0) throw std::runtime_error("cannot open the writer's log in " + directory.string());
}

AcknowledgementLog::~AcknowledgementLog() { close(fd_); }

void AcknowledgementLog::begin(const CrashOperation& operation) { append("begin " + operation.encode()); }

void AcknowledgementLog::acknowledge(const CrashOperation& operation) {
  append("ack " + std::to_string(operation.number));
}

// One write per line, so that a line is either whole in the file or missing.
void AcknowledgementLog::append(const std::string& line) {
  const std::string text = line + "\n";
  if (write(fd_, text.data(), text.size()) != static_cast<ssize_t>(text.size()) || fsync(fd_) != 0)
    throw std::runtime_error("cannot append to the writer's log");
}

}  // namespace reliability
