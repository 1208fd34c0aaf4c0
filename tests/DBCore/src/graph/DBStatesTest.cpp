#include "dbstates.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "DBConnectionTestSupport.hpp"
#include "dbimage.hpp"

using namespace dbcore;

namespace {

using StateList = std::vector<std::shared_ptr<DBImgHistoryState>>;

class DBStatesTest : public DBCatalogTestBase {
 protected:
  void SetUp() override {
    DBCatalogTestBase::SetUp();
    imageId = saved(DBImage())->id();
  }

  static StateList unsavedStates(int count) {
    StateList list;
    for (int i = 0; i < count; ++i) {
      list.push_back(std::make_shared<DBImgHistoryState>());
      list.back()->action_name = L"step " + std::to_wstring(i);
    }
    return list;
  }

  std::vector<long long> stateIds() { return ids(DBStates::states(*connection, imageId)); }

  long long currentId() {
    const auto current = DBStates::currentState(*connection, imageId);
    return current ? current->id() : 0;
  }

  long long savedState() { return saved(DBImgHistoryState())->id(); }

  std::set<long long> resourcesOf(long long stateId) {
    return queryIds("SELECT resource_id FROM state_resources WHERE state_id = " + std::to_string(stateId));
  }

  int64_t imageId = 0;
};

}  // namespace

TEST_F(DBStatesTest, StatesComeInListOrderNotIdOrder) {
  StateList list = unsavedStates(3);
  DBStates::replace(*connection, imageId, list, 1);
  EXPECT_EQ(stateIds(), ids(list));
  EXPECT_EQ(currentId(), list[1]->id());
  std::reverse(list.begin(), list.end());
  DBStates::replace(*connection, imageId, list, 0);
  EXPECT_EQ(stateIds(), ids(list));
  EXPECT_EQ(currentId(), list[0]->id());
}

TEST_F(DBStatesTest, ReplaceWritesUnsavedStates) {
  const StateList list = unsavedStates(2);
  DBStates::replace(*connection, imageId, list, -1);
  ASSERT_TRUE(list[0]->is_saved() && list[1]->is_saved());
  const auto stored = DBRecordIO::get<DBImgHistoryState>(*connection, list[1]->id());
  ASSERT_TRUE(stored);
  EXPECT_EQ(stored->action_name, L"step 1");
}

TEST_F(DBStatesTest, ReplaceDropsTheOldListAndMinusOneMeansNoCurrent) {
  const StateList first = unsavedStates(2);
  DBStates::replace(*connection, imageId, first, 0);
  const StateList second{first[1], std::make_shared<DBImgHistoryState>()};
  DBStates::replace(*connection, imageId, second, -1);
  EXPECT_EQ(stateIds(), ids(second));
  EXPECT_EQ(currentId(), 0);
}

TEST_F(DBStatesTest, SetCurrentAppendsANewStateAndKeepsAListedOne) {
  const StateList list = unsavedStates(2);
  DBStates::replace(*connection, imageId, list, 0);
  const auto appended = std::make_shared<DBImgHistoryState>();
  DBStates::setCurrent(*connection, imageId, appended);
  ASSERT_TRUE(appended->is_saved());
  EXPECT_EQ(stateIds(), (std::vector<long long>{list[0]->id(), list[1]->id(), appended->id()}));
  EXPECT_EQ(currentId(), appended->id());
  DBStates::setCurrent(*connection, imageId, list[1]);
  EXPECT_EQ(stateIds(), (std::vector<long long>{list[0]->id(), list[1]->id(), appended->id()}));
  EXPECT_EQ(currentId(), list[1]->id());
}

TEST_F(DBStatesTest, SetCurrentToNothingLeavesNoCurrentState) {
  DBStates::replace(*connection, imageId, unsavedStates(2), 1);
  DBStates::setCurrent(*connection, imageId, nullptr);
  EXPECT_EQ(currentId(), 0);
  EXPECT_EQ(stateIds().size(), 2u);
}

TEST_F(DBStatesTest, BindResourcesReusesAResourceByName) {
  const long long first = savedState();
  const long long second = savedState();
  DBStates::bindResources(*connection, first, {L"mask.png", L"curve.xml"});
  DBStates::bindResources(*connection, second, {L"curve.xml", L"lut.cube", L"lut.cube"});
  EXPECT_EQ(connection->queryInt64("SELECT count(*) FROM history_resources"), 3);
  const std::set<long long> shared =
      queryIds("SELECT _id_int_64 FROM history_resources WHERE name_wide_ch = 'curve.xml'");
  ASSERT_EQ(shared.size(), 1u);
  EXPECT_EQ(resourcesOf(first).count(*shared.begin()), 1u);
  EXPECT_EQ(resourcesOf(second).count(*shared.begin()), 1u);
  EXPECT_EQ(resourcesOf(second).size(), 2u);
}

TEST_F(DBStatesTest, CopyResourcesAddsTheBaseStatesResources) {
  const long long base = savedState();
  const long long copy = savedState();
  DBStates::bindResources(*connection, base, {L"a", L"b"});
  DBStates::bindResources(*connection, copy, {L"b", L"c"});
  DBStates::copyResources(*connection, copy, base);
  DBStates::copyResources(*connection, copy, base);
  EXPECT_EQ(resourcesOf(copy).size(), 3u);
  EXPECT_EQ(resourcesOf(base).size(), 2u);
  EXPECT_EQ(connection->queryInt64("SELECT count(*) FROM history_resources"), 3);
}

TEST_F(DBStatesTest, AllCurrentStatesHoldEveryImageWithACurrentStateOnly) {
  const int64_t other = saved(DBImage())->id();
  const int64_t without = saved(DBImage())->id();
  StateList list = unsavedStates(2);
  DBStates::replace(*connection, imageId, list, 1);
  StateList otherList = unsavedStates(1);
  DBStates::replace(*connection, other, otherList, 0);
  DBStates::replace(*connection, without, unsavedStates(1), -1);
  const auto current = DBStates::allCurrentStates(*connection);
  ASSERT_EQ(current.size(), 2u);
  EXPECT_EQ(current.at(imageId)->id(), list[1]->id());
  EXPECT_EQ(current.at(imageId)->action_name, L"step 1");
  EXPECT_EQ(current.at(other)->id(), otherList[0]->id());
}

TEST_F(DBStatesTest, AllCurrentStatesOfAnEmptyCatalogAreNone) {
  EXPECT_TRUE(DBStates::allCurrentStates(*connection).empty());
}
