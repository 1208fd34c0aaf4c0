#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KRFolderAttributesChecks.hpp"
#include "dbsmartfilterattrib.hpp"

namespace {

using Checks =
    KREntityClassChecks<KRDBCollectionAttributes, dbcore::DBFilterAttrib, dbcore::DBSmartFilterAttrib>;

TEST(KRDBCollectionAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBCollectionAttributes::entityType(), 8);
  EXPECT_EQ(KRDBCollectionAttributes::dbEntityType(), 10);
}

TEST(KRDBCollectionAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBCollectionAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBCollectionAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBCollectionAttributesTest, NoRecordOrAForeignRecordIsRefused) {
  Checks::expectForeignRecordsRefused();
}

using Fields = KRFolderAttributesChecks<KRDBCollectionAttributes, dbcore::DBFilterAttrib>;

TEST(KRDBCollectionAttributesTest, TheRecordGivesTheFields) { Fields::expectLoadedFromRecord(); }

TEST(KRDBCollectionAttributesTest, TheStoreHookTakesAFresherRecord) { Fields::expectStoreHookReloads(); }

TEST(KRDBCollectionAttributesTest, StoredFieldsFollowTheSetterProtocol) {
  Fields::expectSettersFollowTheProtocol();
}

TEST(KRDBCollectionAttributesTest, FilterTypeSetsAreComparedByIdentity) {
  Fields::expectSetsComparedByIdentity();
}

}  // namespace
