#include "dbstatement.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <string>

#include "dbexception.hpp"

using namespace dbcore;

namespace {

// An in-memory database with one table of untyped values.
class DBStatementTest : public testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(sqlite3_open(":memory:", &db), SQLITE_OK);
    ASSERT_EQ(sqlite3_exec(db, "CREATE TABLE t(v, u UNIQUE)", nullptr, nullptr, nullptr), SQLITE_OK);
  }
  void TearDown() override { sqlite3_close_v2(db); }

  // The SQLite type name and text of `value` once stored as the table's only row.
  std::pair<std::string, std::string> storedVariant(const TVariant& value) {
    DBStatement(db, "DELETE FROM t").execute();
    DBStatement(db, "INSERT INTO t(v) VALUES (?)").bind(1, value).execute();
    DBStatement select(db, "SELECT typeof(v), v FROM t");
    EXPECT_TRUE(select.step());
    return {select.columnText(0), select.columnText(1)};
  }

  // The exception of a statement that fails, or a default one with an empty description.
  template <class F>
  static DBException failureOf(F&& action) {
    try {
      action();
    } catch (const DBException& exception) {
      return exception;
    }
    return DBException("", 0);
  }

  sqlite3* db = nullptr;
};

}  // namespace

TEST_F(DBStatementTest, Int64RoundTripsAtTheLimits) {
  DBStatement statement(db, "SELECT ?, ?");
  statement.bind(1, std::numeric_limits<int64_t>::min()).bind(2, std::numeric_limits<int64_t>::max());
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnInt64(0), std::numeric_limits<int64_t>::min());
  EXPECT_EQ(statement.columnInt64(1), std::numeric_limits<int64_t>::max());
  EXPECT_FALSE(statement.step());
}

TEST_F(DBStatementTest, TextRoundTripsWithEveryByte) {
  const std::string text("\xc3\x89t\xc3\xa9\0after", 12);
  DBStatement statement(db, "SELECT ?, 2.5");
  statement.bind(1, text);
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnText(0), text);
  EXPECT_EQ(statement.columnDouble(1), 2.5);
}

TEST_F(DBStatementTest, DoubleAndWideTextBindWithoutAVariant) {
  DBStatement statement(db, "SELECT ?, ?, typeof(?), ?");
  statement.bindDouble(1, 0.1).bindWide(2, L"\u00e9\U0001F600").bindDouble(3, 2.0).bindWide(4, L"second");
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnDouble(0), 0.1);
  EXPECT_EQ(statement.columnText(1), "\xc3\xa9\xf0\x9f\x98\x80");
  EXPECT_EQ(statement.columnText(2), "real");
  EXPECT_EQ(statement.columnText(3), "second");
}

TEST_F(DBStatementTest, NullReadsAsNullEmptyTextAndZero) {
  DBStatement statement(db, "SELECT ?, 0");
  statement.bindNull(1);
  ASSERT_TRUE(statement.step());
  EXPECT_TRUE(statement.columnIsNull(0));
  EXPECT_FALSE(statement.columnIsNull(1));
  EXPECT_EQ(statement.columnText(0), "");
  EXPECT_EQ(statement.columnInt64(0), 0);
}

TEST_F(DBStatementTest, ColumnReadsEachFieldType) {
  DBStatement statement(db, "SELECT 2, -5, 1099511627776, 0.1, 'abc', '\xc3\xa9\xf0\x9f\x98\x80', 3");
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.column(0, FieldType::T_BOOL), TVariant(true));
  EXPECT_EQ(statement.column(1, FieldType::T_INT), TVariant(int32_t{-5}));
  EXPECT_EQ(statement.column(1, FieldType::T_UINT), TVariant(int32_t{-5}));
  EXPECT_EQ(statement.column(2, FieldType::T_INT_64), TVariant(int64_t{1} << 40));
  EXPECT_EQ(statement.column(3, FieldType::T_FLOAT), TVariant(0.1f));
  EXPECT_EQ(statement.column(4, FieldType::T_TEXT), TVariant(std::string("abc")));
  EXPECT_EQ(statement.column(5, FieldType::T_WIDE_TEXT), TVariant(std::wstring(L"\u00e9\U0001F600")));
  EXPECT_EQ(statement.column(6, FieldType::T_NONE), TVariant());
}

TEST_F(DBStatementTest, ResetRewindsAndClearsBindings) {
  DBStatement statement(db, "SELECT ? IS NULL");
  statement.bind(1, int64_t{4});
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnInt64(0), 0);
  statement.reset();
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnInt64(0), 1);
}

