#include "KRFoundation/KRRunLoop.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <future>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

using Clock = std::chrono::steady_clock;

KRDate secondsFromNow(double seconds) { return KRDate::dateWithTimeIntervalSinceNow(seconds); }

double secondsSince(Clock::time_point start) {
  return std::chrono::duration<double>(Clock::now() - start).count();
}

class KRRunLoopTest : public testing::Test {
 protected:
  // Runs the main loop until the flag is set, with a generous limit that only a failure reaches.
  bool runUntilSet(const bool& flag) {
    return loop_->runUntil([&] { return flag; }, secondsFromNow(5));
  }

  std::shared_ptr<KRRunLoop> loop_ = KRRunLoop::mainRunLoop();
  std::vector<std::string> log_;
};

TEST_F(KRRunLoopTest, TestsRunOnTheMainThreadWhoseCurrentLoopIsTheMainLoop) {
  EXPECT_TRUE(KRRunLoop::isMainThread());
  EXPECT_EQ(KRRunLoop::currentRunLoop(), loop_);
}

TEST_F(KRRunLoopTest, OtherThreadsHaveTheirOwnLoopAndSeeTheSameMainLoop) {
  bool otherIsMain = true;
  std::shared_ptr<KRRunLoop> otherCurrent;
  std::shared_ptr<KRRunLoop> otherMain;
  std::thread([&] {
    otherIsMain = KRRunLoop::isMainThread();
    otherCurrent = KRRunLoop::currentRunLoop();
    otherMain = KRRunLoop::mainRunLoop();
  }).join();
  EXPECT_FALSE(otherIsMain);
  EXPECT_NE(otherCurrent, loop_);
  EXPECT_EQ(otherMain, loop_);
}

TEST_F(KRRunLoopTest, DesignatingAnotherMainThreadRaises) {
  std::string raised;
  std::thread([&] {
    try {
      KRRunLoop::designateMainThread();
    } catch (const KRException& exception) {
      raised = exception.name().str();
    }
  }).join();
  EXPECT_EQ(raised, KRException::NSInternalInconsistencyException);
  EXPECT_TRUE(KRRunLoop::isMainThread());
}

TEST_F(KRRunLoopTest, BlocksRunInPostingOrder) {
  for (int i = 0; i < 5; ++i) loop_->performBlock([this, i] { log_.push_back(std::to_string(i)); });
  EXPECT_TRUE(loop_->runUntil([this] { return log_.size() == 5; }, secondsFromNow(5)));
  EXPECT_EQ(log_, (std::vector<std::string>{"0", "1", "2", "3", "4"}));
}

TEST_F(KRRunLoopTest, BlockPostedDuringAPassRunsInTheNextPass) {
  loop_->performBlock([this] {
    log_.push_back("first");
    loop_->performBlock([this] { log_.push_back("posted while running"); });
  });
  EXPECT_TRUE(loop_->runModeBeforeDate(KRRunLoop::NSDefaultRunLoopMode, secondsFromNow(5)));
  EXPECT_EQ(log_, std::vector<std::string>{"first"});
  EXPECT_TRUE(loop_->runModeBeforeDate(KRRunLoop::NSDefaultRunLoopMode, secondsFromNow(5)));
  EXPECT_EQ(log_, (std::vector<std::string>{"first", "posted while running"}));
}

TEST_F(KRRunLoopTest, NestedRunInsideABlockRunsTheBlocksPostedBeforeIt) {
  bool secondRan = false;
  bool outerDone = false;
  loop_->performBlock([&] {
    log_.push_back("outer start");
    EXPECT_TRUE(loop_->runUntil([&] { return secondRan; }, secondsFromNow(5)));
    log_.push_back("outer end");
    outerDone = true;
  });
  loop_->performBlock([&] {
    log_.push_back("second");
    secondRan = true;
  });
  EXPECT_TRUE(runUntilSet(outerDone));
  EXPECT_EQ(log_, (std::vector<std::string>{"outer start", "second", "outer end"}));
}

TEST_F(KRRunLoopTest, BlockForACustomModeDoesNotRunInTheDefaultMode) {
  const std::string custom = "KRRunLoopTest.custom";
  bool customRan = false;
  bool markerRan = false;
  loop_->performBlock({custom}, [&] { customRan = true; });
  loop_->performBlock({KRRunLoop::NSDefaultRunLoopMode}, [&] { markerRan = true; });
  EXPECT_TRUE(runUntilSet(markerRan));
  EXPECT_FALSE(customRan);
  EXPECT_TRUE(loop_->runModeBeforeDate(custom, secondsFromNow(5)));
  EXPECT_TRUE(customRan);
}

