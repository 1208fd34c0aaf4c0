#include "RawDatabase.hpp"

#include <sqlite3.h>

#include <algorithm>
#include <stdexcept>

#include "Text.hpp"

namespace reliability {

namespace {

std::string columnText(sqlite3_stmt* statement, int column) {
  const unsigned char* text = sqlite3_column_text(statement, column);
  if (!text) return "NULL";
  return std::string(reinterpret_cast<const char*>(text),
                     static_cast<size_t>(sqlite3_column_bytes(statement, column)));
}

std::string rowText(sqlite3_stmt* statement) {
  std::string row;
  for (int column = 0; column < sqlite3_column_count(statement); ++column) {
    if (column > 0) row += '|';
    row += columnText(statement, column);
  }
  return row;
}

}  // namespace

RawDatabase::RawDatabase(const std::filesystem::path& path) {
  if (sqlite3_open_v2(path.c_str(), &handle_, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE, nullptr) !=
      SQLITE_OK) {
    const std::string message = handle_ ? sqlite3_errmsg(handle_) : "out of memory";
    sqlite3_close(handle_);
    throw std::runtime_error("cannot open " + path.string() + ": " + message);
  }
  sqlite3_busy_timeout(handle_, 5000);
}

RawDatabase::~RawDatabase() { sqlite3_close_v2(handle_); }

std::string RawDatabase::failure(const std::string& sql) const {
  return sqlite3_errmsg(handle_) + std::string(" (in: ") + sql + ")";
}

void RawDatabase::exec(const std::string& sql) {
  if (sqlite3_exec(handle_, sql.c_str(), nullptr, nullptr, nullptr) != SQLITE_OK)
    throw std::runtime_error(failure(sql));
}

std::vector<std::string> RawDatabase::rows(const std::string& sql) {
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_prepare_v2(handle_, sql.c_str(), -1, &statement, nullptr) != SQLITE_OK)
    throw std::runtime_error(failure(sql));
  std::vector<std::string> result;
  int step = SQLITE_ROW;
  while ((step = sqlite3_step(statement)) == SQLITE_ROW) result.push_back(rowText(statement));
  sqlite3_finalize(statement);
  if (step != SQLITE_DONE) throw std::runtime_error(failure(sql));
  return result;
}

long long RawDatabase::integer(const std::string& sql) {
  const std::vector<std::string> result = rows(sql);
  return result.empty() ? 0 : std::stoll(result.front());
}

std::string RawDatabase::integrityProblems() {
  try {
    const std::vector<std::string> integrity = rows("PRAGMA integrity_check");
    if (integrity != std::vector<std::string>{"ok"}) return "integrity_check: " + Text::join(integrity, "; ");
    const std::vector<std::string> foreignKeys = rows("PRAGMA foreign_key_check");
    if (!foreignKeys.empty()) return "foreign_key_check: " + Text::join(foreignKeys, "; ");
    return "";
  } catch (const std::exception& error) {
    return error.what();
  }
}

std::string RawDatabase::contentText() {
  std::vector<std::string> lines{"user_version " + rows("PRAGMA user_version").front(),
                                 "application_id " + rows("PRAGMA application_id").front()};
  for (const auto& entry : rows("SELECT type, name, tbl_name, sql FROM sqlite_schema ORDER BY type, name"))
    lines.push_back(entry);
  for (const auto& table : rows("SELECT name FROM sqlite_schema WHERE type = 'table' ORDER BY name")) {
    std::vector<std::string> tableRows = rows("SELECT * FROM \"" + table + "\"");
    std::sort(tableRows.begin(), tableRows.end());
    lines.push_back("table " + table);
    lines.insert(lines.end(), tableRows.begin(), tableRows.end());
  }
  return Text::join(lines, "\n");
}

}  // namespace reliability
