#include "dbexception.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <exception>

using dbcore::DBException;

TEST(DBExceptionTest, WithoutACodeHasNoCode) {
  const DBException exception("The catalog is not open");
  EXPECT_STREQ(exception.what(), "The catalog is not open");
  EXPECT_EQ(exception.code(), DBException::kNoCode);
  EXPECT_EQ(DBException::kNoCode, -1);
}

TEST(DBExceptionTest, KeepsItsCodeWhenCaughtAsStdException) {
  try {
    throw DBException("constraint failed", SQLITE_CONSTRAINT_UNIQUE);
  } catch (const std::exception& caught) {
    EXPECT_STREQ(caught.what(), "constraint failed");
    const auto* exception = dynamic_cast<const DBException*>(&caught);
    ASSERT_NE(exception, nullptr);
    EXPECT_EQ(exception->code(), SQLITE_CONSTRAINT_UNIQUE);
  }
}
