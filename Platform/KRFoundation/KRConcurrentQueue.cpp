#include "KRFoundation/KRConcurrentQueue.hpp"

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <exception>
#include <memory>
#include <mutex>
#include <thread>
#include <utility>

#include "KRFoundation/KRDispatchQueue.hpp"

// The shared state of one apply(): threads claim indices from a counter until none are left. A helper
// that starts after every index was claimed does nothing, so it never touches the body after apply
// returned.
class KRConcurrentQueue::ParallelLoop {
 public:
  ParallelLoop(size_t count, const std::function<void(size_t)>& body) : count_(count), body_(body) {}

  // Claims and runs indices until none are left.
  void drain() {
    size_t ran = 0;
    for (size_t index = next_++; index < count_; index = next_++, ++ran) run(index);
    if (ran == 0) return;
    std::lock_guard lock(mutex_);
    finished_ += ran;
    if (finished_ == count_) allFinished_.notify_all();
  }

  // Waits until every index has run; rethrows the first exception of a body. The exception is taken out
  // so that the caller, not a late helper, releases it.
  void wait() {
    std::unique_lock lock(mutex_);
    allFinished_.wait(lock, [this] { return finished_ == count_; });
    if (firstError_) std::rethrow_exception(std::exchange(firstError_, nullptr));
  }

 private:
  void run(size_t index) {
    try {
      body_(index);
    } catch (...) {
      std::lock_guard lock(mutex_);
      if (!firstError_) firstError_ = std::current_exception();
    }
  }

  const size_t count_;
  const std::function<void(size_t)>& body_;
  std::atomic<size_t> next_{0};
  std::mutex mutex_;
  std::condition_variable allFinished_;
  size_t finished_ = 0;
  std::exception_ptr firstError_;
};

KRConcurrentQueue& KRConcurrentQueue::globalQueue() {
  static KRConcurrentQueue& queue =
      *new KRConcurrentQueue(std::max<size_t>(2, std::thread::hardware_concurrency()));
  return queue;
}

KRConcurrentQueue::KRConcurrentQueue(size_t threadCount) : threadCount_(threadCount) {
  for (size_t i = 0; i < threadCount_; ++i) std::thread([this] { work(); }).detach();
}

void KRConcurrentQueue::async(std::function<void()> block) { blocks_.push(std::move(block)); }

void KRConcurrentQueue::apply(size_t count, const std::function<void(size_t)>& body) {
  if (count == 0) return;
  auto loop = std::make_shared<ParallelLoop>(count, body);
  const size_t helpers = std::min(count - 1, threadCount_);
  for (size_t i = 0; i < helpers; ++i) async([loop] { loop->drain(); });
  loop->drain();
  loop->wait();
}

void KRConcurrentQueue::work() {
  blocks_.runUntilClosed([this](std::exception_ptr error) {
    KRDispatchQueue::reportUncaughtException(label_, std::move(error));
  });
}
