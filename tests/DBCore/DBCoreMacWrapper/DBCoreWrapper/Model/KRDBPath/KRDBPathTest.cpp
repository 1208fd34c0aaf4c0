#include "Model/KRDBPath/KRDBPath.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbreffolder.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBPath, dbcore::DBPath, dbcore::DBRefFolder>;

TEST(KRDBPathTest, TypeNumbers) {
  EXPECT_EQ(KRDBPath::entityType(), 4);
  EXPECT_EQ(KRDBPath::dbEntityType(), 8);
}

TEST(KRDBPathTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBPathTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBPathTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBPathTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
