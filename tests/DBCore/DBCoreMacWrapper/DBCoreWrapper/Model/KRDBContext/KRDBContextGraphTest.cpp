#include <gtest/gtest.h>

#include <memory>

#include "KRContextGraphFixture.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbpath.hpp"

namespace {

class KRDBContextGraphTest : public KRContextGraphFixture {
 protected:
  void SetUp() override {
    KRContextGraphFixture::SetUp();
    loadRelations();
  }
};

}  // namespace

// ---- Creation

TEST_F(KRDBContextGraphTest, ACreatedCollectionIsCachedAddedAndPutUnderTheRoot) {
  const auto created = context->createEntityWithType(KRDBEntityTypeCollection);
  ASSERT_TRUE(created);
  EXPECT_EQ(context->cachedEntityForEntityID(created->entityID()), created);
  EXPECT_TRUE(context->addedEntities().contains(created));
  EXPECT_TRUE(context->rootFilter()->childsPrimitive()->contains(created));
  EXPECT_EQ(created->context(), context);
  EXPECT_TRUE(context->isWaitingForProcessChanges());
  finishTurn();
  EXPECT_TRUE(context->addedEntities().empty());
}

TEST_F(KRDBContextGraphTest, AnAsynchronousCreationDeliversTheCachedEntity) {
  std::shared_ptr<KRDBEntity> delivered;
  context->createEntityWithType(KRDBEntityTypeCollection,
                                [&](std::shared_ptr<KRDBEntity> entity) { delivered = std::move(entity); });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return delivered != nullptr; }));
  EXPECT_EQ(context->cachedEntityForEntityID(delivered->entityID()), delivered);
}

TEST_F(KRDBContextGraphTest, UndoingACreationDeletesTheCreatedEntity) {
  const auto undoManager = KRUndoManager::undoManager();
  context->setUndoManager(undoManager);
  const auto created = context->createEntityWithType(KRDBEntityTypeCollection);
  finishTurn();
  ASSERT_TRUE(undoManager->canUndo());
  undoManager->undo();
  EXPECT_TRUE(created->isMarkedToDelete());
}

TEST_F(KRDBContextGraphTest, SeveralEntitiesCreatedFromOneInfoEachTakeThatInfo) {
  auto record = std::make_shared<dbcore::DBPath>();
  record->path = KRString("/trips").krs_wstring();
  const KRDictionary plain{{"unused", true}};
  const KRDictionary info{
      {"DBReferencedFolderPath", KRDBPath::initWithDBEntity(record)},
      {"DBPathInfoVolume", folders[0]->volume()},
      {"DBReferencedFolderChildsPaths", KRDictionary{{"/trips/a", plain}, {"/trips/b", plain}}}};
  KRDBEntityArray created;
  context->createEntitiesWithType(
      KRDBEntityTypeReferencedFolder, std::optional(std::vector{info}),
      [&created](const KRDBEntityArray& entities) { created = entities; }, true);
  ASSERT_EQ(created.size(), 3u);
  for (const auto& entity : created) {
    const auto made = std::static_pointer_cast<KRDBReferencedFolder>(entity);
    EXPECT_EQ(context->cachedEntityForEntityID(made->entityID()), made);
    EXPECT_TRUE(context->addedEntities().contains(made));
    // The info's child paths make each folder's own path a created entity too.
    EXPECT_TRUE(context->addedEntities().contains(made->dbPath()));
  }
  const auto top = std::static_pointer_cast<KRDBReferencedFolder>(created[0]);
  EXPECT_EQ(*top->childsPrimitive(), (KRDBEntitySet{created[1], created[2]}));
  finishTurn();
}

TEST_F(KRDBContextGraphTest, AppliedInfoGivesAnImageItsImportIndexAndDate) {
  context->applyInfo({{"DBImageImportIndex", 42}, {"DBImageImportTimeIntervalNumber", 1700000000}},
                     images[0]);
  EXPECT_EQ(images[0]->importIndex(), 42);
  EXPECT_EQ(images[0]->importDate().timeIntervalSince1970(), 1700000000.0);
}

// ---- Deletion

TEST_F(KRDBContextGraphTest, DeletingImageAttributesWarnsAndStillDeletesThem) {
  const auto attributes = images[2]->attributesPrimitive();
  KRCapturingLogSink sink;
  context->deleteEntity(attributes);
  ASSERT_EQ(sink.records().size(), 1u);
  EXPECT_EQ(sink.records()[0].level, 4);
  EXPECT_EQ(sink.records()[0].message, "Warning: Should not delete image attributes");
  EXPECT_TRUE(context->deletedEntities().contains(attributes));
  EXPECT_FALSE(context->cachedEntityForEntityID(attributes->entityID()));
  finishTurn();
  EXPECT_FALSE(store.catalog()->fetchEntityWithID(attributes->entityID()));
}

