#include "dbreactor.hpp"

#include <sqlite3.h>

#include <cstdio>

#include "dbbackuptemporaries.hpp"
#include "dbcatalogidentity.hpp"
#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbidentitystamp.hpp"
#include "dblinks.hpp"
#include "dbopenclassifier.hpp"
#include "dbrecordio.hpp"
#include "dbrecordvisitor.hpp"
#include "dbschema.hpp"
#include "dbselectqueryrunner.hpp"
#include "dbstates.hpp"
#include "dbstrings.hpp"
#include "dbtree.hpp"

namespace dbcore {

namespace {

const DBStaticSql kUserVersionSql("PRAGMA user_version");
const DBStaticSql kProductVersionSql("SELECT value FROM catalog_info WHERE key = 'product_version'");

// Copies the consistent content of an open database into a new file. The copy is a catalog of its own:
// it gets a new identifier, so that the log of the original, left beside a restored copy, is refused.
bool copyDatabase(sqlite3* source, const std::string& destination) {
  sqlite3* target = nullptr;
  bool copied = sqlite3_open_v2(destination.c_str(), &target, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE,
                                nullptr) == SQLITE_OK;
  if (copied) {
    sqlite3_backup* backup = sqlite3_backup_init(target, "main", source, "main");
    copied = backup && sqlite3_backup_step(backup, -1) == SQLITE_DONE;
    copied = sqlite3_backup_finish(backup) == SQLITE_OK && copied;
  }
  copied = copied && DBCatalogIdentity::renew(target);
  return sqlite3_close_v2(target) == SQLITE_OK && copied;
}

}  // namespace

DBReactor::DBReactor(AppInfo const& appInfo) : appInfo_(appInfo) {}

DBReactor::~DBReactor() = default;

DBConnection& DBReactor::connection() const {
  if (!connection_) throw DBException("The catalog is not open");
  return *connection_;
}

int DBReactor::Open(const std::wstring& path, const std::wstring&) {
  if (connection_ && connection_->inTransaction()) return kDBOpenFailed;
  Close();
  if (path.find(L'\0') != std::wstring::npos) return kDBOpenFailed;
  const std::string file = ws2s(path);
  const int result = DBOpenClassifier(file, DBSchema::applicationIdFor(appInfo_)).classify();
  if (result != kDBOpenCurrent && result != kDBOpenNeedsUpdate) return result;
  try {
    connection_ = std::make_unique<DBConnection>(file);
    useWriteAheadLog();
    stamp_ = std::make_unique<DBIdentityStamp>(connection_->handle());
    if (result == kDBOpenCurrent) adoptIdentity();
    return result;
  } catch (const std::exception&) {
    Close();
    return kDBOpenFailed;
  }
}

void DBReactor::useWriteAheadLog() {
  // A read-only file keeps its journal mode; its writes fail later with a DBException.
  try {
    connection_->exec("PRAGMA journal_mode = WAL");
  } catch (const DBException&) {
  }
}

// A catalog made before catalogs had an identifier gets one. The checkpoint puts it into the main file at
// once: until then the main file alone would show none, and a log beside it would be refused. A catalog
// that has one stamps the log its writes go to.
void DBReactor::adoptIdentity() {
  try {
    if (DBCatalogIdentity::assignIfMissing(*connection_)) {
      stamp_->checkpoint();
      return;
    }
  } catch (const DBException&) {
  }
  stamp_->stamp();
}

void DBReactor::Initialize() {
  DBConnection& db = connection();
  db.transaction([&] {
    const int64_t version = db.queryInt64(kUserVersionSql);
    DBSchema::migrate(db, static_cast<int>(version));
    db.exec("PRAGMA application_id = " + std::to_string(DBSchema::applicationIdFor(appInfo_)));
    DBSchema::createRootRecords(db);
    DBCatalogIdentity::assignIfMissing(db);
  });
  stamp_->checkpoint();
}

void DBReactor::Close() {
  if (connection_ && connection_->inTransaction())
    throw DBException("The catalog cannot be closed in a batch");
  stamp_.reset();
  connection_.reset();
}

bool DBReactor::Backup(const std::wstring& path) {
  DBConnection& db = connection();
  const std::string destination = ws2s(path);
  if (destination.empty() || path.find(L'\0') != std::wstring::npos) return false;
  const DBBackupTemporaries temporaries(destination);
  temporaries.removeStale();
  const std::string temporary = temporaries.next();
  if (!copyDatabase(db.handle(), temporary) || std::rename(temporary.c_str(), destination.c_str()) != 0) {
    DBBackupTemporaries::remove(temporary);
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
