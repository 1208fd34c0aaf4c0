#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
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

}  // namespace
