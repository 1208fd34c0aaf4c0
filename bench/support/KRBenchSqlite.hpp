#pragma once

#include <sqlite3.h>

#include <functional>
#include <string>

// What the raw-SQLite baselines of the benchmarks share: statements that abort the run on any failure
// (a baseline that silently did less work would flatter it), and wall-clock timing.
class KRBenchSqlite {
 public:
  static sqlite3_stmt* prepare(sqlite3* db, const char* sql);
  // Steps a statement that returns no rows, then resets it.
  static void execute(sqlite3_stmt* statement);
  static void bindText(sqlite3_stmt* statement, int index, const std::string& text);
  // The attribute rows of the benchmarks' catalogs for image number `i`: rating i % 6 and camera model
  // "X-T" + i % 5. `user` and `exif` insert (image id, rating) and (image id, camera model).
  static void insertAttributes(sqlite3_stmt* user, sqlite3_stmt* exif, sqlite3_int64 imageId, int i);
  // Inserts of every column of the image and attribute tables, with the given VALUES list in column order
  // (the marked-to-delete flag first; for attributes the image id next).
  static std::string imagesInsert(const std::string& values);
  static std::string userAttributesInsert(const std::string& values);
  static std::string exifAttributesInsert(const std::string& values);
  // Seconds the work takes.
  static double timed(const std::function<void()>& work);
};
