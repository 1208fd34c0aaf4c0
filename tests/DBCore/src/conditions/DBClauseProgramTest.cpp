#include "dbclauseprogram.hpp"

#include <gtest/gtest.h>

using namespace dbcore;

TEST(DBClauseProgramTest, DefaultProgramHoldsForEveryRecord) {
  const DBClauseProgram program;
  EXPECT_FALSE(program.rejected());
  EXPECT_FALSE(program.hasCondition());
  EXPECT_TRUE(program.sql().empty());
  EXPECT_EQ(program.literals().size(), 0u);
  EXPECT_TRUE(program.aggregateSql().empty());
  EXPECT_EQ(program.relatedSlots(), 0u);
}
