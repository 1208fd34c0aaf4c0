#include "dbschema.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "DBConnectionTestSupport.hpp"
#include "dbexception.hpp"
#include "dbrecords.hpp"

using namespace dbcore;

namespace {

// The version whose step lets float columns take NULL.
constexpr int kNullFloatsVersion = 121;

class DBSchemaTest : public DBCatalogTestBase {
 protected:
  // The text of the first column of each row of a query (SQL of the test's own).
  std::set<std::string> queryNames(DBConnection& db, const std::string& sql) {
    const DBStatementLease statement = db.prepare(sql);
    std::set<std::string> names;
    while (statement->step()) names.insert(statement->columnText(0));
    return names;
  }

  std::set<std::string> tableColumns(const std::string& table) {
    return queryNames(*connection, "SELECT name FROM pragma_table_info('" + table + "')");
  }

  std::set<std::string> indexNames(DBConnection& db) {
    return queryNames(db, "SELECT name FROM sqlite_schema WHERE type = 'index' AND sql IS NOT NULL");
  }

  // SQLite refuses to drop an indexed column: the tests that drop one drop the table's indexes first.
  void dropIndexesOf(const std::string& table) {
    for (const auto& index : queryNames(*connection,
                                        "SELECT name FROM sqlite_schema WHERE type = 'index' AND "
                                        "sql IS NOT NULL AND tbl_name = '" +
                                            table + "'"))
      connection->exec("DROP INDEX " + index);
  }

  // The record's columns plus the link columns that are no field of the record.
  template <class Record>
  static std::set<std::string> expectedColumns() {
    static const std::map<std::string, std::string> linkColumns{{"images", "folder_path_id"},
                                                                {"filters", "parent_id"},
                                                                {"smart_filters", "parent_id"},
                                                                {DBRefFolder::kTableName, "parent_id"}};
    std::set<std::string> names;
    for (const auto& column : Record::all_columns()) names.insert(column.name);
    const auto link = linkColumns.find(Record::kTableName);
    if (link != linkColumns.end()) names.insert(link->second);
    return names;
  }

  // Checks the columns of every record type's table; returns the names of those tables.
  template <class... Records>
  std::set<std::string> expectRecordTables(std::tuple<Records...>*) {
    (expectRecordTable<Records>(), ...);
    return {Records::kTableName...};
  }

  template <class Record>
  void expectRecordTable() {
    SCOPED_TRACE(Record::kTableName);
    EXPECT_EQ(tableColumns(Record::kTableName), expectedColumns<Record>());
  }

  // The schema of a file, one text per table, column, index, index column and foreign key, with every
  // property SQLite reports for it.
  std::set<std::string> schemaOf(DBConnection& db) {
    static const char* const kQueries[] = {
        "SELECT 'table ' || name || ' wr=' || wr || ' strict=' || strict FROM pragma_table_list "
        "WHERE schema = 'main'",
        "SELECT type || ' ' || name || ' on ' || tbl_name FROM sqlite_schema",
        "SELECT 'column ' || m.name || '.' || c.name || ' ' || c.type || ' notnull=' || c.\"notnull\" || "
        "' default=' || ifnull(c.dflt_value, 'none') || ' pk=' || c.pk "
        "FROM sqlite_schema AS m, pragma_table_info(m.name) AS c WHERE m.type = 'table'",
        "SELECT 'index ' || m.name || ' ' || l.name || ' unique=' || l.\"unique\" || ' origin=' || l.origin "
        "|| "
        "' partial=' || l.partial FROM sqlite_schema AS m, pragma_index_list(m.name) AS l "
        "WHERE m.type = 'table'",
        "SELECT 'index column ' || m.name || ' ' || i.seqno || ' ' || ifnull(i.name, 'expression') "
        "FROM sqlite_schema AS m, pragma_index_info(m.name) AS i WHERE m.type = 'index'",
        "SELECT 'foreign key ' || m.name || ' ' || f.id || ' ' || f.seq || ' ' || f.\"table\" || ' ' || "
        "f.\"from\" || ' ' || ifnull(f.\"to\", 'key') || ' ' || f.on_delete "
        "FROM sqlite_schema AS m, pragma_foreign_key_list(m.name) AS f WHERE m.type = 'table'"};
    std::set<std::string> schema;
    for (const char* sql : kQueries) schema.merge(queryNames(db, sql));
    return schema;
  }

