#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbexivimgattrib.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBImageAttributes, dbcore::DBUserImgAttrib, dbcore::DBExivImgAttrib>;

TEST(KRDBImageAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageAttributes::entityType(), 5);
  EXPECT_EQ(KRDBImageAttributes::dbEntityType(), 4);
}

TEST(KRDBImageAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBImageAttributesTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
