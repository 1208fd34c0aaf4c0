#pragma once

#include <atomic>
#include <functional>
#include <memory>
#include <string>

#include "KRFoundation/KRObject.hpp"

// A pending write of one entity: a block that runs when the operation starts, unless the operation was
// cancelled before. Made and cancelled on the caller's thread, started on the catalog's queue: the
// cancelled flag is atomic, the block is set once at construction and never changes.
class KRDBUpdateOperation : public KRObject {
 public:
  // The block gets the operation that runs it.
  using Block = std::function<void(const KRDBUpdateOperation& operation)>;

  static std::shared_ptr<KRDBUpdateOperation> operationWithBlock(Block block);

  // The name of the catalog operation it carries: "updateEntity:".
  const std::string& name() const;
  void cancel() { cancelled_ = true; }
  bool isCancelled() const { return cancelled_; }
  // Runs the block on the calling thread unless the operation was cancelled.
  void start();

 private:
  explicit KRDBUpdateOperation(Block block) : block_(std::move(block)) {}

  const Block block_;
  std::atomic<bool> cancelled_ = false;
};
