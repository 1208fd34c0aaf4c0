#include "dbidentitystamp.hpp"

#include <utility>

namespace dbcore {

namespace {

// Two updates that give the row back its value: the page is written, its content is the same.
constexpr const char* kStampSql =
    "BEGIN IMMEDIATE;"
    "UPDATE catalog_info SET value = ' ' || value WHERE key = 'catalog_id';"
    "UPDATE catalog_info SET value = substr(value, 2) WHERE key = 'catalog_id';"
    "COMMIT;";

}  // namespace

DBIdentityStamp::DBIdentityStamp(sqlite3* db) : db_(db) {
  sqlite3_wal_hook(db_, &DBIdentityStamp::onCommit, this);
}

DBIdentityStamp::~DBIdentityStamp() { sqlite3_wal_hook(db_, nullptr, nullptr); }

void DBIdentityStamp::stamp() {
  stamping_ = true;
  if (sqlite3_exec(db_, kStampSql, nullptr, nullptr, nullptr) != SQLITE_OK && !sqlite3_get_autocommit(db_))
    sqlite3_exec(db_, "ROLLBACK", nullptr, nullptr, nullptr);
  stamping_ = false;
}

void DBIdentityStamp::checkpoint() {
  if (!sqlite3_get_autocommit(db_)) {
    checkpointAfterCommit_ = true;
    return;
  }
  int logFrames = 0;
  int movedFrames = 0;
  const int code =
      sqlite3_wal_checkpoint_v2(db_, "main", SQLITE_CHECKPOINT_TRUNCATE, &logFrames, &movedFrames);
  if (code == SQLITE_OK && logFrames == movedFrames) stamp();
}

// SQLite calls this after each commit, outside the transaction: the connection may write again here.
int DBIdentityStamp::onCommit(void* self, sqlite3*, const char*, int frames) {
  static_cast<DBIdentityStamp*>(self)->committed(frames);
  return SQLITE_OK;
}

void DBIdentityStamp::committed(int frames) {
  if (stamping_) return;
  const bool restarted = frames < lastFrames_;
  lastFrames_ = frames;
  if (std::exchange(checkpointAfterCommit_, false)) {
    checkpoint();
    return;
  }
  if (frames >= kCheckpointFrames) {
    int logFrames = 0;
    int movedFrames = 0;
    sqlite3_wal_checkpoint_v2(db_, "main", SQLITE_CHECKPOINT_PASSIVE, &logFrames, &movedFrames);
  }
  if (restarted) stamp();
}

}  // namespace dbcore
