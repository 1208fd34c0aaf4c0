#include "dbstatementcache.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <string>

#include "dbexception.hpp"
#include "dbstatementlease.hpp"

using namespace dbcore;

namespace {

class DBStatementCacheTest : public testing::Test {
 protected:
  void SetUp() override { ASSERT_EQ(sqlite3_open(":memory:", &db), SQLITE_OK); }
  void TearDown() override {
    cache.reset();
    sqlite3_close(db);
  }

  static std::string generated(std::size_t n) { return "SELECT " + std::to_string(n); }

  // The number of statements SQLite holds for the connection.
  int preparedStatements() const {
    int count = 0;
    for (sqlite3_stmt* s = sqlite3_next_stmt(db, nullptr); s; s = sqlite3_next_stmt(db, s)) ++count;
    return count;
  }

  sqlite3* db = nullptr;
  std::unique_ptr<DBStatementCache> cache = nullptr;
};

}  // namespace

TEST_F(DBStatementCacheTest, StaticSqlIsPreparedOnceForTheLifeOfTheCache) {
  cache = std::make_unique<DBStatementCache>(db);
  static const DBStaticSql kSql("SELECT 42");
  DBStatement& first = cache->statement(kSql);
  EXPECT_EQ(&cache->statement(kSql), &first);
  EXPECT_EQ(cache->generatedCount(), 0u);
}

TEST_F(DBStatementCacheTest, GeneratedSqlIsBoundedAndTheLeastRecentlyUsedGoesFirst) {
  cache = std::make_unique<DBStatementCache>(db);
  DBStatement& kept = cache->statement(generated(0));
  for (std::size_t n = 1; n <= DBStatementCache::kGeneratedCapacity + 100; ++n) {
    cache->statement(generated(n));
    EXPECT_EQ(&cache->statement(generated(0)), &kept) << n;  // used again, so never the oldest
  }
  EXPECT_EQ(cache->generatedCount(), DBStatementCache::kGeneratedCapacity);
  EXPECT_EQ(preparedStatements(), static_cast<int>(DBStatementCache::kGeneratedCapacity));
}

TEST_F(DBStatementCacheTest, ALentStatementIsNotEvicted) {
  cache = std::make_unique<DBStatementCache>(db);
  const DBStatementLease lent(cache->statement(generated(0)));
  for (std::size_t n = 1; n <= DBStatementCache::kGeneratedCapacity + 10; ++n) cache->statement(generated(n));
  EXPECT_EQ(&cache->statement(generated(0)), &*lent);
  EXPECT_LE(cache->generatedCount(), DBStatementCache::kGeneratedCapacity + 1);
}

TEST_F(DBStatementCacheTest, SqlThatDoesNotPrepareThrowsAndIsNotKept) {
  cache = std::make_unique<DBStatementCache>(db);
  EXPECT_THROW(cache->statement(std::string("SELECT * FROM missing")), DBException);
  EXPECT_EQ(cache->generatedCount(), 0u);
  static const DBStaticSql kBad("SELECT * FROM missing");
  EXPECT_THROW(cache->statement(kBad), DBException);
}

TEST_F(DBStatementCacheTest, ClearFinalizesEveryStatement) {
  cache = std::make_unique<DBStatementCache>(db);
  static const DBStaticSql kSql("SELECT 1");
  cache->statement(kSql);
  cache->statement(generated(2));
  cache->clear();
  EXPECT_EQ(preparedStatements(), 0);
  EXPECT_EQ(cache->generatedCount(), 0u);
}
