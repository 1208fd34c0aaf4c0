#include "dbentity.hpp"

#include <tuple>

#include "dbrecords.hpp"

namespace dbcore {

namespace {

template <class... Records>
std::map<std::string, ColumnTypes> column_types_by_table(std::tuple<Records...>*) {
  return {{Records::kTableName, Records::column_types()}...};
}

// The column types of every table, built once from the list of record types.
const std::map<std::string, ColumnTypes>& tables() {
  static const auto tables = column_types_by_table(static_cast<DBRecordTypes*>(nullptr));
  return tables;
}

}  // namespace

const ColumnTypes& DBEntity::T_COLUMN_TYPES(const std::string& table) {
  static const ColumnTypes kNone;
  const auto found = tables().find(table);
  return found == tables().end() ? kNone : found->second;
}

}  // namespace dbcore
