#include "KRFoundation/KRUndoManager.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRRunLoop.hpp"

namespace {

// A model value whose setter registers its own inverse, the usual way undo is written.
struct Box {
  int value = 0;
};

class KRUndoManagerTest : public testing::Test {
 protected:
  void SetUp() override { undo_->setGroupsByEvent(false); }

  void set(const std::shared_ptr<Box>& box, int value) {
    const int old = box->value;
    undo_->prepareWithInvocationTarget<Box>(box, [this, old](const std::shared_ptr<Box>& target) {
      log_.push_back(std::to_string(target->value) + "->" + std::to_string(old));
      set(target, old);
    });
    box->value = value;
  }

  // One closed top-level group that sets the box to each value in turn.
  void setInGroup(const std::shared_ptr<Box>& box, std::initializer_list<int> values) {
    undo_->beginUndoGrouping();
    for (int value : values) set(box, value);
    undo_->endUndoGrouping();
  }

  // Ends the turn, sets 3 in a turn of its own, then undoes twice: first back to `between`, then to 0.
  void expectTwoTurnsUndoneOneByOne(int between) {
    std::shared_ptr<KRRunLoop> loop = KRRunLoop::currentRunLoop();
    const auto noGroupOpen = [this] { return undo_->groupingLevel() == 0; };
    EXPECT_TRUE(loop->runUntil(noGroupOpen, KRDate::dateWithTimeIntervalSinceNow(5)));
    set(box_, 3);
    EXPECT_TRUE(loop->runUntil(noGroupOpen, KRDate::dateWithTimeIntervalSinceNow(5)));
    undo_->undo();
    EXPECT_EQ(box_->value, between);
    undo_->undo();
    EXPECT_EQ(box_->value, 0);
  }
  static void expectInconsistency(const std::function<void()>& operation) {
    try {
      operation();
      ADD_FAILURE() << "no exception";
    } catch (const KRException& exception) {
      EXPECT_EQ(exception.name().str(), KRException::NSInternalInconsistencyException);
    }
  }

