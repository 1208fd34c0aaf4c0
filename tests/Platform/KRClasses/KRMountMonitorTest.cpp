#include "KRClasses/KRMountMonitor.hpp"

#include <gtest/gtest.h>

#include <chrono>
#include <future>

TEST(KRMountMonitorTest, StopEndsAWaitAtOnce) {
  const auto monitor = KRMountMonitor::create();
  ASSERT_NE(monitor, nullptr);
  auto wait = std::async(std::launch::async, [&] { return monitor->waitForChange(); });
  monitor->stop();
  ASSERT_EQ(wait.wait_for(std::chrono::seconds(1)), std::future_status::ready);
  EXPECT_FALSE(wait.get());
}

TEST(KRMountMonitorTest, WaitsAfterStopReturnAtOnce) {
  const auto monitor = KRMountMonitor::create();
  ASSERT_NE(monitor, nullptr);
  monitor->stop();
  EXPECT_FALSE(monitor->waitForChange());
  EXPECT_FALSE(monitor->waitForChange());
}
