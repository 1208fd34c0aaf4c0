#pragma once

#include <sqlite3.h>

namespace dbcore {

// Keeps a catalog's identity in every generation of its write-ahead log. SQLite replays a log whatever
// database it came from, and a log holds only the pages its transactions changed; a log that holds the
// page of `catalog_info` shows, read with the main file, the identifier of the catalog that wrote it
// (DBCatalogIdentity). So the first transaction of each new log rewrites that page without changing its
// content: when the catalog is opened, after each checkpoint that empties the log, and after a commit that
// finds the log restarted. While installed, it also takes over SQLite's automatic checkpoint.
class DBIdentityStamp {
 public:
  // Installs the stamp on the connection's commits; the connection must outlive it.
  explicit DBIdentityStamp(sqlite3* db);
  ~DBIdentityStamp();
  DBIdentityStamp(const DBIdentityStamp&) = delete;
  DBIdentityStamp& operator=(const DBIdentityStamp&) = delete;

  // Rewrites the page of `catalog_info` in a transaction of its own; best effort, like any checkpoint.
  void stamp();
  // Moves the log into the main file and empties it, then stamps the log's next generation. Inside an
  // open transaction, where no checkpoint can run, it runs after the next commit.
  void checkpoint();

  // The log size at which a commit checkpoints, as SQLite's automatic checkpoint does.
  static constexpr int kCheckpointFrames = 1000;

 private:
  static int onCommit(void* self, sqlite3* db, const char* database, int frames);
  void committed(int frames);

  sqlite3* db_;
  int lastFrames_ = 0;
  bool stamping_ = false;
  bool checkpointAfterCommit_ = false;
};

}  // namespace dbcore
