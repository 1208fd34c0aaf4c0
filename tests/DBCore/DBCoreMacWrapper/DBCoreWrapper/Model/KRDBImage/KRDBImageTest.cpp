#include "Model/KRDBImage/KRDBImage.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbfilter.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBImage, dbcore::DBImage, dbcore::DBFilter>;

TEST(KRDBImageTest, TypeNumbers) {
  EXPECT_EQ(KRDBImage::entityType(), 1);
  EXPECT_EQ(KRDBImage::dbEntityType(), 1);
}

TEST(KRDBImageTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBImageTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
