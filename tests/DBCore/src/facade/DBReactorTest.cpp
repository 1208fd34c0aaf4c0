#include "dbreactor.hpp"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sqlite3.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <fstream>
#include <functional>
#include <set>

#include "DBFileSetTestSupport.hpp"
#include "DBReactorTestSupport.hpp"
#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbschema.hpp"
#include "support/KRUnprivilegedUser.hpp"

using namespace dbcore;

namespace {

// Runs SQL on a file with plain SQLite, outside the engine, to make fixture files.
void rawSql(const std::string& path, const std::string& sql) {
  sqlite3* db = nullptr;
  const int opened = sqlite3_open(path.c_str(), &db);
  const int executed = sqlite3_exec(db, sql.c_str(), nullptr, nullptr, nullptr);
  const std::string message = sqlite3_errmsg(db);
  sqlite3_close(db);
  ASSERT_EQ(opened, SQLITE_OK);
  ASSERT_EQ(executed, SQLITE_OK) << message;
}

std::vector<std::string> namedIndexes(const std::string& path) {
  sqlite3* db = nullptr;
  std::vector<std::string> names;
  if (sqlite3_open(path.c_str(), &db) != SQLITE_OK) return names;
  sqlite3_stmt* statement = nullptr;
  sqlite3_prepare_v2(db,
                     "SELECT name FROM sqlite_schema WHERE type = 'index' AND sql IS NOT NULL ORDER BY name",
                     -1, &statement, nullptr);
  while (sqlite3_step(statement) == SQLITE_ROW) {
    names.emplace_back(reinterpret_cast<const char*>(sqlite3_column_text(statement, 0)));
  }
  sqlite3_finalize(statement);
  sqlite3_close(db);
  return names;
}

int openResult(const std::string& path, AppInfo appInfo = 5) {
  DBReactor reactor(appInfo);
  return reactor.Open(s2ws(path), L"");
}

std::string singleText(const std::string& path, const std::string& sql) {
  sqlite3* db = nullptr;
  std::string text;
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_open_v2(path.c_str(), &db, SQLITE_OPEN_READONLY, nullptr) == SQLITE_OK &&
      sqlite3_prepare_v2(db, sql.c_str(), -1, &statement, nullptr) == SQLITE_OK &&
      sqlite3_step(statement) == SQLITE_ROW && sqlite3_column_text(statement, 0)) {
    text = reinterpret_cast<const char*>(sqlite3_column_text(statement, 0));
  }
  sqlite3_finalize(statement);
  sqlite3_close(db);
  return text;
}

std::string catalogId(const std::string& path) {
  return singleText(path, "SELECT value FROM catalog_info WHERE key = 'catalog_id'");
}

// A plain SQLite connection kept open, so that its write-ahead log keeps committed frames (no checkpoint).
class OpenWriter {
 public:
  explicit OpenWriter(const std::string& path) { sqlite3_open(path.c_str(), &db_); }
  ~OpenWriter() { sqlite3_close(db_); }
  OpenWriter(const OpenWriter&) = delete;
  OpenWriter& operator=(const OpenWriter&) = delete;
  void run(const std::string& sql) {
    ASSERT_EQ(sqlite3_exec(db_, sql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK);
  }

 private:
  sqlite3* db_ = nullptr;
};

// Copies a database file and whichever of its -wal, -shm and -journal exist, as a crash would leave them.
void copyWithSidecars(const std::string& from, const std::string& to, bool withIndex = true) {
  for (const std::string suffix : {"", "-wal", "-shm", "-journal"}) {
    if (suffix == "-shm" && !withIndex) continue;
    if (std::filesystem::exists(from + suffix)) writeFileBytes(to + suffix, fileBytes(from + suffix));
  }
}

// Rewrites the definition of a table in place, as another program might have left it.
void editTableDefinition(const std::string& path, const std::string& table, const std::string& from,
                         const std::string& to) {
  rawSql(path, "PRAGMA writable_schema = ON; UPDATE sqlite_schema SET sql = replace(sql, '" + from + "', '" +
                   to + "') WHERE name = '" + table + "' AND instr(sql, '" + from + "') > 0;");
  ASSERT_EQ(
      singleText(path, "SELECT instr(sql, '" + to + "') > 0 FROM sqlite_schema WHERE name = '" + table + "'"),
      "1");
}

class DBReactorTest : public DBReactorTestBase {
 protected:
  // Opens the file and expects the answer with every file of the folder as it was.
  void expectRefusedUnchanged(const std::string& path, std::set<int> answers) {
    const auto before = filesIn(std::filesystem::path(path).parent_path());
    const int answer = openResult(path);
    EXPECT_TRUE(answers.count(answer)) << "Open answered " << answer;
    EXPECT_EQ(filesIn(std::filesystem::path(path).parent_path()), before);
  }

