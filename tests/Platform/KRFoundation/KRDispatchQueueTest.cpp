#include "KRFoundation/KRDispatchQueue.hpp"

#include <gtest/gtest.h>

#include <future>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

// What the uncaught-exception handler received, guarded because workers report.
struct Report {
  std::mutex mutex;
  std::vector<std::string> labels;
  std::vector<std::exception_ptr> errors;
};

class KRDispatchQueueTest : public testing::Test {
 protected:
  void TearDown() override { KRDispatchQueue::setUncaughtExceptionHandler(nullptr); }

  // Sends uncaught exceptions to report_ instead of stderr.
  void captureUncaughtExceptions() {
    KRDispatchQueue::setUncaughtExceptionHandler([this](const std::string& label, std::exception_ptr error) {
      std::lock_guard lock(report_.mutex);
      report_.labels.push_back(label);
      report_.errors.push_back(std::move(error));
    });
  }

  std::shared_ptr<KRDispatchQueue> queue_ = KRDispatchQueue::serialQueue("test.serial");
  Report report_;
};

TEST_F(KRDispatchQueueTest, KeepsItsLabel) { EXPECT_EQ(queue_->label(), "test.serial"); }

TEST_F(KRDispatchQueueTest, AsyncBlocksRunInSubmissionOrder) {
  constexpr int kBlocks = 10000;
  std::vector<int> order;
  for (int i = 0; i < kBlocks; ++i) queue_->async([&order, i] { order.push_back(i); });
  std::vector<int> seen;
  queue_->sync([&] { seen = order; });
  ASSERT_EQ(seen.size(), static_cast<size_t>(kBlocks));
  for (int i = 0; i < kBlocks; ++i) ASSERT_EQ(seen[i], i);
}

TEST_F(KRDispatchQueueTest, BlocksRunOnTheWorkerAndNotOnTheCaller) {
  std::thread::id ranOn;
  bool currentInside = false;
  queue_->sync([&] {
    ranOn = std::this_thread::get_id();
    currentInside = queue_->isCurrent();
  });
  EXPECT_NE(ranOn, std::this_thread::get_id());
  EXPECT_TRUE(currentInside);
  EXPECT_FALSE(queue_->isCurrent());
}

TEST_F(KRDispatchQueueTest, IsCurrentIsFalseOnAnotherQueuesWorker) {
  std::shared_ptr<KRDispatchQueue> other = KRDispatchQueue::serialQueue("test.other");
  bool firstIsCurrent = true;
  other->sync([&] { firstIsCurrent = queue_->isCurrent(); });
  EXPECT_FALSE(firstIsCurrent);
}

TEST_F(KRDispatchQueueTest, SyncOnItsOwnQueueRunsInline) {
  std::vector<std::string> steps;
  queue_->sync([&] {
    steps.push_back("outer");
    queue_->sync([&] { steps.push_back("inner"); });
    steps.push_back("after inner");
  });
  EXPECT_EQ(steps, (std::vector<std::string>{"outer", "inner", "after inner"}));
}

TEST_F(KRDispatchQueueTest, SyncRethrowsTheBlocksException) {
  try {
    queue_->sync([] { KRException::raise(KRException::NSInvalidArgumentException, "bad value"); });
    FAIL() << "sync did not rethrow";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name().str(), KRException::NSInvalidArgumentException);
    EXPECT_EQ(exception.reason().str(), "bad value");
  }
  bool stillWorks = false;
  queue_->sync([&] { stillWorks = true; });
  EXPECT_TRUE(stillWorks);
}

TEST_F(KRDispatchQueueTest, AsyncExceptionGoesToTheHandlerAndTheQueueKeepsWorking) {
  captureUncaughtExceptions();
  queue_->async([] { throw std::runtime_error("async failure"); });
  bool laterRan = false;
  queue_->sync([&] { laterRan = true; });
  EXPECT_TRUE(laterRan);
  std::lock_guard lock(report_.mutex);
  ASSERT_EQ(report_.labels, std::vector<std::string>{"test.serial"});
  try {
    std::rethrow_exception(report_.errors.front());
  } catch (const std::runtime_error& error) {
    EXPECT_STREQ(error.what(), "async failure");
  }
}

TEST_F(KRDispatchQueueTest, ExceptionOfAnyTypeIsReported) {
  captureUncaughtExceptions();
  queue_->async([] { throw 42; });
  queue_->sync([] {});
  std::lock_guard lock(report_.mutex);
  ASSERT_EQ(report_.errors.size(), 1u);
  try {
    std::rethrow_exception(report_.errors.front());
  } catch (int value) {
    EXPECT_EQ(value, 42);
  }
}

TEST_F(KRDispatchQueueTest, DefaultHandlerWritesTheLabelAndReasonToStandardError) {
  testing::internal::CaptureStderr();
  queue_->async([] { throw std::runtime_error("written out"); });
  queue_->sync([] {});
  const std::string written = testing::internal::GetCapturedStderr();
  EXPECT_NE(written.find("test.serial"), std::string::npos) << written;
  EXPECT_NE(written.find("written out"), std::string::npos) << written;
}

TEST_F(KRDispatchQueueTest, HandlerThatThrowsFallsBackToStandardError) {
  KRDispatchQueue::setUncaughtExceptionHandler(
      [](const std::string&, std::exception_ptr) { throw std::logic_error("handler failed"); });
  testing::internal::CaptureStderr();
  queue_->async([] { throw std::runtime_error("original failure"); });
  queue_->sync([] {});
  const std::string written = testing::internal::GetCapturedStderr();
  EXPECT_NE(written.find("original failure"), std::string::npos) << written;
}

TEST_F(KRDispatchQueueTest, DestructionRunsTheQueuedBlocksFirst) {
  int ran = 0;
  std::promise<void> release;
  std::shared_future<void> released = release.get_future().share();
  queue_->async([released] { released.wait(); });
  for (int i = 0; i < 100; ++i) queue_->async([&ran] { ++ran; });
  std::thread releaser([&release] { release.set_value(); });
  queue_.reset();
  releaser.join();
  EXPECT_EQ(ran, 100);
}

TEST_F(KRDispatchQueueTest, LastReferenceDroppedOnTheWorkerDoesNotDeadlock) {
  std::promise<void> mainDropped;
  std::shared_future<void> dropped = mainDropped.get_future().share();
  std::promise<int> finished;
  std::future<int> result = finished.get_future();
  auto ran = std::make_shared<int>(0);
  auto lastReference = std::make_shared<std::shared_ptr<KRDispatchQueue>>(queue_);
  queue_->async([lastReference, dropped, ran, &finished] {
    dropped.wait();
    std::shared_ptr<KRDispatchQueue>& self = *lastReference;
    for (int i = 0; i < 10; ++i) self->async([ran] { ++*ran; });
    self->async([ran, &finished] { finished.set_value(*ran); });
    self.reset();
  });
  queue_.reset();
  mainDropped.set_value();
  EXPECT_EQ(result.get(), 10);
}

TEST_F(KRDispatchQueueTest, SeparateQueuesRunAtTheSameTime) {
  std::shared_ptr<KRDispatchQueue> other = KRDispatchQueue::serialQueue("test.other");
  std::promise<void> fromOther;
  std::future<void> otherArrived = fromOther.get_future();
  bool waitedForOther = false;
  queue_->async([&] {
    otherArrived.wait();
    waitedForOther = true;
  });
  other->async([&] { fromOther.set_value(); });
  queue_->sync([] {});
  EXPECT_TRUE(waitedForOther);
}

}  // namespace
