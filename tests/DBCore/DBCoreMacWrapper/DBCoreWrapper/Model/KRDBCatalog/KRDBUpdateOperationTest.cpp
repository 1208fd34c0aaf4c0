#include "Model/KRDBCatalog/KRDBUpdateOperation.hpp"

#include <gtest/gtest.h>

#include <thread>

namespace {

TEST(KRDBUpdateOperationTest, StartingRunsTheBlockWithTheOperation) {
  const KRDBUpdateOperation* seen = nullptr;
  int runs = 0;
  const auto operation = KRDBUpdateOperation::operationWithBlock([&](const KRDBUpdateOperation& started) {
    seen = &started;
    ++runs;
  });
  EXPECT_FALSE(operation->isCancelled());
  operation->start();
  EXPECT_EQ(runs, 1);
  EXPECT_EQ(seen, operation.get());
}

TEST(KRDBUpdateOperationTest, ACancelledOperationNeverRunsItsBlock) {
  int runs = 0;
  const auto operation = KRDBUpdateOperation::operationWithBlock([&](const KRDBUpdateOperation&) { ++runs; });
  operation->cancel();
  EXPECT_TRUE(operation->isCancelled());
  operation->start();
  EXPECT_EQ(runs, 0);
}

TEST(KRDBUpdateOperationTest, ItIsNamedAfterTheCatalogOperation) {
  const auto operation = KRDBUpdateOperation::operationWithBlock(nullptr);
  EXPECT_EQ(operation->name(), "updateEntity:");
  operation->start();
  EXPECT_FALSE(operation->isCancelled());
}

TEST(KRDBUpdateOperationTest, ACancellationOnAnotherThreadIsSeenByTheStartingThread) {
  int runs = 0;
  const auto operation = KRDBUpdateOperation::operationWithBlock([&](const KRDBUpdateOperation&) { ++runs; });
  std::thread canceller([operation] { operation->cancel(); });
  while (!operation->isCancelled()) std::this_thread::yield();
  operation->start();
  canceller.join();
  EXPECT_EQ(runs, 0);
}

}  // namespace