TEST_F(KRRunLoopTest, CommonModesCoverTheDefaultModeAndAddedCommonModes) {
  const std::string added = "KRRunLoopTest.common";
  loop_->addCommonMode(added);
  bool inAdded = false;
  bool inDefault = false;
  loop_->performBlock([&] { inAdded = loop_->currentMode() == added; });
  EXPECT_TRUE(loop_->runModeBeforeDate(added, secondsFromNow(5)));
  EXPECT_TRUE(inAdded);
  loop_->performBlock({KRRunLoop::NSRunLoopCommonModes}, [&] { inDefault = true; });
  EXPECT_TRUE(runUntilSet(inDefault));
}

TEST_F(KRRunLoopTest, CommonModesDoNotCoverModesThatWereNotAdded) {
  const std::string other = "KRRunLoopTest.notCommon";
  bool ran = false;
  loop_->performBlock([&] { ran = true; });
  EXPECT_FALSE(loop_->runModeBeforeDate(other, secondsFromNow(0.02)));
  EXPECT_FALSE(ran);
  EXPECT_TRUE(runUntilSet(ran));
}

TEST_F(KRRunLoopTest, CurrentModeFollowsNestedRuns) {
  const std::string custom = "KRRunLoopTest.mode";
  std::vector<std::string> modes;
  loop_->performBlock({custom}, [&] {
    modes.push_back(loop_->currentMode());
    loop_->performBlock([&] { modes.push_back(loop_->currentMode()); });
    loop_->runModeBeforeDate(KRRunLoop::NSDefaultRunLoopMode, secondsFromNow(5));
    modes.push_back(loop_->currentMode());
  });
  EXPECT_TRUE(loop_->runModeBeforeDate(custom, secondsFromNow(5)));
  EXPECT_EQ(modes, (std::vector<std::string>{custom, KRRunLoop::NSDefaultRunLoopMode, custom}));
  EXPECT_EQ(loop_->currentMode(), "");
}

TEST_F(KRRunLoopTest, BlocksPostedFromOtherThreadsRunOnTheWaitingMainThread) {
  constexpr int kThreads = 4;
  constexpr int kBlocksPerThread = 100;
  std::vector<std::vector<int>> received(kThreads);
  int total = 0;
  bool allOnMain = true;
  std::vector<std::thread> posters;
  for (int t = 0; t < kThreads; ++t) {
    posters.emplace_back([&, t] {
      for (int i = 0; i < kBlocksPerThread; ++i) {
        loop_->performBlock([&, t, i] {
          received[t].push_back(i);
          allOnMain = allOnMain && KRRunLoop::isMainThread();
          ++total;
        });
      }
    });
  }
  EXPECT_TRUE(loop_->runUntil([&] { return total == kThreads * kBlocksPerThread; }, secondsFromNow(5)));
  for (std::thread& poster : posters) poster.join();
  EXPECT_TRUE(allOnMain);
  for (const std::vector<int>& fromOneThread : received) {
    ASSERT_EQ(fromOneThread.size(), static_cast<size_t>(kBlocksPerThread));
    EXPECT_TRUE(std::is_sorted(fromOneThread.begin(), fromOneThread.end()));
  }
}

TEST_F(KRRunLoopTest, WaitInsideABlockEndsAsSoonAsAnotherThreadDelivers) {
  bool delivered = false;
  bool waitResult = false;
  double waited = 0;
  bool outerDone = false;
  std::thread worker;
  loop_->performBlock([&] {
    worker = std::thread([&] {
      std::this_thread::sleep_for(std::chrono::milliseconds(20));
      loop_->performBlock([&] { delivered = true; });
    });
    const Clock::time_point start = Clock::now();
    waitResult = loop_->runUntil([&] { return delivered; }, secondsFromNow(10));
    waited = secondsSince(start);
    outerDone = true;
  });
  EXPECT_TRUE(runUntilSet(outerDone));
  worker.join();
  EXPECT_TRUE(waitResult);
  EXPECT_LT(waited, 1.0);
}

