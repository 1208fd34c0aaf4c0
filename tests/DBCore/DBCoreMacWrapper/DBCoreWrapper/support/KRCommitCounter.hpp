#pragma once

#include <sqlite3.h>

#include <cstdint>
#include <fstream>
#include <stdexcept>
#include <string>
#include <vector>

// A read-only connection of its own to a catalog file, for tests. It tells whether other connections
// committed since it last looked (SQLite's data_version changes between two reads when they did, however
// many commits there were), counts the commits held in the file's write-ahead log (one commit frame each)
// and answers single values of SQL statements (integrity checks, row counts). Used on one thread.
class KRCommitCounter {
 public:
  explicit KRCommitCounter(const std::string& path) : path_(path) {
    if (sqlite3_open_v2(path.c_str(), &db_, SQLITE_OPEN_READONLY, nullptr) != SQLITE_OK) {
      sqlite3_close(db_);
      throw std::runtime_error("cannot open " + path);
    }
    last_ = dataVersion();
  }
  ~KRCommitCounter() { sqlite3_close(db_); }
  KRCommitCounter(const KRCommitCounter&) = delete;
  KRCommitCounter& operator=(const KRCommitCounter&) = delete;

  // Whether another connection committed since the last call (or since opening).
  bool changedSinceLastLook() {
    const int64_t now = dataVersion();
    const bool changed = now != last_;
    last_ = now;
    return changed;
  }

  // The commit frames of the current generation of the write-ahead log: frames whose salts match the log's
  // header and whose "size after commit" field is set.
  int64_t commitsInLog() const {
    std::ifstream log(path_ + "-wal", std::ios::binary);
    std::vector<unsigned char> header(kLogHeaderSize);
    if (!log.read(reinterpret_cast<char*>(header.data()), kLogHeaderSize)) return 0;
    const uint32_t pageSize = bigEndian(header, 8);
    const uint32_t salt1 = bigEndian(header, 16);
    const uint32_t salt2 = bigEndian(header, 20);
    std::vector<unsigned char> frame(kFrameHeaderSize + pageSize);
    int64_t commits = 0;
    while (log.read(reinterpret_cast<char*>(frame.data()), static_cast<std::streamsize>(frame.size()))) {
      if (bigEndian(frame, 8) != salt1 || bigEndian(frame, 12) != salt2) break;
      if (bigEndian(frame, 4) != 0) ++commits;
    }
    return commits;
  }

  // The first column of the first row of the statement, as text; empty when there is no row.
  std::string text(const std::string& sql) const {
    sqlite3_stmt* statement = nullptr;
    if (sqlite3_prepare_v2(db_, sql.c_str(), -1, &statement, nullptr) != SQLITE_OK)
      throw std::runtime_error(sqlite3_errmsg(db_));
    std::string result;
    if (sqlite3_step(statement) == SQLITE_ROW) {
      const unsigned char* value = sqlite3_column_text(statement, 0);
      result = value ? reinterpret_cast<const char*>(value) : "";
    }
    sqlite3_finalize(statement);
    return result;
  }
  int64_t integer(const std::string& sql) const { return std::stoll(text(sql)); }

 private:
  static constexpr size_t kLogHeaderSize = 32;
  static constexpr size_t kFrameHeaderSize = 24;

  static uint32_t bigEndian(const std::vector<unsigned char>& bytes, size_t offset) {
    return (uint32_t{bytes[offset]} << 24) | (uint32_t{bytes[offset + 1]} << 16) |
           (uint32_t{bytes[offset + 2]} << 8) | uint32_t{bytes[offset + 3]};
  }
  int64_t dataVersion() const { return integer("PRAGMA data_version"); }

  std::string path_;
  sqlite3* db_ = nullptr;
  int64_t last_ = 0;
};
