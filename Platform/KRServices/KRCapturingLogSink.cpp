#include "KRServices/KRCapturingLogSink.hpp"

#include <mutex>

// Shared with the installed sink function, so that a record still being written after the
// capturing sink is gone has somewhere to go.
struct KRCapturingLogSink::Storage {
  mutable std::mutex mutex;
  std::vector<KRLogRecord> records;
};

KRCapturingLogSink::KRCapturingLogSink() : storage_(std::make_shared<Storage>()) {
  previous_ = KRLogger::setSink([storage = storage_](const KRLogRecord& record) {
    std::lock_guard lock(storage->mutex);
    storage->records.push_back(record);
  });
}

KRCapturingLogSink::~KRCapturingLogSink() { KRLogger::setSink(std::move(previous_)); }

std::vector<KRLogRecord> KRCapturingLogSink::records() const {
  std::lock_guard lock(storage_->mutex);
  return storage_->records;
}

std::vector<std::string> KRCapturingLogSink::messages() const {
  std::vector<std::string> messages;
  for (const KRLogRecord& record : records()) messages.push_back(record.message);
  return messages;
}

void KRCapturingLogSink::clear() {
  std::lock_guard lock(storage_->mutex);
  storage_->records.clear();
}
