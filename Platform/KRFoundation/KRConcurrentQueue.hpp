#pragma once

#include <cstddef>
#include <functional>
#include <string>

#include "KRFoundation/KRBlockQueue.hpp"

// The global concurrent queue: a fixed pool of max(2, hardware concurrency) worker threads that take
// blocks from one shared FIFO. The pool lives as long as the process; its threads are never joined.
//
// - An exception escaping an async block goes to KRDispatchQueue's uncaught-exception handler with this
//   queue's label.
// - apply() is a parallel loop on the pool and the calling thread. The calling thread works through the
//   indices itself and only waits for indices that other threads are already running, so nested apply
//   (from inside a body, even on a pool thread) cannot deadlock.
class KRConcurrentQueue {
 public:
  static KRConcurrentQueue& globalQueue();
  KRConcurrentQueue(const KRConcurrentQueue&) = delete;
  KRConcurrentQueue& operator=(const KRConcurrentQueue&) = delete;

  const std::string& label() const { return label_; }
  size_t threadCount() const { return threadCount_; }
  void async(std::function<void()> block);
  // Calls body(i) once for every i in [0, count) and returns when all calls are done. When bodies throw,
  // every index still runs and the first exception is rethrown at the end.
  void apply(size_t count, const std::function<void(size_t)>& body);

 private:
  class ParallelLoop;

  explicit KRConcurrentQueue(size_t threadCount);
  void work();

  const std::string label_ = "com.apple.root.default-qos";
  const size_t threadCount_;
  KRBlockQueue blocks_;
};
