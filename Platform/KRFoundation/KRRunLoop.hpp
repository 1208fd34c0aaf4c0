#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <vector>

#include "KRFoundation/KRDate.hpp"

// The event loop of one thread, held by std::shared_ptr. Each thread gets its loop from currentRunLoop()
// on first use; the designated main thread's loop is the main run loop.
//
// - Work arrives as blocks posted from any thread. A pass of the loop in a mode runs, one at a time and
//   in posting order, the blocks that were posted before the pass began and whose modes match; blocks
//   posted during the pass wait for a later pass. NSRunLoopCommonModes matches every mode of the common
//   set (the default mode and the modes added with addCommonMode).
// - Runs nest: a block may run the same loop again (a wait inside a callback). The nested run sees every
//   pending block, including the ones the outer pass has not reached yet, so order stays FIFO.
// - An exception from a block leaves the run call that ran it; the rest stay queued and the loop stays
//   usable.
// - An idle run blocks on a condition variable until a block is posted, wakeUp() or stop() is called, or
//   its limit passes; it never sleeps. A runUntil condition that another thread makes true without
//   posting a block must be followed by wakeUp() so that the waiting run checks it again.
// - stop() ends the innermost run before it starts another block; when no run is active, the next run
//   returns at once.
// - Blocks still pending when the loop's thread ends are dropped.
class KRRunLoop {
 public:
  static constexpr const char* NSDefaultRunLoopMode = "kCFRunLoopDefaultMode";
  static constexpr const char* NSRunLoopCommonModes = "kCFRunLoopCommonModes";

  KRRunLoop(const KRRunLoop&) = delete;
  KRRunLoop& operator=(const KRRunLoop&) = delete;

  // This thread's loop, made on first use.
  static std::shared_ptr<KRRunLoop> currentRunLoop();
  // The main thread's loop; made ahead of designateMainThread() if asked for earlier.
  static std::shared_ptr<KRRunLoop> mainRunLoop();
  // The calling thread becomes the main thread and its loop the main run loop. Call once, at start;
  // raises NSInternalInconsistencyException when another thread is already the main thread.
  static void designateMainThread();
  static bool isMainThread();

  // Posts a block for a later pass in one of the modes (default: the common modes). Thread-safe. An empty
  // block or an empty mode list is ignored.
  void performBlock(std::function<void()> block);
  void performBlock(const std::vector<std::string>& modes, std::function<void()> block);
  void addCommonMode(const std::string& mode);
  // The mode of the innermost active run; empty when the loop is not running.
  std::string currentMode() const;

  // One pass in the mode: runs the due blocks; if there were none, waits until a block is posted, the
  // loop is woken or stopped, or the limit passes, and then runs one more pass. Returns false when the
  // limit passed or stop() ended it with nothing run; NSRunLoopCommonModes is not a mode to run in and
  // returns false at once.
  bool runModeBeforeDate(const std::string& mode, const KRDate& limit);
  // Runs the default mode until the date (or stop()).
  void runUntilDate(const KRDate& limit);
  // Runs the default mode until the condition holds, stop() or the limit. The condition is checked before
  // every wait and after every block; returns its last value.
  bool runUntil(const std::function<bool()>& condition, const KRDate& limit);
  // Runs the default mode until stop().
  void run();
  // Thread-safe: ends the innermost run after its current block.
  void stop();
  // Thread-safe: makes a waiting run check its condition again.
  void wakeUp();

 private:
  using Clock = std::chrono::steady_clock;
  struct Entry {
    uint64_t sequence;
    std::vector<std::string> modes;
    std::function<void()> block;
  };
  enum class Outcome { Drained, Satisfied, Stopped, TimedOut };
  struct PassResult {
    size_t ran = 0;
    Outcome outcome = Outcome::Drained;
  };
  class ModeScope;
  struct ThreadSlot;

  KRRunLoop() = default;
  static std::shared_ptr<KRRunLoop> create();
  static ThreadSlot& threadSlot();

  Outcome runDefaultMode(const std::function<bool()>& condition, Clock::time_point deadline);
  PassResult runPass(const std::string& mode, const std::function<bool()>& condition);
  std::function<void()> nextBlockOfPass(const std::string& mode, uint64_t passEnd, bool& stopped);
  bool waitForWork(const std::string& mode, Clock::time_point deadline);
  uint64_t postedCount() const;
  void discardPendingBlocks();

  // Callers hold mutex_.
  bool matches(const Entry& entry, const std::string& mode) const;
  bool hasDueBlock(const std::string& mode) const;
  std::function<void()> takeDueBlock(const std::string& mode, uint64_t passEnd);

  mutable std::mutex mutex_;
  std::condition_variable wakeCondition_;
  std::deque<Entry> entries_;
  uint64_t nextSequence_ = 0;
  std::set<std::string> commonModes_{NSDefaultRunLoopMode};
  std::vector<std::string> modeStack_;
  bool stopRequested_ = false;
  bool wakeRequested_ = false;
};
