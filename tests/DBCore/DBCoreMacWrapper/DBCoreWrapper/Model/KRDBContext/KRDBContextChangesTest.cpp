#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <vector>

#include "KRContextCatalog.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBContext/KRDBContextObserver.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "dbuserimgattrib.hpp"

namespace {

using ChangesPtr = std::shared_ptr<KRDBEntitiesChangesStorage>;

// Keeps every change set the context publishes; `onUpdate` runs inside the notification.
class KRContextRecorder : public KRObject, public KRDBContextObserver {
 public:
  void contextDidUpdate(const std::shared_ptr<KRDBContext>& /*context*/, const ChangesPtr& changes) override {
    received.push_back(changes);
    if (onUpdate) onUpdate();
  }
  std::vector<ChangesPtr> received;
  std::function<void()> onUpdate;
};

class KRDBContextChangesTest : public testing::Test {
 protected:
  void SetUp() override {
    const auto folders = std::vector{store.folder("/photos/a")};
    const auto created = store.images(2, folders);
    context = KRDBContext::initWithCatalog(store.catalog());
    ASSERT_TRUE(context);
    context->addListener(recorder);
    for (const auto& image : created) {
      const auto live = std::static_pointer_cast<KRDBImage>(context->entityWithID(image->entityID()));
      ASSERT_TRUE(live && live->attributesPrimitive());
      attributes.push_back(live->attributesPrimitive());
    }
  }

  // Turns the main run loop until the scheduled pass, if any, has run.
  void finishTurn() {
    ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
  }
  // The change keys recorded for the entity in a change set.
  static KRDictionary changeRecordOf(const ChangesPtr& changes, const std::shared_ptr<KRDBEntity>& entity) {
    const auto record = std::dynamic_pointer_cast<KRDBValueBox<KRDictionary>>(
        changes->entitiesChanges()->objectForKey(entity->entityID()));
    return record ? *record->held() : KRDictionary();
  }
  int32_t storedRating(const std::shared_ptr<KRDBImageAttributes>& live) {
    store.waitForQueue();
    const auto fresh = store.catalog()->fetchEntityWithID(live->entityID());
    return std::static_pointer_cast<KRDBImageAttributes>(fresh)->rating();
  }

  KRContextCatalog store;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<KRContextRecorder> recorder = std::make_shared<KRContextRecorder>();
  std::vector<std::shared_ptr<KRDBImageAttributes>> attributes;
};

}  // namespace

// ---- The pass

TEST_F(KRDBContextChangesTest, TwoChangesOfOneEntityInOneTurnMakeOneUpdateWithMergedKeys) {
  attributes[0]->didChange({{"first", 1}, {"second", 1}});
  attributes[0]->didChange({{"first", 2}});
  EXPECT_TRUE(context->isWaitingForProcessChanges());
  finishTurn();
  ASSERT_EQ(recorder->received.size(), 1u);
  const ChangesPtr& changes = recorder->received[0];
  EXPECT_EQ(*changes->updatedEntities(), (KRDBEntitySet{attributes[0]}));
  EXPECT_FALSE(changes->addedEntities());
  EXPECT_FALSE(changes->deletedEntities());
  const KRDictionary record = changeRecordOf(changes, attributes[0]);
  EXPECT_EQ(record.count(), 2u);
  EXPECT_EQ(record.objectForKey(KRValue("first")), KRValue(2));
  EXPECT_EQ(record.objectForKey(KRValue("second")), KRValue(1));
  EXPECT_TRUE(context->updatedEntities().empty());
  EXPECT_EQ(context->entitiesChanges()->count(), 0u);
}

TEST_F(KRDBContextChangesTest, APassWritesTheUpdatedRecordsToTheCatalog) {
  attributes[1]->setRating(4);
  finishTurn();
  EXPECT_EQ(storedRating(attributes[1]), 4);
  EXPECT_FALSE(attributes[1]->isDbEntityChanged());
}

TEST_F(KRDBContextChangesTest, AChangeOfADeletedEntityIsIgnoredAndSchedulesNothing) {
  context->prepareDeleteEntity(attributes[0]);
  context->entityDidChange(attributes[0], KRDictionary{{"first", 1}});
  EXPECT_FALSE(context->isWaitingForProcessChanges());
  EXPECT_TRUE(context->updatedEntities().empty());
  EXPECT_FALSE(context->entitiesChanges()->containsKey(attributes[0]->entityID()));
}

TEST_F(KRDBContextChangesTest, AnEntityCreatedAndDeletedInOneTurnIsReportedDeletedOnly) {
  context->addedEntities().insert(attributes[0]);
  attributes[0]->setRating(2);
  context->prepareDeleteEntity(attributes[0]);
  finishTurn();
  ASSERT_EQ(recorder->received.size(), 1u);
  EXPECT_FALSE(recorder->received[0]->addedEntities());
  EXPECT_FALSE(recorder->received[0]->updatedEntities());
  EXPECT_EQ(*recorder->received[0]->deletedEntities(), (KRDBEntitySet{attributes[0]}));
}

TEST_F(KRDBContextChangesTest, DeletingTakesTheEntityOutOfTheCacheAndTheContextsReach) {
  attributes[0]->setRating(5);
  context->prepareDeletedEntities({attributes[0], attributes[1]});
  for (const auto& deleted : attributes) {
    EXPECT_FALSE(context->cachedEntityForEntityID(deleted->entityID()));
    EXPECT_FALSE(deleted->context());
    EXPECT_FALSE(deleted->hasListener(context));
    EXPECT_TRUE(context->deletedEntities().contains(deleted));
  }
  EXPECT_TRUE(context->updatedEntities().empty());
  EXPECT_EQ(context->entitiesChanges()->count(), 0u);
}

