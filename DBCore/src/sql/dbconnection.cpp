#include "dbconnection.hpp"

#include "dbexception.hpp"

namespace dbcore {

namespace {

[[noreturn]] void failOpen(sqlite3* db, int code) {
  std::string message = sqlite3_errstr(code);
  if (db) message += std::string(": ") + sqlite3_errmsg(db);
  const int extended = db ? sqlite3_extended_errcode(db) : code;
  sqlite3_close_v2(db);
  throw DBException(message, extended);
}

}  // namespace

DBConnection::DBConnection(const std::string& path) {
  const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_NOMUTEX;
  const int code = sqlite3_open_v2(path.c_str(), &db_, flags, nullptr);
  if (code != SQLITE_OK) failOpen(db_, code);
  sqlite3_extended_result_codes(db_, 1);
  try {
    configure();
  } catch (...) {
    statements_.clear();
    sqlite3_close_v2(db_);
    db_ = nullptr;
    throw;
  }
}

DBConnection::~DBConnection() {
  statements_.clear();
  sqlite3_close_v2(db_);
}

void DBConnection::configure() {
  sqlite3_db_config(db_, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_ENABLE_TRIGGER, 0, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_ENABLE_VIEW, 0, nullptr);
  sqlite3_busy_timeout(db_, 5000);
  exec("PRAGMA foreign_keys = ON");
  // Statement journals (an update of a table with foreign keys keeps one per statement) stay in memory
  // instead of going through a temporary file page by page.
  exec("PRAGMA temp_store = MEMORY");
  // Reading the schema here makes a file that is not a database fail now rather than later.
  queryInt64("SELECT count(*) FROM sqlite_schema");
}

void DBConnection::exec(const std::string& sql) {
  char* error = nullptr;
  const int code = sqlite3_exec(db_, sql.c_str(), nullptr, nullptr, &error);
  if (code == SQLITE_OK) return;
  std::string message = error ? error : sqlite3_errstr(code);
  sqlite3_free(error);
  throw DBException(message, sqlite3_extended_errcode(db_));
}

DBStatement& DBConnection::prepare(const std::string& sql) {
  auto& slot = statements_[sql];
  if (!slot) {
    try {
      slot = std::make_unique<DBStatement>(db_, sql);
    } catch (...) {
      statements_.erase(sql);
      throw;
    }
  }
  return slot->reset();
}

int64_t DBConnection::queryInt64(const std::string& sql) {
  DBStatement& statement = prepare(sql);
  const int64_t value = statement.step() ? statement.columnInt64(0) : 0;
  statement.reset();
  return value;
}

void DBConnection::transaction(const std::function<void()>& body) {
  const std::string savepoint = "kr_sp" + std::to_string(transactionDepth_);
  exec(transactionDepth_ == 0 ? "BEGIN IMMEDIATE" : "SAVEPOINT " + savepoint);
  ++transactionDepth_;
  try {
    body();
  } catch (...) {
    --transactionDepth_;
    if (transactionDepth_ == 0) {
      sqlite3_exec(db_, "ROLLBACK", nullptr, nullptr, nullptr);
    } else {
      sqlite3_exec(db_, ("ROLLBACK TO " + savepoint + "; RELEASE " + savepoint).c_str(), nullptr, nullptr,
                   nullptr);
    }
    throw;
  }
  --transactionDepth_;
  if (transactionDepth_ > 0) {
    exec("RELEASE " + savepoint);
    return;
  }
  try {
    exec("COMMIT");
  } catch (...) {
    sqlite3_exec(db_, "ROLLBACK", nullptr, nullptr, nullptr);
    throw;
  }
}

}  // namespace dbcore
