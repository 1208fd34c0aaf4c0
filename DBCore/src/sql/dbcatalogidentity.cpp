#include "dbcatalogidentity.hpp"

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbreadonlydatabase.hpp"

namespace dbcore {

namespace {

constexpr const char* kHasCatalogInfoSql =
    "SELECT count(*) FROM sqlite_schema WHERE type = 'table' AND name = 'catalog_info'";
constexpr const char* kCatalogIdSql = "SELECT value FROM catalog_info WHERE key = 'catalog_id'";

}  // namespace

DBCatalogIdentity DBCatalogIdentity::of(const DBReadOnlyDatabase& database) {
  DBCatalogIdentity identity;
  try {
    identity.schemaObjects_ = database.integer("SELECT count(*) FROM sqlite_schema");
    identity.applicationId_ = database.integer("PRAGMA application_id");
    if (database.integer(kHasCatalogInfoSql) != 0) identity.catalogId_ = database.text(kCatalogIdSql);
    identity.readable_ = true;
  } catch (const DBException&) {
    return unreadable();
  }
  return identity;
}

DBCatalogIdentity DBCatalogIdentity::unreadable() { return DBCatalogIdentity(); }

bool DBCatalogIdentity::assignIfMissing(DBConnection& connection) {
  static const DBStaticSql kCountSql("SELECT count(*) FROM catalog_info WHERE key = 'catalog_id'");
  static const DBStaticSql kInsertSql(
      "INSERT OR IGNORE INTO catalog_info(key, value) VALUES ('catalog_id', lower(hex(randomblob(16))))");
  if (connection.queryInt64(kCountSql) != 0) return false;
  connection.transaction([&connection] { connection.prepare(kInsertSql)->execute(); });
  return true;
}

bool DBCatalogIdentity::renew(sqlite3* db) {
  return sqlite3_exec(db,
                      "UPDATE catalog_info SET value = lower(hex(randomblob(16))) WHERE key = 'catalog_id'",
                      nullptr, nullptr, nullptr) == SQLITE_OK;
}

bool DBCatalogIdentity::sameCatalog(const DBCatalogIdentity& other) const {
  return readable_ && other.readable_ && applicationId_ == other.applicationId_ &&
         catalogId_ == other.catalogId_;
}

}  // namespace dbcore
