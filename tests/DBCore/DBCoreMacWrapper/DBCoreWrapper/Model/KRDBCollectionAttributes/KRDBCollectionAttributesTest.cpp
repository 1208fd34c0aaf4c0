#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
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

}  // namespace
