#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KRFolderAttributesChecks.hpp"
#include "dbreffolderattrib.hpp"

namespace {

using Checks =
    KREntityClassChecks<KRDBSmartFilterAttributes, dbcore::DBSmartFilterAttrib, dbcore::DBRefFolderAttrib>;

TEST(KRDBSmartFilterAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBSmartFilterAttributes::entityType(), 12);
  EXPECT_EQ(KRDBSmartFilterAttributes::dbEntityType(), 13);
}

TEST(KRDBSmartFilterAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBSmartFilterAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBSmartFilterAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBSmartFilterAttributesTest, NoRecordOrAForeignRecordIsRefused) {
  Checks::expectForeignRecordsRefused();
}

using Fields = KRFolderAttributesChecks<KRDBSmartFilterAttributes, dbcore::DBSmartFilterAttrib>;

TEST(KRDBSmartFilterAttributesTest, TheRecordGivesTheFields) { Fields::expectLoadedFromRecord(); }

TEST(KRDBSmartFilterAttributesTest, TheStoreHookTakesAFresherRecord) { Fields::expectStoreHookReloads(); }

TEST(KRDBSmartFilterAttributesTest, StoredFieldsFollowTheSetterProtocol) {
  Fields::expectSettersFollowTheProtocol();
}

TEST(KRDBSmartFilterAttributesTest, FilterTypeSetsAreComparedByIdentity) {
  Fields::expectSetsComparedByIdentity();
}

TEST(KRDBSmartFilterAttributesTest, TheFavoriteFlagIsNeitherStoredNorPosted) {
  const auto attributes = Fields::entity();
  const auto observer = KREntityObserverRecorder::observing(*attributes);
  attributes->setFavorite(true);
  EXPECT_TRUE(attributes->isFavorite());
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(attributes->isDbEntityChanged());
  EXPECT_TRUE(attributes->storeInfoFromDBentity(attributes->dbentity()));
  EXPECT_TRUE(attributes->isFavorite());
}

}  // namespace
