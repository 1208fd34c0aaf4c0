#include "dbselectplan.hpp"

#include <gtest/gtest.h>

#include "DBClauseTestSupport.hpp"
#include "dbclausecompiler.hpp"

using namespace dbcore;
using namespace clausetest;

namespace {

DBClauseProgram programOf(const std::string& table, Node tree) {
  return DBClauseCompiler(table).compile({std::move(tree)});
}

}  // namespace

TEST(DBSelectPlanTest, NoConditionOnlyOrders) {
  const DBSelectPlan plan("paths", DBClauseProgram(), 0, {});
  EXPECT_EQ(plan.tail(), " ORDER BY paths._id_int_64");
  EXPECT_EQ(plan.parameters().size(), 0u);
  EXPECT_FALSE(plan.selectsNothing());
}

TEST(DBSelectPlanTest, JoinsTheRelatedTablesTheConditionsRead) {
  const DBSelectPlan plan(
      "images", programOf("images", ge(other("image_user_attributes", "rating"), int32(3))), 0b100, {});
  EXPECT_EQ(plan.tail(),
            " JOIN image_user_attributes ON image_user_attributes.image_id_int_64 = images._id_int_64"
            " JOIN image_exiv_attributes ON image_exiv_attributes.image_id_int_64 = images._id_int_64"
            " WHERE image_user_attributes.rating >= ? ORDER BY images._id_int_64");
  EXPECT_EQ(plan.joinedSlots(), 0b110u);
}

TEST(DBSelectPlanTest, RestrictionsFollowTheClausesWithTheirParameters) {
  const DBSelectPlan plan(
      "images", programOf("images", eq(source("width"), int32(3))), 0,
      {{"a = ?", {TVariant(int64_t{7})}}, {"b IN (?, ?)", {TVariant(std::string("x")), TVariant()}}});
  EXPECT_EQ(plan.tail(), " WHERE images.width = ? AND a = ? AND b IN (?, ?) ORDER BY images._id_int_64");
  ASSERT_EQ(plan.parameters().size(), 4u);
  EXPECT_EQ(plan.parameters()[0].asInteger(), 3);
  EXPECT_EQ(plan.parameters()[1].asInteger(), 7);
  EXPECT_EQ(plan.parameters()[2].asText(), "x");
  EXPECT_TRUE(plan.parameters()[3].isNull());
}

TEST(DBSelectPlanTest, RejectedProgramSelectsNothing) {
  const DBSelectPlan plan("images", programOf("images", eq(source("nope"), int32(3))), 0, {});
  EXPECT_TRUE(plan.selectsNothing());
}
