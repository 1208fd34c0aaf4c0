#include "KRFoundation/KRRunLoop.hpp"

#include <algorithm>
#include <optional>
#include <thread>
#include <utility>

#include "KRFoundation/KRException.hpp"

namespace {

// Longer waits are cut to this, so that far dates such as distantFuture cannot overflow the clock.
constexpr double kLongestWaitSeconds = 1e8;

std::chrono::steady_clock::time_point deadlineFor(const KRDate& limit) {
  double seconds = limit.timeIntervalSinceNow();
  if (!(seconds > 0)) seconds = 0;  // past, nil or not a number
  seconds = std::min(seconds, kLongestWaitSeconds);
  return std::chrono::steady_clock::now() + std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                                                std::chrono::duration<double>(seconds));
}

// The designated main thread and its loop. Never destroyed, so threads still running at exit can use it.
struct MainThread {
  std::mutex mutex;
  std::optional<std::thread::id> thread;
  std::shared_ptr<KRRunLoop> loop;
};

MainThread& mainThread() {
  static MainThread& state = *new MainThread;
  return state;
}

thread_local bool tIsMainThread = false;

}  // namespace

// Marks the mode of a run as current for the run's duration, also when a block throws.
class KRRunLoop::ModeScope {
 public:
  ModeScope(KRRunLoop& loop, const std::string& mode) : loop_(loop) {
    std::lock_guard lock(loop_.mutex_);
    loop_.modeStack_.push_back(mode);
  }
  ~ModeScope() {
    std::lock_guard lock(loop_.mutex_);
    loop_.modeStack_.pop_back();
  }
  ModeScope(const ModeScope&) = delete;
  ModeScope& operator=(const ModeScope&) = delete;

 private:
  KRRunLoop& loop_;
};

// A thread's own loop. Blocks left when the thread ends can never run; dropping them also breaks
// reference cycles through blocks that hold the loop.
struct KRRunLoop::ThreadSlot {
  std::shared_ptr<KRRunLoop> loop;
  ~ThreadSlot() {
    if (loop) loop->discardPendingBlocks();
  }
};

std::shared_ptr<KRRunLoop> KRRunLoop::create() { return std::shared_ptr<KRRunLoop>(new KRRunLoop); }

KRRunLoop::ThreadSlot& KRRunLoop::threadSlot() {
  thread_local ThreadSlot slot;
  return slot;
}

std::shared_ptr<KRRunLoop> KRRunLoop::currentRunLoop() {
  ThreadSlot& slot = threadSlot();
  if (!slot.loop) slot.loop = create();
  return slot.loop;
}

std::shared_ptr<KRRunLoop> KRRunLoop::mainRunLoop() {
  MainThread& main = mainThread();
  std::lock_guard lock(main.mutex);
  if (!main.loop) main.loop = create();
  return main.loop;
}

void KRRunLoop::designateMainThread() {
  MainThread& main = mainThread();
  std::lock_guard lock(main.mutex);
  const std::thread::id self = std::this_thread::get_id();
  if (main.thread && *main.thread != self) {
    KRException::raise(KRException::NSInternalInconsistencyException,
                       "another thread is already the main thread");
  }
  main.thread = self;
  if (!main.loop) main.loop = currentRunLoop();
  threadSlot().loop = main.loop;
  tIsMainThread = true;
}

bool KRRunLoop::isMainThread() { return tIsMainThread; }

void KRRunLoop::performBlock(std::function<void()> block) {
  performBlock({NSRunLoopCommonModes}, std::move(block));
}

void KRRunLoop::performBlock(const std::vector<std::string>& modes, std::function<void()> block) {
  if (!block || modes.empty()) return;
  {
    std::lock_guard lock(mutex_);
    entries_.push_back(Entry{nextSequence_++, modes, std::move(block)});
  }
  wakeCondition_.notify_all();
}

void KRRunLoop::addCommonMode(const std::string& mode) {
  {
    std::lock_guard lock(mutex_);
    commonModes_.insert(mode);
  }
  wakeCondition_.notify_all();
}

std::string KRRunLoop::currentMode() const {
  std::lock_guard lock(mutex_);
  return modeStack_.empty() ? std::string() : modeStack_.back();
}