  // A closed catalog in a folder of its own, holding images.
  std::string closedCatalog(const KRTemporaryDirectory& folder, int images) {
    const std::string path = folder.file("catalog.krcatalog");
    DBReactor catalog(kAppInfo);
    EXPECT_EQ(catalog.Open(s2ws(path), L""), kDBOpenNeedsUpdate);
    catalog.Initialize();
    for (int index = 0; index < images; ++index) catalog << std::make_shared<DBImage>();
    return path;
  }

  // The -wal of another catalog, with committed frames: written while that catalog is open.
  std::string logOfAnotherCatalog(bool touchingItsInfo) {
    KRTemporaryDirectory folder;
    const std::string path = closedCatalog(folder, 40);
    DBReactor other(kAppInfo);
    EXPECT_EQ(other.Open(s2ws(path), L""), kDBOpenCurrent);
    for (int index = 0; index < 30; ++index) other << std::make_shared<DBImage>();
    if (touchingItsInfo) other.SetDBApplicationID(77);
    return fileBytes(path + "-wal");
  }
};

}  // namespace

// ---- Open results

TEST_F(DBReactorTest, NewPathNeedsInitialize) {
  EXPECT_EQ(openResult(directory.file("new.krcatalog")), kDBOpenNeedsUpdate);
}

TEST_F(DBReactorTest, InitializedFileIsCurrent) {
  reactor->Close();
  EXPECT_EQ(openResult(catalogPath()), kDBOpenCurrent);
}

TEST_F(DBReactorTest, OlderSchemaNeedsInitializeAndMigrates) {
  makeImage(L"kept.jpg");
  reactor->Close();
  // A file of the oldest version: the tables without the indexes of the current one.
  const std::vector<std::string> indexes = namedIndexes(catalogPath());
  ASSERT_FALSE(indexes.empty());
  for (const auto& index : indexes) rawSql(catalogPath(), "DROP INDEX " + index);
  rawSql(catalogPath(), "PRAGMA user_version = 119");
  DBReactor old(5);
  ASSERT_EQ(old.Open(s2ws(catalogPath()), L""), kDBOpenNeedsUpdate);
  old.Initialize();
  EXPECT_EQ(old.DBUserVersion(), DBSchema::kCurrentVersion);
  EXPECT_EQ(old.Count<DBImage>(), 1u);
  old.Close();
  EXPECT_EQ(namedIndexes(catalogPath()), indexes);
  EXPECT_EQ(openResult(catalogPath()), kDBOpenCurrent);
}

TEST_F(DBReactorTest, VersionBelowTheOldestIsIncompatible) {
  reactor->Close();
  rawSql(catalogPath(), "PRAGMA user_version = 50");
  EXPECT_EQ(openResult(catalogPath()), kDBOpenIncompatible);
}

TEST_F(DBReactorTest, NewerSchemaIsIncompatible) {
  reactor->Close();
  rawSql(catalogPath(), "PRAGMA user_version = 999;");
  EXPECT_EQ(openResult(catalogPath()), kDBOpenIncompatible);
}

TEST_F(DBReactorTest, AnotherApplicationsDatabaseIsIncompatible) {
  const std::string path = directory.file("other.db");
  rawSql(path, "CREATE TABLE notes(text TEXT); INSERT INTO notes VALUES ('hello');");
  EXPECT_EQ(openResult(path), kDBOpenIncompatible);
  reactor->Close();
  EXPECT_EQ(openResult(catalogPath(), 6), kDBOpenIncompatible);
}

TEST_F(DBReactorTest, FileThatIsNotADatabaseFails) {
  const std::string path = directory.file("text.krcatalog");
  std::ofstream(path) << "This is not a database, just some text that is long enough to fill a header. "
                         "More text, more text, more text, more text.";
  EXPECT_EQ(openResult(path), kDBOpenFailed);
}

TEST_F(DBReactorTest, TruncatedFileFails) {
  reactor->Close();
  std::filesystem::resize_file(catalogPath(), 50);
  EXPECT_EQ(openResult(catalogPath()), kDBOpenFailed);
}

TEST_F(DBReactorTest, CorruptedHeaderFails) {
  reactor->Close();
  {
    std::fstream file(catalogPath(), std::ios::in | std::ios::out | std::ios::binary);
    file.seekp(0);
    file << "garbage garbage garbage";
  }
  EXPECT_EQ(openResult(catalogPath()), kDBOpenFailed);
}

