#include "Model/KRDBImageState/KRDBImageState.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbimage.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBImageState, dbcore::DBImgHistoryState, dbcore::DBImage>;

TEST(KRDBImageStateTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageState::entityType(), 10);
  EXPECT_EQ(KRDBImageState::dbEntityType(), 6);
}

TEST(KRDBImageStateTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageStateTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageStateTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBImageStateTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
