#include "Model/KRDBContext/KRDBContext.hpp"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "KRContextCatalog.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBAdditionalFetchForImagesService.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

namespace {

using ImagePtr = std::shared_ptr<KRDBImage>;

class KRDBContextTest : public testing::Test {
 protected:
  void SetUp() override {
    folders = {store.folder("/photos/a"), store.folder("/photos/b")};
    images = store.images(3, folders);
    context = KRDBContext::initWithCatalog(store.catalog());
    ASSERT_TRUE(context);
  }

  static KRDBEntityIDPtr idOf(int64_t type, int64_t dbid) {
    return KRDBEntityID::initWithEntityType(type, dbid);
  }
  ImagePtr imageWithID(const ImagePtr& fetched) {
    return std::dynamic_pointer_cast<KRDBImage>(context->entityWithID(fetched->entityID()));
  }
  // The request's entities as the context hands them over.
  KRDBEntitySet obtained(const KRDBContext::FetchRequestPtr& request) {
    KRDBEntitySet result;
    bool done = false;
    context->obtainEntitiesUsingFetchRequest(request, [&](KRDBEntitySet entities) {
      result = std::move(entities);
      done = true;
    });
    EXPECT_TRUE(KRContextCatalog::runUntil([&] { return done; }));
    return result;
  }
  // Whether a block posted to the main run loop before `action` ran while it ran.
  static bool turnsTheRunLoop(const std::function<void()>& action) {
    auto ran = std::make_shared<bool>(false);
    KRRunLoop::mainRunLoop()->performBlock([ran] { *ran = true; });
    action();
    const bool turned = *ran;
    KRContextCatalog::runUntil([ran] { return *ran; });
    return turned;
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBPath>> folders;
  std::vector<ImagePtr> images;
  std::shared_ptr<KRDBContext> context;
};

// ---- Construction

TEST_F(KRDBContextTest, BuildsTheRootsTheAllImagesFilterAndTheService) {
  ASSERT_TRUE(context->rootFilter());
  EXPECT_EQ(context->rootFilter()->entityID()->dbid(), 1);
  ASSERT_TRUE(context->rootReferencedFolder());
  EXPECT_EQ(context->rootReferencedFolder()->entityID()->dbid(), 1);
  EXPECT_TRUE(context->allImagesFilter());
  EXPECT_TRUE(context->additionalFetchForImagesService());
  EXPECT_EQ(context->blockDispatcher(), store.catalog()->dispatcher());
  EXPECT_EQ(context->catalog(), store.catalog());
  EXPECT_EQ(context->cachedEntityForEntityID(idOf(KRDBEntityTypeCollection, 1)), context->rootFilter());
  EXPECT_FALSE(context->isWaitingForProcessChanges());
  EXPECT_FALSE(context->isWaitingForClose());
  EXPECT_FALSE(context->isWaitingForResetValidationRecords());
  EXPECT_FALSE(context->contextUndoGrouping());
  EXPECT_FALSE(context->undoManager());
  EXPECT_TRUE(context->addedEntities().empty());
  EXPECT_EQ(context->entitiesChanges()->count(), 0u);
}

TEST_F(KRDBContextTest, NoCatalogMakesNoContext) { EXPECT_FALSE(KRDBContext::initWithCatalog(nullptr)); }

// ---- Fetch by identifier

TEST_F(KRDBContextTest, AnImageByIdentifierComesWithAllFourLinksAttached) {
  const auto image = imageWithID(images[1]);
  ASSERT_TRUE(image);
  EXPECT_EQ(image->necesserryEntitiesToFetchCount(), 0u);
  ASSERT_TRUE(image->folderDBPath());
  EXPECT_EQ(image->folderDBPath()->entityID()->dbid(), folders[1]->entityID()->dbid());
  ASSERT_TRUE(image->attributesPrimitive());
  ASSERT_TRUE(image->exivAttributesPrimitive());
  ASSERT_TRUE(image->currentStatePrimitive());
  EXPECT_EQ(image->currentStatePrimitive()->guid(), KRString("state-IMG_1.JPG"));
  EXPECT_EQ(image->context(), context);
}

TEST_F(KRDBContextTest, TheLinkedRecordsAreTheCachedInstances) {
  const auto image = imageWithID(images[0]);
  EXPECT_EQ(context->cachedEntityForEntityID(image->attributesPrimitive()->entityID()),
            image->attributesPrimitive());
  EXPECT_EQ(context->entityWithID(image->exivAttributesPrimitive()->entityID()),
            image->exivAttributesPrimitive());
  EXPECT_EQ(context->entityWithID(image->folderDBPath()->entityID()), image->folderDBPath());
  EXPECT_EQ(imageWithID(images[2])->folderDBPath(), image->folderDBPath());
}

TEST_F(KRDBContextTest, AMissingRecordOrIdentifierGivesNothing) {
  EXPECT_FALSE(context->entityWithID(idOf(KRDBEntityTypeImage, 999)));
  EXPECT_FALSE(context->entityWithID(nullptr));
  EXPECT_FALSE(context->cachedEntityForEntityID(idOf(KRDBEntityTypeImage, 999)));
  EXPECT_FALSE(context->cachedEntityForEntityID(nullptr));
}

TEST_F(KRDBContextTest, TwoFetchesOfOneRecordGiveOneObject) {
  const auto first = imageWithID(images[0]);
  EXPECT_EQ(imageWithID(images[0]), first);
  const auto request = KRDBFilteredImagesFetchRequest::init();
  const KRDBEntitySet all = obtained(request);
  EXPECT_EQ(all.size(), images.size());
  EXPECT_TRUE(all.contains(first));
  EXPECT_EQ(context->imageForAttributes(first->attributesPrimitive()), first);
  EXPECT_EQ(context->attributesForImage(first), first->attributesPrimitive());
}

TEST_F(KRDBContextTest, AnEntityWithoutNecessaryLinksIsPreparedWithoutTurningTheRunLoop) {
  const auto attributesID = imageWithID(images[0])->attributesPrimitive()->entityID();
  const auto fresh = KRDBContext::initWithCatalog(store.catalog());
  std::shared_ptr<KRDBEntity> attributes;
  EXPECT_FALSE(turnsTheRunLoop([&] { attributes = fresh->entityWithID(attributesID); }));
  ASSERT_TRUE(attributes);
  EXPECT_EQ(attributes->necesserryEntitiesToFetchCount(), 0u);
  EXPECT_EQ(attributes->context(), fresh);
}

// ---- Caching and preparing

TEST_F(KRDBContextTest, ASecondFetchedCopyIsDroppedByTheCache) {
  const auto cached = imageWithID(images[0]);
  const auto copy = store.catalog()->fetchEntityWithID(cached->entityID());
  ASSERT_NE(copy, cached);
  context->cacheEntityAndFetchLinkedEntities(copy);
  EXPECT_EQ(context->cachedEntityForEntityID(cached->entityID()), cached);
  EXPECT_EQ(context->preparedEntity(copy), cached);
}

TEST_F(KRDBContextTest, PreparedEntitiesHandsOverTheCachedInstances) {
  const auto cached = imageWithID(images[0]);
  const auto copy = store.catalog()->fetchEntityWithID(cached->entityID());
  const auto other = store.catalog()->fetchEntityWithID(images[1]->entityID());
  KRDBEntitySet result;
  bool called = false;
  context->preparedEntities({copy, other}, [&](KRDBEntitySet entities) {
    result = std::move(entities);
    called = true;
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  EXPECT_EQ(result, (KRDBEntitySet{cached, other}));
  EXPECT_EQ(other->necesserryEntitiesToFetchCount(), 0u);
  EXPECT_TRUE(std::static_pointer_cast<KRDBImage>(other)->attributesPrimitive());
}

TEST_F(KRDBContextTest, PreparedEntitiesOfNothingCallsTheHandlerAtOnceWithNothing) {
  bool called = false;
  context->preparedEntities({}, [&](KRDBEntitySet entities) {
    called = true;
    EXPECT_TRUE(entities.empty());
  });
  EXPECT_TRUE(called);
}

TEST_F(KRDBContextTest, PreparedEntitiesSkipsAMissingEntity) {
  const auto cached = imageWithID(images[0]);
  KRDBEntitySet result;
  bool called = false;
  context->preparedEntities({nullptr, cached}, [&](KRDBEntitySet entities) {
    result = std::move(entities);
    called = true;
  });
  EXPECT_TRUE(called);
  EXPECT_EQ(result, (KRDBEntitySet{cached}));
}

TEST_F(KRDBContextTest, PreparingReplacesALinkedCopyByTheCachedInstance) {
  const auto cached = imageWithID(images[0]);
  const auto copy =
      std::static_pointer_cast<KRDBImage>(store.catalog()->fetchEntityWithID(cached->entityID()));
  store.catalog()->additionalFetchingSyncForEntities({copy});
  ASSERT_TRUE(copy->attributesPrimitive());
  ASSERT_NE(copy->attributesPrimitive(), cached->attributesPrimitive());
  context->prepareFetchedEntity(copy);
  EXPECT_EQ(copy->attributesPrimitive(), cached->attributesPrimitive());
  EXPECT_EQ(copy->exivAttributesPrimitive(), cached->exivAttributesPrimitive());
  EXPECT_EQ(copy->folderDBPath(), cached->folderDBPath());
}

TEST_F(KRDBContextTest, AnImageNotInTheMapsGetsItsLinksTheOrdinaryWay) {
  imageWithID(images[0]);
  ASSERT_TRUE(context->additionalFetchForImagesService()->allFetchesCompleted());
  const auto later = store.images(1, folders).at(0);
  const auto image = imageWithID(later);
  ASSERT_TRUE(image);
  EXPECT_TRUE(image->attributesPrimitive());
  EXPECT_TRUE(image->exivAttributesPrimitive());
  EXPECT_TRUE(image->folderDBPath());
  EXPECT_FALSE(image->needFetchNecessaryEntities());
}

TEST_F(KRDBContextTest, ImagesPreparedBeforeTheMapsArriveAreHandedOverOnceAllAreLinked) {
  KRDBEntitySet fetched;
  for (const auto& image : images) fetched.insert(store.catalog()->fetchEntityWithID(image->entityID()));
  int calls = 0;
  KRDBEntitySet result;
  context->preparedEntities(fetched, [&](KRDBEntitySet entities) {
    ++calls;
    result = std::move(entities);
  });
  EXPECT_EQ(calls, 0);
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return calls == 1; }));
  EXPECT_EQ(result, fetched);
  for (const auto& entity : result) {
    const auto image = std::static_pointer_cast<KRDBImage>(entity);
    EXPECT_EQ(context->cachedEntityForEntityID(image->entityID()), image);
    EXPECT_EQ(image->necesserryEntitiesToFetchCount(), 0u);
    EXPECT_TRUE(image->folderDBPath() && image->attributesPrimitive() && image->exivAttributesPrimitive());
    EXPECT_EQ(image->context(), context);
  }
  store.waitForQueue();
  EXPECT_EQ(calls, 1);
}

TEST_F(KRDBContextTest, AnImageWaitingInABatchIsPreparedForAnotherCallerToo) {
  const auto copy = store.catalog()->fetchEntityWithID(images[1]->entityID());
  bool called = false;
  context->preparedEntities({copy}, [&](KRDBEntitySet) { called = true; });
  const auto image = imageWithID(images[1]);
  EXPECT_EQ(image, copy);
  EXPECT_TRUE(image->attributesPrimitive());
  EXPECT_EQ(image->context(), context);
  EXPECT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
}

TEST_F(KRDBContextTest, AnImageOfABatchTheMapsLackGetsItsLinksTheOrdinaryWay) {
  imageWithID(images[0]);
  ASSERT_TRUE(context->additionalFetchForImagesService()->allFetchesCompleted());
  const auto later = store.catalog()->fetchEntityWithID(store.images(1, folders).at(0)->entityID());
  bool called = false;
  context->preparedEntities({later}, [&](KRDBEntitySet entities) {
    called = true;
    EXPECT_EQ(entities, KRDBEntitySet{later});
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  const auto image = std::static_pointer_cast<KRDBImage>(later);
  EXPECT_TRUE(image->attributesPrimitive());
  EXPECT_TRUE(image->exivAttributesPrimitive());
  EXPECT_TRUE(image->folderDBPath());
  EXPECT_FALSE(image->needFetchNecessaryEntities());
  EXPECT_EQ(image->context(), context);
  EXPECT_EQ(context->cachedEntityForEntityID(image->entityID()), image);
}

// ---- Waiting, closing, backup

TEST_F(KRDBContextTest, WaitingForChangesCallsTheHandlerAtOnceWhenNoPassIsPending) {
  bool called = false;
  context->waitForProcessChangesWithHandler([&] { called = true; });
  EXPECT_TRUE(called);
}

TEST_F(KRDBContextTest, WaitingForAPendingPassQueuesTheHandlersInOrder) {
  context->setWaitingForProcessChanges(true);
  std::vector<int> order;
  context->waitForProcessChangesWithHandler([&] { order.push_back(1); });
  context->enqueueWaitingBlock([&] { order.push_back(2); });
  EXPECT_TRUE(order.empty());
  while (const auto block = context->dequeueWaitingChangesBlock()) block();
  EXPECT_EQ(order, (std::vector<int>{1, 2}));
  EXPECT_FALSE(context->dequeueWaitingChangesBlock());
}

TEST_F(KRDBContextTest, WaitsForTheCatalogsOperations) {
  bool called = false;
  context->waitForAllDataBaseOperationsWithHandler([&] { called = true; });
  EXPECT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
}

TEST_F(KRDBContextTest, ClosingMarksTheContextAndClosesTheCatalog) {
  bool closed = false;
  context->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  EXPECT_TRUE(context->isWaitingForClose());
  EXPECT_TRUE(KRContextCatalog::runUntil([&] { return closed; }));
  EXPECT_FALSE(store.catalog()->dbReactor());
}

TEST_F(KRDBContextTest, BackupCopiesTheCatalogFile) {
  const std::string copy = store.file("backup.krcatalog");
  bool called = false;
  bool succeeded = false;
  context->backupDBToPath(copy, [&](bool outcome) {
    called = true;
    succeeded = outcome;
  });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return called; }));
  EXPECT_TRUE(succeeded);
  EXPECT_TRUE(std::filesystem::exists(copy));
}

TEST_F(KRDBContextTest, PerformsBlocksOnTheCatalogsQueue) {
  bool ran = false;
  context->performBlockAndWait([&] { ran = !KRRunLoop::isMainThread(); });
  EXPECT_TRUE(ran);
  bool queued = false;
  context->performBlock([&] { queued = true; });
  context->performBlockAndWait([] {});
  EXPECT_TRUE(queued);
}

TEST(KRDBContextPathTest, NormalizedPathEndsInOneSlash) {
  EXPECT_EQ(KRDBContext::normilizedPath("/a/b"), KRString("/a/b/"));
  EXPECT_EQ(KRDBContext::normilizedPath("/a/b/"), KRString("/a/b/"));
  EXPECT_TRUE(KRDBContext::normilizedPath(KRString()).isNil());
}

}  // namespace