  // A file as an earlier engine left it: every step below `version` done, the first `parts` parts of
  // its own step done, and the version of the step before.
  static std::unique_ptr<DBConnection> earlierShape(int version, std::size_t parts) {
    auto file = std::make_unique<DBConnection>(":memory:");
    file->transaction([&file, version, parts] {
      int previous = 0;
      for (int step : DBSchema::stepVersions()) {
        if (step == version) break;
        DBSchema::runStepParts(*file, step, DBSchema::stepPartCount(step));
        previous = step;
      }
      DBSchema::runStepParts(*file, version, parts);
      file->exec("PRAGMA user_version = " + std::to_string(previous));
    });
    return file;
  }

  // Migrates the file from its own version and checks that it then has the schema of a new catalog.
  void expectMigratesToTheCurrentSchema(DBConnection& file) {
    const int64_t version = file.queryInt64("PRAGMA user_version");
    file.transaction([&file, version] { DBSchema::migrate(file, static_cast<int>(version)); });
    EXPECT_EQ(file.queryInt64("PRAGMA user_version"), DBSchema::kCurrentVersion);
    EXPECT_EQ(schemaOf(file), schemaOf(*connection));
  }

  // Float fields take NULL, which stands for NaN; every other field keeps NOT NULL.
  template <class... Records>
  void expectNullOnlyInFloats(std::tuple<Records...>*) {
    (expectNullOnlyInFloats<Records>(), ...);
  }

  template <class Record>
  void expectNullOnlyInFloats() {
    const std::set<std::string> notNull =
        queryNames(*connection, std::string("SELECT name FROM pragma_table_info('") + Record::kTableName +
                                    "') WHERE \"notnull\"");
    for (const auto& column : Record::all_columns()) {
      if (std::string(column.name) == kIdColumn) continue;
      EXPECT_EQ(notNull.count(column.name) == 0, column.type == FieldType::T_FLOAT)
          << Record::kTableName << "." << column.name;
    }
  }

  static int64_t notNullOfEv(DBConnection& file) {
    return file.queryInt64(
        std::string("SELECT \"notnull\" FROM pragma_table_info('image_exiv_attributes') WHERE name = 'ev'"));
  }

  static int defensiveMode(DBConnection& file) {
    int enabled = -1;
    sqlite3_db_config(file.handle(), SQLITE_DBCONFIG_DEFENSIVE, -1, &enabled);
    return enabled;
  }

  bool wellFormedAfter(const std::string& sql) {
    connection->exec(sql);
    return DBSchema::isWellFormed(*connection);
  }
};

}  // namespace

TEST_F(DBSchemaTest, MigrateFromZeroBuildsAWellFormedCatalog) {
  DBConnection empty(directory.file("empty.db"));
  EXPECT_FALSE(DBSchema::isWellFormed(empty));
  empty.transaction([&empty] { DBSchema::migrate(empty, 0); });
  EXPECT_TRUE(DBSchema::isWellFormed(empty));
  EXPECT_EQ(empty.queryInt64("PRAGMA user_version"), DBSchema::kCurrentVersion);
}

TEST_F(DBSchemaTest, MigrateFromTheOldestVersionRunsOnlyTheLaterSteps) {
  const std::set<std::string> indexes = indexNames(*connection);
  ASSERT_FALSE(indexes.empty());
  for (const auto& index : indexes) connection->exec("DROP INDEX " + index);
  connection->exec("PRAGMA user_version = " + std::to_string(DBSchema::kOldestVersion));
  connection->transaction([this] { DBSchema::migrate(*connection, DBSchema::kOldestVersion); });
  EXPECT_EQ(indexNames(*connection), indexes);
  EXPECT_EQ(connection->queryInt64("PRAGMA user_version"), DBSchema::kCurrentVersion);
}

