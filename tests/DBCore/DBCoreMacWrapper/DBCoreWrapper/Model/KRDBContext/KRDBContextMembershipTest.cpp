#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "KRContextGraphFixture.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"

namespace {

class KRDBContextMembershipTest : public KRContextGraphFixture {
 protected:
  void SetUp() override {
    KRContextGraphFixture::SetUp();
    loadRelations();
  }
  std::vector<int64_t> idsOf(std::initializer_list<ImagePtr> members) {
    std::vector<int64_t> ids;
    for (const auto& image : members) ids.push_back(image->entityID()->dbid());
    std::sort(ids.begin(), ids.end());
    return ids;
  }
  std::vector<int64_t> sortedStoredImageIDs(const std::shared_ptr<KRDBEntity>& collection) {
    auto ids = storedImageIDs(collection);
    std::sort(ids.begin(), ids.end());
    return ids;
  }
};

}  // namespace

TEST_F(KRDBContextMembershipTest, AddingImagesToACollectionChangesMemoryAndCatalogAlike) {
  KRCapturingLogSink sink;
  context->addImages(KRDBEntitySet{images[2], images[0]},
                     std::static_pointer_cast<KRDBAbstractBaseFolder>(second));
  EXPECT_EQ(*second->imagesPrimitive(), (KRDBEntitySet{images[2], images[0]}));
  EXPECT_TRUE(images[2]->filtersPrimitive()->contains(second));
  finishTurn();
  EXPECT_EQ(sortedStoredImageIDs(second), idsOf({images[0], images[2]}));
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBContextMembershipTest, RemovingImagesFromACollectionIsUndoneByAddingThemBack) {
  const auto undoManager = KRUndoManager::undoManager();
  context->setUndoManager(undoManager);
  undoManager->beginUndoGrouping();
  context->deleteImages(KRDBEntitySet{images[1]}, std::static_pointer_cast<KRDBAbstractBaseFolder>(first));
  undoManager->endUndoGrouping();
  EXPECT_FALSE(first->imagesPrimitive()->contains(images[1]));
  EXPECT_FALSE(images[1]->filtersPrimitive()->contains(first));
  finishTurn();
  EXPECT_EQ(sortedStoredImageIDs(first), idsOf({images[0]}));
  undoManager->undo();
  EXPECT_TRUE(first->imagesPrimitive()->contains(images[1]));
  finishTurn();
  EXPECT_EQ(sortedStoredImageIDs(first), idsOf({images[0], images[1]}));
}

TEST_F(KRDBContextMembershipTest, MovingAChildTakesItFromItsParentInMemoryAndCatalog) {
  KRCapturingLogSink sink;
  context->addChilds(KRDBEntitySet{second}, std::static_pointer_cast<KRDBAbstractBaseFolder>(first));
  EXPECT_EQ(second->parentPrimitive(), first);
  EXPECT_TRUE(first->childsPrimitive()->contains(second));
  EXPECT_FALSE(context->rootFilter()->childsPrimitive()->contains(second));
  finishTurn();
  EXPECT_EQ(store.catalog()->fetchParentOfFilter(second)->entityID()->dbid(), first->entityID()->dbid());
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBContextMembershipTest, ChildrenAlreadyThereChangeNothing) {
  KRCapturingLogSink sink;
  context->addChilds(KRDBEntitySet{child}, std::static_pointer_cast<KRDBAbstractBaseFolder>(first));
  EXPECT_FALSE(context->isWaitingForProcessChanges());
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBContextMembershipTest, TheCurrentStateChangesInMemoryAndCatalogAndUndoes) {
  const auto undoManager = KRUndoManager::undoManager();
  context->setUndoManager(undoManager);
  const auto before = images[0]->currentState();
  const auto state =
      std::static_pointer_cast<KRDBImageState>(context->createEntityWithType(KRDBEntityTypeImageState));
  ASSERT_TRUE(state);
  context->setStates({before, state}, state, images[0]);
  EXPECT_EQ(images[0]->currentState(), state);
  finishTurn();
  EXPECT_EQ(store.catalog()->fetchCurrentStateForImage(images[0])->entityID()->dbid(),
            state->entityID()->dbid());
  undoManager->beginUndoGrouping();
  context->setCurrentState(before, images[0]);
  undoManager->endUndoGrouping();
  EXPECT_EQ(images[0]->currentState(), before);
  finishTurn();
  EXPECT_EQ(store.catalog()->fetchCurrentStateForImage(images[0])->entityID()->dbid(),
            before->entityID()->dbid());
  undoManager->undo();
  EXPECT_EQ(images[0]->currentState(), state);
}

TEST_F(KRDBContextMembershipTest, ImagesMovedToAnotherFolderAreBoundThere) {
  const auto target = folders[1];
  context->setFolderDBPath(target, {images[0], images[1]});
  EXPECT_EQ(images[0]->folderDBPath(), target);
  EXPECT_EQ(images[1]->folderDBPath(), target);
  finishTurn();
  EXPECT_EQ(store.catalog()->fetchDBPathForImageSync(images[0])->entityID()->dbid(),
            target->entityID()->dbid());
}

TEST_F(KRDBContextMembershipTest, ARenamedFolderRenamesTheCachedPathsAtAndBelowIt) {
  const auto path = std::static_pointer_cast<KRDBPath>(context->entityWithID(folders[0]->entityID()));
  const auto volume = path->volume();
  bool renamed = false;
  context->setNewPath("/pictures/a", volume, path, [&](bool done) { renamed = done; });
  ASSERT_TRUE(KRContextCatalog::runUntil([&] { return renamed; }));
  EXPECT_EQ(path->path(), KRString("/pictures/a"));
  EXPECT_EQ(std::static_pointer_cast<KRDBPath>(context->entityWithID(folders[1]->entityID()))->path(),
            KRString("/photos/b"));
}