bool KRRunLoop::runModeBeforeDate(const std::string& mode, const KRDate& limit) {
  if (mode == NSRunLoopCommonModes) return false;
  const Clock::time_point deadline = deadlineFor(limit);
  ModeScope scope(*this, mode);
  PassResult pass = runPass(mode, nullptr);
  if (pass.ran == 0 && pass.outcome == Outcome::Drained) {
    if (!waitForWork(mode, deadline)) return false;
    pass = runPass(mode, nullptr);
  }
  return pass.ran > 0 || pass.outcome != Outcome::Stopped;
}

void KRRunLoop::runUntilDate(const KRDate& limit) { runDefaultMode(nullptr, deadlineFor(limit)); }

bool KRRunLoop::runUntil(const std::function<bool()>& condition, const KRDate& limit) {
  return runDefaultMode(condition, deadlineFor(limit)) == Outcome::Satisfied;
}

void KRRunLoop::run() {
  while (runDefaultMode(nullptr, deadlineFor(KRDate::distantFuture())) != Outcome::Stopped) {
  }
}

void KRRunLoop::stop() {
  {
    std::lock_guard lock(mutex_);
    stopRequested_ = true;
  }
  wakeCondition_.notify_all();
}

void KRRunLoop::wakeUp() {
  {
    std::lock_guard lock(mutex_);
    wakeRequested_ = true;
  }
  wakeCondition_.notify_all();
}

KRRunLoop::Outcome KRRunLoop::runDefaultMode(const std::function<bool()>& condition,
                                             Clock::time_point deadline) {
  ModeScope scope(*this, NSDefaultRunLoopMode);
  while (!(condition && condition())) {
    const PassResult pass = runPass(NSDefaultRunLoopMode, condition);
    if (pass.outcome != Outcome::Drained) return pass.outcome;
    if (Clock::now() >= deadline) return Outcome::TimedOut;
    if (pass.ran == 0 && !waitForWork(NSDefaultRunLoopMode, deadline)) return Outcome::TimedOut;
  }
  return Outcome::Satisfied;
}

KRRunLoop::PassResult KRRunLoop::runPass(const std::string& mode, const std::function<bool()>& condition) {
  PassResult result;
  const uint64_t passEnd = postedCount();
  bool stopped = false;
  while (std::function<void()> block = nextBlockOfPass(mode, passEnd, stopped)) {
    ++result.ran;
    block();
    if (condition && condition()) {
      result.outcome = Outcome::Satisfied;
      return result;
    }
  }
  if (stopped) result.outcome = Outcome::Stopped;
  return result;
}

std::function<void()> KRRunLoop::nextBlockOfPass(const std::string& mode, uint64_t passEnd, bool& stopped) {
  std::lock_guard lock(mutex_);
  stopped = std::exchange(stopRequested_, false);
  if (stopped) return {};
  return takeDueBlock(mode, passEnd);
}

bool KRRunLoop::waitForWork(const std::string& mode, Clock::time_point deadline) {
  std::unique_lock lock(mutex_);
  const bool woken = wakeCondition_.wait_until(
      lock, deadline, [&] { return stopRequested_ || wakeRequested_ || hasDueBlock(mode); });
  wakeRequested_ = false;
  return woken;
}

uint64_t KRRunLoop::postedCount() const {
  std::lock_guard lock(mutex_);
  return nextSequence_;
}

void KRRunLoop::discardPendingBlocks() {
  std::deque<Entry> dropped;
  std::lock_guard lock(mutex_);
  dropped.swap(entries_);
}

bool KRRunLoop::matches(const Entry& entry, const std::string& mode) const {
  return std::ranges::any_of(entry.modes, [&](const std::string& entryMode) {
    return entryMode == mode || (entryMode == NSRunLoopCommonModes && commonModes_.contains(mode));
  });
}

bool KRRunLoop::hasDueBlock(const std::string& mode) const {
  return std::ranges::any_of(entries_, [&](const Entry& entry) { return matches(entry, mode); });
}

std::function<void()> KRRunLoop::takeDueBlock(const std::string& mode, uint64_t passEnd) {
  for (auto it = entries_.begin(); it != entries_.end() && it->sequence < passEnd; ++it) {
    if (!matches(*it, mode)) continue;
    std::function<void()> block = std::move(it->block);
    entries_.erase(it);
    return block;
  }
  return {};
}
