#pragma once

#include <memory>
#include <utility>

// The allocator that std::allocate_shared needs to build an object next to its reference count, in one
// allocation, when the object's constructor is not public: Builder::build(place, args...) constructs it,
// and a class hands in a Builder of its own that may reach its constructor. Stateless; any thread.
template <class T, class Builder>
struct KRDBInPlaceAllocator : std::allocator<T> {
  template <class U>
  struct rebind {
    using other = KRDBInPlaceAllocator<U, Builder>;
  };
  KRDBInPlaceAllocator() = default;
  template <class U>
  KRDBInPlaceAllocator(const KRDBInPlaceAllocator<U, Builder>& /*other*/) {}
  template <class U, class... Args>
  void construct(U* place, Args&&... args) {
    Builder::build(place, std::forward<Args>(args)...);
  }
};
