#pragma once

#include <sqlite3.h>

#include <cstdint>
#include <string>

namespace dbcore {

// A connection to a database file that cannot write it: used to look at a file before the engine accepts
// it. Throws DBException when the file cannot be opened or read.
class DBReadOnlyDatabase {
 public:
  enum class View {
    // The bytes of the main file alone; no journal or write-ahead log is read, no file is created.
    kMainFile,
    // The committed content: the main file with the frames of its write-ahead log. SQLite creates the log's
    // index (-shm) when it is missing.
    kCommitted,
    // The same, reading an existing index without writing it (rebuilt in memory when it is stale).
    kCommittedWithReadOnlyIndex,
  };

  DBReadOnlyDatabase(const std::string& path, View view);
  ~DBReadOnlyDatabase();
  DBReadOnlyDatabase(const DBReadOnlyDatabase&) = delete;
  DBReadOnlyDatabase& operator=(const DBReadOnlyDatabase&) = delete;

  // One value of a query of the engine's own returning one row and column (0 or "" when there is none).
  int64_t integer(const std::string& sql) const;
  std::string text(const std::string& sql) const;
  sqlite3* handle() const { return db_; }

  // The SQLite URI naming the file with the view's parameters; the path is percent-encoded.
  static std::string uri(const std::string& path, View view);

 private:
  sqlite3* db_ = nullptr;
};

}  // namespace dbcore