TEST_F(DBSchemaTest, NotWellFormedWithoutARecordColumn) {
  dropIndexesOf("images");
  EXPECT_FALSE(wellFormedAfter("ALTER TABLE images DROP COLUMN import_index"));
}

TEST_F(DBSchemaTest, NotWellFormedWithoutARecordTable) {
  EXPECT_FALSE(wellFormedAfter(std::string("DROP TABLE ") + DBEntityFavoriteAlias::kTableName));
}

TEST_F(DBSchemaTest, NotWellFormedWithoutALinkTable) {
  EXPECT_FALSE(wellFormedAfter("DROP TABLE image_states"));
}

TEST_F(DBSchemaTest, LaterCheckSeesAColumnDroppedAfterAnEarlierOne) {
  ASSERT_TRUE(DBSchema::isWellFormed(*connection));
  dropIndexesOf("filters");
  EXPECT_FALSE(wellFormedAfter("ALTER TABLE filters DROP COLUMN name_wide_ch"));
}

TEST_F(DBSchemaTest, ApplicationIdIsStableAndDistinctPerAppInfo) {
  EXPECT_EQ(DBSchema::applicationIdFor(5), DBSchema::applicationIdFor(5));
  std::set<int32_t> ids;
  for (int32_t appInfo : {0, 1, 5, 255, 256, 257, 4217, 65541, -1})
    ids.insert(DBSchema::applicationIdFor(appInfo));
  EXPECT_EQ(ids.size(), 9u);
  EXPECT_EQ(ids.count(0), 0u);  // 0 is the id of any plain SQLite file
}

TEST_F(DBSchemaTest, CreatingTheRootRecordsAgainKeepsOneRootEach) {
  connection->exec("INSERT INTO filters(_id_int_64, parent_id) VALUES (2, 1)");
  DBSchema::createRootRecords(*connection);
  EXPECT_EQ(queryIds("SELECT _id_int_64 FROM filters WHERE parent_id IS NULL"), (std::set<long long>{1}));
  EXPECT_EQ(queryIds(std::string("SELECT _id_int_64 FROM ") + DBRefFolder::kTableName),
            (std::set<long long>{1}));
  EXPECT_EQ(connection->queryInt64("SELECT count(*) FROM filters"), 2);
}

TEST_F(DBSchemaTest, RecordTablesHaveExactlyTheRecordAndLinkColumns) {
  const std::set<std::string> recordTables = expectRecordTables(static_cast<DBRecordTypes*>(nullptr));
  const std::set<std::string> tablesWithIds =
      queryNames(*connection,
                 "SELECT m.name FROM sqlite_schema AS m, pragma_table_info(m.name) AS c "
                 "WHERE m.type = 'table' AND c.name = '_id_int_64'");
  EXPECT_EQ(tablesWithIds, recordTables);
}

TEST_F(DBSchemaTest, StepsRunFromTheOldestToTheCurrentVersion) {
  const std::vector<int>& versions = DBSchema::stepVersions();
  ASSERT_FALSE(versions.empty());
  EXPECT_EQ(versions.front(), DBSchema::kOldestVersion);
  EXPECT_EQ(versions.back(), DBSchema::kCurrentVersion);
  EXPECT_TRUE(std::is_sorted(versions.begin(), versions.end()));
  EXPECT_THROW(DBSchema::stepPartCount(DBSchema::kCurrentVersion + 1), DBException);
}

TEST_F(DBSchemaTest, EveryEarlierShapeMigratesToTheSchemaOfANewCatalog) {
  for (int version : DBSchema::stepVersions()) {
    for (std::size_t parts = 0; parts <= DBSchema::stepPartCount(version); ++parts) {
      SCOPED_TRACE("step " + std::to_string(version) + " with " + std::to_string(parts) + " parts");
      expectMigratesToTheCurrentSchema(*earlierShape(version, parts));
      if (HasFailure()) return;
    }
  }
}

