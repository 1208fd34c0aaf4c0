#pragma once

#include <condition_variable>
#include <deque>
#include <exception>
#include <functional>
#include <mutex>

// A thread-safe FIFO of blocks for worker threads: any thread pushes, workers take the blocks in order
// until the queue is closed and empty. Shared by the serial queues and the concurrent pool.
class KRBlockQueue {
 public:
  // Appends a block. An empty block, or one pushed after close(), is dropped.
  void push(std::function<void()> block);
  // No block is accepted any more; workers finish the queued ones and return.
  void close();
  // The worker loop: runs blocks as they arrive, waiting while the queue is empty, until it is closed and
  // drained. An exception escaping a block goes to onException and the loop carries on.
  void runUntilClosed(const std::function<void(std::exception_ptr)>& onException);

 private:
  // The next block, waiting while the queue is open and empty; empty once closed and drained.
  std::function<void()> pop();

  std::mutex mutex_;
  std::condition_variable available_;
  std::deque<std::function<void()>> blocks_;
  bool closed_ = false;
};