TEST_F(DBReactorTest, DirectoryFails) { EXPECT_EQ(openResult(directory.path().string()), kDBOpenFailed); }

TEST_F(DBReactorTest, EmptyPathFails) { EXPECT_EQ(openResult(""), kDBOpenFailed); }

TEST_F(DBReactorTest, UnreadablePathFails) {
  EXPECT_EQ(openResult(directory.file("missing-folder/catalog.krcatalog")), kDBOpenFailed);
}

TEST_F(DBReactorTest, MalformedSchemaFails) {
  reactor->Close();
  rawSql(catalogPath(), "ALTER TABLE images DROP COLUMN width;");
  EXPECT_EQ(openResult(catalogPath()), kDBOpenFailed);
}

// ---- Paths and sizes

TEST_F(DBReactorTest, PathWithANulFailsAndTouchesNothing) {
  reactor->Close();
  const auto before = filesIn(directory.path());
  const std::wstring nul(1, L'\0');
  EXPECT_EQ(reactor->Open(s2ws(catalogPath()) + nul + L".x", L""), kDBOpenFailed);
  EXPECT_EQ(reactor->Open(s2ws(directory.file("new")) + nul + L".krcatalog", L""), kDBOpenFailed);
  EXPECT_EQ(reactor->Open(s2ws(directory.path().string()) + nul + L"/catalog.krcatalog", L""), kDBOpenFailed);
  EXPECT_THROW(reactor->Count<DBImage>(), DBException);
  EXPECT_EQ(filesIn(directory.path()), before);
}

TEST_F(DBReactorTest, ZeroLengthFileNeedsInitialize) {
  const std::string path = directory.file("empty.krcatalog");
  writeFileBytes(path, "");
  EXPECT_EQ(openResult(path), kDBOpenNeedsUpdate);
}

TEST_F(DBReactorTest, FileShorterThanAHeaderFailsAndKeepsItsBytes) {
  reactor->Close();
  const std::string catalog = fileBytes(catalogPath());
  KRTemporaryDirectory folder;
  for (const size_t size : {size_t{1}, size_t{16}, size_t{99}}) {
    const std::string path = folder.file("short.krcatalog");
    writeFileBytes(path, catalog.substr(0, size));
    expectRefusedUnchanged(path, {kDBOpenFailed});
  }
}

TEST_F(DBReactorTest, LogBesideAnEmptyFileFailsAndStays) {
  const std::string log = logOfAnotherCatalog(false);
  for (const bool fileExists : {false, true}) {
    KRTemporaryDirectory folder;
    const std::string path = folder.file("new.krcatalog");
    if (fileExists) writeFileBytes(path, "");
    writeFileBytes(path + "-wal", log);
    expectRefusedUnchanged(path, {kDBOpenFailed});
  }
}

// ---- Logs and journals beside the file

TEST_F(DBReactorTest, OwnCommittedLogIsReplayed) {
  for (int index = 0; index < 3; ++index) makeImage(L"in-the-log.jpg");
  ASSERT_GT(std::filesystem::file_size(catalogPath() + "-wal"), 0u);
  for (const bool withIndex : {true, false}) {
    KRTemporaryDirectory folder;
    const std::string copy = folder.file("catalog.krcatalog");
    copyWithSidecars(catalogPath(), copy, withIndex);
    DBReactor recovered(kAppInfo);
    ASSERT_EQ(recovered.Open(s2ws(copy), L""), kDBOpenCurrent);
    EXPECT_EQ(recovered.Count<DBImage>(), 3u);
  }
}

TEST_F(DBReactorTest, NewCatalogWhoseFirstTransactionIsInItsLogOpens) {
  KRTemporaryDirectory folder;
  const std::string path = folder.file("first.krcatalog");
  DBConnection writer(path);
  writer.exec("PRAGMA journal_mode = WAL");
  writer.exec("PRAGMA wal_autocheckpoint = 0");
  writer.transaction([&writer] {
    DBSchema::migrate(writer, 0);
    writer.exec("PRAGMA application_id = " + std::to_string(DBSchema::applicationIdFor(kAppInfo)));
    DBSchema::createRootRecords(writer);
  });
  const std::string copy = directory.file("first.krcatalog");
  copyWithSidecars(path, copy);
  ASSERT_EQ(singleText(copy, "PRAGMA application_id"), std::to_string(DBSchema::applicationIdFor(kAppInfo)));
  EXPECT_EQ(openResult(copy), kDBOpenCurrent);
}

