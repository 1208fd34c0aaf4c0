#pragma once

#include <string>

// Log levels: a lower level is more severe.
inline constexpr int KRLogLevelMissingOverride = 1;
inline constexpr int KRLogLevelError = 2;
inline constexpr int KRLogLevelInfo = 3;
inline constexpr int KRLogLevelWarning = 4;

// One log line as the sinks receive it: the formatted message and where it was logged from.
struct KRLogRecord {
  int level = 0;
  std::string sourcePath;
  std::string function;
  int line = 0;
  std::string message;

  bool operator==(const KRLogRecord&) const = default;
};
