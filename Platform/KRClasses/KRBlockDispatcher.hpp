#pragma once

#include <functional>
#include <memory>

#include "KRFoundation/KRDispatchQueue.hpp"
#include "KRFoundation/KRObject.hpp"

// Runs blocks on one serial dispatch queue, in submission order.
class KRBlockDispatcher : public KRObject {
 public:
  // Nil without a queue.
  static std::shared_ptr<KRBlockDispatcher> initWithDispatchQueue(std::shared_ptr<KRDispatchQueue> queue);

  // Queues the block and returns at once. An exception escaping it is logged, never propagated.
  void performBlock(std::function<void()> block);
  // Runs the block after every earlier one and waits for it; inline when called on the queue itself.
  // An exception escaping the block reaches the caller.
  void performBlockAndWait(const std::function<void()>& block);

  const std::shared_ptr<KRDispatchQueue>& dispatchQueue() const { return queue_; }

 protected:
  explicit KRBlockDispatcher(std::shared_ptr<KRDispatchQueue> queue) : queue_(std::move(queue)) {}

 private:
  std::shared_ptr<KRDispatchQueue> queue_;
};
