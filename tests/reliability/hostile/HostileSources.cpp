#include "HostileSources.hpp"

#include <stdexcept>

#include "CatalogFormat.hpp"
#include "CatalogPopulator.hpp"
#include "FileBytes.hpp"
#include "RawDatabase.hpp"
#include "dbstrings.hpp"

namespace reliability {

namespace {

std::filesystem::path withSuffix(const std::filesystem::path& file, const std::string& suffix) {
  return file.string() + suffix;
}

void open(dbcore::DBReactor& reactor, const std::filesystem::path& file, int expectedAnswer) {
  if (reactor.Open(dbcore::s2ws(file.string()), L"") != expectedAnswer)
    throw std::runtime_error("cannot open " + file.string() + " as a catalog");
  if (expectedAnswer == dbcore::kDBOpenNeedsUpdate) reactor.Initialize();
}

void makeCatalogFile(const std::filesystem::path& file, const std::wstring& label, int images) {
  dbcore::DBReactor reactor(kAppInfo);
  open(reactor, file, dbcore::kDBOpenNeedsUpdate);
  CatalogPopulator(reactor, label).fill(images);
}

std::string nonEmptyFile(const std::filesystem::path& file) {
  std::string bytes = FileBytes::read(file);
  if (bytes.empty()) throw std::runtime_error(file.string() + " is empty");
  return bytes;
}

}  // namespace

HostileSources::HostileSources(const std::filesystem::path& folder) : folder_(folder) {
  std::filesystem::create_directories(folder_);
  makeCatalog();
  makeForeignCatalogWal();
  makeOtherDatabase();
  makeOtherDatabaseWal();
  makeOtherDatabaseHotJournal();
}

void HostileSources::makeCatalog() {
  const std::filesystem::path file = folder_ / "valid.krcatalog";
  makeCatalogFile(file, L"valid", 60);
  catalog_ = nonEmptyFile(file);
  readSchema(file);
}

void HostileSources::readSchema(const std::filesystem::path& file) {
  RawDatabase database(file);
  pageSize_ = static_cast<size_t>(database.integer("PRAGMA page_size"));
  for (const auto& table :
       database.rows("SELECT name FROM sqlite_schema WHERE type = 'table' ORDER BY rootpage"))
    tables_[table] = database.rows("SELECT name FROM pragma_table_info('" + table + "')");
  indexes_ = database.rows(
      "SELECT name FROM sqlite_schema WHERE type = 'index' AND sql IS NOT NULL ORDER BY rootpage");
}

// A second catalog, reopened and written again: its -wal holds committed frames while it is open.
void HostileSources::makeForeignCatalogWal() {
  const std::filesystem::path file = folder_ / "foreign.krcatalog";
  makeCatalogFile(file, L"foreign", 40);
  dbcore::DBReactor reactor(kAppInfo);
  open(reactor, file, dbcore::kDBOpenCurrent);
  CatalogPopulator(reactor, L"foreign-late").fill(30);
  foreignCatalogWal_ = nonEmptyFile(withSuffix(file, "-wal"));
}

void HostileSources::makeOtherDatabase() {
  const std::filesystem::path file = folder_ / "other.db";
  RawDatabase(file).exec(
      "CREATE TABLE notes(id INTEGER PRIMARY KEY, body TEXT);"
      "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 2000)"
      "  INSERT INTO notes(body) SELECT printf('note %d %s', i, hex(randomblob(60))) FROM n;");
  otherDatabase_ = nonEmptyFile(file);
}

std::filesystem::path HostileSources::copyOfOtherDatabase(const std::string& name) const {
  const std::filesystem::path file = folder_ / name;
  FileBytes::write(file, otherDatabase_);
  return file;
}

void HostileSources::makeOtherDatabaseWal() {
  const std::filesystem::path file = copyOfOtherDatabase("other-wal.db");
  RawDatabase database(file);
  database.exec(
      "PRAGMA journal_mode = WAL; PRAGMA wal_autocheckpoint = 0;"
      "UPDATE notes SET body = upper(body) WHERE id % 3 = 0;");
  otherDatabaseWal_ = nonEmptyFile(withSuffix(file, "-wal"));
}

// A transaction larger than the page cache spills to the file: its journal is then synced and, copied
// before the rollback, is a hot journal.
void HostileSources::makeOtherDatabaseHotJournal() {
  const std::filesystem::path file = copyOfOtherDatabase("other-hot.db");
  RawDatabase database(file);
  database.exec(
      "PRAGMA journal_mode = DELETE; PRAGMA cache_size = 4; BEGIN; UPDATE notes SET body = lower(body) || "
      "'~';");
  otherDatabaseHotJournal_ = nonEmptyFile(withSuffix(file, "-journal"));
  database.exec("ROLLBACK");
}

}  // namespace reliability