TEST_F(KRDBContextChangesTest, MarkingToRemoveSetsTheFlagOfEach) {
  context->markToRemoveEntities({attributes[0], attributes[1]});
  EXPECT_TRUE(attributes[0]->isMarkedToDelete());
  EXPECT_TRUE(attributes[1]->isMarkedToDelete());
  EXPECT_TRUE(context->deletedEntities().empty());
}

TEST_F(KRDBContextChangesTest, AWaitingCallbackThatWaitsAgainIsCalledInTheSameDrain) {
  attributes[0]->setRating(1);
  std::vector<bool> flags;
  context->waitForProcessChangesWithHandler([&] {
    flags.push_back(context->isWaitingForProcessChanges());
    context->waitForProcessChangesWithHandler(
        [&] { flags.push_back(context->isWaitingForProcessChanges()); });
  });
  EXPECT_TRUE(flags.empty());
  finishTurn();
  EXPECT_EQ(flags, (std::vector<bool>{true, true}));
}

TEST_F(KRDBContextChangesTest, AnObserverThatChangesEntitiesCausesASecondPassAtOnce) {
  recorder->onUpdate = [&] {
    if (recorder->received.size() == 1) attributes[1]->setRating(3);
  };
  attributes[0]->setRating(2);
  finishTurn();
  ASSERT_EQ(recorder->received.size(), 2u);
  EXPECT_EQ(*recorder->received[1]->updatedEntities(), (KRDBEntitySet{attributes[1]}));
  EXPECT_FALSE(context->isWaitingForProcessChanges());
}

TEST_F(KRDBContextChangesTest, AValidationRecordLivesUntilTheEndOfTheTurn) {
  attributes[0]->setValidationRecord(std::make_shared<dbcore::DBUserImgAttrib>());
  EXPECT_TRUE(attributes[0]->validationRecord());
  EXPECT_TRUE(context->isWaitingForResetValidationRecords());
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForResetValidationRecords(); }));
  EXPECT_FALSE(attributes[0]->validationRecord());
  EXPECT_TRUE(context->entitiesWithValidationRecord().empty());
}

// ---- Undo

TEST_F(KRDBContextChangesTest, TheChangesOfOneTurnFormOneUndoStep) {
  const auto undoManager = KRUndoManager::undoManager();
  context->setUndoManager(undoManager);
  const int32_t rating = attributes[0]->rating();
  const int32_t color = attributes[0]->color();
  attributes[0]->setRating(rating + 1);
  attributes[0]->setColor(color + 1);
  EXPECT_TRUE(context->contextUndoGrouping());
  finishTurn();
  EXPECT_FALSE(context->contextUndoGrouping());
  EXPECT_EQ(undoManager->groupingLevel(), 0);
  ASSERT_TRUE(undoManager->canUndo());
  undoManager->undo();
  EXPECT_EQ(attributes[0]->rating(), rating);
  EXPECT_EQ(attributes[0]->color(), color);
  // Undoing registered the way back without opening a group of the context's own.
  EXPECT_FALSE(context->contextUndoGrouping());
  EXPECT_TRUE(undoManager->canRedo());
  finishTurn();
  EXPECT_EQ(storedRating(attributes[0]), rating);
}

TEST_F(KRDBContextChangesTest, EachTurnIsAnUndoStepOfItsOwn) {
  const auto undoManager = KRUndoManager::undoManager();
  context->setUndoManager(undoManager);
  const int32_t rating = attributes[0]->rating();
  attributes[0]->setRating(rating + 1);
  finishTurn();
  attributes[1]->setRating(rating + 2);
  attributes[0]->setRating(rating + 3);
  finishTurn();
  undoManager->undo();
  finishTurn();
  EXPECT_EQ(attributes[0]->rating(), rating + 1);
  EXPECT_EQ(storedRating(attributes[0]), rating + 1);
  undoManager->undo();
  finishTurn();
  EXPECT_EQ(attributes[0]->rating(), rating);
  EXPECT_FALSE(undoManager->canUndo());
}

TEST_F(KRDBContextChangesTest, WithUndoRegistrationDisabledNoGroupIsOpened) {
  const auto undoManager = KRUndoManager::undoManager();
  undoManager->disableUndoRegistration();
  context->setUndoManager(undoManager);
  attributes[0]->setRating(attributes[0]->rating() + 1);
  EXPECT_FALSE(context->contextUndoGrouping());
  EXPECT_EQ(undoManager->groupingLevel(), 0);
  finishTurn();
}

TEST_F(KRDBContextChangesTest, AnEmptyGroupIsLeftOpenAndAnotherManagerClosesTheOldOnesGroup) {
  const auto first = KRUndoManager::undoManager();
  context->setUndoManager(first);
  context->setContextUndoGrouping(true);
  EXPECT_EQ(first->groupingLevel(), 1);
  context->setContextUndoGrouping(false);
  EXPECT_EQ(first->groupingLevel(), 1);
  context->setContextUndoGrouping(true);
  attributes[0]->setRating(attributes[0]->rating() + 1);
  const auto second = KRUndoManager::undoManager();
  context->setUndoManager(second);
  EXPECT_FALSE(context->contextUndoGrouping());
  EXPECT_EQ(context->undoManager(), second);
  finishTurn();
}
