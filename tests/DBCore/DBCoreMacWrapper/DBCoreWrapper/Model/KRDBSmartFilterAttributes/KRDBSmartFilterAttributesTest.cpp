#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
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

}  // namespace
