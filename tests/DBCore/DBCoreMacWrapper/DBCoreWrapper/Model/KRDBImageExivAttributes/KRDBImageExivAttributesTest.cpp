#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbuserimgattrib.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBImageExivAttributes, dbcore::DBExivImgAttrib, dbcore::DBUserImgAttrib>;

TEST(KRDBImageExivAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageExivAttributes::entityType(), 6);
  EXPECT_EQ(KRDBImageExivAttributes::dbEntityType(), 5);
}

TEST(KRDBImageExivAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageExivAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageExivAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBImageExivAttributesTest, NoRecordOrAForeignRecordIsRefused) {
  Checks::expectForeignRecordsRefused();
}

}  // namespace
