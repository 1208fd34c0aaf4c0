#pragma once

#include <functional>

// Runs a block on another thread and waits for it: the caller hands a wrapper of the block to a queue or
// a run loop and sleeps until the block has run. An exception escaping the block is rethrown to the
// caller, as if the block had run inline.
class KRBlockWaiter {
 public:
  using Post = std::function<void(std::function<void()> wrapper)>;

  // `post` must run the wrapper exactly once, on another thread or before returning; a wrapper that
  // never runs leaves the caller waiting for ever.
  static void postAndWait(const Post& post, const std::function<void()>& block);
};
