#include "dbconnection.hpp"

#include <exception>

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

sqlite3* openDatabase(const std::string& path) {
  sqlite3* db = nullptr;
  const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_NOMUTEX;
  const int code = sqlite3_open_v2(path.c_str(), &db, flags, nullptr);
  if (code != SQLITE_OK) failOpen(db, code);
  sqlite3_extended_result_codes(db, 1);
  return db;
}

}  // namespace

DBConnection::DBConnection(const std::string& path) : db_(openDatabase(path)), statements_(db_) {
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
  static const DBStaticSql kCountSchema("SELECT count(*) FROM sqlite_schema");
  queryInt64(kCountSchema);
}

void DBConnection::exec(const std::string& sql) {
  char* error = nullptr;
  const int code = sqlite3_exec(db_, sql.c_str(), nullptr, nullptr, &error);
  if (code == SQLITE_OK) return;
  std::string message = error ? error : sqlite3_errstr(code);
  sqlite3_free(error);
  throw DBException(message, sqlite3_extended_errcode(db_));
}

DBStatementLease DBConnection::prepare(const DBStaticSql& sql) {
  return DBStatementLease(statements_.statement(sql));
}

DBStatementLease DBConnection::prepare(const std::string& sql) {
  return DBStatementLease(statements_.statement(sql));
}

void DBConnection::singleChange(const std::function<void()>& body) {
  if (inTransaction()) return body();
  transaction(body);
}

void DBConnection::transaction(const std::function<void()>& body) {
  // SQLite rolls a whole transaction back on some errors (a full disk, say): a savepoint opened then
  // would start a transaction of its own and commit apart from the one it was meant to join.
  if (transactionDepth_ > 0 && sqlite3_get_autocommit(db_))
    throw DBException("The open transaction was rolled back by an earlier error");
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
  commit();
}

void DBConnection::commitTogether(const std::function<void()>& body) {
  if (transactionDepth_ > 0) {
    body();
    return;
  }
  exec("BEGIN IMMEDIATE");
  ++transactionDepth_;
  std::exception_ptr failure;
  try {
    body();
  } catch (...) {
    failure = std::current_exception();
  }
  --transactionDepth_;
  commit();
  if (failure) std::rethrow_exception(failure);
}

void DBConnection::commit() {
  try {
    exec("COMMIT");
  } catch (...) {
    sqlite3_exec(db_, "ROLLBACK", nullptr, nullptr, nullptr);
    throw;
  }
}

}  // namespace dbcore
