#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <thread>
#include <vector>

#include "KRTestEntities.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Support/KRDBCoreInjectorService.hpp"

namespace {

using EntitySetPtr = KRDBEntitiesChangesStorage::EntitySetPtr;

using KRTestEntities::makeImage;
using KRTestEntities::makePath;

std::shared_ptr<KRDBEntityIDMapTable> makeMap() {
  KRDBCoreInjectorService::load();
  return KRDBCoreInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>()
      ->makeMapTableWithObjectsMappedByEntityIDs();
}

class KRDBEntitiesChangesStorageTest : public testing::Test {
 protected:
  std::shared_ptr<KRDBImage> image1 = makeImage(1);
  std::shared_ptr<KRDBImage> image2 = makeImage(2);
  std::shared_ptr<KRDBPath> path1 = makePath(1);
  EntitySetPtr mixed = std::make_shared<KRDBEntitySet>(KRDBEntitySet{image1, image2, path1});
};

TEST_F(KRDBEntitiesChangesStorageTest, KeepsTheFourValuesItWasMadeWith) {
  const auto added = std::make_shared<KRDBEntitySet>(KRDBEntitySet{image1});
  const auto deleted = std::make_shared<KRDBEntitySet>(KRDBEntitySet{image2});
  const auto updated = std::make_shared<KRDBEntitySet>(KRDBEntitySet{path1});
  const auto changes = makeMap();
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(added, deleted, updated, changes);
  EXPECT_EQ(storage->addedEntities(), added);
  EXPECT_EQ(storage->deletedEntities(), deleted);
  EXPECT_EQ(storage->updatedEntities(), updated);
  EXPECT_EQ(storage->entitiesChanges(), changes);
}

TEST_F(KRDBEntitiesChangesStorageTest, AnAbsentAddedSetAnswersNoneForEveryType) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(nullptr, mixed, mixed, nullptr);
  for (int64_t type = 0; type <= 13; ++type) EXPECT_EQ(storage->addedEntitiesOfType(type), nullptr) << type;
  EXPECT_NE(storage->deletedEntitiesOfType(KRDBEntityTypeImage), nullptr);
}

TEST_F(KRDBEntitiesChangesStorageTest, AbsentDeletedAndUpdatedSetsAnswerNone) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, nullptr, nullptr, nullptr);
  EXPECT_EQ(storage->deletedEntitiesOfType(KRDBEntityTypeImage), nullptr);
  EXPECT_EQ(storage->updatedEntitiesOfType(KRDBEntityTypeImage), nullptr);
}

TEST_F(KRDBEntitiesChangesStorageTest, ASubsetHoldsTheEntitiesOfTheTypeOnly) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, mixed, mixed, nullptr);
  const KRDBEntitySet images{image1, image2};
  const KRDBEntitySet paths{path1};
  EXPECT_EQ(*storage->addedEntitiesOfType(KRDBEntityTypeImage), images);
  EXPECT_EQ(*storage->deletedEntitiesOfType(KRDBEntityTypePath), paths);
  EXPECT_EQ(*storage->updatedEntitiesOfType(KRDBEntityTypeImage), images);
}

TEST_F(KRDBEntitiesChangesStorageTest, AskingTwiceForOneTypeAnswersTheSameCachedSet) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, mixed, mixed, nullptr);
  const auto addedImages = storage->addedEntitiesOfType(KRDBEntityTypeImage);
  EXPECT_EQ(storage->addedEntitiesOfType(KRDBEntityTypeImage), addedImages);
  const auto deletedPaths = storage->deletedEntitiesOfType(KRDBEntityTypePath);
  EXPECT_EQ(storage->deletedEntitiesOfType(KRDBEntityTypePath), deletedPaths);
  const auto updatedImages = storage->updatedEntitiesOfType(KRDBEntityTypeImage);
  EXPECT_EQ(storage->updatedEntitiesOfType(KRDBEntityTypeImage), updatedImages);
}

TEST_F(KRDBEntitiesChangesStorageTest, EachSetKeepsItsOwnCache) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, mixed, mixed, nullptr);
  const auto added = storage->addedEntitiesOfType(KRDBEntityTypeImage);
  const auto deleted = storage->deletedEntitiesOfType(KRDBEntityTypeImage);
  const auto updated = storage->updatedEntitiesOfType(KRDBEntityTypeImage);
  EXPECT_NE(added, deleted);
  EXPECT_NE(added, updated);
  EXPECT_NE(deleted, updated);
  EXPECT_NE(storage->addedEntitiesOfType(KRDBEntityTypePath), added);
}

TEST_F(KRDBEntitiesChangesStorageTest, AnEmptySubsetIsCachedToo) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, nullptr, nullptr, nullptr);
  const auto volumes = storage->addedEntitiesOfType(KRDBEntityTypeVolume);
  ASSERT_NE(volumes, nullptr);
  EXPECT_TRUE(volumes->empty());
  EXPECT_EQ(storage->addedEntitiesOfType(KRDBEntityTypeVolume), volumes);
}

TEST_F(KRDBEntitiesChangesStorageTest, ReadersOnSeveralThreadsGetOneCachedSet) {
  const auto storage = KRDBEntitiesChangesStorage::initWithAddedEntities(mixed, nullptr, nullptr, nullptr);
  std::vector<EntitySetPtr> answers(8);
  std::vector<std::thread> readers;
  for (size_t reader = 0; reader < answers.size(); ++reader) {
    readers.emplace_back(
        [&, reader] { answers[reader] = storage->addedEntitiesOfType(KRDBEntityTypeImage); });
  }
  for (auto& thread : readers) thread.join();
  for (const auto& answer : answers) EXPECT_EQ(answer, answers.front());
  EXPECT_EQ(answers.front()->size(), 2u);
}

TEST_F(KRDBEntitiesChangesStorageTest, ThePredicateForATypeKeepsEntitiesWhoseIdentifierHasIt) {
  const auto keepsImages = KRDBEntitiesChangesStorage::predicateForEntityType(KRDBEntityTypeImage);
  EXPECT_TRUE(keepsImages(image1));
  EXPECT_FALSE(keepsImages(path1));
  EXPECT_FALSE(keepsImages(nullptr));
}

}  // namespace
