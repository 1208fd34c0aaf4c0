#include "dbschema.hpp"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dbrecords.hpp"

namespace dbcore {

namespace {

// Version 119: every record table, the links between records and the catalog's key-value info.
constexpr const char* kCreateTables = R"sql(
CREATE TABLE IF NOT EXISTS catalog_info (key TEXT PRIMARY KEY, value INTEGER NOT NULL) WITHOUT ROWID;
CREATE TABLE IF NOT EXISTS volumes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  uuid_wide_ch TEXT NOT NULL DEFAULT '', info_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS paths (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  volume_id_int_64 INTEGER NOT NULL DEFAULT 0, path_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS images (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  guid_wide_ch TEXT NOT NULL DEFAULT '', path_wide_ch TEXT NOT NULL DEFAULT '',
  width INTEGER NOT NULL DEFAULT 0, height INTEGER NOT NULL DEFAULT 0,
  file_size_int_64 INTEGER NOT NULL DEFAULT 0, modification_date_int_64 INTEGER NOT NULL DEFAULT 0,
  import_date_int_64 INTEGER NOT NULL DEFAULT 0, import_index INTEGER NOT NULL DEFAULT 0,
  creation_date_int_64 INTEGER NOT NULL DEFAULT 0,
  folder_path_id INTEGER REFERENCES paths(_id_int_64) ON DELETE SET NULL);
CREATE TABLE IF NOT EXISTS image_user_attributes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  image_id_int_64 INTEGER NOT NULL UNIQUE REFERENCES images(_id_int_64) ON DELETE CASCADE,
  trash_bool INTEGER NOT NULL DEFAULT 0, marker INTEGER NOT NULL DEFAULT 0, color INTEGER NOT NULL DEFAULT 0,
  rating INTEGER NOT NULL DEFAULT 0, edit_date_int_64 INTEGER NOT NULL DEFAULT 0,
  opened_bool INTEGER NOT NULL DEFAULT 0, trashed_date_int_64 INTEGER NOT NULL DEFAULT 0,
  origin_path_wide_ch TEXT NOT NULL DEFAULT '', lost_bool INTEGER NOT NULL DEFAULT 0,
  tutorial INTEGER NOT NULL DEFAULT 0);
CREATE TABLE IF NOT EXISTS image_exiv_attributes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  image_id_int_64 INTEGER NOT NULL UNIQUE REFERENCES images(_id_int_64) ON DELETE CASCADE,
  iso_speed REAL NOT NULL DEFAULT 0, shutter_speed REAL NOT NULL DEFAULT 0, number REAL NOT NULL DEFAULT 0,
  focal_len REAL NOT NULL DEFAULT 0, focal_len35mm REAL NOT NULL DEFAULT 0, ev REAL NOT NULL DEFAULT 0,
  focal_len_min REAL NOT NULL DEFAULT 0, focal_len_max REAL NOT NULL DEFAULT 0,
  shutter_min REAL NOT NULL DEFAULT 0, shutter_max REAL NOT NULL DEFAULT 0, aperture REAL NOT NULL DEFAULT 0,
  focus_distance REAL NOT NULL DEFAULT 0, bits_per_sample INTEGER NOT NULL DEFAULT 0,
  white_balance INTEGER NOT NULL DEFAULT 0, white_balance_index INTEGER NOT NULL DEFAULT 0,
  light_source INTEGER NOT NULL DEFAULT 0, metering_mode INTEGER NOT NULL DEFAULT 0,
  camera_maker_wide_ch TEXT NOT NULL DEFAULT '', camera_name_wide_ch TEXT NOT NULL DEFAULT '',
  camera_model_wide_ch TEXT NOT NULL DEFAULT '', lens_maker_wide_ch TEXT NOT NULL DEFAULT '',
  lens_pretty_name_wide_ch TEXT NOT NULL DEFAULT '', date_time_int_64 INTEGER NOT NULL DEFAULT 0,
  is_raw_bool INTEGER NOT NULL DEFAULT 0, is_full_filled_bool INTEGER NOT NULL DEFAULT 0,
  version INTEGER NOT NULL DEFAULT 0);
CREATE TABLE IF NOT EXISTS image_history_states (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  action_name_wide_ch TEXT NOT NULL DEFAULT '', additional_info_wide_ch TEXT NOT NULL DEFAULT '',
  guid_wide_ch TEXT NOT NULL DEFAULT '', crop_description_wide_ch TEXT NOT NULL DEFAULT '',
  image_orientation_int_64 INTEGER NOT NULL DEFAULT 0, state_hash_wide_ch TEXT NOT NULL DEFAULT '',
  original_bool INTEGER NOT NULL DEFAULT 0);
CREATE TABLE IF NOT EXISTS image_states (
  image_id INTEGER NOT NULL REFERENCES images(_id_int_64) ON DELETE CASCADE,
  state_id INTEGER NOT NULL REFERENCES image_history_states(_id_int_64) ON DELETE CASCADE,
  position INTEGER NOT NULL, is_current INTEGER NOT NULL DEFAULT 0,
  PRIMARY KEY (image_id, state_id)) WITHOUT ROWID;
CREATE TABLE IF NOT EXISTS history_resources (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  name_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS state_resources (
  state_id INTEGER NOT NULL REFERENCES image_history_states(_id_int_64) ON DELETE CASCADE,
  resource_id INTEGER NOT NULL REFERENCES history_resources(_id_int_64) ON DELETE CASCADE,
  PRIMARY KEY (state_id, resource_id)) WITHOUT ROWID;
CREATE TABLE IF NOT EXISTS filters (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  name_wide_ch TEXT NOT NULL DEFAULT '', order_float REAL NOT NULL DEFAULT 0,
  parent_id INTEGER REFERENCES filters(_id_int_64) ON DELETE CASCADE);
CREATE TABLE IF NOT EXISTS filter_attributes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  filter_id_int_64 INTEGER NOT NULL UNIQUE REFERENCES filters(_id_int_64) ON DELETE CASCADE,
  favorite_bool INTEGER NOT NULL DEFAULT 0, selected_filter_types_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS filter_images (
  filter_id INTEGER NOT NULL REFERENCES filters(_id_int_64) ON DELETE CASCADE,
  image_id INTEGER NOT NULL REFERENCES images(_id_int_64) ON DELETE CASCADE,
  PRIMARY KEY (filter_id, image_id)) WITHOUT ROWID;
CREATE TABLE IF NOT EXISTS smart_filters (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  identifier_wide_ch TEXT NOT NULL DEFAULT '', filter_conditions_wide_ch TEXT NOT NULL DEFAULT '',
  applying_conditions_wide_ch TEXT NOT NULL DEFAULT '', name_wide_ch TEXT NOT NULL DEFAULT '',
  parent_id INTEGER REFERENCES smart_filters(_id_int_64) ON DELETE CASCADE);
CREATE TABLE IF NOT EXISTS smart_filter_attributes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  smart_filter_id_int_64 INTEGER NOT NULL UNIQUE REFERENCES smart_filters(_id_int_64) ON DELETE CASCADE,
  selected_filter_types_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS reffolders (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  uuid_wide_ch TEXT NOT NULL DEFAULT '', path_id_int_64 INTEGER NOT NULL DEFAULT 0,
  order_float REAL NOT NULL DEFAULT 0,
  parent_id INTEGER REFERENCES reffolders(_id_int_64) ON DELETE CASCADE);
CREATE TABLE IF NOT EXISTS referenced_folder_attributes (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  ref_folder_id_int_64 INTEGER NOT NULL UNIQUE REFERENCES reffolders(_id_int_64) ON DELETE CASCADE,
  favorite_bool INTEGER NOT NULL DEFAULT 0, selected_filter_types_wide_ch TEXT NOT NULL DEFAULT '');
CREATE TABLE IF NOT EXISTS referenced_folder_images (
  ref_folder_id INTEGER NOT NULL REFERENCES reffolders(_id_int_64) ON DELETE CASCADE,
  image_id INTEGER NOT NULL REFERENCES images(_id_int_64) ON DELETE CASCADE,
  PRIMARY KEY (ref_folder_id, image_id)) WITHOUT ROWID;
CREATE TABLE IF NOT EXISTS entity_favorite_aliases (
  _id_int_64 INTEGER PRIMARY KEY, marked_to_delete_bool INTEGER NOT NULL DEFAULT 0,
  favorite_bool INTEGER NOT NULL DEFAULT 0, favorite_order_float REAL NOT NULL DEFAULT 0,
  orig_entity_type INTEGER NOT NULL DEFAULT 0, orig_entity_id_int_64 INTEGER NOT NULL DEFAULT 0,
  UNIQUE (orig_entity_type, orig_entity_id_int_64));
)sql";

// Version 120: indexes on every link column and on every column that conditions filter on.
constexpr const char* kCreateIndexes = R"sql(
CREATE INDEX IF NOT EXISTS images_folder ON images(folder_path_id);
CREATE INDEX IF NOT EXISTS paths_volume ON paths(volume_id_int_64, path_wide_ch);
CREATE INDEX IF NOT EXISTS image_states_state ON image_states(state_id);
CREATE INDEX IF NOT EXISTS state_resources_resource ON state_resources(resource_id);
CREATE INDEX IF NOT EXISTS filters_parent ON filters(parent_id);
CREATE INDEX IF NOT EXISTS filter_images_image ON filter_images(image_id);
CREATE INDEX IF NOT EXISTS smart_filters_parent ON smart_filters(parent_id);
CREATE INDEX IF NOT EXISTS reffolders_parent ON reffolders(parent_id);
CREATE INDEX IF NOT EXISTS reffolders_path ON reffolders(path_id_int_64);
CREATE INDEX IF NOT EXISTS referenced_folder_images_image ON referenced_folder_images(image_id);
CREATE INDEX IF NOT EXISTS images_marked_to_delete_bool ON images(marked_to_delete_bool);
CREATE INDEX IF NOT EXISTS images_guid_wide_ch ON images(guid_wide_ch);
CREATE INDEX IF NOT EXISTS images_path_wide_ch ON images(path_wide_ch);
CREATE INDEX IF NOT EXISTS images_file_size_int_64 ON images(file_size_int_64);
CREATE INDEX IF NOT EXISTS images_modification_date_int_64 ON images(modification_date_int_64);
CREATE INDEX IF NOT EXISTS images_import_date_int_64 ON images(import_date_int_64);
CREATE INDEX IF NOT EXISTS images_import_index ON images(import_index);
CREATE INDEX IF NOT EXISTS user_attributes_marked_to_delete_bool ON image_user_attributes(marked_to_delete_bool);
CREATE INDEX IF NOT EXISTS user_attributes_trash_bool ON image_user_attributes(trash_bool);
CREATE INDEX IF NOT EXISTS user_attributes_rating ON image_user_attributes(rating);
CREATE INDEX IF NOT EXISTS user_attributes_edit_date_int_64 ON image_user_attributes(edit_date_int_64);
CREATE INDEX IF NOT EXISTS user_attributes_opened_bool ON image_user_attributes(opened_bool);
CREATE INDEX IF NOT EXISTS user_attributes_origin_path_wide_ch ON image_user_attributes(origin_path_wide_ch);
CREATE INDEX IF NOT EXISTS user_attributes_lost_bool ON image_user_attributes(lost_bool);
CREATE INDEX IF NOT EXISTS exiv_attributes_marked_to_delete_bool ON image_exiv_attributes(marked_to_delete_bool);
CREATE INDEX IF NOT EXISTS exiv_attributes_iso_speed ON image_exiv_attributes(iso_speed);
CREATE INDEX IF NOT EXISTS exiv_attributes_shutter_speed ON image_exiv_attributes(shutter_speed);
CREATE INDEX IF NOT EXISTS exiv_attributes_number ON image_exiv_attributes(number);
CREATE INDEX IF NOT EXISTS exiv_attributes_focal_len ON image_exiv_attributes(focal_len);
CREATE INDEX IF NOT EXISTS exiv_attributes_focal_len35mm ON image_exiv_attributes(focal_len35mm);
CREATE INDEX IF NOT EXISTS exiv_attributes_focal_len_min ON image_exiv_attributes(focal_len_min);
CREATE INDEX IF NOT EXISTS exiv_attributes_focal_len_max ON image_exiv_attributes(focal_len_max);
CREATE INDEX IF NOT EXISTS exiv_attributes_shutter_min ON image_exiv_attributes(shutter_min);
CREATE INDEX IF NOT EXISTS exiv_attributes_shutter_max ON image_exiv_attributes(shutter_max);
CREATE INDEX IF NOT EXISTS exiv_attributes_focus_distance ON image_exiv_attributes(focus_distance);
CREATE INDEX IF NOT EXISTS exiv_attributes_bits_per_sample ON image_exiv_attributes(bits_per_sample);
CREATE INDEX IF NOT EXISTS exiv_attributes_white_balance ON image_exiv_attributes(white_balance);
CREATE INDEX IF NOT EXISTS exiv_attributes_white_balance_index ON image_exiv_attributes(white_balance_index);
CREATE INDEX IF NOT EXISTS exiv_attributes_light_source ON image_exiv_attributes(light_source);
CREATE INDEX IF NOT EXISTS exiv_attributes_metering_mode ON image_exiv_attributes(metering_mode);
CREATE INDEX IF NOT EXISTS exiv_attributes_camera_maker_wide_ch ON image_exiv_attributes(camera_maker_wide_ch);
CREATE INDEX IF NOT EXISTS exiv_attributes_camera_name_wide_ch ON image_exiv_attributes(camera_name_wide_ch);
CREATE INDEX IF NOT EXISTS exiv_attributes_camera_model_wide_ch ON image_exiv_attributes(camera_model_wide_ch);
CREATE INDEX IF NOT EXISTS exiv_attributes_lens_maker_wide_ch ON image_exiv_attributes(lens_maker_wide_ch);
CREATE INDEX IF NOT EXISTS exiv_attributes_lens_pretty_name_wide_ch ON image_exiv_attributes(lens_pretty_name_wide_ch);
CREATE INDEX IF NOT EXISTS exiv_attributes_date_time_int_64 ON image_exiv_attributes(date_time_int_64);
CREATE INDEX IF NOT EXISTS exiv_attributes_is_raw_bool ON image_exiv_attributes(is_raw_bool);
CREATE INDEX IF NOT EXISTS exiv_attributes_is_full_filled_bool ON image_exiv_attributes(is_full_filled_bool);
)sql";