TEST_F(DBReactorTest, CommittedLogOfAnotherCatalogIsRefusedAndChangesNothing) {
  reactor->Close();
  for (const bool touchingItsInfo : {false, true}) {
    writeFileBytes(catalogPath() + "-wal", logOfAnotherCatalog(touchingItsInfo));
    expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
    std::filesystem::remove(catalogPath() + "-wal");
    EXPECT_EQ(openResult(catalogPath()), kDBOpenCurrent);
  }
}

TEST_F(DBReactorTest, CommittedLogOfAnotherApplicationsDatabaseIsRefused) {
  reactor->Close();
  KRTemporaryDirectory folder;
  const std::string other = folder.file("other.db");
  OpenWriter writer(other);
  writer.run(
      "PRAGMA journal_mode = WAL; PRAGMA wal_autocheckpoint = 0; CREATE TABLE notes(body TEXT);"
      "INSERT INTO notes VALUES ('kept in the log');");
  for (const bool withIndex : {true, false}) {
    // The other database itself, with its log.
    KRTemporaryDirectory copies;
    const std::string copy = copies.file("other.db");
    copyWithSidecars(other, copy, withIndex);
    expectRefusedUnchanged(copy, {kDBOpenFailed, kDBOpenIncompatible});
    // Its log beside a catalog.
    writeFileBytes(catalogPath() + "-wal", fileBytes(other + "-wal"));
    if (withIndex) writeFileBytes(catalogPath() + "-shm", fileBytes(other + "-shm"));
    expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
  }
}

TEST_F(DBReactorTest, NewerSchemaInTheLogIsIncompatibleAndChangesNothing) {
  reactor->Close();
  OpenWriter writer(catalogPath());
  writer.run("PRAGMA wal_autocheckpoint = 0; PRAGMA user_version = 999;");
  for (const bool withIndex : {true, false}) {
    KRTemporaryDirectory folder;
    const std::string copy = folder.file("catalog.krcatalog");
    copyWithSidecars(catalogPath(), copy, withIndex);
    ASSERT_TRUE(std::filesystem::exists(copy + "-wal"));
    expectRefusedUnchanged(copy, {kDBOpenIncompatible});
  }
}

TEST_F(DBReactorTest, HotJournalOfAnotherDatabaseIsRefusedAndChangesNothing) {
  reactor->Close();
  KRTemporaryDirectory folder;
  const std::string other = folder.file("other.db");
  OpenWriter writer(other);
  writer.run(
      "CREATE TABLE notes(body TEXT);"
      "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 2000)"
      "  INSERT INTO notes SELECT hex(randomblob(60)) FROM n;"
      "PRAGMA cache_size = 4; BEGIN; UPDATE notes SET body = lower(body);");
  const std::string journal = fileBytes(other + "-journal");
  ASSERT_FALSE(journal.empty());
  writeFileBytes(catalogPath() + "-journal", journal);
  expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
  std::filesystem::remove(catalogPath() + "-journal");
  rawSql(catalogPath(), "PRAGMA journal_mode = DELETE");
  writeFileBytes(catalogPath() + "-journal", journal);
  expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
}

// ---- Identity

TEST_F(DBReactorTest, InitializeGivesEveryCatalogItsOwnIdentifier) {
  reactor->Close();
  KRTemporaryDirectory folder;
  const std::string other = closedCatalog(folder, 0);
  EXPECT_EQ(catalogId(catalogPath()).size(), 32u);
  EXPECT_NE(catalogId(catalogPath()), catalogId(other));
  // In the main file itself, not only in a log.
  EXPECT_FALSE(std::filesystem::exists(catalogPath() + "-wal") &&
               std::filesystem::file_size(catalogPath() + "-wal") > 0);
}

TEST_F(DBReactorTest, CurrentCatalogWithoutAnIdentifierGetsOne) {
  reactor->Close();
  rawSql(catalogPath(), "DELETE FROM catalog_info WHERE key = 'catalog_id'");
  ASSERT_EQ(catalogId(catalogPath()), "");
  DBReactor again(kAppInfo);
  ASSERT_EQ(again.Open(s2ws(catalogPath()), L""), kDBOpenCurrent);
  const std::string assigned = catalogId(catalogPath());
  EXPECT_EQ(assigned.size(), 32u);
  again.Close();
  EXPECT_EQ(openResult(catalogPath()), kDBOpenCurrent);
  EXPECT_EQ(catalogId(catalogPath()), assigned);
}

// ---- Tables and columns

