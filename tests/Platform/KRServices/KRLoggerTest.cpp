#include "KRServices/KRLogger.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <thread>
#include <vector>

#include "KRServices/KRLog.hpp"

namespace {

// Counts the records it receives; stays alive while an installed copy is in use.
KRLogSink countingSink(const std::shared_ptr<std::atomic<int>>& count) {
  return [count](const KRLogRecord&) { ++*count; };
}

TEST(KRLoggerTest, SetSinkReturnsThePreviousSink) {
  auto first = std::make_shared<std::atomic<int>>(0);
  auto second = std::make_shared<std::atomic<int>>(0);
  const KRLogSink original = KRLogger::setSink(countingSink(first));
  KRLog(KRLogLevelError, "to first");
  const KRLogSink previous = KRLogger::setSink(countingSink(second));
  KRLog(KRLogLevelError, "to second");
  previous(KRLogRecord{});
  KRLogger::setSink(original);
  EXPECT_EQ(*first, 2);
  EXPECT_EQ(*second, 1);
}

TEST(KRLoggerTest, EmptySinkDiscardsRecords) {
  const KRLogSink original = KRLogger::setSink(nullptr);
  KRLog(KRLogLevelError, "into nothing");
  const KRLogSink previous = KRLogger::setSink(original);
  EXPECT_FALSE(previous);
}

TEST(KRLoggerTest, DefaultSinkWritesSevereRecordsToStandardError) {
  if (std::getenv("KR_LOG_LEVEL")) GTEST_SKIP() << "KR_LOG_LEVEL changes the default threshold";
  testing::internal::CaptureStderr();
  const int line = __LINE__ + 1;
  KRLog(KRLogLevelError, "shown %d", 1);
  KRLog(KRLogLevelWarning, "hidden");
  const std::string written = testing::internal::GetCapturedStderr();
  EXPECT_EQ(written,
            "[2] tests/Platform/KRServices/KRLoggerTest:" + std::to_string(line) + " TestBody: shown 1\n");
}

TEST(KRLoggerTest, EveryRecordReachesExactlyOneSinkWhileSinksAreReplaced) {
  constexpr int kThreads = 4;
  constexpr int kLinesPerThread = 500;
  auto first = std::make_shared<std::atomic<int>>(0);
  auto second = std::make_shared<std::atomic<int>>(0);
  const KRLogSink original = KRLogger::setSink(countingSink(first));
  std::atomic<bool> done = false;
  std::thread swapper([&] {
    for (bool useFirst = false; !done; useFirst = !useFirst) {
      KRLogger::setSink(countingSink(useFirst ? first : second));
    }
  });
  std::vector<std::thread> loggers;
  for (int thread = 0; thread < kThreads; ++thread) {
    loggers.emplace_back([] {
      for (int line = 0; line < kLinesPerThread; ++line) KRLog(KRLogLevelInfo, "line %d", line);
    });
  }
  for (std::thread& logger : loggers) logger.join();
  done = true;
  swapper.join();
  KRLogger::setSink(original);
  EXPECT_EQ(*first + *second, kThreads * kLinesPerThread);
}

}  // namespace
