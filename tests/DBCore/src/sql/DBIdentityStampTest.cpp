#include "dbidentitystamp.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <set>
#include <vector>

#include "DBFileSetTestSupport.hpp"
#include "dbconnection.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

uint32_t bigEndian(const std::string& bytes, size_t offset) {
  uint32_t value = 0;
  for (size_t index = 0; index < 4; ++index)
    value = value << 8 | static_cast<unsigned char>(bytes[offset + index]);
  return value;
}

// The pages of the log's current generation: the frames from the start that carry the header's salts.
std::vector<uint32_t> framesInLog(const std::string& path) {
  const std::string log = fileBytes(path + "-wal");
  std::vector<uint32_t> pages;
  if (log.size() < 32) return pages;
  const uint32_t pageSize = bigEndian(log, 8);
  for (size_t frame = 32; frame + 24 + pageSize <= log.size(); frame += 24 + pageSize) {
    if (log.compare(frame + 8, 8, log, 16, 8) != 0) break;
    pages.push_back(bigEndian(log, frame));
  }
  return pages;
}

std::set<uint32_t> pagesInLog(const std::string& path) {
  const std::vector<uint32_t> frames = framesInLog(path);
  return std::set<uint32_t>(frames.begin(), frames.end());
}

class DBIdentityStampTest : public testing::Test {
 protected:
  void SetUp() override {
    connection = std::make_unique<DBConnection>(path());
    connection->exec(
        "PRAGMA journal_mode = WAL;"
        "CREATE TABLE catalog_info (key TEXT PRIMARY KEY, value INTEGER NOT NULL) WITHOUT ROWID;"
        "INSERT INTO catalog_info VALUES ('catalog_id', 'abc'), ('product_version', 3);"
        "CREATE TABLE t(x);"
        "PRAGMA wal_checkpoint(TRUNCATE);");
    infoPage = static_cast<uint32_t>(connection->queryInt64(
        std::string("SELECT rootpage FROM sqlite_schema WHERE name = 'catalog_info'")));
    stamp = std::make_unique<DBIdentityStamp>(connection->handle());
  }

  std::string path() const { return directory.file("data.db"); }
  std::string info() {
    std::string text;
    const DBStatementLease rows =
        connection->prepare(std::string("SELECT key, value FROM catalog_info ORDER BY key"));
    while (rows->step()) text += rows->columnText(0) + "=" + rows->columnText(1) + ";";
    return text;
  }

  KRTemporaryDirectory directory;
  std::unique_ptr<DBConnection> connection;
  std::unique_ptr<DBIdentityStamp> stamp;
  uint32_t infoPage = 0;
};

}  // namespace

TEST_F(DBIdentityStampTest, StampWritesTheInfoPageWithTheSameContent) {
  const std::string before = info();
  ASSERT_TRUE(pagesInLog(path()).empty());
  stamp->stamp();
  EXPECT_EQ(pagesInLog(path()), std::set<uint32_t>{infoPage});
  EXPECT_EQ(info(), before);
  EXPECT_EQ(info(), "catalog_id=abc;product_version=3;");
}

TEST_F(DBIdentityStampTest, CheckpointEmptiesTheLogAndStampsTheNextOne) {
  connection->exec("INSERT INTO t VALUES (1)");
  ASSERT_FALSE(pagesInLog(path()).count(infoPage));
  stamp->checkpoint();
  EXPECT_EQ(pagesInLog(path()), std::set<uint32_t>{infoPage});
}

TEST_F(DBIdentityStampTest, ALogThatRestartsIsStampedAndLongLogsAreCheckpointed) {
  connection->exec("INSERT INTO t VALUES (1)");
  connection->exec(
      "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 1200) "
      "INSERT INTO t SELECT zeroblob(3000) FROM n");
  // The commit passed the checkpoint size: the log was moved into the file, and the next commit restarts it.
  connection->exec("INSERT INTO t VALUES (2)");
  const std::set<uint32_t> pages = pagesInLog(path());
  EXPECT_TRUE(pages.count(infoPage));
  EXPECT_LT(framesInLog(path()).size(), 10u);
}

TEST_F(DBIdentityStampTest, RemovedStampLeavesCommitsAlone) {
  stamp.reset();
  connection->exec("INSERT INTO t VALUES (1)");
  EXPECT_FALSE(pagesInLog(path()).count(infoPage));
}

TEST(DBIdentityStampWithoutInfoTest, StampOfADatabaseWithoutInfoChangesNothing) {
  KRTemporaryDirectory directory;
  DBConnection connection(directory.file("plain.db"));
  connection.exec("PRAGMA journal_mode = WAL; CREATE TABLE t(x); PRAGMA wal_checkpoint(TRUNCATE);");
  DBIdentityStamp stamp(connection.handle());
  stamp.stamp();
  EXPECT_TRUE(sqlite3_get_autocommit(connection.handle()));
  EXPECT_TRUE(pagesInLog(directory.file("plain.db")).empty());
  connection.exec("INSERT INTO t VALUES (1)");
}
