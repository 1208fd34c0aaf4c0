#include "dbreadonlydatabase.hpp"

#include "dbexception.hpp"
#include "dbstatement.hpp"

namespace dbcore {

namespace {

bool unreserved(unsigned char c) {
  return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '-' || c == '.' ||
         c == '_' || c == '~' || c == '/';
}

std::string percentEncoded(const std::string& path) {
  static const char kHex[] = "0123456789ABCDEF";
  std::string encoded;
  for (const unsigned char c : path) {
    if (unreserved(c)) {
      encoded += static_cast<char>(c);
    } else {
      encoded += '%';
      encoded += kHex[c >> 4];
      encoded += kHex[c & 15];
    }
  }
  return encoded;
}

const char* parameters(DBReadOnlyDatabase::View view) {
  switch (view) {
    case DBReadOnlyDatabase::View::kMainFile:
      return "?mode=ro&immutable=1";
    case DBReadOnlyDatabase::View::kCommitted:
      return "?mode=ro";
    case DBReadOnlyDatabase::View::kCommittedWithReadOnlyIndex:
      return "?mode=ro&readonly_shm=1";
  }
  return "?mode=ro";
}

[[noreturn]] void fail(sqlite3* db, int code) {
  std::string message = sqlite3_errstr(code);
  if (db) message += std::string(": ") + sqlite3_errmsg(db);
  const int extended = db ? sqlite3_extended_errcode(db) : code;
  sqlite3_close_v2(db);
  throw DBException(message, extended);
}

}  // namespace

DBReadOnlyDatabase::DBReadOnlyDatabase(const std::string& path, View view) {
  const int flags = SQLITE_OPEN_READONLY | SQLITE_OPEN_URI | SQLITE_OPEN_NOMUTEX;
  const int code = sqlite3_open_v2(uri(path, view).c_str(), &db_, flags, nullptr);
  if (code != SQLITE_OK) fail(db_, code);
  sqlite3_extended_result_codes(db_, 1);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_ENABLE_TRIGGER, 0, nullptr);
  sqlite3_db_config(db_, SQLITE_DBCONFIG_ENABLE_VIEW, 0, nullptr);
  // Closing never checkpoints: the log stays as it was found.
  sqlite3_db_config(db_, SQLITE_DBCONFIG_NO_CKPT_ON_CLOSE, 1, nullptr);
  // A reader of a log waits only while another connection rebuilds the log's index; an index that cannot
  // be read at all (a damaged -shm) would otherwise hold every read for the whole timeout.
  sqlite3_busy_timeout(db_, 1000);
}

DBReadOnlyDatabase::~DBReadOnlyDatabase() { sqlite3_close_v2(db_); }

int64_t DBReadOnlyDatabase::integer(const std::string& sql) const {
  DBStatement statement(db_, sql);
  return statement.step() ? statement.columnInt64(0) : 0;
}

std::string DBReadOnlyDatabase::text(const std::string& sql) const {
  DBStatement statement(db_, sql);
  return statement.step() ? statement.columnText(0) : std::string();
}

std::string DBReadOnlyDatabase::uri(const std::string& path, View view) {
  return "file:" + percentEncoded(path) + parameters(view);
}

}  // namespace dbcore
