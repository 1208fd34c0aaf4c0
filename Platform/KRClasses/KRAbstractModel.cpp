#include "KRClasses/KRAbstractModel.hpp"

#include <algorithm>
#include <array>
#include <cstdint>

#include "KRFoundation/KRBlockWaiter.hpp"
#include "KRFoundation/KRRunLoop.hpp"

namespace {

bool refersTo(const std::weak_ptr<KRObject>& entry, const KRObject* object) {
  const auto held = entry.lock();
  return held && held.get() == object;
}

}  // namespace

std::mutex& KRAbstractModel::lock() const {
  static std::array<std::mutex, 64> locks;
  return locks[(reinterpret_cast<uintptr_t>(this) >> 4) % locks.size()];
}

size_t KRAbstractModel::positionOf(const KRObject* listener) const {
  if (moreListeners_) return listedPositionOf(listener);
  return refersTo(onlyListener_, listener) ? 0 : kNotListed;
}

size_t KRAbstractModel::listedPositionOf(const KRObject* listener) const {
  const auto& entries = moreListeners_->entries;
  if (const auto& index = moreListeners_->index) {
    const auto found = index->positions.find(listener);
    if (found == index->positions.end() || !refersTo(entries[found->second], listener)) return kNotListed;
    return found->second;
  }
  for (size_t position = 0; position < entries.size(); ++position) {
    if (refersTo(entries[position], listener)) return position;
  }
  return kNotListed;
}

void KRAbstractModel::rebuildPositions() {
  const auto& entries = moreListeners_->entries;
  auto& index = moreListeners_->index;
  if (entries.size() <= kIndexedListeners) {
    index.reset();
    return;
  }
  if (!index) index = std::make_unique<Index>();
  index->positions.clear();
  index->positions.reserve(entries.size());
  for (size_t position = 0; position < entries.size(); ++position) {
    if (const auto held = entries[position].lock()) index->positions[held.get()] = position;
  }
}

void KRAbstractModel::eraseAt(size_t position) {
  if (!moreListeners_) return onlyListener_.reset();
  auto& entries = moreListeners_->entries;
  const auto& index = moreListeners_->index;
  if (!index) {
    entries.erase(entries.begin() + static_cast<std::ptrdiff_t>(position));
    return;
  }
  if (const auto held = entries[position].lock()) index->positions.erase(held.get());
  entries[position].reset();
  if (2 * ++index->emptied > entries.size()) dropEntries();
}

void KRAbstractModel::dropGoneListeners() {
  const auto& index = moreListeners_->index;
  if (index && moreListeners_->entries.size() < index->pruneAt) return;
  dropEntries();
}

void KRAbstractModel::dropEntries() {
  std::erase_if(moreListeners_->entries, [](const auto& entry) { return entry.expired(); });
  rebuildPositions();
  if (const auto& index = moreListeners_->index) {
    index->pruneAt = 2 * moreListeners_->entries.size();
    index->emptied = 0;
  }
}

void KRAbstractModel::append(const std::shared_ptr<KRObject>& listener) {
  if (!moreListeners_) {
    if (onlyListener_.expired()) {
      onlyListener_ = listener;
      return;
    }
    moreListeners_ = std::make_unique<Listeners>();
    moreListeners_->entries.push_back(std::move(onlyListener_));
    onlyListener_.reset();
  }
  auto& index = moreListeners_->index;
  // An entry left by a dead observer at the same address is replaced.
  if (index) {
    const auto stale = index->positions.find(listener.get());
    if (stale != index->positions.end()) eraseAt(stale->second);
  }
  auto& entries = moreListeners_->entries;
  entries.push_back(listener);
  if (index) index->positions[listener.get()] = entries.size() - 1;
  dropGoneListeners();
}

void KRAbstractModel::addListener(const std::shared_ptr<KRObject>& listener) {
  if (!listener) return;
  std::lock_guard held(lock());
  if (positionOf(listener.get()) == kNotListed) append(listener);
}

void KRAbstractModel::removeListener(const std::shared_ptr<KRObject>& listener) {
  std::lock_guard held(lock());
  const size_t position = positionOf(listener.get());
  if (position != kNotListed) eraseAt(position);
}

bool KRAbstractModel::hasListener(const std::shared_ptr<KRObject>& listener) const {
  std::lock_guard held(lock());
  return positionOf(listener.get()) != kNotListed;
}

bool KRAbstractModel::hasListeners() const {
  std::lock_guard held(lock());
  return moreListeners_ ? !moreListeners_->entries.empty() : !onlyListener_.expired();
}

std::vector<std::shared_ptr<KRObject>> KRAbstractModel::listeners() const {
  std::lock_guard held(lock());
  std::vector<std::shared_ptr<KRObject>> live;
  if (!moreListeners_) {
    if (auto only = onlyListener_.lock()) live.push_back(std::move(only));
    return live;
  }
  live.reserve(moreListeners_->entries.size());
  for (const auto& entry : moreListeners_->entries) {
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
