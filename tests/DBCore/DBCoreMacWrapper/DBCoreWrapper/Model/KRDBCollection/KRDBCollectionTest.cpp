#include "Model/KRDBCollection/KRDBCollection.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbsmartfilter.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBCollection, dbcore::DBFilter, dbcore::DBSmartFilter>;

TEST(KRDBCollectionTest, TypeNumbers) {
  EXPECT_EQ(KRDBCollection::entityType(), 2);
  EXPECT_EQ(KRDBCollection::dbEntityType(), 2);
}

TEST(KRDBCollectionTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBCollectionTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBCollectionTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBCollectionTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
