#pragma once

#include <functional>
#include <set>
#include <string>
#include <vector>

#include "HostileCase.hpp"
#include "HostileSources.hpp"
#include "RawDatabase.hpp"

namespace reliability {

// The valid catalog edited with plain SQLite: a column dropped or renamed in every table, link tables
// included; every table dropped; indexes added or missing; other versions and application ids.
class SchemaCases {
 public:
  static std::vector<HostileCase> make(const HostileSources& sources);

 private:
  using Edit = std::function<void(RawDatabase& database)>;

  static void addColumnEdits(std::vector<HostileCase>& cases, const HostileSources& sources);
  static void addTableDrops(std::vector<HostileCase>& cases, const HostileSources& sources);
  static void addIndexEdits(std::vector<HostileCase>& cases, const HostileSources& sources);
  static void addHeaderEdits(std::vector<HostileCase>& cases, const HostileSources& sources);
  static HostileCase edited(const HostileSources& sources, const std::string& name, const Edit& edit,
                            const std::set<int>& answers);
  // Drops the column, with the indexes over it; a column SQLite cannot drop (a key or a link) goes by
  // rebuilding the table without it.
  static void dropColumn(RawDatabase& database, const std::string& table, const std::string& column,
                         const std::vector<std::string>& columns);
  static void dropIndexes(RawDatabase& database, const std::vector<std::string>& indexes);
};

}  // namespace reliability
