#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "dbpath.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBReferencedFolder, dbcore::DBRefFolder, dbcore::DBPath>;

TEST(KRDBReferencedFolderTest, TypeNumbers) {
  EXPECT_EQ(KRDBReferencedFolder::entityType(), 3);
  EXPECT_EQ(KRDBReferencedFolder::dbEntityType(), 7);
}

TEST(KRDBReferencedFolderTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBReferencedFolderTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBReferencedFolderTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBReferencedFolderTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

}  // namespace
