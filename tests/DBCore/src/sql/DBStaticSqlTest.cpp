#include "dbstaticsql.hpp"

#include <gtest/gtest.h>

using namespace dbcore;

TEST(DBStaticSqlTest, KeepsItsTextAndHasASlotOfItsOwn) {
  static const DBStaticSql first("SELECT 1");
  static const DBStaticSql second("SELECT 1");
  EXPECT_EQ(first.text(), "SELECT 1");
  EXPECT_EQ(second.text(), "SELECT 1");
  EXPECT_NE(first.slot(), second.slot());
}
