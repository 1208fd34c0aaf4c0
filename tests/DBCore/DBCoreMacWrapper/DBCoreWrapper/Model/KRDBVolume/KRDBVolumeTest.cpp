#include "Model/KRDBVolume/KRDBVolume.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbpath.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBVolume, dbcore::DBVolume, dbcore::DBPath>;

TEST(KRDBVolumeTest, TypeNumbers) {
  EXPECT_EQ(KRDBVolume::entityType(), 13);
  EXPECT_EQ(KRDBVolume::dbEntityType(), 15);
}

TEST(KRDBVolumeTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBVolumeTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBVolumeTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBVolumeTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
