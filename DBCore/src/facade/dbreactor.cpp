#include "dbreactor.hpp"

#include <sqlite3.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <filesystem>

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dblinks.hpp"
#include "dbrecordio.hpp"
#include "dbrecordvisitor.hpp"
#include "dbschema.hpp"
#include "dbselectqueryrunner.hpp"
#include "dbstates.hpp"
#include "dbstrings.hpp"
#include "dbtree.hpp"

namespace dbcore {

namespace {

const DBStaticSql kApplicationIdSql("PRAGMA application_id");
const DBStaticSql kUserVersionSql("PRAGMA user_version");
const DBStaticSql kSchemaObjectsSql("SELECT count(*) FROM sqlite_schema");
const DBStaticSql kProductVersionSql("SELECT value FROM catalog_info WHERE key = 'product_version'");

// Copies the consistent content of an open database into a new file.
bool copyDatabase(sqlite3* source, const std::string& destination) {
  sqlite3* target = nullptr;
  bool copied = sqlite3_open_v2(destination.c_str(), &target, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE,
                                nullptr) == SQLITE_OK;
  if (copied) {
    sqlite3_backup* backup = sqlite3_backup_init(target, "main", source, "main");
    copied = backup && sqlite3_backup_step(backup, -1) == SQLITE_DONE;
    copied = sqlite3_backup_finish(backup) == SQLITE_OK && copied;
  }
  return sqlite3_close_v2(target) == SQLITE_OK && copied;
}

std::string temporaryPathBeside(const std::string& path) {
  static std::atomic<unsigned> counter{0};
  return path + ".backup-" + std::to_string(getpid()) + "-" + std::to_string(counter++);
}

}  // namespace

DBReactor::DBReactor(AppInfo const& appInfo) : appInfo_(appInfo) {}

DBReactor::~DBReactor() = default;

DBConnection& DBReactor::connection() const {
  if (!connection_) throw DBException("The catalog is not open");
  return *connection_;
}

int DBReactor::Open(const std::wstring& path, const std::wstring&) {
  Close();
  const std::string file = ws2s(path);
  std::error_code error;
  if (file.empty() || std::filesystem::is_directory(file, error)) return kDBOpenFailed;
  try {
    connection_ = std::make_unique<DBConnection>(file);
    const int result = classifyOpenedFile();
    if (result != kDBOpenCurrent && result != kDBOpenNeedsUpdate) connection_.reset();
    return result;
  } catch (const std::exception&) {
    connection_.reset();
    return kDBOpenFailed;
  }
}

int DBReactor::classifyOpenedFile() {
  DBConnection& db = *connection_;
  const int64_t applicationId = db.queryInt64(kApplicationIdSql);
  const int64_t version = db.queryInt64(kUserVersionSql);
  const int64_t objects = db.queryInt64(kSchemaObjectsSql);
  if (applicationId == 0 && version == 0 && objects == 0) return useWriteAheadLog(kDBOpenNeedsUpdate);
  if (applicationId != DBSchema::applicationIdFor(appInfo_)) return kDBOpenIncompatible;
  if (version > DBSchema::kCurrentVersion || version < DBSchema::kOldestVersion) return kDBOpenIncompatible;
  if (version < DBSchema::kCurrentVersion) return useWriteAheadLog(kDBOpenNeedsUpdate);
  return DBSchema::isWellFormed(db) ? useWriteAheadLog(kDBOpenCurrent) : kDBOpenFailed;
}

int DBReactor::useWriteAheadLog(int result) {
  // A read-only file keeps its journal mode; its writes fail later with a DBException.
  try {
    connection_->exec("PRAGMA journal_mode = WAL");
  } catch (const DBException&) {
  }
  return result;
}

void DBReactor::Initialize() {
  DBConnection& db = connection();
  db.transaction([&] {
    const int64_t version = db.queryInt64(kUserVersionSql);
    DBSchema::migrate(db, static_cast<int>(version));
    db.exec("PRAGMA application_id = " + std::to_string(DBSchema::applicationIdFor(appInfo_)));
    DBSchema::createRootRecords(db);
  });
}

void DBReactor::Close() { connection_.reset(); }

bool DBReactor::Backup(const std::wstring& path) {
  DBConnection& db = connection();
  const std::string destination = ws2s(path);
  if (destination.empty()) return false;
  const std::string temporary = temporaryPathBeside(destination);
  if (!copyDatabase(db.handle(), temporary) || std::rename(temporary.c_str(), destination.c_str()) != 0) {
    std::remove(temporary.c_str());
    return false;
  }
  return true;
}

// ---- Versions

int DBReactor::DBUserVersion() const { return static_cast<int>(connection().queryInt64(kUserVersionSql)); }

ApplicationID DBReactor::GetDBApplicationID() const {
  return static_cast<ApplicationID>(connection().queryInt64(kProductVersionSql));
}

void DBReactor::SetDBApplicationID(ApplicationID version) const {
  DBConnection& db = connection();
  db.transaction([&] {
    static const DBStaticSql kSql(
        "INSERT OR REPLACE INTO catalog_info(key, value) VALUES ('product_version', ?)");
    db.prepare(kSql)->bind(1, static_cast<int64_t>(version)).execute();
  });
}

}  // namespace dbcore