// One change of a migration step (a table, an index, ...). A part whose change is already in the file
// leaves the file as it is, so that a file half migrated by an earlier engine still migrates.
using MigrationPart = std::function<void(DBConnection&)>;

struct MigrationStep {
  int version;
  std::vector<MigrationPart> parts;
};

// One part per statement of the SQL text; statements end with ';' and hold no other ';'.
std::vector<MigrationPart> statementParts(std::string_view sql) {
  std::vector<MigrationPart> parts;
  for (std::size_t start = 0, end = sql.find(';'); end != std::string_view::npos;
       start = end + 1, end = sql.find(';', start)) {
    parts.push_back([statement = std::string(sql.substr(start, end - start))](DBConnection& connection) {
      connection.exec(statement);
    });
  }
  return parts;
}

// Version 121: the float columns take NULL, which stands for NaN (SQLite keeps no NaN and stores it as
// NULL). One part per table that has float columns.
constexpr const char* kTablesWithFloats[] = {"image_exiv_attributes", "filters", "reffolders",
                                             "entity_favorite_aliases"};

const DBStaticSql kSchemaVersionSql("PRAGMA schema_version");

// Runs the body with SQLite's table definitions writable; defensive mode, which forbids that, is off
// only meanwhile.
void withWritableSchema(DBConnection& connection, const std::function<void()>& body) {
  sqlite3_db_config(connection.handle(), SQLITE_DBCONFIG_DEFENSIVE, 0, nullptr);
  try {
    connection.exec("PRAGMA writable_schema = ON");
    body();
  } catch (...) {
    // The body's failure is the one to report: a failure to restore the flag here would hide it.
    sqlite3_exec(connection.handle(), "PRAGMA writable_schema = RESET", nullptr, nullptr, nullptr);
    sqlite3_db_config(connection.handle(), SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
    throw;
  }
  connection.exec("PRAGMA writable_schema = RESET");
  sqlite3_db_config(connection.handle(), SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr);
}

// SQLite cannot drop a NOT NULL constraint with ALTER TABLE, and rebuilding a table that others
// reference would delete their rows through the foreign keys, which stay on inside the migration's
// transaction. Dropping a constraint leaves every stored row valid, so the table's definition is
// rewritten in place, as SQLite documents for such changes, and a new schema version makes every
// connection read it again. A table whose floats already take NULL is left as it is.
void allowNullFloats(DBConnection& connection, const std::string& table) {
  withWritableSchema(connection, [&connection, &table] {
    connection.exec(
        "UPDATE sqlite_schema SET sql = replace(sql, ' REAL NOT NULL DEFAULT 0', ' REAL DEFAULT 0') "
        "WHERE type = 'table' AND name = '" +
        table + "' AND instr(sql, ' REAL NOT NULL DEFAULT 0') > 0");
    if (connection.changes() == 0) return;
    connection.exec("PRAGMA schema_version = " +
                    std::to_string(connection.queryInt64(kSchemaVersionSql) + 1));
  });
}

std::vector<MigrationPart> floatParts() {
  std::vector<MigrationPart> parts;
  for (const char* table : kTablesWithFloats) {
    parts.push_back([table](DBConnection& connection) { allowNullFloats(connection, table); });
  }
  return parts;
}

const std::vector<MigrationStep>& migrationSteps() {
  static const std::vector<MigrationStep> steps{
      {119, statementParts(kCreateTables)}, {120, statementParts(kCreateIndexes)}, {121, floatParts()}};
  return steps;
}

const MigrationStep& stepOf(int version) {
  for (const auto& step : migrationSteps()) {
    if (step.version == version) return step;
  }
  throw DBException("No migration step makes version " + std::to_string(version));
}

void runParts(DBConnection& connection, const MigrationStep& step, std::size_t count) {
  for (std::size_t index = 0; index < count && index < step.parts.size(); ++index)
    step.parts[index](connection);
}

// Whether SQL compiles against the file's current schema (a fresh statement, never a cached one).
bool compiles(DBConnection& connection, const std::string& sql) {
  try {
    DBStatement probe(connection.handle(), sql);
    return true;
  } catch (const DBException&) {
    return false;
  }
}

// Preparing a query over every column of a record table fails when a table or column is missing.
template <class Record>
bool hasAllColumns(DBConnection& connection) {
  std::string sql = "SELECT ";
  for (const auto& column : Record::all_columns()) sql += std::string(column.name) + ",";
  sql.back() = ' ';
  sql += std::string("FROM ") + Record::kTableName + " LIMIT 0";
  return compiles(connection, sql);
}

template <class... Records>
bool haveAllColumns(DBConnection& connection) {
  return (hasAllColumns<Records>(connection) && ...);
}

}  // namespace

