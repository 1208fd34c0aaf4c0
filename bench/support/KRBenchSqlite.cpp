#include "KRBenchSqlite.hpp"

#include <chrono>
#include <cstdlib>
#include <string>

sqlite3_stmt* KRBenchSqlite::prepare(sqlite3* db, const char* sql) {
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_prepare_v2(db, sql, -1, &statement, nullptr) != SQLITE_OK) std::abort();
  return statement;
}

void KRBenchSqlite::execute(sqlite3_stmt* statement) {
  if (sqlite3_step(statement) != SQLITE_DONE) std::abort();
  sqlite3_reset(statement);
}

void KRBenchSqlite::bindText(sqlite3_stmt* statement, int index, const std::string& text) {
  sqlite3_bind_text(statement, index, text.c_str(), static_cast<int>(text.size()), SQLITE_TRANSIENT);
}

void KRBenchSqlite::insertAttributes(sqlite3_stmt* user, sqlite3_stmt* exif, sqlite3_int64 imageId, int i) {
  sqlite3_bind_int64(user, 1, imageId);
  sqlite3_bind_int(user, 2, i % 6);
  execute(user);
  sqlite3_bind_int64(exif, 1, imageId);
  bindText(exif, 2, "X-T" + std::to_string(i % 5));
  execute(exif);
}

double KRBenchSqlite::timed(const std::function<void()>& work) {
  const auto start = std::chrono::steady_clock::now();
  work();
  return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}