TEST_F(DBSchemaTest, OldestVersionThatHasAnIndexOfTheNextMigrates) {
  for (const auto& index : indexNames(*connection)) {
    if (index != "images_folder") connection->exec("DROP INDEX " + index);
  }
  connection->exec("PRAGMA user_version = " + std::to_string(DBSchema::kOldestVersion));
  expectMigratesToTheCurrentSchema(*connection);
}

TEST_F(DBSchemaTest, RunningEveryStepAgainKeepsTheSchemaAndTheRecords) {
  const std::set<std::string> schema = schemaOf(*connection);
  connection->exec("INSERT INTO images(_id_int_64, guid_wide_ch) VALUES (7, 'kept')");
  connection->transaction([this] { DBSchema::migrate(*connection, 0); });
  EXPECT_EQ(schemaOf(*connection), schema);
  EXPECT_EQ(queryIds("SELECT _id_int_64 FROM images WHERE guid_wide_ch = 'kept'"), (std::set<long long>{7}));
}

TEST_F(DBSchemaTest, FloatColumnsAloneTakeNull) {
  expectNullOnlyInFloats(static_cast<DBRecordTypes*>(nullptr));
}

TEST_F(DBSchemaTest, FloatStepKeepsEveryRowAndLinkOfTheTablesItChanges) {
  const auto file = earlierShape(kNullFloatsVersion, 0);
  file->exec(
      "INSERT INTO images(_id_int_64) VALUES (1);"
      "INSERT INTO image_exiv_attributes(image_id_int_64, ev) VALUES (1, 2.5);"
      "INSERT INTO filters(_id_int_64, order_float) VALUES (1, 1.5);"
      "INSERT INTO filters(_id_int_64, order_float, parent_id) VALUES (2, 0.5, 1);"
      "INSERT INTO filter_images(filter_id, image_id) VALUES (2, 1);"
      "INSERT INTO filter_attributes(filter_id_int_64) VALUES (2);"
      "INSERT INTO reffolders(_id_int_64) VALUES (1);"
      "INSERT INTO referenced_folder_images(ref_folder_id, image_id) VALUES (1, 1)");
  ASSERT_EQ(notNullOfEv(*file), 1);
  expectMigratesToTheCurrentSchema(*file);
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM image_exiv_attributes WHERE ev = 2.5")), 1);
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM filters WHERE parent_id = 1")), 1);
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM filter_images")), 1);
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM filter_attributes")), 1);
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM referenced_folder_images")), 1);
  file->exec("UPDATE filters SET order_float = NULL; UPDATE image_exiv_attributes SET ev = NULL");
  EXPECT_EQ(file->queryInt64(std::string("SELECT count(*) FROM filters WHERE order_float IS NULL")), 2);
  EXPECT_EQ(defensiveMode(*file), 1);
}

TEST_F(DBSchemaTest, FloatStepRolledBackKeepsTheConstraint) {
  const auto file = earlierShape(kNullFloatsVersion, 0);
  EXPECT_THROW(file->transaction([&file] {
    DBSchema::migrate(*file, kNullFloatsVersion - 1);
    ASSERT_EQ(notNullOfEv(*file), 0);
    throw DBException("stopped");
  }),
               DBException);
  EXPECT_EQ(notNullOfEv(*file), 1);
  file->exec("INSERT INTO images(_id_int_64) VALUES (1)");
  EXPECT_THROW(file->exec("INSERT INTO image_exiv_attributes(image_id_int_64, ev) VALUES (1, NULL)"),
               DBException);
}

TEST_F(DBSchemaTest, FloatStepThatFailsLeavesDefensiveModeOn) {
  const auto file = earlierShape(kNullFloatsVersion, 0);
  file->exec("PRAGMA query_only = ON");
  EXPECT_THROW(DBSchema::migrate(*file, kNullFloatsVersion - 1), DBException);
  EXPECT_EQ(defensiveMode(*file), 1);
  file->exec("PRAGMA query_only = OFF");
  EXPECT_EQ(notNullOfEv(*file), 1);
}
