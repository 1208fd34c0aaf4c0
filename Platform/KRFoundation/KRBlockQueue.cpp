#include "KRFoundation/KRBlockQueue.hpp"

void KRBlockQueue::push(std::function<void()> block) {
  if (!block) return;
  {
    std::lock_guard lock(mutex_);
    if (closed_) return;
    blocks_.push_back(std::move(block));
  }
  available_.notify_one();
}

void KRBlockQueue::close() {
  {
    std::lock_guard lock(mutex_);
    closed_ = true;
  }
  available_.notify_all();
}

void KRBlockQueue::runUntilClosed(const std::function<void(std::exception_ptr)>& onException) {
  while (std::function<void()> block = pop()) {
    try {
      block();
    } catch (...) {
      onException(std::current_exception());
    }
  }
}

std::function<void()> KRBlockQueue::pop() {
  std::unique_lock lock(mutex_);
  available_.wait(lock, [this] { return closed_ || !blocks_.empty(); });
  if (blocks_.empty()) return {};
  std::function<void()> block = std::move(blocks_.front());
  blocks_.pop_front();
  return block;
}
