#include "dbassert.hpp"

#include <gtest/gtest.h>

TEST(DBAssertTest, PassesOnTrueEvaluatingTheExpressionOnce) {
  int evaluations = 0;
  DB_ASSERT(++evaluations == 1);
  EXPECT_EQ(evaluations, 1);
}

TEST(DBAssertDeathTest, DiesWithTheExpressionTextFileAndLine) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const int answer = 42;
  EXPECT_DEATH(DB_ASSERT(answer == 41),
               "dbcore assertion failed: answer == 41 \\(.*DBAssertTest\\.cpp:[0-9]+\\)");
  EXPECT_DEATH(dbcore::assertionFailed("x > 0", "file.cpp", 7), "x > 0 \\(file\\.cpp:7\\)");
}
