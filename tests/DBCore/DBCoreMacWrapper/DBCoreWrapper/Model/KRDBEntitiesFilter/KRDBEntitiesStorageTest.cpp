#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRTestEntities.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"

namespace {

using KRTestEntities::makeImage;
using KRTestEntities::makePath;

TEST(KRDBEntitiesStorageTest, HasOneMapPerEntityType) {
  const auto storage = KRDBEntitiesStorage::init();
  ASSERT_EQ(storage->entitiesStorage().size(), 14u);
  for (const auto& map : storage->entitiesStorage()) {
    ASSERT_NE(map, nullptr);
    EXPECT_EQ(map->count(), 0u);
  }
}

TEST(KRDBEntitiesStorageTest, AnIdentifierNeverStoredFindsNothing) {
  const auto storage = KRDBEntitiesStorage::init();
  EXPECT_EQ(storage->entityForID(KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 5)), nullptr);
}

TEST(KRDBEntitiesStorageTest, FindsTheStoredObjectByAnEqualIdentifier) {
  const auto storage = KRDBEntitiesStorage::init();
  const auto image = makeImage(5);
  storage->setEntity(image, image->entityID());
  EXPECT_EQ(storage->entityForID(KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 5)), image);
  EXPECT_EQ(storage->entityForID(KRDBEntityID::initWithEntityType(KRDBEntityTypePath, 5)), nullptr);
}

TEST(KRDBEntitiesStorageTest, SettingAgainReplacesAndRemovingForgets) {
  const auto storage = KRDBEntitiesStorage::init();
  const auto first = makeImage(5);
  const auto second = makeImage(5);
  storage->setEntity(first, first->entityID());
  storage->setEntity(second, first->entityID());
  EXPECT_EQ(storage->entityForID(first->entityID()), second);
  storage->removeEntityForID(second->entityID());
  EXPECT_EQ(storage->entityForID(first->entityID()), nullptr);
}

TEST(KRDBEntitiesStorageTest, ListsTheObjectsOfOneTypeAndAllTypesInTypeOrder) {
  const auto storage = KRDBEntitiesStorage::init();
  const auto path = makePath(1);
  const auto images = {makeImage(1), makeImage(2)};
  storage->setEntity(path, path->entityID());
  for (const auto& image : images) storage->setEntity(image, image->entityID());
  const auto ofImages = storage->allEntitiesWithType(KRDBEntityTypeImage);
  EXPECT_EQ(ofImages.size(), 2u);
  EXPECT_EQ(storage->allEntitiesWithType(KRDBEntityTypePath),
            (std::vector<std::shared_ptr<KRDBEntity>>{path}));
  EXPECT_TRUE(storage->allEntitiesWithType(KRDBEntityTypeVolume).empty());
  const auto all = storage->allEntities();
  ASSERT_EQ(all.size(), 3u);
  EXPECT_EQ(all.back(), path);
}

}  // namespace
