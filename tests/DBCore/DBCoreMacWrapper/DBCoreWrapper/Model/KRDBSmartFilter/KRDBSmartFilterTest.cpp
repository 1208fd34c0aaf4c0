#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbfilter.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBSmartFilter, dbcore::DBSmartFilter, dbcore::DBFilter>;

TEST(KRDBSmartFilterTest, TypeNumbers) {
  EXPECT_EQ(KRDBSmartFilter::entityType(), 11);
  EXPECT_EQ(KRDBSmartFilter::dbEntityType(), 12);
}

TEST(KRDBSmartFilterTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBSmartFilterTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBSmartFilterTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBSmartFilterTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
