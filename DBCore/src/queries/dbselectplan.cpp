#include "dbselectplan.hpp"

#include <cstddef>
#include <utility>

#include "dbrecord.hpp"
#include "dbvalidationrecord.hpp"

namespace dbcore {

DBSelectPlan::DBSelectPlan(std::string table, DBClauseProgram program, uint32_t joinedSlots,
                           const std::vector<DBSelectRestriction>& restrictions)
    : table_(std::move(table)),
      program_(std::move(program)),
      joinedSlots_(joinedSlots | program_.relatedSlots()),
      tail_(joins() + conditions(restrictions) + " ORDER BY " + table_ + "." + kIdColumn),
      parameters_(parametersOf(restrictions)) {}

std::string DBSelectPlan::joins() const {
  std::string sql;
  const auto& related = DBValidationRecord::relatedTables(table_);
  for (std::size_t index = 0; index < related.size(); ++index) {
    if ((joinedSlots_ >> (index + 1) & 1u) == 0) continue;
    const std::string other = related[index].table;
    sql += " JOIN " + other + " ON " + other + "." + related[index].linkColumn + " = " + table_ + "." +
           kIdColumn;
  }
  return sql;
}

std::string DBSelectPlan::conditions(const std::vector<DBSelectRestriction>& restrictions) const {
  std::string sql = program_.sql();
  for (const DBSelectRestriction& restriction : restrictions)
    sql += (sql.empty() ? "" : " AND ") + restriction.sql;
  return sql.empty() ? sql : " WHERE " + sql;
}

// The literals of the clauses come first: their SQL precedes the restrictions'.
DBSqlRow DBSelectPlan::parametersOf(const std::vector<DBSelectRestriction>& restrictions) const {
  std::vector<TVariant> extra;
  for (const DBSelectRestriction& restriction : restrictions) {
    extra.insert(extra.end(), restriction.parameters.begin(), restriction.parameters.end());
  }
  const DBSqlRow extraRow(extra);
  std::vector<DBSqlValue> values(program_.literals().values().begin(), program_.literals().values().end());
  values.insert(values.end(), extraRow.values().begin(), extraRow.values().end());
  return DBSqlRow(values);
}

}  // namespace dbcore
