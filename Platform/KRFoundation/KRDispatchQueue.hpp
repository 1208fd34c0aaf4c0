#pragma once

#include <exception>
#include <functional>
#include <memory>
#include <string>
#include <thread>

#include "KRFoundation/KRBlockQueue.hpp"

// A named serial queue: one worker thread runs the blocks one at a time in FIFO order. Held by
// std::shared_ptr.
//
// - An exception escaping an async block is caught on the worker and handed to the uncaught-exception
//   handler (by default a line on stderr); the queue carries on and the process never terminates.
// - sync() waits for its block after all earlier ones and rethrows the block's exception to the caller;
//   called on the queue's own worker it runs the block inline instead of deadlocking.
// - Destruction finishes the queued blocks and joins the worker. When the last reference is dropped on
//   the worker itself, the worker is detached instead; it finishes the queued blocks and ends on its own.
class KRDispatchQueue {
 public:
  using UncaughtExceptionHandler = std::function<void(const std::string& label, std::exception_ptr error)>;

  static std::shared_ptr<KRDispatchQueue> serialQueue(std::string label);
  ~KRDispatchQueue();
  KRDispatchQueue(const KRDispatchQueue&) = delete;
  KRDispatchQueue& operator=(const KRDispatchQueue&) = delete;

  const std::string& label() const;
  void async(std::function<void()> block);
  void sync(const std::function<void()>& block);
  // The calling thread is this queue's worker.
  bool isCurrent() const;

  // The handler of exceptions that escape async blocks of every queue; an empty handler restores the
  // default. Thread-safe; the handler may be called from several workers at once. A handler that throws
  // falls back to the default report.
  static void setUncaughtExceptionHandler(UncaughtExceptionHandler handler);
  // Hands an exception that escaped a block of the queue with this label to the handler.
  static void reportUncaughtException(const std::string& label, std::exception_ptr error);

 private:
  // What the worker thread shares with the queue; it outlives the queue when the worker is detached.
  struct Worker {
    explicit Worker(std::string name) : label(std::move(name)) {}
    std::string label;
    KRBlockQueue blocks;
  };

  explicit KRDispatchQueue(std::string label);
  static void work(const std::shared_ptr<Worker>& worker);

  std::shared_ptr<Worker> worker_;
  std::thread thread_;
};
