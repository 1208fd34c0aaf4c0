#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "KRFoundation/KRObject.hpp"

// Base of the model classes: a list of weakly held observers notified in registration order, and
// doors to the main run loop.
//
// Observers are KRObjects that implement an observer interface (an abstract class whose methods have
// empty default bodies). A notification names the interface method; each registered observer that
// implements the interface gets the call, an observer that is gone or no longer registered is skipped.
// Adding and finding an observer take constant time however many there are (a folder path observed by
// every image in it), so registering n observers costs O(n).
class KRAbstractModel : public KRObject {
 public:
  // Registers an observer once; adding it again changes nothing.
  void addListener(const std::shared_ptr<KRObject>& listener);
  void removeListener(const std::shared_ptr<KRObject>& listener);
  bool hasListener(const std::shared_ptr<KRObject>& listener) const;
  // Whether any observer is registered (one that is gone may still count until it is dropped).
  bool hasListeners() const;
  // The live observers in registration order.
  std::vector<std::shared_ptr<KRObject>> listeners() const;

  // Calls `selector` with the arguments on every observer that implements `Protocol`. Observers may
  // add or remove observers (themselves included) while being notified.
  template <class Protocol, class... Params, class... Args>
  void notifyObserversWithSelector(void (Protocol::*selector)(Params...), Args&&... args) {
    for (const auto& listener : listeners()) {
      if (!hasListener(listener)) continue;
      if (auto observer = std::dynamic_pointer_cast<Protocol>(listener)) ((*observer).*selector)(args...);
    }
  }

  // Runs the block in a later iteration of the main run loop, in one of the modes (default: the default
  // mode).
  void performOnNextRunLoopIterationBlock(std::function<void()> block, const std::vector<std::string>& modes);
  void performOnNextRunLoopIterationBlock(std::function<void()> block);
  // Runs the block on the main thread: inline when called there, otherwise posted and waited for.
  void performMainThreadBlock(const std::function<void()>& block);
  // Posts the block to the main run loop; it runs later even when called on the main thread.
  void asyncPerformMainThreadBlock(std::function<void()> block);

 protected:
  KRAbstractModel() = default;

 private:
  // The position of each live observer, the list size at which dead entries are dropped next, and the
  // number of entries emptied by removal since they were last dropped.
  struct Index {
    std::unordered_map<const KRObject*, size_t> positions;
    size_t pruneAt = 0;
    size_t emptied = 0;
  };
  // The observers once there have been two at a time; lists longer than kIndexedListeners get an index.
  struct Listeners {
    std::vector<std::weak_ptr<KRObject>> entries;
    std::unique_ptr<Index> index;
  };
  static constexpr size_t kNotListed = static_cast<size_t>(-1);
  // Lists longer than this get a position index; shorter ones are searched.
  static constexpr size_t kIndexedListeners = 8;

  // One lock of a fixed set, chosen by address: a model with a mutex of its own would double the size of
  // the small ones (a catalog keeps millions). No code holds two of them at once.
  std::mutex& lock() const;
  // The position of the live entry for the object, or kNotListed. Called under the lock.
  size_t positionOf(const KRObject* listener) const;
  size_t listedPositionOf(const KRObject* listener) const;
  // Adds an observer known not to be listed, moving to the list form at the second one.
  void append(const std::shared_ptr<KRObject>& listener);
  // Removes the entry; in an indexed list it is emptied instead, and the empty entries are dropped once
  // they are half the list, so that removing each of many observers costs amortised constant time.
  void eraseAt(size_t position);
  void dropEntries();
  // Drops the entries of observers that are gone: at every addition while the list is short, otherwise
  // once it has doubled since the last time, so that dead entries cost amortised constant time.
  void dropGoneListeners();
  void rebuildPositions();

  // onlyListener holds the observer while there has never been more than one (most models have one, or
  // none); moreListeners replaces it from the second on.
  std::weak_ptr<KRObject> onlyListener_;
  std::unique_ptr<Listeners> moreListeners_;
};