TEST_F(KRRunLoopTest, WakeUpMakesAWaitCheckAConditionSetByAnotherThread) {
  std::atomic<bool> done{false};
  std::thread worker([&] {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    done = true;
    loop_->wakeUp();
  });
  const Clock::time_point start = Clock::now();
  EXPECT_TRUE(loop_->runUntil([&] { return done.load(); }, secondsFromNow(10)));
  EXPECT_LT(secondsSince(start), 1.0);
  worker.join();
}

TEST_F(KRRunLoopTest, RunUntilEndsRightAfterTheBlockThatSatisfiesTheCondition) {
  bool satisfied = false;
  bool laterRan = false;
  loop_->performBlock([&] { satisfied = true; });
  loop_->performBlock([&] { laterRan = true; });
  EXPECT_TRUE(runUntilSet(satisfied));
  EXPECT_FALSE(laterRan);
  EXPECT_TRUE(runUntilSet(laterRan));
}

TEST_F(KRRunLoopTest, RunModeBeforeDateReturnsFalseWhenTheLimitPassesWithNothingRun) {
  const Clock::time_point start = Clock::now();
  EXPECT_FALSE(loop_->runModeBeforeDate("KRRunLoopTest.idle", secondsFromNow(0.05)));
  const double waited = secondsSince(start);
  EXPECT_GE(waited, 0.04);
  EXPECT_LT(waited, 1.0);
}

TEST_F(KRRunLoopTest, RunModeBeforeDateReturnsTrueWhenABlockArrivesWhileWaiting) {
  bool ran = false;
  std::thread poster([&] {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    loop_->performBlock({"KRRunLoopTest.arrival"}, [&] { ran = true; });
  });
  EXPECT_TRUE(loop_->runModeBeforeDate("KRRunLoopTest.arrival", secondsFromNow(10)));
  poster.join();
  EXPECT_TRUE(ran);
}

TEST_F(KRRunLoopTest, RunUntilReturnsFalseWhenTheLimitPasses) {
  int checks = 0;
  EXPECT_FALSE(loop_->runUntil(
      [&] {
        ++checks;
        return false;
      },
      secondsFromNow(0.05)));
  EXPECT_GE(checks, 1);
}

TEST_F(KRRunLoopTest, RunUntilDateRunsBlocksUntilTheDate) {
  bool ran = false;
  loop_->performBlock([&] { ran = true; });
  const Clock::time_point start = Clock::now();
  loop_->runUntilDate(secondsFromNow(0.05));
  EXPECT_TRUE(ran);
  EXPECT_GE(secondsSince(start), 0.04);
}

TEST_F(KRRunLoopTest, StopInsideABlockEndsRunBeforeTheNextBlock) {
  bool laterRan = false;
  loop_->performBlock([this] { loop_->stop(); });
  loop_->performBlock([&] { laterRan = true; });
  loop_->run();
  EXPECT_FALSE(laterRan);
  EXPECT_TRUE(runUntilSet(laterRan));
}

TEST_F(KRRunLoopTest, StopFromAnotherThreadEndsAWaitingRun) {
  std::thread stopper([this] {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    loop_->stop();
  });
  const Clock::time_point start = Clock::now();
  loop_->run();
  EXPECT_LT(secondsSince(start), 1.0);
  stopper.join();
}

TEST_F(KRRunLoopTest, ExceptionFromABlockLeavesTheRunAndTheLoopStaysUsable) {
  bool laterRan = false;
  loop_->performBlock([] { throw std::runtime_error("block failed"); });
  loop_->performBlock([&] { laterRan = true; });
  EXPECT_THROW(runUntilSet(laterRan), std::runtime_error);
  EXPECT_FALSE(laterRan);
  EXPECT_EQ(loop_->currentMode(), "");
  EXPECT_TRUE(runUntilSet(laterRan));
}

TEST_F(KRRunLoopTest, LoopOfAnotherThreadRunsBlocksOnThatThread) {
  std::promise<std::shared_ptr<KRRunLoop>> otherLoop;
  std::thread::id ranOn;
  bool done = false;
  std::thread other([&] {
    std::shared_ptr<KRRunLoop> own = KRRunLoop::currentRunLoop();
    otherLoop.set_value(own);
    own->runUntil([&] { return done; }, secondsFromNow(5));
  });
  otherLoop.get_future().get()->performBlock([&] {
    ranOn = std::this_thread::get_id();
    done = true;
  });
  const std::thread::id otherId = other.get_id();
  other.join();
  EXPECT_EQ(ranOn, otherId);
}

}  // namespace
