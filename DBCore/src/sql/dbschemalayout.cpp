#include "dbschemalayout.hpp"

#include "dbconnection.hpp"
#include "dbschema.hpp"
#include "dbstatement.hpp"

namespace dbcore {

namespace {

constexpr const char* kTablesSql =
    "SELECT name FROM sqlite_schema WHERE type = 'table' AND name NOT LIKE 'sqlite\\_%' ESCAPE '\\'";
constexpr const char* kColumnsSql =
    "SELECT 'column ' || name || ' ' || type || ' ' || pk FROM pragma_table_info(?1) ORDER BY cid";
constexpr const char* kForeignKeysSql =
    "SELECT 'reference ' || \"from\" || ' ' || \"table\" || '.' || coalesce(\"to\", '') || ' ' || on_update "
    "|| "
    "' ' || on_delete FROM pragma_foreign_key_list(?1) ORDER BY id, seq";

std::vector<std::string> rows(sqlite3* db, const char* sql, const std::string& table) {
  DBStatement statement(db, sql);
  if (!table.empty()) statement.bind(1, table);
  std::vector<std::string> values;
  while (statement.step()) values.push_back(statement.columnText(0));
  return values;
}

}  // namespace

DBSchemaLayout DBSchemaLayout::of(sqlite3* db) {
  DBSchemaLayout layout;
  for (const auto& table : rows(db, kTablesSql, "")) {
    std::vector<std::string> description = rows(db, kColumnsSql, table);
    for (auto& reference : rows(db, kForeignKeysSql, table)) description.push_back(std::move(reference));
    layout.tables_[table] = std::move(description);
  }
  return layout;
}

DBSchemaLayout DBSchemaLayout::ofVersion(int version) {
  DBConnection memory(":memory:");
  for (const int step : DBSchema::stepVersions()) {
    if (step <= version) DBSchema::runStepParts(memory, step, DBSchema::stepPartCount(step));
  }
  return of(memory.handle());
}

}  // namespace dbcore