TEST_F(DBReactorTest, DifferentColumnsFailAndChangeNothing) {
  reactor->Close();
  const std::string original = fileBytes(catalogPath());
  const auto restore = [&] { writeFileBytes(catalogPath(), original); };
  const std::vector<std::function<void()>> edits{
      [&] { editTableDefinition(catalogPath(), "images", "width INTEGER", "width TEXT"); },
      [&] { editTableDefinition(catalogPath(), "catalog_info", "value INTEGER", "value TEXT"); },
      [&] {
        editTableDefinition(catalogPath(), "filter_images", "PRIMARY KEY (filter_id, image_id)",
                            "PRIMARY KEY (image_id, filter_id)");
      },
      [&] {
        editTableDefinition(catalogPath(), "images", "REFERENCES paths(_id_int_64) ON DELETE SET NULL",
                            "REFERENCES volumes(_id_int_64) ON DELETE SET NULL");
      },
      [&] {
        editTableDefinition(catalogPath(), "filters", "REFERENCES filters(_id_int_64) ON DELETE CASCADE",
                            "REFERENCES filters(_id_int_64) ON DELETE SET NULL");
      },
      [&] {
        editTableDefinition(catalogPath(), "image_states", "is_current INTEGER NOT NULL DEFAULT 0",
                            "is_current INTEGER NOT NULL DEFAULT 0, extra INTEGER");
      },
      [&] { rawSql(catalogPath(), "ALTER TABLE state_resources RENAME COLUMN resource_id TO resource"); },
      [&] { rawSql(catalogPath(), "ALTER TABLE referenced_folder_images RENAME TO old_images"); },
      [&] { rawSql(catalogPath(), "ALTER TABLE reffolders RENAME COLUMN parent_id TO parent"); },
      [&] { rawSql(catalogPath(), "CREATE TABLE extra(value)"); },
  };
  for (size_t index = 0; index < edits.size(); ++index) {
    SCOPED_TRACE("edit " + std::to_string(index));
    edits[index]();
    expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
    restore();
  }
  EXPECT_EQ(openResult(catalogPath()), kDBOpenCurrent);
}

TEST_F(DBReactorTest, OlderVersionWithDifferentColumnsFails) {
  reactor->Close();
  for (const auto& index : namedIndexes(catalogPath())) rawSql(catalogPath(), "DROP INDEX " + index);
  rawSql(catalogPath(),
         "PRAGMA user_version = 119; ALTER TABLE images RENAME COLUMN folder_path_id TO folder;");
  expectRefusedUnchanged(catalogPath(), {kDBOpenFailed});
}

// ---- Initialize and versions

TEST_F(DBReactorTest, InitializeCreatesTheHiddenRoots) {
  auto rootFilter = reactor->GetRoot<DBFilter>();
  auto rootFolder = reactor->GetRoot<DBRefFolder>();
  ASSERT_TRUE(rootFilter);
  ASSERT_TRUE(rootFolder);
  EXPECT_EQ(rootFilter->id(), 1);
  EXPECT_EQ(rootFolder->id(), 1);
  EXPECT_EQ(reactor->DBUserVersion(), DBSchema::kCurrentVersion);
}

TEST_F(DBReactorTest, FileWithoutRootsAnswersNoRoot) {
  reactor->Close();
  rawSql(catalogPath(), "DELETE FROM filters; DELETE FROM reffolders;");
  DBReactor rootless(5);
  ASSERT_EQ(rootless.Open(s2ws(catalogPath()), L""), kDBOpenCurrent);
  EXPECT_EQ(rootless.GetRoot<DBFilter>(), nullptr);
  EXPECT_EQ(rootless.GetRoot<DBRefFolder>(), nullptr);
}

TEST_F(DBReactorTest, ProductVersionRoundTrips) {
  EXPECT_GE(reactor->DBUserVersion(), 119);
  EXPECT_EQ(reactor->GetDBApplicationID(), 0);
  reactor->SetDBApplicationID(4217);
  EXPECT_EQ(reactor->GetDBApplicationID(), 4217);
  reactor->Close();
  DBReactor again(5);
  ASSERT_EQ(again.Open(s2ws(catalogPath()), L""), kDBOpenCurrent);
  EXPECT_EQ(again.GetDBApplicationID(), 4217);
}

// ---- Reads and writes

TEST_F(DBReactorTest, WriteAssignsIdsAndGetReadsBack) {
  auto image = makeImage(L"IMG_0001.CR3");
  ASSERT_TRUE(image->is_saved());
  auto read = reactor->Get<DBImage>(image->id());
  ASSERT_TRUE(read);
  EXPECT_NE(read.get(), image.get());
  EXPECT_EQ(read->column_values(), image->column_values());
}

TEST_F(DBReactorTest, GetOfAMissingIdIsEmpty) {
  EXPECT_EQ(reactor->Get<DBImage>(12345), nullptr);
  EXPECT_EQ(reactor->Get<DBPath>(1), nullptr);
  EXPECT_EQ(reactor->Get<DBSmartFilter>(1), nullptr);
  EXPECT_EQ(reactor->Get<DBUserImgAttrib>(1), nullptr);
  EXPECT_EQ(reactor->Get<DBExivImgAttrib>(1), nullptr);
}

