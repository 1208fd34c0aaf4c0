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

std::string KRBenchSqlite::imagesInsert(const std::string& values) {
  return "INSERT INTO images(marked_to_delete_bool, guid_wide_ch, path_wide_ch, width, height, "
         "file_size_int_64, "
         "modification_date_int_64, import_date_int_64, import_index, creation_date_int_64, folder_path_id) "
         "VALUES (" +
         values + ")";
}

std::string KRBenchSqlite::userAttributesInsert(const std::string& values) {
  return "INSERT INTO image_user_attributes(marked_to_delete_bool, image_id_int_64, trash_bool, marker, "
         "color, "
         "rating, edit_date_int_64, opened_bool, trashed_date_int_64, origin_path_wide_ch, lost_bool, "
         "tutorial) "
         "VALUES (" +
         values + ")";
}

std::string KRBenchSqlite::exifAttributesInsert(const std::string& values) {
  return "INSERT INTO image_exiv_attributes(marked_to_delete_bool, image_id_int_64, iso_speed, "
         "shutter_speed, "
         "number, focal_len, focal_len35mm, ev, focal_len_min, focal_len_max, shutter_min, shutter_max, "
         "aperture, "
         "focus_distance, bits_per_sample, white_balance, white_balance_index, light_source, metering_mode, "
         "camera_maker_wide_ch, camera_name_wide_ch, camera_model_wide_ch, lens_maker_wide_ch, "
         "lens_pretty_name_wide_ch, date_time_int_64, is_raw_bool, is_full_filled_bool, version) VALUES (" +
         values + ")";
}
