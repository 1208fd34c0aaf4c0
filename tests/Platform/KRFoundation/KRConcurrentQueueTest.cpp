#include "KRFoundation/KRConcurrentQueue.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <latch>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "KRFoundation/KRDispatchQueue.hpp"

namespace {

class KRConcurrentQueueTest : public testing::Test {
 protected:
  KRConcurrentQueue& queue_ = KRConcurrentQueue::globalQueue();
};

TEST_F(KRConcurrentQueueTest, GlobalQueueIsOnePoolOfAtLeastTwoThreads) {
  EXPECT_EQ(&KRConcurrentQueue::globalQueue(), &queue_);
  EXPECT_GE(queue_.threadCount(), 2u);
  EXPECT_GE(queue_.threadCount(), std::thread::hardware_concurrency());
}

TEST_F(KRConcurrentQueueTest, AsyncRunsEveryBlockOnPoolThreads) {
  constexpr int kBlocks = 200;
  std::atomic<int> ran{0};
  std::atomic<bool> onCaller{false};
  std::promise<void> allRan;
  const std::thread::id caller = std::this_thread::get_id();
  for (int i = 0; i < kBlocks; ++i) {
    queue_.async([&] {
      if (std::this_thread::get_id() == caller) onCaller = true;
      if (++ran == kBlocks) allRan.set_value();
    });
  }
  allRan.get_future().wait();
  EXPECT_EQ(ran.load(), kBlocks);
  EXPECT_FALSE(onCaller.load());
}

TEST_F(KRConcurrentQueueTest, AsyncBlocksRunInParallel) {
  // Each block waits for the other: this only finishes when two pool threads run them at once.
  std::latch bothRunning(2);
  std::promise<void> first;
  std::promise<void> second;
  queue_.async([&] {
    bothRunning.arrive_and_wait();
    first.set_value();
  });
  queue_.async([&] {
    bothRunning.arrive_and_wait();
    second.set_value();
  });
  first.get_future().wait();
  second.get_future().wait();
}

TEST_F(KRConcurrentQueueTest, AsyncExceptionGoesToTheUncaughtExceptionHandler) {
  std::promise<std::string> reported;
  KRDispatchQueue::setUncaughtExceptionHandler(
      [&reported](const std::string& label, std::exception_ptr) { reported.set_value(label); });
  queue_.async([] { throw std::runtime_error("pool failure"); });
  EXPECT_EQ(reported.get_future().get(), queue_.label());
  KRDispatchQueue::setUncaughtExceptionHandler(nullptr);
}

TEST_F(KRConcurrentQueueTest, ApplyCallsTheBodyForEveryIndexExactlyOnce) {
  constexpr size_t kCount = 100000;
  std::vector<std::atomic<int>> calls(kCount);
  queue_.apply(kCount, [&](size_t index) { ++calls[index]; });
  size_t exactlyOnce = 0;
  for (const std::atomic<int>& count : calls) exactlyOnce += count.load() == 1 ? 1 : 0;
  EXPECT_EQ(exactlyOnce, kCount);
}

TEST_F(KRConcurrentQueueTest, ApplyWithNoIndicesDoesNotCallTheBody) {
  bool called = false;
  queue_.apply(0, [&](size_t) { called = true; });
  EXPECT_FALSE(called);
}

TEST_F(KRConcurrentQueueTest, ApplyWithOneIndexRunsOnTheCallingThread) {
  std::thread::id ranOn;
  queue_.apply(1, [&](size_t) { ranOn = std::this_thread::get_id(); });
  EXPECT_EQ(ranOn, std::this_thread::get_id());
}

TEST_F(KRConcurrentQueueTest, ApplyRunsIndicesInParallel) {
  // Both indices wait for each other: this only finishes when two threads run them at once.
  std::latch bothRunning(2);
  queue_.apply(2, [&](size_t) { bothRunning.arrive_and_wait(); });
  EXPECT_TRUE(bothRunning.try_wait());
}

TEST_F(KRConcurrentQueueTest, ApplyRethrowsTheFirstExceptionAfterEveryIndexRan) {
  constexpr size_t kCount = 1000;
  std::atomic<size_t> ran{0};
  std::atomic<size_t> thrown{0};
  try {
    queue_.apply(kCount, [&](size_t index) {
      ++ran;
      if (index % 10 == 0) {
        ++thrown;
        throw std::runtime_error("index " + std::to_string(index));
      }
    });
    FAIL() << "apply did not rethrow";
  } catch (const std::runtime_error& error) {
    EXPECT_EQ(std::string(error.what()).rfind("index ", 0), 0u);
  }
  EXPECT_EQ(ran.load(), kCount);
  EXPECT_EQ(thrown.load(), kCount / 10);
}

TEST_F(KRConcurrentQueueTest, NestedApplyDoesNotDeadlock) {
  constexpr size_t kOuter = 16;
  constexpr size_t kInner = 100;
  std::atomic<size_t> ran{0};
  queue_.apply(kOuter, [&](size_t) { queue_.apply(kInner, [&](size_t) { ++ran; }); });
  EXPECT_EQ(ran.load(), kOuter * kInner);
}

TEST_F(KRConcurrentQueueTest, ApplyFromEveryPoolThreadAtOnceDoesNotDeadlock) {
  // Every pool thread sits in an apply of its own, so no helper can start: each caller works alone.
  const size_t callers = queue_.threadCount();
  std::latch allInside(static_cast<std::ptrdiff_t>(callers));
  std::atomic<size_t> ran{0};
  std::atomic<size_t> finished{0};
  std::promise<void> allFinished;
  for (size_t i = 0; i < callers; ++i) {
    queue_.async([&, callers] {
      allInside.arrive_and_wait();
      queue_.apply(50, [&](size_t) { ++ran; });
      if (++finished == callers) allFinished.set_value();
    });
  }
  allFinished.get_future().wait();
  EXPECT_EQ(ran.load(), callers * 50);
}

}  // namespace
