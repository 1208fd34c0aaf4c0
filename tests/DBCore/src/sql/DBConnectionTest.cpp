#include "dbconnection.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <set>
#include <stdexcept>
#include <string>

#include "dbexception.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

// A connection to a new file in a temporary folder, with one table of integers.
class DBConnectionTest : public testing::Test {
 protected:
  void SetUp() override {
    connection = std::make_unique<DBConnection>(path());
    connection->exec("CREATE TABLE numbers(n INTEGER PRIMARY KEY)");
  }

  std::string path() const { return directory.file("connection.db"); }

  void insert(int64_t n) { connection->prepare("INSERT INTO numbers(n) VALUES (?)")->bind(1, n).execute(); }

  // The stored numbers, read through a second connection so that only committed rows count.
  std::set<int64_t> committedNumbers() const {
    DBConnection reader(path());
    const DBStatementLease statement = reader.prepare("SELECT n FROM numbers");
    std::set<int64_t> numbers;
    while (statement->step()) numbers.insert(statement->columnInt64(0));
    return numbers;
  }

  KRTemporaryDirectory directory;
  std::unique_ptr<DBConnection> connection;
};

}  // namespace

TEST_F(DBConnectionTest, OpensAFileInTheTemporaryFolder) {
  EXPECT_TRUE(std::filesystem::is_regular_file(path()));
  EXPECT_NE(connection->handle(), nullptr);
  EXPECT_EQ(connection->queryInt64("SELECT 41 + 1"), 42);
}

TEST_F(DBConnectionTest, StatementCacheLendsTheSameStatementForTheSameSql) {
  const DBStatement* first = &*connection->prepare("SELECT n FROM numbers");
  EXPECT_EQ(&*connection->prepare("SELECT n FROM numbers"), first);
  EXPECT_NE(&*connection->prepare("SELECT n FROM numbers WHERE n > 0"), first);
  static const DBStaticSql kSql("SELECT n FROM numbers");
  const DBStatement* fixed = &*connection->prepare(kSql);
  EXPECT_EQ(&*connection->prepare(kSql), fixed);
}

TEST_F(DBConnectionTest, AnEndedLeaseLeavesTheStatementResetAndUnbound) {
  insert(1);
  {
    const DBStatementLease statement = connection->prepare("SELECT count(*) FROM numbers WHERE n = ?");
    statement->bind(1, int64_t{1});
    ASSERT_TRUE(statement->step());
    EXPECT_EQ(statement->columnInt64(0), 1);
  }
  const DBStatementLease again = connection->prepare("SELECT count(*) FROM numbers WHERE n = ?");
  ASSERT_TRUE(again->step());
  EXPECT_EQ(again->columnInt64(0), 0);  // n = NULL: the earlier binding is gone
}

TEST_F(DBConnectionTest, AStatementThatIsLentIsNotLentAgain) {
  static const DBStaticSql kSql("SELECT n FROM numbers");
  const DBStatementLease lent = connection->prepare(kSql);
  EXPECT_THROW(connection->prepare(kSql), DBException);
  const DBStatementLease generated = connection->prepare(std::string("SELECT 1"));
  EXPECT_THROW(connection->prepare(std::string("SELECT 1")), DBException);
}

// Counts the connection's statements that are between a step and their reset.
int busyStatements(sqlite3* db) {
  int busy = 0;
  for (sqlite3_stmt* statement = sqlite3_next_stmt(db, nullptr); statement;
       statement = sqlite3_next_stmt(db, statement)) {
    busy += sqlite3_stmt_busy(statement) ? 1 : 0;
  }
  return busy;
}

TEST_F(DBConnectionTest, AReadThatThrowsMidwayLeavesNoStatementBusyAndTheCheckpointCompletes) {
  connection->exec("PRAGMA journal_mode = WAL");
  for (int64_t n = 1; n <= 3; ++n) insert(n);
  const auto readUntilTheSecondRow = [this] {
    const DBStatementLease statement = connection->prepare("SELECT n FROM numbers ORDER BY n");
    while (statement->step()) {
      if (statement->columnInt64(0) == 2) throw std::runtime_error("reading stopped");
    }
  };
  EXPECT_THROW(readUntilTheSecondRow(), std::runtime_error);
  EXPECT_EQ(busyStatements(connection->handle()), 0);
  DBConnection writer(path());
  writer.exec("INSERT INTO numbers(n) VALUES (4)");
  int logFrames = -1;
  int checkpointed = -1;
  EXPECT_EQ(sqlite3_wal_checkpoint_v2(writer.handle(), nullptr, SQLITE_CHECKPOINT_TRUNCATE, &logFrames,
                                      &checkpointed),
            SQLITE_OK);
  EXPECT_EQ(logFrames, 0);
}

TEST_F(DBConnectionTest, FailedPrepareIsNotCached) {
  EXPECT_THROW(connection->prepare("SELECT * FROM later"), DBException);
  connection->exec("CREATE TABLE later(x)");
  EXPECT_NO_THROW(connection->prepare("SELECT * FROM later"));
}

