#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KRFolderAttributesChecks.hpp"
#include "dbfilterattrib.hpp"

namespace {

using Checks =
    KREntityClassChecks<KRDBRefFolderAttributes, dbcore::DBRefFolderAttrib, dbcore::DBFilterAttrib>;

TEST(KRDBRefFolderAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBRefFolderAttributes::entityType(), 7);
  EXPECT_EQ(KRDBRefFolderAttributes::dbEntityType(), 9);
}

TEST(KRDBRefFolderAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBRefFolderAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBRefFolderAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBRefFolderAttributesTest, NoRecordOrAForeignRecordIsRefused) {
  Checks::expectForeignRecordsRefused();
}

using Fields = KRFolderAttributesChecks<KRDBRefFolderAttributes, dbcore::DBRefFolderAttrib>;

TEST(KRDBRefFolderAttributesTest, TheRecordGivesTheFields) { Fields::expectLoadedFromRecord(); }

TEST(KRDBRefFolderAttributesTest, TheStoreHookTakesAFresherRecord) { Fields::expectStoreHookReloads(); }

TEST(KRDBRefFolderAttributesTest, StoredFieldsFollowTheSetterProtocol) {
  Fields::expectSettersFollowTheProtocol();
}

TEST(KRDBRefFolderAttributesTest, FilterTypeSetsAreComparedByIdentity) {
  Fields::expectSetsComparedByIdentity();
}

}  // namespace
