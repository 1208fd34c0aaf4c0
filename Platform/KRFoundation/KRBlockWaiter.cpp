#include "KRFoundation/KRBlockWaiter.hpp"

#include <condition_variable>
#include <exception>
#include <mutex>

namespace {

// Runs the block; returns its exception, already out of the catch handler so that the running thread
// holds no reference to it once handed over.
std::exception_ptr runCatching(const std::function<void()>& block) {
  std::exception_ptr error;
  try {
    block();
  } catch (...) {
    error = std::current_exception();
  }
  return error;
}

}  // namespace

void KRBlockWaiter::postAndWait(const Post& post, const std::function<void()>& block) {
  std::mutex mutex;
  std::condition_variable finished;
  bool done = false;
  std::exception_ptr error;
  post([&] {
    std::exception_ptr caught = runCatching(block);
    // Notifying under the lock keeps the waiter, whose stack holds all of this, from leaving early.
    std::lock_guard lock(mutex);
    error = std::move(caught);
    done = true;
    finished.notify_one();
  });
  std::unique_lock lock(mutex);
  finished.wait(lock, [&done] { return done; });
  if (error) std::rethrow_exception(std::move(error));
}
