#include "SchemaCases.hpp"

#include <stdexcept>

#include "CaseFiles.hpp"
#include "CatalogFormat.hpp"

namespace reliability {

namespace {

std::string columnList(const std::vector<std::string>& columns, const std::string& except) {
  std::string list;
  for (const auto& column : columns)
    if (column != except) list += (list.empty() ? "" : ", ") + column;
  return list;
}

// The first column after the record id, and the last one.
std::set<std::string> editedColumns(const std::vector<std::string>& columns) {
  const bool hasId = columns.front() == "_id_int_64" && columns.size() > 1;
  return {columns[hasId ? 1 : 0], columns.back()};
}

}  // namespace

std::vector<HostileCase> SchemaCases::make(const HostileSources& sources) {
  std::vector<HostileCase> cases;
  addColumnEdits(cases, sources);
  addTableDrops(cases, sources);
  addIndexEdits(cases, sources);
  addHeaderEdits(cases, sources);
  return cases;
}

void SchemaCases::addColumnEdits(std::vector<HostileCase>& cases, const HostileSources& sources) {
  for (const auto& [table, columns] : sources.tables()) {
    for (const auto& column : editedColumns(columns)) {
      const auto drop = [table, column, columns](RawDatabase& database) {
        dropColumn(database, table, column, columns);
      };
      const auto rename = [table, column](RawDatabase& database) {
        database.exec("ALTER TABLE " + table + " RENAME COLUMN " + column + " TO " + column + "_renamed");
      };
      cases.push_back(edited(sources, "column " + table + "." + column + " dropped", drop, {2}));
      cases.push_back(edited(sources, "column " + table + "." + column + " renamed", rename, {2}));
    }
  }
}

void SchemaCases::addTableDrops(std::vector<HostileCase>& cases, const HostileSources& sources) {
  for (const auto& entry : sources.tables()) {
    const std::string table = entry.first;
    const auto drop = [table](RawDatabase& database) {
      database.exec("PRAGMA foreign_keys = OFF; DROP TABLE " + table);
    };
    cases.push_back(edited(sources, "table " + table + " dropped", drop, {2}));
  }
}

// The oldest version has no indexes; migrating creates them.
void SchemaCases::addIndexEdits(std::vector<HostileCase>& cases, const HostileSources& sources) {
  const std::vector<std::string> indexes = sources.indexes();
  const std::vector<std::string> allButFirst(indexes.begin() + 1, indexes.end());
  const auto oldest = [](RawDatabase& database) {
    database.exec("PRAGMA user_version = " + std::to_string(kOldestVersion));
  };
  cases.push_back(edited(
      sources, "extra index on a current catalog",
      [](RawDatabase& database) { database.exec("CREATE INDEX extra_height ON images(height)"); }, {0}));
  cases.push_back(edited(sources, "version 119 without indexes",
                         [indexes, oldest](RawDatabase& database) {
                           dropIndexes(database, indexes);
                           oldest(database);
                         },
                         {1}));
  cases.push_back(edited(sources, "version 119 with index " + indexes.front() + " already present",
                         [allButFirst, oldest](RawDatabase& database) {
                           dropIndexes(database, allButFirst);
                           oldest(database);
                         },
                         {1}));
  cases.push_back(edited(sources, "version 119 with every index already present", oldest, {1}));
}

void SchemaCases::addHeaderEdits(std::vector<HostileCase>& cases, const HostileSources& sources) {
  for (const int version : {kOldestVersion - 1, kCurrentVersion + 1, 999, 0, -1}) {
    const std::string pragma = "PRAGMA user_version = " + std::to_string(version);
    cases.push_back(edited(sources, "user_version " + std::to_string(version),
                           [pragma](RawDatabase& database) { database.exec(pragma); }, {3}));
  }
  for (const int32_t id : {0, kApplicationIdBase ^ (kAppInfo + 1), 0x12345678}) {
    const std::string pragma = "PRAGMA application_id = " + std::to_string(id);
    cases.push_back(edited(sources, "application_id " + std::to_string(id),
                           [pragma](RawDatabase& database) { database.exec(pragma); }, {3}));
  }
}

HostileCase SchemaCases::edited(const HostileSources& sources, const std::string& name, const Edit& edit,
                                const std::set<int>& answers) {
  const auto prepare = [&sources, edit](const std::filesystem::path& folder) {
    CaseFiles::writeCatalog(folder, sources.catalog());
    RawDatabase database(CaseFiles::catalog(folder));
    edit(database);
  };
  return HostileCase{name, prepare, answers};
}

void SchemaCases::dropColumn(RawDatabase& database, const std::string& table, const std::string& column,
                             const std::vector<std::string>& columns) {
  dropIndexes(database,
              database.rows("SELECT DISTINCT list.name FROM pragma_index_list('" + table +
                            "') AS list, pragma_index_info(list.name) AS info WHERE list.origin = 'c' "
                            "AND info.name = '" +
                            column + "'"));
  try {
    database.exec("ALTER TABLE " + table + " DROP COLUMN " + column);
  } catch (const std::runtime_error&) {
    database.exec("PRAGMA foreign_keys = OFF; BEGIN; CREATE TABLE rebuilt AS SELECT " +
                  columnList(columns, column) + " FROM " + table + "; DROP TABLE " + table +
                  "; ALTER TABLE rebuilt RENAME TO " + table + "; COMMIT;");
  }
}

void SchemaCases::dropIndexes(RawDatabase& database, const std::vector<std::string>& indexes) {
  for (const auto& index : indexes) database.exec("DROP INDEX " + index);
}

}  // namespace reliability
