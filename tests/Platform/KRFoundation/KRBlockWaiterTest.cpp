#include "KRFoundation/KRBlockWaiter.hpp"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>

#include "KRFoundation/KRException.hpp"

namespace {

// Posts every wrapper to a thread of its own, joined when the poster goes.
class ThreadPoster {
 public:
  ~ThreadPoster() {
    if (thread_.joinable()) thread_.join();
  }

  KRBlockWaiter::Post post() {
    return [this](std::function<void()> wrapper) { thread_ = std::thread(std::move(wrapper)); };
  }

 private:
  std::thread thread_;
};

}  // namespace

TEST(KRBlockWaiterTest, RunsTheBlockOnThePostingThreadAndWaitsForIt) {
  ThreadPoster poster;
  std::thread::id ranOn;
  int result = 0;
  KRBlockWaiter::postAndWait(poster.post(), [&] {
    ranOn = std::this_thread::get_id();
    result = 42;
  });
  EXPECT_NE(ranOn, std::this_thread::get_id());
  EXPECT_EQ(result, 42);
}

TEST(KRBlockWaiterTest, ReturnsWhenThePostRunsTheWrapperAtOnce) {
  int runs = 0;
  KRBlockWaiter::postAndWait([](std::function<void()> wrapper) { wrapper(); }, [&runs] { ++runs; });
  EXPECT_EQ(runs, 1);
}

TEST(KRBlockWaiterTest, RethrowsTheExceptionOfTheBlock) {
  ThreadPoster poster;
  try {
    KRBlockWaiter::postAndWait(poster.post(), [] { throw std::runtime_error("failed on the worker"); });
    ADD_FAILURE() << "no exception";
  } catch (const std::runtime_error& error) {
    EXPECT_STREQ(error.what(), "failed on the worker");
  }
}

TEST(KRBlockWaiterTest, RethrowsPlatformExceptionsWithTheirName) {
  ThreadPoster poster;
  try {
    KRBlockWaiter::postAndWait(
        poster.post(), [] { KRException::raise(KRException::NSInvalidArgumentException, "bad argument"); });
    ADD_FAILURE() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
    EXPECT_EQ(exception.reason().str(), "bad argument");
  }
}

TEST(KRBlockWaiterTest, RethrowsExceptionsThatAreNotStandardOnes) {
  EXPECT_THROW(KRBlockWaiter::postAndWait([](std::function<void()> wrapper) { wrapper(); }, [] { throw 7; }),
               int);
}