TEST_F(DBStatementTest, BindOfEachVariantTypeStoresItsSQLiteType) {
  EXPECT_EQ(storedVariant(TVariant(true)), std::make_pair(std::string("integer"), std::string("1")));
  EXPECT_EQ(storedVariant(TVariant(int32_t{-3})), std::make_pair(std::string("integer"), std::string("-3")));
  EXPECT_EQ(storedVariant(TVariant(int64_t{1} << 40)),
            std::make_pair(std::string("integer"), std::string("1099511627776")));
  EXPECT_EQ(storedVariant(TVariant(2.5f)), std::make_pair(std::string("real"), std::string("2.5")));
  EXPECT_EQ(storedVariant(TVariant(std::string("abc"))),
            std::make_pair(std::string("text"), std::string("abc")));
  EXPECT_EQ(storedVariant(TVariant(std::wstring(L"\u00e9"))),
            std::make_pair(std::string("text"), std::string("\xc3\xa9")));
  EXPECT_EQ(storedVariant(TVariant()), std::make_pair(std::string("null"), std::string()));
}

TEST_F(DBStatementTest, PrepareErrorThrowsWithSQLiteCode) {
  const DBException syntax = failureOf([this] { DBStatement(db, "SELEC 1"); });
  EXPECT_EQ(syntax.code(), SQLITE_ERROR);
  EXPECT_NE(std::string(syntax.what()).find("syntax error"), std::string::npos) << syntax.what();
  const DBException missing = failureOf([this] { DBStatement(db, "SELECT * FROM missing"); });
  EXPECT_EQ(missing.code(), SQLITE_ERROR);
  EXPECT_NE(std::string(missing.what()).find("no such table"), std::string::npos) << missing.what();
}

TEST_F(DBStatementTest, ConstraintErrorFromStepThrowsAndLeavesTheStatementReusable) {
  DBStatement insert(db, "INSERT INTO t(u) VALUES (?)");
  insert.bind(1, int64_t{1}).execute();
  insert.reset().bind(1, int64_t{1});
  const DBException exception = failureOf([&insert] { insert.step(); });
  EXPECT_EQ(exception.code() & 0xff, SQLITE_CONSTRAINT);
  EXPECT_EQ(exception.code(), SQLITE_CONSTRAINT_UNIQUE);
  insert.reset().bind(1, int64_t{2}).execute();
  DBStatement count(db, "SELECT count(*) FROM t");
  ASSERT_TRUE(count.step());
  EXPECT_EQ(count.columnInt64(0), 2);
}

TEST_F(DBStatementTest, BindOutsideTheParametersThrowsRangeError) {
  DBStatement statement(db, "SELECT ?");
  EXPECT_EQ(failureOf([&statement] { statement.bind(2, int64_t{1}); }).code(), SQLITE_RANGE);
  EXPECT_EQ(failureOf([&statement] { statement.bind(0, std::string("x")); }).code(), SQLITE_RANGE);
}

TEST_F(DBStatementTest, NaNBindsNullAndInfinitiesBindAsReals) {
  DBStatement statement(db, "SELECT typeof(?), typeof(?), ?, ?, typeof(?)");
  const double infinity = std::numeric_limits<double>::infinity();
  statement.bindDouble(1, std::nan(""))
      .bindDouble(2, infinity)
      .bindDouble(3, infinity)
      .bindDouble(4, -infinity);
  statement.bind(5, TVariant(std::numeric_limits<float>::quiet_NaN()));
  ASSERT_TRUE(statement.step());
  EXPECT_EQ(statement.columnText(0), "null");
  EXPECT_EQ(statement.columnText(1), "real");
  EXPECT_EQ(statement.columnDouble(2), infinity);
  EXPECT_EQ(statement.columnDouble(3), -infinity);
  EXPECT_EQ(statement.columnText(4), "null");
}

TEST_F(DBStatementTest, FloatColumnReadsNullAsNaNAndKeepsInfinities) {
  DBStatement statement(db, "SELECT NULL, 9e999, -9e999, NULL");
  ASSERT_TRUE(statement.step());
  EXPECT_TRUE(std::isnan(statement.column(0, FieldType::T_FLOAT).asFloat()));
  EXPECT_EQ(statement.column(1, FieldType::T_FLOAT), TVariant(std::numeric_limits<float>::infinity()));
  EXPECT_EQ(statement.column(2, FieldType::T_FLOAT), TVariant(-std::numeric_limits<float>::infinity()));
  EXPECT_EQ(statement.column(3, FieldType::T_INT_64), TVariant(int64_t{0}));
}
