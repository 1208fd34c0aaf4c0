#pragma once

#include <cstdio>
#include <string>

#include "KRServices/KRLogRecord.hpp"

// The default log sink: writes each record whose level is at or below a threshold (lower levels are
// more severe) as one line to a stream, stderr unless told otherwise.
class KRLogStreamSink {
 public:
  static constexpr int kDefaultThreshold = KRLogLevelError;
  static constexpr const char* kThresholdVariable = "KR_LOG_LEVEL";

  explicit KRLogStreamSink(FILE* stream = stderr, int threshold = thresholdFromEnvironment());

  // The integer in KR_LOG_LEVEL, or kDefaultThreshold when it is unset or not an integer.
  static int thresholdFromEnvironment();
  // "[2] Platform/KRServices/KRLog:12 function: message"
  static std::string lineForRecord(const KRLogRecord& record);

  int threshold() const { return threshold_; }
  void operator()(const KRLogRecord& record) const;

 private:
  FILE* stream_;
  int threshold_;
};
