#include <gtest/gtest.h>
#include <sqlite3.h>

#include <filesystem>
#include <functional>
#include <string>

#include "DBReactorTestSupport.hpp"
#include "dbexception.hpp"
#include "dbreactor.hpp"

using namespace dbcore;

namespace {

// A plain SQLite connection on the catalog beside the reactor's. `PRAGMA data_version` changes when another
// connection has committed since the last look, so looking after each facade call counts the calls that
// committed.
class CatalogWatcher {
 public:
  explicit CatalogWatcher(const std::string& path) {
    sqlite3_open_v2(path.c_str(), &db_, SQLITE_OPEN_READONLY, nullptr);
    lastVersion_ = number("PRAGMA data_version");
  }
  ~CatalogWatcher() { sqlite3_close(db_); }
  CatalogWatcher(const CatalogWatcher&) = delete;
  CatalogWatcher& operator=(const CatalogWatcher&) = delete;

  void look() {
    const long long version = number("PRAGMA data_version");
    if (version != lastVersion_) ++commits_;
    lastVersion_ = version;
  }
  int commits() const { return commits_; }

  std::string text(const std::string& sql) {
    sqlite3_stmt* statement = nullptr;
    std::string result;
    if (sqlite3_prepare_v2(db_, sql.c_str(), -1, &statement, nullptr) == SQLITE_OK &&
        sqlite3_step(statement) == SQLITE_ROW && sqlite3_column_text(statement, 0)) {
      result = reinterpret_cast<const char*>(sqlite3_column_text(statement, 0));
    }
    sqlite3_finalize(statement);
    return result;
  }
  long long number(const std::string& sql) { return std::stoll("0" + text(sql)); }
  long long imagesNamed(const std::string& name) {
    return number("SELECT count(*) FROM images WHERE path_wide_ch = '" + name + "'");
  }

 private:
  sqlite3* db_ = nullptr;
  long long lastVersion_ = 0;
  int commits_ = 0;
};

// What the body throws in the tests of a body that fails.
struct BodyFailure {
  int marker;
};

class DBReactorBatchTest : public DBReactorTestBase {
 protected:
  void SetUp() override {
    DBReactorTestBase::SetUp();
    watcher = std::make_unique<CatalogWatcher>(catalogPath());
  }

  // Writes images named name-0, name-1, ... one facade call each, looking for commits after each.
  void writeImages(const std::wstring& name, int count) {
    for (int index = 0; index < count; ++index) {
      makeImage(name + L"-" + std::to_wstring(index));
      watcher->look();
    }
  }

  // A write the engine refuses: the second attribute record names no image, so the first one, written
  // by the same call, must go too.
  void writeOrphanAttributes(long long imageId) {
    auto valid = std::make_shared<DBUserImgAttrib>();
    valid->image_id = imageId;
    auto orphan = std::make_shared<DBUserImgAttrib>();
    orphan->image_id = 999999;
    *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{valid, orphan};
  }

  void expectCleanFile() {
    EXPECT_EQ(watcher->text("PRAGMA integrity_check"), "ok");
    EXPECT_EQ(watcher->text("PRAGMA foreign_key_check"), "");
  }

  std::unique_ptr<CatalogWatcher> watcher;
};

TEST_F(DBReactorBatchTest, WritesOutsideABatchCommitOneByOne) {
  writeImages(L"single", 1000);
  EXPECT_EQ(watcher->commits(), 1000);
}

TEST_F(DBReactorBatchTest, AThousandWritesInABatchCommitOnce) {
  reactor->Batch([&] { writeImages(L"grouped", 1000); });
  EXPECT_EQ(watcher->commits(), 0);
  watcher->look();
  EXPECT_EQ(watcher->commits(), 1);
  EXPECT_EQ(watcher->number("SELECT count(*) FROM images WHERE path_wide_ch LIKE 'grouped-%'"), 1000);
  expectCleanFile();
}

TEST_F(DBReactorBatchTest, ARefusedCallKeepsTheEarlierWritesAndPassesItsExceptionOn) {
  const auto image = makeImage(L"owner");
  watcher->look();
  std::string refusal;
  int32_t refusalCode = 0;
  try {
    writeOrphanAttributes(image->id());
  } catch (const DBException& exception) {
    refusal = exception.what();
    refusalCode = exception.code();
  }
  ASSERT_FALSE(refusal.empty());
  const int commitsBefore = watcher->commits();

  try {
    reactor->Batch([&] {
      writeImages(L"before", 3);
      writeOrphanAttributes(image->id());
      writeImages(L"after", 2);
    });
    FAIL() << "The refused write passed";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.what(), refusal);
    EXPECT_EQ(exception.code(), refusalCode);
  }
  watcher->look();
  EXPECT_EQ(watcher->commits(), commitsBefore + 1);
  for (const char* name : {"before-0", "before-1", "before-2"}) EXPECT_EQ(watcher->imagesNamed(name), 1);
  EXPECT_EQ(watcher->imagesNamed("after-0"), 0);
  EXPECT_EQ(watcher->number("SELECT count(*) FROM image_user_attributes"), 0);
  expectCleanFile();
}

