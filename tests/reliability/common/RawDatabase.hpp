#pragma once

#include <filesystem>
#include <string>
#include <vector>

struct sqlite3;

namespace reliability {

// A plain SQLite connection, outside the engine: makes fixture files and inspects what the engine left.
// Failures throw std::runtime_error with SQLite's message.
class RawDatabase {
 public:
  // Opens the file for reading and writing, creating it when missing.
  explicit RawDatabase(const std::filesystem::path& path);
  ~RawDatabase();
  RawDatabase(const RawDatabase&) = delete;
  RawDatabase& operator=(const RawDatabase&) = delete;

  void exec(const std::string& sql);
  // Every row of a query, its columns as text joined by '|' (NULL as "NULL").
  std::vector<std::string> rows(const std::string& sql);
  // The first column of the first row as an integer; 0 when there is no row.
  long long integer(const std::string& sql);
  // Empty when integrity_check answers "ok" and foreign_key_check finds nothing; otherwise their report.
  std::string integrityProblems();
  // The header values, the schema and every row of every table, as text that compares equal exactly
  // when two files hold the same catalog content.
  std::string contentText();

 private:
  std::string failure(const std::string& sql) const;

  sqlite3* handle_ = nullptr;
};

}  // namespace reliability
