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

size_t KRAbstractModel::positionOf(const KRObject* listener) const {
  if (index_) {
    const auto found = index_->positions.find(listener);
    if (found == index_->positions.end() || !refersTo(listeners_[found->second], listener)) return kNotListed;
    return found->second;
  }
  for (size_t position = 0; position < listeners_.size(); ++position) {
    if (refersTo(listeners_[position], listener)) return position;
  }
  return kNotListed;
}

void KRAbstractModel::rebuildPositions() {
  if (listeners_.size() <= kIndexedListeners) {
    index_.reset();
    return;
  }
  if (!index_) index_ = std::make_unique<Index>();
  index_->positions.clear();
  index_->positions.reserve(listeners_.size());
  for (size_t position = 0; position < listeners_.size(); ++position) {
    if (const auto held = listeners_[position].lock()) index_->positions[held.get()] = position;
  }
}

void KRAbstractModel::eraseAt(size_t position) {
  listeners_.erase(listeners_.begin() + static_cast<std::ptrdiff_t>(position));
  rebuildPositions();
}

void KRAbstractModel::dropGoneListeners() {
  if (index_ && listeners_.size() < index_->pruneAt) return;
  std::erase_if(listeners_, [](const auto& entry) { return entry.expired(); });
  rebuildPositions();
  if (index_) index_->pruneAt = 2 * listeners_.size();
}

void KRAbstractModel::addListener(const std::shared_ptr<KRObject>& listener) {
  if (!listener) return;
  std::lock_guard lock(mutex_);
  if (positionOf(listener.get()) != kNotListed) return;
  // An entry left by a dead observer at the same address is replaced.
  if (index_) {
    const auto stale = index_->positions.find(listener.get());
    if (stale != index_->positions.end()) eraseAt(stale->second);
  }
  listeners_.push_back(listener);
  if (index_) index_->positions[listener.get()] = listeners_.size() - 1;
  dropGoneListeners();
}

void KRAbstractModel::removeListener(const std::shared_ptr<KRObject>& listener) {
  std::lock_guard lock(mutex_);
  const size_t position = positionOf(listener.get());
  if (position != kNotListed) eraseAt(position);
}

bool KRAbstractModel::hasListener(const std::shared_ptr<KRObject>& listener) const {
  std::lock_guard lock(mutex_);
  return positionOf(listener.get()) != kNotListed;
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