TEST_F(DBReactorBatchTest, AnExceptionOfTheBodyPassesOnAfterTheWritesBeforeItCommit) {
  try {
    reactor->Batch([&] {
      writeImages(L"kept", 2);
      throw BodyFailure{42};
    });
    FAIL() << "The body's exception was lost";
  } catch (const BodyFailure& failure) {
    EXPECT_EQ(failure.marker, 42);
  }
  watcher->look();
  EXPECT_EQ(watcher->commits(), 1);
  EXPECT_EQ(watcher->imagesNamed("kept-0"), 1);
  EXPECT_EQ(watcher->imagesNamed("kept-1"), 1);
  expectCleanFile();
}

TEST_F(DBReactorBatchTest, ANestedBatchJoinsTheOuterCommit) {
  reactor->Batch([&] {
    writeImages(L"outer", 1);
    reactor->Batch([&] { writeImages(L"inner", 1); });
    EXPECT_THROW(reactor->Batch([&] {
      writeImages(L"failing", 1);
      throw BodyFailure{7};
    }),
                 BodyFailure);
    writeImages(L"last", 1);
  });
  EXPECT_EQ(watcher->commits(), 0);
  watcher->look();
  EXPECT_EQ(watcher->commits(), 1);
  for (const char* name : {"outer-0", "inner-0", "failing-0", "last-0"})
    EXPECT_EQ(watcher->imagesNamed(name), 1);
}

TEST_F(DBReactorBatchTest, ABatchOnAClosedCatalogThrows) {
  reactor->Close();
  bool ran = false;
  try {
    reactor->Batch([&] { ran = true; });
    FAIL() << "A closed catalog ran a batch";
  } catch (const DBException& exception) {
    EXPECT_STREQ(exception.what(), "The catalog is not open");
  }
  EXPECT_FALSE(ran);
}

TEST_F(DBReactorBatchTest, ClosingOrOpeningInsideABatchIsRefused) {
  const KRTemporaryDirectory other;
  try {
    reactor->Batch([&] {
      writeImages(L"kept", 1);
      EXPECT_EQ(reactor->Open(s2ws(other.file("other.krcatalog")), L""), kDBOpenFailed);
      reactor->Close();
    });
    FAIL() << "The catalog was closed in a batch";
  } catch (const DBException& exception) {
    EXPECT_STREQ(exception.what(), "The catalog cannot be closed in a batch");
  }
  EXPECT_FALSE(std::filesystem::exists(other.file("other.krcatalog")));
  watcher->look();
  EXPECT_EQ(watcher->commits(), 1);
  EXPECT_EQ(watcher->imagesNamed("kept-0"), 1);
  EXPECT_EQ(reactor->Count<DBImage>(), 1u);
}

TEST_F(DBReactorBatchTest, AfterABatchEachWriteCommitsOnItsOwn) {
  EXPECT_THROW(reactor->Batch([&] {
    writeImages(L"grouped", 2);
    throw BodyFailure{1};
  }),
               BodyFailure);
  watcher->look();
  writeImages(L"single", 2);
  EXPECT_EQ(watcher->commits(), 3);
  EXPECT_EQ(watcher->imagesNamed("single-1"), 1);
}

// Initialize checkpoints so that the main file alone shows the catalog's identity; in a batch the
// checkpoint waits for the commit.
TEST_F(DBReactorBatchTest, InitializeInABatchCheckpointsAfterTheCommit) {
  const KRTemporaryDirectory folder;
  const std::string path = folder.file("fresh.krcatalog");
  DBReactor fresh(kAppInfo);
  ASSERT_EQ(fresh.Open(s2ws(path), L""), kDBOpenNeedsUpdate);
  fresh.Batch([&] { fresh.Initialize(); });
  const std::string mainFileOnly = folder.file("copy.krcatalog");
  std::filesystem::copy_file(path, mainFileOnly);
  EXPECT_FALSE(
      CatalogWatcher(mainFileOnly).text("SELECT value FROM catalog_info WHERE key = 'catalog_id'").empty());
}

}  // namespace
