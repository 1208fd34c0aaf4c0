#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"

#include <gtest/gtest.h>

#include "KREntityObserverRecorder.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"

namespace {

using dbcore::DBEntityFavoriteAlias;

std::shared_ptr<DBEntityFavoriteAlias> aliasRecord(uint8_t originalType, int64_t originalId) {
  auto record = std::make_shared<DBEntityFavoriteAlias>();
  record->set_id(3);
  record->favorite = true;
  record->favorite_order = 2.5f;
  record->orig_type = originalType;
  record->orig_id = originalId;
  return record;
}

class KRDBEntityFavoriteAliasTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }
};

TEST_F(KRDBEntityFavoriteAliasTest, TheNumbersOfTheClass) {
  EXPECT_EQ(KRDBEntityFavoriteAlias::entityType(), 9);
  EXPECT_EQ(KRDBEntityFavoriteAlias::dbEntityType(), 11);
  EXPECT_EQ(KRDBEntity::entityClassForDBEntityType(11), &KRDBEntityFavoriteAlias::classInfo());
}

TEST_F(KRDBEntityFavoriteAliasTest, TheRecordGivesTheFieldsAndTheOriginalIdentifier) {
  const auto record = aliasRecord(dbcore::kDBRefFolderType, 17);
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(record);
  EXPECT_TRUE(alias->isFavorite());
  EXPECT_EQ(alias->favoriteOrder(), 2.5);
  EXPECT_TRUE(alias->originalEntityID()->isEqual(KRDBEntityID::initWithEntityType(3, 17)));
  EXPECT_EQ(alias->dbalias(), record);
  EXPECT_EQ(alias->entityID()->entityType(), 9);
}

TEST_F(KRDBEntityFavoriteAliasTest, AnOriginalOfAnUnregisteredRecordTypeHasEntityTypeZero) {
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord(dbcore::kDBResourceType, 17));
  EXPECT_EQ(alias->originalEntityID()->entityType(), 0);
  EXPECT_EQ(alias->originalEntityID()->dbid(), 17);
}

TEST_F(KRDBEntityFavoriteAliasTest, ARecordOfAnotherClassIsRefused) {
  auto path = std::make_shared<dbcore::DBPath>();
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(path);
  ASSERT_TRUE(alias);
  EXPECT_FALSE(alias->dbalias());
  EXPECT_FALSE(alias->storeInfoFromDBentity(path));
  EXPECT_FALSE(alias->originalEntityID());
}

TEST_F(KRDBEntityFavoriteAliasTest, TheOrderIsWrittenAsAFloatAndKeptWholeUntilReloaded) {
  const auto record = aliasRecord(dbcore::kDBImageType, 1);
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*alias);
  alias->setFavoriteOrder(0.1);
  EXPECT_EQ(record->favorite_order, 0.1f);
  EXPECT_EQ(alias->favoriteOrder(), 0.1);
  EXPECT_EQ(observer->events.back().info,
            KRDictionary({{"kKRDBEntityFavoriteAliasDidChangeFavoriteOrder", true}}));
  const auto reloaded = KRDBEntityFavoriteAlias::initWithDBEntity(record);
  EXPECT_NE(reloaded->favoriteOrder(), 0.1);
  EXPECT_NEAR(reloaded->favoriteOrder(), 0.1, 1e-7);
}

TEST_F(KRDBEntityFavoriteAliasTest, ResetToDefaultStatePostsOnlyWhenTheAliasWasAFavorite) {
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord(dbcore::kDBImageType, 1));
  const auto observer = KREntityObserverRecorder::observing(*alias);
  alias->resetToDefaultState();
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBEntityFavoriteAliasDidChangeFavorite", true}}));
  EXPECT_FALSE(alias->dbalias()->favorite);
  EXPECT_EQ(alias->favoriteOrder(), 2.5);
  observer->events.clear();
  alias->resetToDefaultState();
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntityFavoriteAliasTest, TheOriginalEntityIsItsNecessaryLink) {
  EXPECT_EQ(KRDBEntityFavoriteAlias::necessaryLinkedEntitiesKeys(),
            std::vector<std::string>{"originalEntityPrimitive"});
  EXPECT_EQ(KRDBEntityFavoriteAlias::reverseKeyForNecessaryKey("originalEntityPrimitive"),
            "favoriteAliasPrimitive");
  EXPECT_EQ(KRDBEntityFavoriteAlias::reverseKeyForNecessaryKey("favorite"), "");
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord(dbcore::kDBImageType, 1));
  EXPECT_TRUE(alias->needFetchNecessaryEntities());
  const auto image = KRDBImage::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  alias->updateNecessaryEntityForKey("originalEntityPrimitive", image);
  EXPECT_EQ(alias->originalEntity(), image);
  EXPECT_EQ(image->favoriteAliasPrimitive(), alias);
  EXPECT_FALSE(alias->needFetchNecessaryEntities());
}

TEST_F(KRDBEntityFavoriteAliasTest, ResetDropsTheOriginalEntity) {
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord(dbcore::kDBImageType, 1));
  const auto image = KRDBImage::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  alias->setOriginalEntityPrimitive(image);
  alias->reset();
  EXPECT_FALSE(alias->originalEntityPrimitive());
}

TEST_F(KRDBEntityFavoriteAliasTest, FieldsAreReachedByKey) {
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord(dbcore::kDBImageType, 1));
  EXPECT_EQ(alias->valueForKey("favorite"), KRValue(true));
  alias->setValueForKey(false, "favorite");
  EXPECT_FALSE(alias->isFavorite());
  alias->setValueForKey(4.0, "favoriteOrder");
  EXPECT_EQ(alias->valueForKey("favoriteOrder"), KRValue(4.0));
  EXPECT_EQ(alias->valueForKey("originalEntityID").object(), alias->originalEntityID());
}

}  // namespace
