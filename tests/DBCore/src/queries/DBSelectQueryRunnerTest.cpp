#include "dbselectqueryrunner.hpp"

#include <gtest/gtest.h>

#include "DBClauseTestSupport.hpp"
#include "DBConnectionTestSupport.hpp"
#include "dbclausecompiler.hpp"
#include "dbexception.hpp"
#include "dbimgselectquery.hpp"
#include "dbpathselectquery.hpp"
#include "dbreactor.hpp"

using namespace dbcore;
using namespace clausetest;

namespace {

class DBSelectQueryRunnerTest : public DBCatalogTestBase {
 protected:
  std::shared_ptr<DBPath> path(const std::wstring& text) {
    DBPath record;
    record.path = text;
    return saved(record);
  }

  // How many prepared statements the connection holds.
  int statementCount() const {
    int count = 0;
    for (sqlite3_stmt* statement = sqlite3_next_stmt(connection->handle(), nullptr); statement;
         statement = sqlite3_next_stmt(connection->handle(), statement)) {
      ++count;
    }
    return count;
  }

  std::shared_ptr<DBPathSelectQuery> pathQuery(Node tree) {
    auto query = std::make_shared<DBPathSelectQuery>();
    query->Where(clause(std::move(tree)));
    return query;
  }
};

}  // namespace

TEST_F(DBSelectQueryRunnerTest, RunsTheQueryInIdOrder) {
  const auto b = path(L"/b");
  const auto a = path(L"/a");
  const auto records =
      DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(ge(source("path_wide_ch"), wide(L"/a"))));
  EXPECT_EQ(ids(records), (std::vector<long long>{b->id(), a->id()}));
  EXPECT_EQ(records[1]->path, L"/a");
}

TEST_F(DBSelectQueryRunnerTest, StatementsAreReusedAcrossLiteralValues) {
  const auto a = path(L"/a");
  const auto b = path(L"/b");
  EXPECT_EQ(
      ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(eq(source("path_wide_ch"), wide(L"/a"))))),
      std::vector<long long>{a->id()});
  const int statements = statementCount();
  EXPECT_EQ(
      ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(eq(source("path_wide_ch"), wide(L"/b"))))),
      std::vector<long long>{b->id()});
  EXPECT_EQ(statementCount(), statements);
}

TEST_F(DBSelectQueryRunnerTest, QueriesThatSelectNothingRunNoStatement) {
  path(L"/a");
  const int statements = statementCount();
  EXPECT_TRUE(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(eq(source("nope"), int32(1)))).empty());
  EXPECT_EQ(statementCount(), statements);
}

TEST_F(DBSelectQueryRunnerTest, KeepsTheSubSelectValuesOnTheQuery) {
  path(L"/a");
  const auto z = path(L"/z");
  auto query = pathQuery(eq(source("path_wide_ch"), maxOf("paths", "path_wide_ch")));
  ColumnValues result;
  EXPECT_FALSE(query->Result(result, query->validationRecordForEntity(z)));
  EXPECT_EQ(ids(DBSelectQueryRunner::run<DBPath>(*connection, query)), std::vector<long long>{z->id()});
  EXPECT_TRUE(query->Result(result, query->validationRecordForEntity(z)));
}

TEST_F(DBSelectQueryRunnerTest, DeepestAcceptedChainsRunInSqlite) {
  const auto a = path(L"/a");
  const Node isA = eq(source("path_wide_ch"), wide(L"/a"));
  Node left = isA;
  Node right = isA;
  for (int i = 1; i < DBClauseCompiler::kMaxDepth; ++i) {
    left = both(left, ne(source("path_wide_ch"), wide(L"/b")));
    right = both(ne(source("path_wide_ch"), wide(L"/b")), right);
  }
  EXPECT_EQ(ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(left))),
            std::vector<long long>{a->id()});
  EXPECT_EQ(ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(right))),
            std::vector<long long>{a->id()});
}

TEST_F(DBSelectQueryRunnerTest, DeepestAcceptedNestingRunsInSqlite) {
  const auto a = path(L"/a");
  const Node top = ge(maxOf("paths", "path_wide_ch"), source("path_wide_ch"));
  Node comparisons = top;
  Node alternating = top;
  for (int i = 0; i < DBClauseCompiler::kMaxNesting; ++i) comparisons = eq(int32(1), comparisons);
  // Every || below a && is parenthesized.
  for (int i = 0; i < 2 * DBClauseCompiler::kMaxNesting; ++i) {
    alternating =
        i % 2 ? both(top, alternating) : either(alternating, eq(maxOf("paths", "path_wide_ch"), int32(0)));
  }
  EXPECT_FALSE(DBClauseCompiler("paths").compile({alternating}).rejected());
  EXPECT_EQ(ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(comparisons))),
            std::vector<long long>{a->id()});
  EXPECT_EQ(ids(DBSelectQueryRunner::run<DBPath>(*connection, pathQuery(alternating))),
            std::vector<long long>{a->id()});
}

TEST_F(DBSelectQueryRunnerTest, WrongOrMissingQueryThrows) {
  EXPECT_THROW(DBSelectQueryRunner::run<DBImage>(*connection, std::make_shared<DBPathSelectQuery>()),
               DBException);
  EXPECT_THROW(DBSelectQueryRunner::run<DBPath>(*connection, nullptr), DBException);
}
