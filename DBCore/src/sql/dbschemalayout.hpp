#pragma once

#include <sqlite3.h>

#include <map>
#include <string>
#include <vector>

namespace dbcore {

// The tables of a database with, per table, its columns (name, declared type, primary-key position) and
// foreign keys (referenced table, columns, actions). Indexes are not part of it.
class DBSchemaLayout {
 public:
  // The layout of an open database; throws DBException when its schema cannot be read.
  static DBSchemaLayout of(sqlite3* db);
  // The layout of a catalog of the given version: the migration steps up to it, run in memory. The
  // versions the engine knows today share one layout: the steps after the first add indexes or drop
  // NOT NULL, which a layout does not hold.
  static DBSchemaLayout ofVersion(int version);

  bool operator==(const DBSchemaLayout& other) const = default;

 private:
  std::map<std::string, std::vector<std::string>> tables_;
};

}  // namespace dbcore
