#include "dbschemalayout.hpp"

#include <gtest/gtest.h>

#include "dbconnection.hpp"
#include "dbschema.hpp"

using namespace dbcore;

namespace {

DBSchemaLayout layoutAfter(const std::string& sql) {
  DBConnection memory(":memory:");
  DBSchema::migrate(memory, 0);
  memory.exec(sql);
  return DBSchemaLayout::of(memory.handle());
}

}  // namespace

TEST(DBSchemaLayoutTest, ExpectedLayoutIsTheMigratedOne) {
  EXPECT_TRUE(layoutAfter("SELECT 1") == DBSchemaLayout::ofVersion(DBSchema::kCurrentVersion));
}

TEST(DBSchemaLayoutTest, EveryVersionHasTheLayoutOfItsSteps) {
  EXPECT_FALSE(DBSchemaLayout::ofVersion(0) == DBSchemaLayout::ofVersion(DBSchema::kOldestVersion));
  for (const int version : DBSchema::stepVersions()) {
    EXPECT_TRUE(DBSchemaLayout::ofVersion(version) == DBSchemaLayout::ofVersion(DBSchema::kCurrentVersion))
        << version;
  }
}

TEST(DBSchemaLayoutTest, IndexesAndRowsAreNotPartOfIt) {
  EXPECT_TRUE(
      layoutAfter("CREATE INDEX extra ON images(width); INSERT INTO volumes DEFAULT VALUES; ANALYZE") ==
      DBSchemaLayout::ofVersion(DBSchema::kCurrentVersion));
}

TEST(DBSchemaLayoutTest, NamesTypesKeysAndTablesAreCompared) {
  for (const char* edit : {"ALTER TABLE filter_images RENAME COLUMN image_id TO image",
                           "ALTER TABLE images ADD COLUMN extra TEXT", "ALTER TABLE images DROP COLUMN width",
                           "ALTER TABLE catalog_info RENAME TO info", "CREATE TABLE extra(x)",
                           "ALTER TABLE images ADD COLUMN other_folder INTEGER REFERENCES paths(_id_int_64)",
                           "ALTER TABLE volumes ADD COLUMN number REAL"}) {
    EXPECT_FALSE(layoutAfter(edit) == DBSchemaLayout::ofVersion(DBSchema::kCurrentVersion)) << edit;
  }
}

TEST(DBSchemaLayoutTest, DeclaredTypesAndKeyOrderAreCompared) {
  DBConnection typed(":memory:");
  typed.exec("CREATE TABLE t(a INTEGER, b TEXT, PRIMARY KEY (a, b)) WITHOUT ROWID");
  DBConnection retyped(":memory:");
  retyped.exec("CREATE TABLE t(a INT, b TEXT, PRIMARY KEY (a, b)) WITHOUT ROWID");
  DBConnection reordered(":memory:");
  reordered.exec("CREATE TABLE t(a INTEGER, b TEXT, PRIMARY KEY (b, a)) WITHOUT ROWID");
  DBConnection same(":memory:");
  same.exec("CREATE TABLE t(a INTEGER, b TEXT, PRIMARY KEY (a, b)) WITHOUT ROWID");
  EXPECT_TRUE(DBSchemaLayout::of(typed.handle()) == DBSchemaLayout::of(same.handle()));
  EXPECT_FALSE(DBSchemaLayout::of(typed.handle()) == DBSchemaLayout::of(retyped.handle()));
  EXPECT_FALSE(DBSchemaLayout::of(typed.handle()) == DBSchemaLayout::of(reordered.handle()));
}

TEST(DBSchemaLayoutTest, ForeignKeyActionsAreCompared) {
  DBConnection cascade(":memory:");
  cascade.exec(
      "CREATE TABLE p(id INTEGER PRIMARY KEY); CREATE TABLE c(p INTEGER REFERENCES p(id) ON DELETE CASCADE)");
  DBConnection setNull(":memory:");
  setNull.exec(
      "CREATE TABLE p(id INTEGER PRIMARY KEY); CREATE TABLE c(p INTEGER REFERENCES p(id) ON DELETE SET "
      "NULL)");
  EXPECT_FALSE(DBSchemaLayout::of(cascade.handle()) == DBSchemaLayout::of(setNull.handle()));
}
