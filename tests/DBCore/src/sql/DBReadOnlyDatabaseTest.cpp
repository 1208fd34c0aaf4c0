#include "dbreadonlydatabase.hpp"

#include <gtest/gtest.h>

#include "DBFileSetTestSupport.hpp"
#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

using View = DBReadOnlyDatabase::View;

// A WAL database whose last write is still in its log, written by a connection that stays open.
class DBReadOnlyDatabaseTest : public testing::Test {
 protected:
  void SetUp() override {
    writer = std::make_unique<DBConnection>(path());
    writer->exec("PRAGMA journal_mode = WAL; CREATE TABLE t(x); INSERT INTO t VALUES ('in the file');");
    writer->exec("PRAGMA wal_checkpoint(TRUNCATE); PRAGMA wal_autocheckpoint = 0");
    writer->exec("INSERT INTO t VALUES ('in the log')");
  }

  std::string path() const { return directory.file("data.db"); }

  KRTemporaryDirectory directory;
  std::unique_ptr<DBConnection> writer;
};

}  // namespace

TEST_F(DBReadOnlyDatabaseTest, MainFileViewReadsTheFileAloneAndCreatesNothing) {
  writer.reset();
  std::filesystem::remove(path() + "-wal");
  std::filesystem::remove(path() + "-shm");
  const auto before = filesIn(directory.path());
  {
    const DBReadOnlyDatabase database(path(), View::kMainFile);
    EXPECT_EQ(database.integer("SELECT count(*) FROM t"), 2);
  }
  EXPECT_EQ(filesIn(directory.path()), before);
}

TEST_F(DBReadOnlyDatabaseTest, MainFileViewIgnoresTheLog) {
  const DBReadOnlyDatabase database(path(), View::kMainFile);
  EXPECT_EQ(database.integer("SELECT count(*) FROM t"), 1);
}

TEST_F(DBReadOnlyDatabaseTest, CommittedViewReadsTheLogWithoutWritingAnyFile) {
  const std::string copy = directory.file("copy.db");
  for (const std::string suffix : {"", "-wal", "-shm"})
    writeFileBytes(copy + suffix, fileBytes(path() + suffix));
  writer.reset();
  std::filesystem::remove(path());
  std::filesystem::remove(path() + "-wal");
  std::filesystem::remove(path() + "-shm");
  const auto before = filesIn(directory.path());
  {
    const DBReadOnlyDatabase database(copy, View::kCommittedWithReadOnlyIndex);
    EXPECT_EQ(database.text("SELECT x FROM t ORDER BY rowid DESC"), "in the log");
    EXPECT_THROW(database.integer("INSERT INTO t VALUES (1) RETURNING 1"), DBException);
  }
  EXPECT_EQ(filesIn(directory.path()), before);
}

TEST_F(DBReadOnlyDatabaseTest, CommittedViewWithoutAnIndexBuildsOne) {
  const std::string copy = directory.file("copy.db");
  for (const std::string suffix : {"", "-wal"}) writeFileBytes(copy + suffix, fileBytes(path() + suffix));
  const DBReadOnlyDatabase database(copy, View::kCommitted);
  EXPECT_EQ(database.integer("SELECT count(*) FROM t"), 2);
  EXPECT_TRUE(std::filesystem::exists(copy + "-shm"));
  EXPECT_THROW(DBReadOnlyDatabase(directory.file("missing.db"), View::kMainFile), DBException);
}

TEST(DBReadOnlyDatabaseUriTest, EncodesEveryCharacterThatMeansSomethingInAUri) {
  EXPECT_EQ(DBReadOnlyDatabase::uri("/a b/c%d?e#f.db", DBReadOnlyDatabase::View::kMainFile),
            "file:/a%20b/c%25d%3Fe%23f.db?mode=ro&immutable=1");
  EXPECT_EQ(DBReadOnlyDatabase::uri("rel/\xC3\xA9t\xC3\xA9", DBReadOnlyDatabase::View::kCommitted),
            "file:rel/%C3%A9t%C3%A9?mode=ro");
  EXPECT_EQ(DBReadOnlyDatabase::uri("x", DBReadOnlyDatabase::View::kCommittedWithReadOnlyIndex),
            "file:x?mode=ro&readonly_shm=1");
}

TEST(DBReadOnlyDatabaseUriTest, OpensAPathWithUriCharacters) {
  KRTemporaryDirectory directory;
  const std::string path = directory.file("odd %20 ?name#.db");
  DBConnection(path).exec("CREATE TABLE t(x)");
  const DBReadOnlyDatabase database(path, DBReadOnlyDatabase::View::kMainFile);
  EXPECT_EQ(database.integer("SELECT count(*) FROM sqlite_schema"), 1);
}