TEST_F(DBReactorTest, WritingASavedRecordUpdatesIt) {
  auto image = makeImage(L"a.jpg");
  image->width = 6000;
  image->file_size = 1LL << 40;
  *reactor << image;
  auto read = reactor->Get<DBImage>(image->id());
  EXPECT_EQ(read->width, 6000);
  EXPECT_EQ(read->file_size, 1LL << 40);
  EXPECT_EQ(reactor->Count<DBImage>(), 1u);
}

TEST_F(DBReactorTest, WritingThroughTheBaseRecordReachesItsTable) {
  std::shared_ptr<DBEntity> volume = std::make_shared<DBVolume>();
  std::static_pointer_cast<DBVolume>(volume)->uuid = L"6F2C-11AA";
  *reactor << volume;
  ASSERT_TRUE(volume->is_saved());
  auto path = makePath(L"Photos", volume->id());
  auto read = reactor->GetBy<DBVolume, DBPath>(path);
  ASSERT_TRUE(read);
  EXPECT_EQ(read->uuid, L"6F2C-11AA");
}

TEST_F(DBReactorTest, WideTextSurvivesTheFile) {
  auto image = makeImage(L"\u00c9t\u00e9 \u65e5\u672c \U0001F600.heic");
  EXPECT_EQ(reactor->Get<DBImage>(image->id())->path, L"\u00c9t\u00e9 \u65e5\u672c \U0001F600.heic");
}

TEST_F(DBReactorTest, BatchWritesAllRecords) {
  std::vector<std::shared_ptr<DBImage>> images;
  for (int i = 0; i < 100; ++i) {
    images.push_back(std::make_shared<DBImage>());
    images.back()->import_index = i;
  }
  *reactor << images;
  EXPECT_EQ(reactor->Count<DBImage>(), 100u);
  EXPECT_EQ(reactor->Get<DBImage>(images[42]->id())->import_index, 42);
}

TEST_F(DBReactorTest, BatchWithAnEmptyRecordWritesNothing) {
  std::vector<std::shared_ptr<DBImage>> images{std::make_shared<DBImage>(), nullptr};
  EXPECT_THROW(*reactor << images, DBException);
  EXPECT_EQ(reactor->Count<DBImage>(), 0u);
}

TEST_F(DBReactorTest, BatchThatFailsHalfwayLeavesTheCatalogAsItWas) {
  auto first = std::make_shared<DBUserImgAttrib>();
  first->image_id = makeImage(L"a.jpg")->id();
  auto second = std::make_shared<DBUserImgAttrib>();
  second->image_id = 999999;  // no such image: the link check fails on the second record
  EXPECT_THROW((*reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{first, second}), DBException);
  EXPECT_EQ(reactor->Get<DBUserImgAttrib>(1), nullptr);
}

TEST_F(DBReactorTest, ImageAttributesComeUnsavedUntilWritten) {
  auto image = makeImage(L"a.jpg");
  auto attributes = reactor->GetBy<DBUserImgAttrib, DBImage>(image);
  ASSERT_TRUE(attributes);
  EXPECT_FALSE(attributes->is_saved());
  EXPECT_EQ(attributes->image_id, image->id());
  attributes->rating = 4;
  *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
  auto again = reactor->GetBy<DBUserImgAttrib, DBImage>(image);
  EXPECT_EQ(again->id(), attributes->id());
  EXPECT_EQ(again->rating, 4);
  EXPECT_EQ((reactor->GetBy<DBImage, DBUserImgAttrib>(again)->id()), image->id());
}

TEST_F(DBReactorTest, ExifAttributesLinkBothWays) {
  auto image = makeImage(L"a.jpg");
  auto exif = reactor->GetBy<DBExivImgAttrib, DBImage>(image);
  exif->camera_model = L"X-T5";
  *reactor << std::vector<std::shared_ptr<DBExivImgAttrib>>{exif};
  EXPECT_EQ((reactor->GetBy<DBExivImgAttrib, DBImage>(image)->camera_model), L"X-T5");
  EXPECT_EQ((reactor->GetBy<DBImage, DBExivImgAttrib>(exif)->id()), image->id());
  EXPECT_EQ((reactor->GetBy<DBExivImgAttrib, DBImage>(nullptr)), nullptr);
}

