#include "dbstatementlease.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <memory>
#include <utility>

#include "dbexception.hpp"

using namespace dbcore;

namespace {

class DBStatementLeaseTest : public testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(sqlite3_open(":memory:", &db), SQLITE_OK);
    statement = std::make_unique<DBStatement>(db, "SELECT ? UNION ALL SELECT 2");
  }
  void TearDown() override {
    statement.reset();
    sqlite3_close(db);
  }

  sqlite3* db = nullptr;
  std::unique_ptr<DBStatement> statement;
};

}  // namespace

TEST_F(DBStatementLeaseTest, MarksTheStatementLentWhileItLives) {
  {
    const DBStatementLease lease(*statement);
    EXPECT_TRUE(statement->leased());
    EXPECT_EQ(&*lease, statement.get());
  }
  EXPECT_FALSE(statement->leased());
}

TEST_F(DBStatementLeaseTest, RefusesAStatementThatIsAlreadyLent) {
  const DBStatementLease lease(*statement);
  EXPECT_THROW(DBStatementLease second(*statement), DBException);
  EXPECT_TRUE(statement->leased());
}

TEST_F(DBStatementLeaseTest, EndingResetsAndClearsTheBindings) {
  {
    const DBStatementLease lease(*statement);
    lease->bind(1, int64_t{7});
    ASSERT_TRUE(lease->step());
    EXPECT_EQ(lease->columnInt64(0), 7);
  }
  const DBStatementLease again(*statement);
  ASSERT_TRUE(again->step());
  EXPECT_TRUE(again->columnIsNull(0));
}

TEST_F(DBStatementLeaseTest, AMovedLeaseGivesTheStatementBackOnce) {
  auto first = std::make_unique<DBStatementLease>(*statement);
  DBStatementLease moved(std::move(*first));
  first.reset();
  EXPECT_TRUE(statement->leased());
  EXPECT_EQ(&*moved, statement.get());
}
