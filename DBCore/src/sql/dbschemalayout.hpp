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
  // The layout of a catalog the engine's migration steps build. Every version the engine migrates has
  // the same tables, columns and keys: the steps after the first add indexes or relax constraints.
  static DBSchemaLayout expected();

  bool operator==(const DBSchemaLayout& other) const = default;

 private:
  std::map<std::string, std::vector<std::string>> tables_;
};

}  // namespace dbcore
