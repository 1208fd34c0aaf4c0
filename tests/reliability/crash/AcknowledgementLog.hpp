#pragma once

#include <filesystem>
#include <string>

#include "CrashOperation.hpp"

namespace reliability {

// A writer's record of its calls, appended and synced line by line beside the catalog: "begin <call>"
// before a call, "ack <number>" once it returned. A checker learns from it which calls were acknowledged
// and which one was in flight when the writer died.
class AcknowledgementLog {
 public:
  static constexpr const char* kFileName = "writer.log";

  // Throws std::runtime_error when the log cannot be opened.
  explicit AcknowledgementLog(const std::filesystem::path& directory);
  ~AcknowledgementLog();
  AcknowledgementLog(const AcknowledgementLog&) = delete;
  AcknowledgementLog& operator=(const AcknowledgementLog&) = delete;

  void begin(const CrashOperation& operation);
  void acknowledge(const CrashOperation& operation);

 private:
  void append(const std::string& line);

  int fd_ = -1;
};

}  // namespace reliability
