#include "KRClasses/KRBlockDispatcher.hpp"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"

namespace {

std::shared_ptr<KRBlockDispatcher> makeDispatcher(const std::string& label = "test.dispatcher") {
  return KRBlockDispatcher::initWithDispatchQueue(KRDispatchQueue::serialQueue(label));
}

}  // namespace

TEST(KRBlockDispatcherTest, NoQueueGivesNil) {
  EXPECT_EQ(KRBlockDispatcher::initWithDispatchQueue(nullptr), nullptr);
}

TEST(KRBlockDispatcherTest, KeepsTheOrderOfTenThousandBlocks) {
  auto dispatcher = makeDispatcher();
  std::vector<int> order;
  for (int i = 0; i < 10000; ++i) dispatcher->performBlock([&order, i] { order.push_back(i); });
  dispatcher->performBlockAndWait([] {});
  ASSERT_EQ(order.size(), 10000u);
  for (int i = 0; i < 10000; ++i) ASSERT_EQ(order[static_cast<size_t>(i)], i);
}

TEST(KRBlockDispatcherTest, WaitingRunsAfterEarlierBlocksOnTheQueueThread) {
  auto dispatcher = makeDispatcher();
  std::thread::id queueThread;
  bool earlierRan = false;
  dispatcher->performBlock([&] { earlierRan = true; });
  dispatcher->performBlockAndWait([&] {
    EXPECT_TRUE(earlierRan);
    queueThread = std::this_thread::get_id();
  });
  EXPECT_NE(queueThread, std::this_thread::get_id());
}

TEST(KRBlockDispatcherTest, WaitingOnItsOwnQueueRunsInline) {
  auto dispatcher = makeDispatcher();
  std::vector<int> order;
  dispatcher->performBlockAndWait([&] {
    order.push_back(1);
    dispatcher->performBlockAndWait([&] { order.push_back(2); });
    order.push_back(3);
  });
  EXPECT_EQ(order, (std::vector<int>{1, 2, 3}));
}

TEST(KRBlockDispatcherTest, ExceptionInAWaitedBlockReachesTheCaller) {
  auto dispatcher = makeDispatcher();
  EXPECT_THROW(dispatcher->performBlockAndWait([] { KRException::raise("DBCore", "failed"); }), KRException);
  bool ranAfter = false;
  dispatcher->performBlockAndWait([&] { ranAfter = true; });
  EXPECT_TRUE(ranAfter);
}

TEST(KRBlockDispatcherTest, ExceptionInAnAsynchronousBlockIsLoggedAndTheQueueGoesOn) {
  KRCapturingLogSink sink;
  auto dispatcher = makeDispatcher("test.failing");
  dispatcher->performBlock([] { throw std::runtime_error("disk full"); });
  bool ranAfter = false;
  dispatcher->performBlockAndWait([&] { ranAfter = true; });
  EXPECT_TRUE(ranAfter);
  const auto records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 2);
  EXPECT_EQ(records[0].message, "Exception in a block of test.failing: disk full");
  EXPECT_EQ(records[0].sourcePath, "Platform/KRClasses/KRBlockDispatcher");
}
