#include "KRServices/KRCapturingLogSink.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "KRServices/KRLog.hpp"

namespace {

using Lines = std::vector<std::string>;

TEST(KRCapturingLogSinkTest, CapturesEveryLevel) {
  KRCapturingLogSink sink;
  for (int level = KRLogLevelMissingOverride; level <= KRLogLevelWarning; ++level)
    KRLog(level, "level %d", level);
  EXPECT_EQ(sink.messages(), (Lines{"level 1", "level 2", "level 3", "level 4"}));
}

TEST(KRCapturingLogSinkTest, RestoresThePreviousSinkWhenDestroyed) {
  KRCapturingLogSink outer;
  {
    KRCapturingLogSink inner;
    KRLog(KRLogLevelError, "inner");
    EXPECT_EQ(inner.messages(), (Lines{"inner"}));
  }
  KRLog(KRLogLevelError, "outer");
  EXPECT_EQ(outer.messages(), (Lines{"outer"}));
}

TEST(KRCapturingLogSinkTest, ClearForgetsCapturedRecords) {
  KRCapturingLogSink sink;
  KRLog(KRLogLevelError, "before");
  sink.clear();
  KRLog(KRLogLevelError, "after");
  ASSERT_EQ(sink.records().size(), 1u);
  EXPECT_EQ(sink.records()[0].message, "after");
}

TEST(KRCapturingLogSinkTest, CanBeReadWhileThreadsLog) {
  constexpr int kThreads = 4;
  constexpr int kLinesPerThread = 300;
  KRCapturingLogSink sink;
  std::atomic<int> finished = 0;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < kThreads; ++thread) {
    threads.emplace_back([&finished] {
      for (int line = 0; line < kLinesPerThread; ++line) KRLog(KRLogLevelInfo, "line");
      ++finished;
    });
  }
  size_t seen = 0;
  while (finished < kThreads) {
    const size_t count = sink.records().size();
    EXPECT_GE(count, seen);
    seen = count;
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(sink.records().size(), size_t{kThreads * kLinesPerThread});
}

}  // namespace