TEST_F(DBConnectionTest, TransactionCommits) {
  connection->transaction([this] {
    insert(1);
    insert(2);
  });
  EXPECT_EQ(committedNumbers(), (std::set<int64_t>{1, 2}));
}

TEST_F(DBConnectionTest, ThrowingBodyRollsBackAndPassesTheExceptionOn) {
  EXPECT_THROW(connection->transaction([this] {
    insert(1);
    throw std::runtime_error("body failed");
  }),
               std::runtime_error);
  EXPECT_EQ(connection->queryInt64("SELECT count(*) FROM numbers"), 0);
  connection->transaction([this] { insert(2); });
  EXPECT_EQ(committedNumbers(), (std::set<int64_t>{2}));
}

TEST_F(DBConnectionTest, NestedTransactionRollsBackOnlyTheInnerBody) {
  connection->transaction([this] {
    insert(1);
    try {
      connection->transaction([this] {
        insert(2);
        throw std::runtime_error("inner failed");
      });
    } catch (const std::runtime_error&) {
    }
    connection->transaction([this] { insert(3); });
  });
  EXPECT_EQ(committedNumbers(), (std::set<int64_t>{1, 3}));
}

TEST_F(DBConnectionTest, QueryInt64OfNoRowIsZero) {
  insert(7);
  EXPECT_EQ(connection->queryInt64("SELECT n FROM numbers WHERE n = 8"), 0);
  EXPECT_EQ(connection->queryInt64("SELECT n FROM numbers WHERE n = 7"), 7);
}

TEST_F(DBConnectionTest, DefensiveModeKeepsTheSchemaReadOnly) {
  connection->exec("PRAGMA writable_schema = ON");
  EXPECT_THROW(connection->exec("UPDATE sqlite_schema SET sql = sql WHERE name = 'numbers'"), DBException);
  // Without defensive mode the same statements go through: the refusal above is the connection's doing.
  connection.reset();
  sqlite3* plain = nullptr;
  ASSERT_EQ(sqlite3_open(path().c_str(), &plain), SQLITE_OK);
  EXPECT_EQ(sqlite3_exec(plain, "PRAGMA writable_schema = ON", nullptr, nullptr, nullptr), SQLITE_OK);
  EXPECT_EQ(sqlite3_exec(plain, "UPDATE sqlite_schema SET sql = sql WHERE name = 'numbers'", nullptr, nullptr,
                         nullptr),
            SQLITE_OK);
  sqlite3_close(plain);
}

TEST_F(DBConnectionTest, ForeignKeysAreEnforced) {
  EXPECT_EQ(connection->queryInt64("PRAGMA foreign_keys"), 1);
  connection->exec("CREATE TABLE links(n INTEGER REFERENCES numbers(n))");
  try {
    connection->exec("INSERT INTO links(n) VALUES (5)");
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.code(), SQLITE_CONSTRAINT_FOREIGNKEY);
  }
}

TEST_F(DBConnectionTest, TemporaryStorageStaysInMemory) {
  // 2 is MEMORY: statement journals never go through a temporary file.
  EXPECT_EQ(connection->queryInt64("PRAGMA temp_store"), 2);
}

TEST_F(DBConnectionTest, OpeningADirectoryThrowsWithACode) {
  try {
    DBConnection opened(directory.path().string());
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.code() & 0xff, SQLITE_CANTOPEN) << exception.what();
  }
}

TEST_F(DBConnectionTest, OpeningAFileThatIsNotADatabaseThrows) {
  const std::string text = directory.file("notes.txt");
  std::ofstream(text) << std::string(200, 'x');
  try {
    DBConnection opened(text);
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.code(), SQLITE_NOTADB) << exception.what();
  }
}

namespace {

int countSavepoint(unsigned /*type*/, void* context, void* statement, void* /*unused*/) {
  const char* sql = sqlite3_sql(static_cast<sqlite3_stmt*>(statement));
  if (sql && std::string(sql).rfind("SAVEPOINT", 0) == 0) ++*static_cast<int*>(context);
  return 0;
}

}  // namespace

TEST_F(DBConnectionTest, ASingleChangeOutsideATransactionGetsOneOfItsOwn) {
  bool inTransaction = false;
  connection->singleChange([&] { inTransaction = connection->inTransaction(); });
  EXPECT_TRUE(inTransaction);
  EXPECT_FALSE(connection->inTransaction());
}

TEST_F(DBConnectionTest, ASingleChangeInsideATransactionTakesNoSavepoint) {
  int savepoints = 0;
  sqlite3_trace_v2(connection->handle(), SQLITE_TRACE_STMT, countSavepoint, &savepoints);
  connection->transaction([&] {
    connection->singleChange([&] { connection->exec("CREATE TABLE t(x)"); });
    connection->transaction([] {});
  });
  sqlite3_trace_v2(connection->handle(), 0, nullptr, nullptr);
  EXPECT_EQ(savepoints, 1);
}