TEST_F(DBReactorTest, FavoriteAliasOfAnyRecord) {
  auto image = makeImage(L"a.jpg");
  EXPECT_EQ((reactor->GetBy<DBEntityFavoriteAlias, DBEntity>(image)), nullptr);
  auto alias = std::make_shared<DBEntityFavoriteAlias>();
  alias->orig_type = image->type();
  alias->orig_id = image->id();
  alias->favorite = true;
  *reactor << alias;
  auto found = reactor->GetBy<DBEntityFavoriteAlias, DBEntity>(image);
  ASSERT_TRUE(found);
  EXPECT_EQ(found->orig_entity_type(), kDBImageType);
  EXPECT_TRUE(reactor->Remove(image));
  EXPECT_EQ((reactor->GetBy<DBEntityFavoriteAlias, DBEntity>(image)), nullptr);
}

TEST_F(DBReactorTest, AttributesOfTreeRecords) {
  auto filter = makeFilter(L"Trips");
  EXPECT_EQ((reactor->GetAttributes<DBFilterAttrib, DBFilter>(filter)), nullptr);
  auto attributes = std::make_shared<DBFilterAttrib>();
  attributes->filter_id = filter->id();
  attributes->favorite = true;
  std::shared_ptr<DBEntity> base = attributes;
  *reactor << base;
  auto found = reactor->GetAttributes<DBFilterAttrib, DBFilter>(filter);
  ASSERT_TRUE(found);
  EXPECT_TRUE(found->favorite);
  EXPECT_EQ((reactor->GetAttributes<DBRefFolderAttrib, DBRefFolder>(reactor->GetRoot<DBRefFolder>())),
            nullptr);
}

// ---- Failures

TEST_F(DBReactorTest, WriteAfterCloseThrows) {
  reactor->Close();
  try {
    makeImage(L"late.jpg");
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.code(), DBException::kNoCode);
    EXPECT_STREQ(exception.what(), "The catalog is not open");
  }
  EXPECT_THROW(reactor->Count<DBImage>(), DBException);
}

TEST_F(DBReactorTest, ReadOnlyFileRefusesWritesWithACode) {
  makeImage(L"kept.jpg");
  reactor->Close();
  std::filesystem::permissions(catalogPath(), std::filesystem::perms::owner_read |
                                                  std::filesystem::perms::group_read |
                                                  std::filesystem::perms::others_read);
  // The superuser writes read-only files: take an ordinary user's rights for this test.
  KRUnprivilegedUser unprivileged(directory.path());
  ASSERT_NE(faccessat(AT_FDCWD, catalogPath().c_str(), W_OK, AT_EACCESS), 0);
  DBReactor readOnly(5);
  ASSERT_EQ(readOnly.Open(s2ws(catalogPath()), L""), kDBOpenCurrent);
  EXPECT_EQ(readOnly.Count<DBImage>(), 1u);
  try {
    auto image = std::make_shared<DBImage>();
    readOnly << image;
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_EQ(exception.code() & 0xff, SQLITE_READONLY);
  }
  EXPECT_EQ(readOnly.Count<DBImage>(), 1u);
}

TEST_F(DBReactorTest, FullDiskFailsWithACodeAndWritesNothing) {
  std::vector<std::shared_ptr<DBImage>> images;
  for (int i = 0; i < 2000; ++i) {
    images.push_back(std::make_shared<DBImage>());
    images.back()->path = std::wstring(200, L'x');
  }
  // The file may not grow past its current size: the batch cannot fit.
  rlimit previous{};
  getrlimit(RLIMIT_FSIZE, &previous);
  const auto size = static_cast<rlim_t>(std::filesystem::file_size(catalogPath()) + 4096);
  rlimit limited{size, previous.rlim_max};
  std::signal(SIGXFSZ, SIG_IGN);
  setrlimit(RLIMIT_FSIZE, &limited);
  bool threw = false;
  int32_t code = 0;
  try {
    *reactor << images;
  } catch (const DBException& exception) {
    threw = true;
    code = exception.code();
  }
  setrlimit(RLIMIT_FSIZE, &previous);
  EXPECT_TRUE(threw);
  EXPECT_NE(code, DBException::kNoCode);
  EXPECT_EQ(reactor->Count<DBImage>(), 0u);
}

// ---- Backup

TEST_F(DBReactorTest, BackupWritesAConsistentCopy) {
  makeImage(L"a.jpg");
  makeImage(L"b.jpg");
  const std::string copy = directory.file("copy.krcatalog");
  ASSERT_TRUE(reactor->Backup(s2ws(copy)));
  makeImage(L"c.jpg");
  DBReactor backup(5);
  ASSERT_EQ(backup.Open(s2ws(copy), L""), kDBOpenCurrent);
  EXPECT_EQ(backup.Count<DBImage>(), 2u);
  EXPECT_EQ(reactor->Count<DBImage>(), 3u);
}

