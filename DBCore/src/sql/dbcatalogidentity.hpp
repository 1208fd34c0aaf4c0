#pragma once

#include <sqlite3.h>

#include <cstdint>
#include <string>

namespace dbcore {

class DBConnection;
class DBReadOnlyDatabase;

// Who a catalog file is: its SQLite application_id and the random identifier stored in `catalog_info`
// under 'catalog_id' when the catalog was made. Two views of one file (its main file alone, and with its
// write-ahead log) must show the same identity, or the log belongs to another database.
class DBCatalogIdentity {
 public:
  // The identity a view shows; a file that cannot be read shows the unreadable identity.
  static DBCatalogIdentity of(const DBReadOnlyDatabase& database);
  static DBCatalogIdentity unreadable();
  // Stores a new random identifier in a catalog that has none, in a transaction of its own; true when it
  // did. Throws DBException when it cannot write.
  static bool assignIfMissing(DBConnection& connection);
  // Gives a catalog that has an identifier a new one (a copy becoming a catalog of its own); false when
  // it cannot write.
  static bool renew(sqlite3* db);

  bool readable() const { return readable_; }
  // A database without any schema object and without an application id: a file being created.
  bool blank() const { return readable_ && schemaObjects_ == 0 && applicationId_ == 0; }
  // Both views were read and show the same application id and catalog identifier.
  bool sameCatalog(const DBCatalogIdentity& other) const;

 private:
  bool readable_ = false;
  int64_t schemaObjects_ = 0;
  int64_t applicationId_ = 0;
  std::string catalogId_;
};

}  // namespace dbcore
