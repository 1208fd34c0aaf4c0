#include "KRClasses/KRAbstractModel.hpp"

#include <algorithm>

#include "KRFoundation/KRBlockWaiter.hpp"
#include "KRFoundation/KRRunLoop.hpp"

namespace {

bool refersTo(const std::weak_ptr<KRObject>& entry, const KRObject* object) {
  const auto held = entry.lock();
  return held && held.get() == object;
}

}  // namespace

void KRAbstractModel::addListener(const std::shared_ptr<KRObject>& listener) {
  if (!listener) return;
  std::lock_guard lock(mutex_);
  std::erase_if(listeners_, [](const auto& entry) { return entry.expired(); });
  const bool known = std::any_of(listeners_.begin(), listeners_.end(),
                                 [&](const auto& entry) { return refersTo(entry, listener.get()); });
  if (!known) listeners_.push_back(listener);
}

void KRAbstractModel::removeListener(const std::shared_ptr<KRObject>& listener) {
  std::lock_guard lock(mutex_);
  std::erase_if(listeners_,
                [&](const auto& entry) { return entry.expired() || refersTo(entry, listener.get()); });
}

bool KRAbstractModel::hasListener(const std::shared_ptr<KRObject>& listener) const {
  std::lock_guard lock(mutex_);
  return std::any_of(listeners_.begin(), listeners_.end(),
                     [&](const auto& entry) { return refersTo(entry, listener.get()); });
}

std::vector<std::shared_ptr<KRObject>> KRAbstractModel::listeners() const {
  std::lock_guard lock(mutex_);
  std::vector<std::shared_ptr<KRObject>> live;
  live.reserve(listeners_.size());
  for (const auto& entry : listeners_) {
    if (auto held = entry.lock()) live.push_back(std::move(held));
  }
  return live;
}

void KRAbstractModel::performOnNextRunLoopIterationBlock(std::function<void()> block,
                                                         const std::vector<std::string>& modes) {
  KRRunLoop::mainRunLoop()->performBlock(modes, std::move(block));
}

void KRAbstractModel::performOnNextRunLoopIterationBlock(std::function<void()> block) {
  performOnNextRunLoopIterationBlock(std::move(block), {KRRunLoop::NSDefaultRunLoopMode});
}

void KRAbstractModel::performMainThreadBlock(const std::function<void()>& block) {
  if (KRRunLoop::isMainThread()) {
    block();
    return;
  }
  KRBlockWaiter::postAndWait(
      [](std::function<void()> wrapper) { KRRunLoop::mainRunLoop()->performBlock(std::move(wrapper)); },
      block);
}

void KRAbstractModel::asyncPerformMainThreadBlock(std::function<void()> block) {
  KRRunLoop::mainRunLoop()->performBlock(std::move(block));
}