TEST_F(DBReactorTest, BackupReplacesAnExistingFileAndLeavesNoTemporaryFile) {
  const std::string copy = directory.file("copy.krcatalog");
  std::ofstream(copy) << "old content";
  ASSERT_TRUE(reactor->Backup(s2ws(copy)));
  EXPECT_EQ(openResult(copy), kDBOpenCurrent);
  int files = 0;
  for (const auto& entry : std::filesystem::directory_iterator(directory.path())) {
    files += entry.path().filename().string().find(".backup-") == std::string::npos ? 0 : 1;
  }
  EXPECT_EQ(files, 0);
}

TEST_F(DBReactorTest, BackupIsACatalogOfItsOwnThatTheOriginalsLogCannotReach) {
  makeImage(L"a.jpg");
  const std::string copy = directory.file("copy.krcatalog");
  ASSERT_TRUE(reactor->Backup(s2ws(copy)));
  EXPECT_EQ(catalogId(copy).size(), 32u);
  EXPECT_NE(catalogId(copy), catalogId(catalogPath()));
  // The original goes on writing; its log, left beside the copy restored in its place, is refused.
  makeImage(L"b.jpg");
  writeFileBytes(copy + "-wal", fileBytes(catalogPath() + "-wal"));
  expectRefusedUnchanged(copy, {kDBOpenFailed});
  std::filesystem::remove(copy + "-wal");
  DBReactor restored(kAppInfo);
  ASSERT_EQ(restored.Open(s2ws(copy), L""), kDBOpenCurrent);
  EXPECT_EQ(restored.Count<DBImage>(), 1u);
}

TEST_F(DBReactorTest, BackupRemovesTheTemporariesOfGoneProcessesOnly) {
  const std::string copy = directory.file("copy.krcatalog");
  const pid_t gone = fork();
  if (gone == 0) _exit(0);
  waitpid(gone, nullptr, 0);
  const pid_t live = fork();
  if (live == 0) {
    pause();
    _exit(0);
  }
  const std::string stale = copy + ".backup-" + std::to_string(gone) + "-3";
  const std::vector<std::string> kept{
      copy + ".backup-" + std::to_string(live) + "-0", copy + ".backup-" + std::to_string(getpid()) + "-99",
      copy + ".backup-" + std::to_string(gone) + "-3-other",
      directory.file("other.krcatalog.backup-" + std::to_string(gone) + "-1")};
  for (const std::string suffix : {"", "-journal", "-wal"}) writeFileBytes(stale + suffix, "partial copy");
  for (const auto& path : kept) writeFileBytes(path, "in use");
  EXPECT_TRUE(reactor->Backup(s2ws(copy)));
  kill(live, SIGKILL);
  waitpid(live, nullptr, 0);
  for (const std::string suffix : {"", "-journal", "-wal"})
    EXPECT_FALSE(std::filesystem::exists(stale + suffix));
  for (const auto& path : kept) EXPECT_EQ(fileBytes(path), "in use") << path;
  EXPECT_EQ(openResult(copy), kDBOpenCurrent);
}

TEST_F(DBReactorTest, BackupToAMissingFolderFails) {
  EXPECT_FALSE(reactor->Backup(s2ws(directory.file("missing/copy.krcatalog"))));
  EXPECT_FALSE(reactor->Backup(L""));
}

// The facade's templates serve only the record types they name; other types do not compile.
template <class T>
concept GettableRecord = requires(const DBReactor& reactor) {
  reactor.Get<T>(1);
};
template <class T, class U>
concept RelatedRecords = requires(const DBReactor& reactor, std::shared_ptr<U> record) {
  reactor.GetBy<T, U>(record);
};
template <class T>
concept QueriedRecord = requires(DBReactor& reactor, std::shared_ptr<DBEntitySelectQuery> query) {
  reactor.GetBySelectQuery<T>(query);
};

TEST(DBReactorTemplatesTest, AcceptOnlyTheRecordTypesTheyServe) {
  static_assert(GettableRecord<DBImage> && GettableRecord<DBExivImgAttrib>);
  static_assert(!GettableRecord<DBVolume> && !GettableRecord<DBResource>);
  static_assert(RelatedRecords<DBPath, DBImage> && RelatedRecords<DBVolume, DBPath>);
  static_assert(!RelatedRecords<DBImage, DBVolume> && !RelatedRecords<DBVolume, DBImage>);
  static_assert(QueriedRecord<DBVolume> && !QueriedRecord<DBFilter>);
  SUCCEED();
}
