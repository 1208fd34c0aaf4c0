#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <span>
#include <string_view>

#include "KRServices/KRLogArgument.hpp"
#include "KRServices/KRLogRecord.hpp"

// Where log records go. Called on the logging thread, possibly from several threads at once.
using KRLogSink = std::function<void(const KRLogRecord&)>;

// Hands every log record to the installed sink, by default a KRLogStreamSink on stderr. Any thread
// may log or replace the sink; a record being written while the sink is replaced still reaches
// the sink it started with.
class KRLogger {
 public:
  // Installs `sink` and returns the one it replaces. An empty sink discards records.
  static KRLogSink setSink(KRLogSink sink);
  // Formats the message (see KRLogFormatter) and writes the record to the current sink.
  static void log(int level, std::string_view sourcePath, std::string_view function, int line,
                  const char* format, std::span<const KRLogArgument> arguments);

 private:
  struct Slot {
    std::mutex mutex;
    std::shared_ptr<const KRLogSink> sink;
  };
  static Slot& slot();
  static std::shared_ptr<const KRLogSink> currentSink();
};
