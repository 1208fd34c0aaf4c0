#include "KRServices/KRLogStreamSink.hpp"

#include <charconv>
#include <cstdlib>
#include <string_view>

KRLogStreamSink::KRLogStreamSink(FILE* stream, int threshold) : stream_(stream), threshold_(threshold) {}

int KRLogStreamSink::thresholdFromEnvironment() {
  const char* variable = std::getenv(kThresholdVariable);
  if (!variable) return kDefaultThreshold;
  const std::string_view text(variable);
  int threshold = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), threshold);
  if (error != std::errc() || end != text.data() + text.size()) return kDefaultThreshold;
  return threshold;
}

std::string KRLogStreamSink::lineForRecord(const KRLogRecord& record) {
  return "[" + std::to_string(record.level) + "] " + record.sourcePath + ":" + std::to_string(record.line) +
         " " + record.function + ": " + record.message + "\n";
}

void KRLogStreamSink::operator()(const KRLogRecord& record) const {
  if (record.level > threshold_) return;
  // One write per line, so that lines from several threads do not interleave.
  const std::string line = lineForRecord(record);
  std::fwrite(line.data(), 1, line.size(), stream_);
  std::fflush(stream_);
}
