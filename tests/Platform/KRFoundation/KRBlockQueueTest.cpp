#include "KRFoundation/KRBlockQueue.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

void ignore(std::exception_ptr) {}

TEST(KRBlockQueueTest, WorkerRunsTheBlocksInOrderUntilClosed) {
  KRBlockQueue queue;
  std::vector<int> order;
  for (int i = 0; i < 5; ++i) queue.push([&order, i] { order.push_back(i); });
  std::thread worker([&] { queue.runUntilClosed(ignore); });
  queue.push([&order] { order.push_back(5); });
  queue.close();
  worker.join();
  EXPECT_EQ(order, (std::vector<int>{0, 1, 2, 3, 4, 5}));
}

TEST(KRBlockQueueTest, BlocksPushedAfterCloseAreDropped) {
  KRBlockQueue queue;
  bool ran = false;
  queue.close();
  queue.push([&ran] { ran = true; });
  queue.runUntilClosed(ignore);
  EXPECT_FALSE(ran);
}

TEST(KRBlockQueueTest, ExceptionGoesToTheCallbackAndTheWorkerCarriesOn) {
  KRBlockQueue queue;
  std::vector<std::string> reasons;
  bool laterRan = false;
  queue.push([] { throw std::runtime_error("first"); });
  queue.push([&laterRan] { laterRan = true; });
  queue.close();
  queue.runUntilClosed([&reasons](std::exception_ptr error) {
    try {
      std::rethrow_exception(error);
    } catch (const std::exception& exception) {
      reasons.emplace_back(exception.what());
    }
  });
  EXPECT_EQ(reasons, std::vector<std::string>{"first"});
  EXPECT_TRUE(laterRan);
}

TEST(KRBlockQueueTest, SeveralWorkersShareTheBlocksAndRunEachOnce) {
  constexpr int kBlocks = 1000;
  KRBlockQueue queue;
  std::vector<std::atomic<int>> calls(kBlocks);
  std::vector<std::thread> workers;
  for (int w = 0; w < 3; ++w) workers.emplace_back([&] { queue.runUntilClosed(ignore); });
  for (int i = 0; i < kBlocks; ++i) queue.push([&calls, i] { ++calls[i]; });
  queue.close();
  for (std::thread& worker : workers) worker.join();
  int exactlyOnce = 0;
  for (const std::atomic<int>& count : calls) exactlyOnce += count.load() == 1 ? 1 : 0;
  EXPECT_EQ(exactlyOnce, kBlocks);
}

}  // namespace
