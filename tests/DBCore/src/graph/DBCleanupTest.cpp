#include "dbcleanup.hpp"

#include <gtest/gtest.h>

#include <set>
#include <string>

#include "DBConnectionTestSupport.hpp"
#include "dblinks.hpp"
#include "dbrecords.hpp"
#include "dbstates.hpp"

using namespace dbcore;

namespace {

// A small catalog with one used and one dangling record of each kind the conditions are about.
class DBCleanupTest : public DBCatalogTestBase {
 protected:
  void SetUp() override {
    DBCatalogTestBase::SetUp();
    const int64_t image = saved(DBImage())->id();
    folderPath = saved(DBPath())->id();
    DBLinks::setFolder(*connection, image, folderPath);
    saved(DBImage());  // in no folder: its NULL folder must not hide every dangling path
    referencedPath = saved(DBPath())->id();
    DBRefFolder folder;
    folder.path_id = referencedPath;
    saved(folder);
    danglingPath = saved(DBPath())->id();

    const auto listed = std::make_shared<DBImgHistoryState>();
    DBStates::replace(*connection, image, {listed}, 0);
    listedState = listed->id();
    danglingState = saved(DBImgHistoryState())->id();
    DBStates::bindResources(*connection, listedState, {L"used"});
    usedResource = *queryIds("SELECT resource_id FROM state_resources").begin();
    DBResource unused;
    unused.name = L"unused";
    danglingResource = saved(unused)->id();
  }

  // The ids of the table's rows that the condition selects.
  std::set<long long> selected(const std::string& table, const char* condition) {
    return queryIds("SELECT _id_int_64 FROM " + table + " WHERE " + condition);
  }

  // Deletes with the condition and returns the ids left in the table.
  std::set<long long> leftAfterDelete(const char* table, const char* condition) {
    connection->exec(DBCleanup::deleteWhere(table, condition));
    return queryIds(std::string("SELECT _id_int_64 FROM ") + table);
  }

  long long folderPath = 0;
  long long referencedPath = 0;
  long long danglingPath = 0;
  long long listedState = 0;
  long long danglingState = 0;
  long long usedResource = 0;
  long long danglingResource = 0;
};

}  // namespace

TEST_F(DBCleanupTest, DeleteWhereJoinsTableAndCondition) {
  EXPECT_EQ(DBCleanup::deleteWhere("paths", "x = 1"), "DELETE FROM paths WHERE x = 1");
}

TEST_F(DBCleanupTest, DanglingPathsAreThoseNoImageOrReferencedFolderUses) {
  EXPECT_EQ(selected("paths", DBCleanup::kDanglingPathsCondition), (std::set<long long>{danglingPath}));
  EXPECT_EQ(leftAfterDelete("paths", DBCleanup::kDanglingPathsCondition),
            (std::set<long long>{folderPath, referencedPath}));
}

TEST_F(DBCleanupTest, DanglingStatesAreThoseNoImageLists) {
  EXPECT_EQ(selected("image_history_states", DBCleanup::kDanglingStatesCondition),
            (std::set<long long>{danglingState}));
  EXPECT_EQ(leftAfterDelete("image_history_states", DBCleanup::kDanglingStatesCondition),
            (std::set<long long>{listedState}));
}

TEST_F(DBCleanupTest, DanglingResourcesAreThoseNoStateUses) {
  EXPECT_EQ(selected("history_resources", DBCleanup::kDanglingResourcesCondition),
            (std::set<long long>{danglingResource}));
  EXPECT_EQ(leftAfterDelete("history_resources", DBCleanup::kDanglingResourcesCondition),
            (std::set<long long>{usedResource}));
}