// The identity mixed with a fixed tag ("KRCT"), one distinct id per identity.
int32_t DBSchema::applicationIdFor(int32_t appInfo) {
  return static_cast<int32_t>(0x4B524354u ^ static_cast<uint32_t>(appInfo));
}

const std::vector<int>& DBSchema::stepVersions() {
  static const std::vector<int> versions = [] {
    std::vector<int> all;
    for (const auto& step : migrationSteps()) all.push_back(step.version);
    return all;
  }();
  return versions;
}

std::size_t DBSchema::stepPartCount(int version) { return stepOf(version).parts.size(); }

void DBSchema::runStepParts(DBConnection& connection, int version, std::size_t count) {
  runParts(connection, stepOf(version), count);
}

void DBSchema::migrate(DBConnection& connection, int fromVersion) {
  for (const auto& step : migrationSteps()) {
    if (step.version > fromVersion) runParts(connection, step, step.parts.size());
  }
  connection.exec("PRAGMA user_version = " + std::to_string(kCurrentVersion));
}

void DBSchema::createRootRecords(DBConnection& connection) {
  connection.exec("INSERT OR IGNORE INTO filters(_id_int_64, parent_id) VALUES (1, NULL)");
  connection.exec("INSERT OR IGNORE INTO reffolders(_id_int_64, parent_id) VALUES (1, NULL)");
}

bool DBSchema::isWellFormed(DBConnection& connection) {
  const char* linkTables[] = {"image_states", "state_resources", "filter_images", "referenced_folder_images",
                              "catalog_info"};
  for (const char* table : linkTables) {
    if (!compiles(connection, std::string("SELECT * FROM ") + table + " LIMIT 0")) return false;
  }
  return haveAllColumns<DBImage, DBPath, DBVolume, DBUserImgAttrib, DBExivImgAttrib, DBImgHistoryState,
                        DBResource, DBFilter, DBFilterAttrib, DBSmartFilter, DBSmartFilterAttrib, DBRefFolder,
                        DBRefFolderAttrib, DBEntityFavoriteAlias>(connection);
}

}  // namespace dbcore
