#include "KRServices/KRLogger.hpp"

#include "KRServices/KRLogFormatter.hpp"
#include "KRServices/KRLogStreamSink.hpp"

// Never destroyed, so that code running during exit (static destructors, late threads) can still log.
KRLogger::Slot& KRLogger::slot() {
  static Slot* const slot =
      new Slot{.mutex = {}, .sink = std::make_shared<const KRLogSink>(KRLogStreamSink())};
  return *slot;
}

std::shared_ptr<const KRLogSink> KRLogger::currentSink() {
  Slot& current = slot();
  std::lock_guard lock(current.mutex);
  return current.sink;
}

KRLogSink KRLogger::setSink(KRLogSink sink) {
  auto replacement = std::make_shared<const KRLogSink>(std::move(sink));
  Slot& current = slot();
  std::lock_guard lock(current.mutex);
  std::swap(current.sink, replacement);
  return *replacement;
}

void KRLogger::log(int level, std::string_view sourcePath, std::string_view function, int line,
                   const char* format, std::span<const KRLogArgument> arguments) {
  const std::shared_ptr<const KRLogSink> sink = currentSink();
  if (!*sink) return;
  (*sink)(KRLogRecord{.level = level,
                      .sourcePath = std::string(sourcePath),
                      .function = std::string(function),
                      .line = line,
                      .message = KRLogFormatter::format(format, arguments)});
}
