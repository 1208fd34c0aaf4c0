#include "dbselectqueryrunner.hpp"

#include <string>

namespace dbcore {

namespace {

// The value of one sub-select, read as its column's type stores it; a text is kept in `text`.
DBSqlValue aggregateValue(const DBStatement& statement, int column, FieldType type, std::string& text) {
  if (statement.columnIsNull(column)) return DBSqlValue();
  switch (type) {
    case FieldType::T_TEXT:
    case FieldType::T_WIDE_TEXT:
      text = statement.columnText(column);
      return DBSqlValue::text(text);
    case FieldType::T_FLOAT:
      return DBSqlValue::real(statement.columnDouble(column));
    default:
      return DBSqlValue::integer(statement.columnInt64(column));
  }
}

}  // namespace

std::shared_ptr<const DBSelectPlan> DBSelectQueryRunner::planOf(
    const std::shared_ptr<DBEntitySelectQuery>& query, const std::string& table) {
  if (!query) throw DBException("GetBySelectQuery was given no query");
  std::shared_ptr<const DBSelectPlan> plan = query->planFor(table);
  if (!plan) throw DBException("A select query over " + query->table() + " was run for " + table);
  return plan;
}

void DBSelectQueryRunner::keepAggregates(DBConnection& connection, DBEntitySelectQuery& query,
                                         const std::shared_ptr<const DBSelectPlan>& plan) {
  const DBClauseProgram& program = plan->program();
  if (program.aggregateSql().empty()) return;
  const std::vector<FieldType>& types = program.aggregateTypes();
  std::vector<std::string> texts(types.size());
  std::vector<DBSqlValue> values;
  {
    const DBStatementLease statement = connection.prepare(program.aggregateSql());
    if (statement->step()) {
      for (std::size_t index = 0; index < types.size(); ++index) {
        values.push_back(aggregateValue(*statement, static_cast<int>(index), types[index], texts[index]));
      }
    }
  }
  query.keepAggregates(plan, DBSqlRow(values));
}

void DBSelectQueryRunner::bind(DBStatement& statement, const DBSqlRow& parameters) {
  int index = 1;
  for (const DBSqlValue& value : parameters.values()) {
    switch (value.storageClass()) {
      case DBSqlValue::Class::Null:
        statement.bindNull(index);
        break;
      case DBSqlValue::Class::Integer:
        statement.bind(index, value.asInteger());
        break;
      case DBSqlValue::Class::Real:
        statement.bindDouble(index, value.asReal());
        break;
      case DBSqlValue::Class::Text:
        statement.bind(index, std::string(value.asText()));
        break;
    }
    ++index;
  }
}

}  // namespace dbcore
