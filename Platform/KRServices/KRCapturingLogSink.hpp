#pragma once

#include <memory>
#include <string>
#include <vector>

#include "KRServices/KRLogger.hpp"

// Captures every log record while it exists, whatever its level: installs itself as the log sink
// when made and puts the previous sink back when destroyed. For tests; any thread may log into it
// while another reads it.
class KRCapturingLogSink {
 public:
  KRCapturingLogSink();
  ~KRCapturingLogSink();
  KRCapturingLogSink(const KRCapturingLogSink&) = delete;
  KRCapturingLogSink& operator=(const KRCapturingLogSink&) = delete;

  // The captured records in the order they were logged.
  std::vector<KRLogRecord> records() const;
  // The messages of the captured records, in the same order.
  std::vector<std::string> messages() const;
  void clear();

 private:
  struct Storage;
  std::shared_ptr<Storage> storage_;
  KRLogSink previous_;
};
