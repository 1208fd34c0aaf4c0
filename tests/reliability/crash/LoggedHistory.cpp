#include "LoggedHistory.hpp"

#include <fstream>
#include <string>

#include "AcknowledgementLog.hpp"

namespace reliability {

LoggedHistory LoggedHistory::read(const std::filesystem::path& directory) {
  LoggedHistory history;
  std::ifstream file(directory / AcknowledgementLog::kFileName);
  std::string line;
  while (std::getline(file, line)) {
    if (!file.eof()) history.readLine(line);
  }
  return history;
}

void LoggedHistory::readLine(const std::string& line) {
  static const std::string kBegin = "begin ";
  static const std::string kAck = "ack ";
  if (line.starts_with(kBegin)) {
    if (const auto operation = CrashOperation::decode(line.substr(kBegin.size())))
      operations_.push_back(*operation);
  } else if (line.starts_with(kAck)) {
    acknowledged_.insert(std::stoll(line.substr(kAck.size())));
  }
}

std::optional<CrashOperation> LoggedHistory::inFlight() const {
  if (operations_.empty() || acknowledged(operations_.back())) return std::nullopt;
  return operations_.back();
}

}  // namespace reliability