  std::shared_ptr<KRUndoManager> undo_ = KRUndoManager::undoManager();
  std::shared_ptr<Box> box_ = std::make_shared<Box>();
  std::vector<std::string> log_;
};

TEST_F(KRUndoManagerTest, NewManagerHasNothingToUndoOrRedo) {
  std::shared_ptr<KRUndoManager> fresh = KRUndoManager::undoManager();
  EXPECT_FALSE(fresh->canUndo());
  EXPECT_FALSE(fresh->canRedo());
  EXPECT_EQ(fresh->groupingLevel(), 0);
  EXPECT_TRUE(fresh->groupsByEvent());
  EXPECT_TRUE(fresh->isUndoRegistrationEnabled());
  EXPECT_EQ(fresh->levelsOfUndo(), 0u);
  EXPECT_EQ(fresh->undoActionName().str(), "");
  EXPECT_EQ(fresh->redoActionName().str(), "");
}

TEST_F(KRUndoManagerTest, GroupIsUndoneAsOneStepInReverseRegistrationOrder) {
  setInGroup(box_, {1, 2, 3});
  EXPECT_TRUE(undo_->canUndo());
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
  EXPECT_EQ(log_, (std::vector<std::string>{"3->2", "2->1", "1->0"}));
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, SeparateGroupsAreUndoneOneAtATime) {
  setInGroup(box_, {1});
  setInGroup(box_, {2});
  undo_->undo();
  EXPECT_EQ(box_->value, 1);
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
}

TEST_F(KRUndoManagerTest, NestedGroupBecomesOneEntryOfItsParent) {
  undo_->beginUndoGrouping();
  set(box_, 1);
  undo_->beginUndoGrouping();
  EXPECT_EQ(undo_->groupingLevel(), 2);
  set(box_, 2);
  undo_->endUndoGrouping();
  EXPECT_EQ(undo_->groupingLevel(), 1);
  EXPECT_FALSE(undo_->canRedo());
  set(box_, 3);
  undo_->endUndoGrouping();
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
  EXPECT_EQ(log_, (std::vector<std::string>{"3->2", "2->1", "1->0"}));
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, EmptyGroupIsDropped) {
  setInGroup(box_, {1});
  undo_->beginUndoGrouping();
  undo_->endUndoGrouping();
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
}

TEST_F(KRUndoManagerTest, UndoThenRedoThenUndo) {
  setInGroup(box_, {5});
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
  EXPECT_TRUE(undo_->canRedo());
  EXPECT_FALSE(undo_->canUndo());
  undo_->redo();
  EXPECT_EQ(box_->value, 5);
  EXPECT_TRUE(undo_->canUndo());
  EXPECT_FALSE(undo_->canRedo());
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
  EXPECT_TRUE(undo_->canRedo());
}

TEST_F(KRUndoManagerTest, RedoKeepsTheRemainingRedoGroups) {
  setInGroup(box_, {1});
  setInGroup(box_, {2});
  undo_->undo();
  undo_->undo();
  undo_->redo();
  EXPECT_EQ(box_->value, 1);
  EXPECT_TRUE(undo_->canRedo());
  undo_->redo();
  EXPECT_EQ(box_->value, 2);
}

TEST_F(KRUndoManagerTest, UndoingAndRedoingAreReportedDuringTheReplay) {
  std::vector<std::string> states;
  auto record = [&](const std::shared_ptr<Box>&) {
    states.push_back(undo_->isUndoing() ? "undoing" : undo_->isRedoing() ? "redoing" : "none");
    undo_->prepareWithInvocationTarget<Box>(box_, [&](const std::shared_ptr<Box>&) {
      states.push_back(undo_->isRedoing() ? "redoing" : "other");
    });
  };
  undo_->beginUndoGrouping();
  undo_->prepareWithInvocationTarget<Box>(box_, record);
  undo_->endUndoGrouping();
  undo_->undo();
  undo_->redo();
  EXPECT_EQ(states, (std::vector<std::string>{"undoing", "redoing"}));
  EXPECT_FALSE(undo_->isUndoing());
  EXPECT_FALSE(undo_->isRedoing());
}

TEST_F(KRUndoManagerTest, NewRegistrationClearsTheRedoStack) {
  setInGroup(box_, {1});
  undo_->undo();
  ASSERT_TRUE(undo_->canRedo());
  setInGroup(box_, {7});
  EXPECT_FALSE(undo_->canRedo());
}

TEST_F(KRUndoManagerTest, RegistrationWhileDisabledIsIgnoredAndDisablingIsCounted) {
  undo_->disableUndoRegistration();
  undo_->disableUndoRegistration();
  undo_->enableUndoRegistration();
  EXPECT_FALSE(undo_->isUndoRegistrationEnabled());
  setInGroup(box_, {1});
  EXPECT_FALSE(undo_->canUndo());
  undo_->enableUndoRegistration();
  EXPECT_TRUE(undo_->isUndoRegistrationEnabled());
  setInGroup(box_, {2});
  undo_->undo();
  EXPECT_EQ(box_->value, 1);
}

TEST_F(KRUndoManagerTest, EnablingWithoutDisablingRaises) {
  expectInconsistency([this] { undo_->enableUndoRegistration(); });
}

TEST_F(KRUndoManagerTest, LevelsOfUndoKeepOnlyTheNewestGroups) {
  undo_->setLevelsOfUndo(2);
  setInGroup(box_, {1});
  setInGroup(box_, {2});
  setInGroup(box_, {3});
  undo_->undo();
  undo_->undo();
  EXPECT_EQ(box_->value, 1);
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, LoweringLevelsOfUndoDropsTheOldestGroups) {
  for (int value = 1; value <= 4; ++value) setInGroup(box_, {value});
  undo_->setLevelsOfUndo(1);
  EXPECT_EQ(undo_->levelsOfUndo(), 1u);
  undo_->undo();
  EXPECT_EQ(box_->value, 3);
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, RemoveAllActionsClearsBothStacksAndEnablesRegistration) {
  setInGroup(box_, {1});
  setInGroup(box_, {2});
  undo_->undo();
  undo_->disableUndoRegistration();
  undo_->removeAllActions();
  EXPECT_FALSE(undo_->canUndo());
  EXPECT_FALSE(undo_->canRedo());
  EXPECT_TRUE(undo_->isUndoRegistrationEnabled());
}

TEST_F(KRUndoManagerTest, RemoveAllActionsKeepsOpenGroupsOpen) {
  undo_->beginUndoGrouping();
  set(box_, 1);
  undo_->removeAllActions();
  EXPECT_EQ(undo_->groupingLevel(), 1);
  undo_->endUndoGrouping();
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, RemoveAllActionsWithTargetKeepsTheOtherTargets) {
  auto other = std::make_shared<Box>();
  undo_->beginUndoGrouping();
  set(box_, 1);
  set(other, 10);
  undo_->beginUndoGrouping();
  set(box_, 2);
  undo_->endUndoGrouping();
  undo_->endUndoGrouping();
  setInGroup(box_, {3});
  undo_->removeAllActionsWithTarget(box_);
  EXPECT_TRUE(undo_->canUndo());
  undo_->undo();
  EXPECT_EQ(other->value, 0);
  EXPECT_EQ(box_->value, 3);
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, ActionNamesFollowTheirGroupsThroughUndoAndRedo) {
  undo_->beginUndoGrouping();
  set(box_, 1);
  undo_->setActionName("Rename");
  undo_->endUndoGrouping();
  setInGroup(box_, {2});
  undo_->setActionName("Rotate");
  EXPECT_EQ(undo_->undoActionName().str(), "Rotate");
  undo_->undo();
  EXPECT_EQ(undo_->undoActionName().str(), "Rename");
  EXPECT_EQ(undo_->redoActionName().str(), "Rotate");
  undo_->undo();
  EXPECT_EQ(undo_->undoActionName().str(), "");
  EXPECT_EQ(undo_->redoActionName().str(), "Rename");
  undo_->redo();
  EXPECT_EQ(undo_->undoActionName().str(), "Rename");
}

TEST_F(KRUndoManagerTest, ActionOfAGoneTargetIsSkipped) {
  auto gone = std::make_shared<Box>();
  undo_->beginUndoGrouping();
  set(box_, 1);
  set(gone, 5);
  undo_->endUndoGrouping();
  gone.reset();
  undo_->undo();
  EXPECT_EQ(log_, std::vector<std::string>{"1->0"});
  EXPECT_EQ(box_->value, 0);
}

TEST_F(KRUndoManagerTest, EndingWithNoOpenGroupRaises) {
  expectInconsistency([this] { undo_->endUndoGrouping(); });
}

TEST_F(KRUndoManagerTest, KrEndUndoGroupingEndsAGroupOnlyWhenOneIsOpen) {
  undo_->kr_endUndoGrouping();
  EXPECT_EQ(undo_->groupingLevel(), 0);
  undo_->beginUndoGrouping();
  set(box_, 1);
  undo_->kr_endUndoGrouping();
  EXPECT_EQ(undo_->groupingLevel(), 0);
  EXPECT_TRUE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, RegistrationWithNoOpenGroupRaisesWhenNotGroupingByEvent) {
  expectInconsistency([this] { set(box_, 1); });
  EXPECT_FALSE(undo_->canUndo());
}

TEST_F(KRUndoManagerTest, UndoWithAGroupOpenedByTheCallerRaises) {
  setInGroup(box_, {1});
  undo_->beginUndoGrouping();
  set(box_, 2);
  EXPECT_TRUE(undo_->canUndo());
  expectInconsistency([this] { undo_->undo(); });
  expectInconsistency([this] { undo_->undoNestedGroup(); });
  EXPECT_EQ(box_->value, 2);
}

TEST_F(KRUndoManagerTest, UndoNestedGroupUndoesTheNewestGroup) {
  setInGroup(box_, {1});
  setInGroup(box_, {2});
  undo_->undoNestedGroup();
  EXPECT_EQ(box_->value, 1);
  EXPECT_TRUE(undo_->canRedo());
}

TEST_F(KRUndoManagerTest, GroupsByEventCloseTheGroupAtTheEndOfTheRunLoopTurn) {
  undo_->setGroupsByEvent(true);
  set(box_, 1);
  set(box_, 2);
  EXPECT_EQ(undo_->groupingLevel(), 1);
  EXPECT_TRUE(undo_->canUndo());
  expectTwoTurnsUndoneOneByOne(2);
}

TEST_F(KRUndoManagerTest, AnAutomaticGroupWithANestedGroupStillOpenClosesOnceThatOneIs) {
  undo_->setGroupsByEvent(true);
  set(box_, 1);
  undo_->beginUndoGrouping();
  set(box_, 2);
  // The nested group closes in a block of the turn that runs after the automatic group's closing.
  KRRunLoop::currentRunLoop()->performBlock([this] { undo_->endUndoGrouping(); });
  expectTwoTurnsUndoneOneByOne(2);
}

TEST_F(KRUndoManagerTest, AnAutomaticGroupStaysOpenOverTurnsWhileAGroupInsideItIsOpen) {
  undo_->setGroupsByEvent(true);
  set(box_, 1);
  undo_->beginUndoGrouping();
  std::shared_ptr<KRRunLoop> loop = KRRunLoop::currentRunLoop();
  for (int turn = 0; turn < 3; ++turn) {
    bool ran = false;
    loop->performBlock([&ran] { ran = true; });
    EXPECT_TRUE(loop->runUntil([&ran] { return ran; }, KRDate::dateWithTimeIntervalSinceNow(5)));
  }
  EXPECT_EQ(undo_->groupingLevel(), 2);
  undo_->endUndoGrouping();
  EXPECT_TRUE(loop->runUntil([this] { return undo_->groupingLevel() == 0; },
                             KRDate::dateWithTimeIntervalSinceNow(5)));
}

TEST_F(KRUndoManagerTest, UndoClosesAnOpenAutomaticGroupFirst) {
  undo_->setGroupsByEvent(true);
  set(box_, 1);
  undo_->undo();
  EXPECT_EQ(box_->value, 0);
  EXPECT_EQ(undo_->groupingLevel(), 0);
  EXPECT_TRUE(undo_->canRedo());
}

TEST_F(KRUndoManagerTest, EndOfTurnLeavesALaterGroupOfTheCallerOpen) {
  undo_->setGroupsByEvent(true);
  set(box_, 1);
  undo_->undo();
  undo_->beginUndoGrouping();
  bool turnEnded = false;
  std::shared_ptr<KRRunLoop> loop = KRRunLoop::currentRunLoop();
  loop->performBlock([&turnEnded] { turnEnded = true; });
  EXPECT_TRUE(loop->runUntil([&turnEnded] { return turnEnded; }, KRDate::dateWithTimeIntervalSinceNow(5)));
  EXPECT_EQ(undo_->groupingLevel(), 1);
  undo_->endUndoGrouping();
}

}  // namespace
