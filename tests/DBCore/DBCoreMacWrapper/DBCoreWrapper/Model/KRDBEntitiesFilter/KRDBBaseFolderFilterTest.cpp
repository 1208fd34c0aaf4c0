#include "Model/KRDBEntitiesFilter/KRDBBaseFolderFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRContextCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"

namespace {

using CollectionPtr = std::shared_ptr<KRDBCollection>;

// A root collection holding two collections, the first of which holds a third.
class KRDBBaseFolderFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    const auto first = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto second = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto third = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    store.onQueue([&](KRDBCatalog& queue) {
      const auto root =
          queue.fetchEntityWithIDSync(KRDBEntityID::initWithEntityType(KRDBEntityTypeCollection, 1));
      queue.addChildsSync({first, second}, root);
      queue.addChildsSync({third}, first);
    });
    context = KRDBContext::initWithCatalog(store.catalog());
    root = context->rootFilter();
    firstChild = cached(first);
    secondChild = cached(second);
    grandchild = cached(third);
  }

  CollectionPtr cached(const CollectionPtr& fetched) {
    return std::static_pointer_cast<KRDBCollection>(context->entityWithID(fetched->entityID()));
  }
  static KRDBEntitySet obtained(const std::shared_ptr<KRDBBaseFolderFilter>& filter) {
    KRDBEntitySet result;
    bool done = false;
    filter->obtainEntities([&](const KRDBEntitiesFilter::EntitySetPtr& set) {
      if (set) result = *set;
      done = true;
    });
    EXPECT_TRUE(KRContextCatalog::runUntil([&] { return done; }));
    return result;
  }
  static KRDBEntitiesFilter::ChangesStoragePtr deleting(const std::shared_ptr<KRDBEntity>& entity) {
    return KRDBEntitiesChangesStorage::initWithAddedEntities(
        nullptr, std::make_shared<KRDBEntitySet>(KRDBEntitySet{entity}), nullptr, nullptr);
  }

  KRContextCatalog store;
  std::shared_ptr<KRDBContext> context;
  CollectionPtr root, firstChild, secondChild, grandchild;
};

}  // namespace

TEST_F(KRDBBaseFolderFilterTest, HoldsTheChildrenOfEveryFolderUnmarked) {
  EXPECT_EQ(obtained(KRDBBaseFolderFilter::initWithFolder(root)), (KRDBEntitySet{firstChild, secondChild}));
  secondChild->setMarkedToDelete(true);
  const auto both = KRDBBaseFolderFilter::initWithFolders({root, firstChild});
  EXPECT_EQ(both->context(), context);
  EXPECT_EQ(both->entityTypes(), (KRDBSpecifiedTypesEntitiesFilter::EntityTypes{KRDBEntityTypeCollection}));
  EXPECT_EQ(obtained(both), (KRDBEntitySet{firstChild, grandchild}));
  EXPECT_FALSE(both->isEntitySatisfiesFilterConditions(secondChild));
  EXPECT_TRUE(both->isEntitySatisfiesFilterConditions(grandchild));
  EXPECT_FALSE(both->isEntitySatisfiesFilterConditions(root));
}

TEST_F(KRDBBaseFolderFilterTest, WithoutFoldersItIsEmpty) {
  EXPECT_TRUE(obtained(KRDBBaseFolderFilter::initWithFolders({})).empty());
}

TEST_F(KRDBBaseFolderFilterTest, DeletingOneOfItsFoldersFreezesTheFilter) {
  const auto filter = KRDBBaseFolderFilter::initWithFolders({root, firstChild});
  obtained(filter);
  EXPECT_FALSE(filter->invalidCurrentFoldersForChanges(deleting(secondChild)));
  filter->processChanges(deleting(secondChild));
  EXPECT_FALSE(filter->invalid());
  EXPECT_FALSE(filter->containsEntity(secondChild));
  EXPECT_TRUE(filter->invalidCurrentFoldersForChanges(deleting(firstChild)));
  filter->processChanges(deleting(firstChild));
  EXPECT_TRUE(filter->invalid());
  EXPECT_TRUE(filter->containsEntity(firstChild));
  filter->processChanges(deleting(grandchild));
  EXPECT_TRUE(filter->containsEntity(grandchild));
}