TEST_F(KRDBContextGraphTest, DeletingExifAttributesWarnsToo) {
  KRCapturingLogSink sink;
  context->deleteEntity(images[2]->exivAttributesPrimitive());
  ASSERT_EQ(sink.messages().size(), 1u);
  EXPECT_EQ(sink.messages()[0], "Warning: Should not delete image exiv attributes");
}

TEST_F(KRDBContextGraphTest, DeletingAPathOrAVolumeDoesNothingAtAll) {
  const auto path = images[0]->folderDBPath();
  KRCapturingLogSink sink;
  context->deleteEntity(path);
  context->deleteEntity(path->volume());
  EXPECT_TRUE(context->deletedEntities().empty());
  EXPECT_FALSE(context->isWaitingForProcessChanges());
  EXPECT_EQ(context->cachedEntityForEntityID(path->entityID()), path);
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBContextGraphTest, DeletingACollectionMarksItItsAliasAndItsDescendantsAndWritesNothingAtOnce) {
  first->createFavoriteAliasIfNeeded();
  const auto alias = first->favoriteAliasPrimitive();
  ASSERT_TRUE(alias);
  context->deleteEntity(first);
  EXPECT_TRUE(first->isMarkedToDelete());
  EXPECT_TRUE(alias->isMarkedToDelete());
  EXPECT_TRUE(child->isMarkedToDelete());
  EXPECT_FALSE(second->isMarkedToDelete());
  EXPECT_TRUE(context->deletedEntities().empty());
  EXPECT_EQ(context->cachedEntityForEntityID(first->entityID()), first);
  finishTurn();
  EXPECT_TRUE(store.catalog()->fetchEntityWithID(first->entityID()));
}

TEST_F(KRDBContextGraphTest, DeletingAnImageTakesItsAttributesAlongAndLeavesItsCollections) {
  const auto image = images[0];
  const auto attributes = image->attributesPrimitive();
  const auto exif = image->exivAttributesPrimitive();
  context->deleteEntity(image);
  EXPECT_TRUE(context->deletedEntities().contains(image));
  EXPECT_TRUE(context->deletedEntities().contains(attributes));
  EXPECT_TRUE(context->deletedEntities().contains(exif));
  EXPECT_FALSE(first->imagesPrimitive()->contains(image));
  finishTurn();
  EXPECT_FALSE(store.catalog()->fetchEntityWithID(image->entityID()));
}

TEST_F(KRDBContextGraphTest, DeletingImagesTogetherDeletesEachAndAsksTheCatalogOnce) {
  context->deleteImages(KRDBEntitySet{images[1], images[2]});
  EXPECT_TRUE(context->deletedEntities().contains(images[1]));
  EXPECT_TRUE(context->deletedEntities().contains(images[2]));
  finishTurn();
  EXPECT_FALSE(store.catalog()->fetchEntityWithID(images[1]->entityID()));
  EXPECT_FALSE(store.catalog()->fetchEntityWithID(images[2]->entityID()));
  EXPECT_TRUE(store.catalog()->fetchEntityWithID(images[0]->entityID()));
}

TEST_F(KRDBContextGraphTest, TheSubfoldersOfAFolderAreAllBelowItButNotItself) {
  const KRDBEntitySet below = KRDBContext::recursiveSubfolders(context->rootFilter());
  EXPECT_TRUE(below.contains(first));
  EXPECT_TRUE(below.contains(second));
  EXPECT_TRUE(below.contains(child));
  EXPECT_FALSE(below.contains(context->rootFilter()));
  EXPECT_EQ(KRDBContext::recursiveSubfolders(first), KRDBEntitySet{child});
}

TEST_F(KRDBContextGraphTest, ImagesAndTheirCollectionsGoWithTheContext) {
  const std::weak_ptr<KRDBImage> image = images[0];
  const std::weak_ptr<KRDBCollection> collection = first;
  ASSERT_TRUE(image.lock()->filtersPrimitive()->contains(first));
  images.clear();
  first.reset();
  second.reset();
  child.reset();
  context.reset();
  EXPECT_TRUE(image.expired());
  EXPECT_TRUE(collection.expired());
}
