#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbsqlrow.hpp"
#include "dbsqlvalue.hpp"
#include "tvariant.hpp"

namespace dbcore {

// The checked, compiled form of a query's conditions (made by DBClauseCompiler): the SQL text of the
// condition with its literals as bound parameters, and the same condition as a flat expression tree for
// DBClauseEvaluator. Column references are (slot, column number) pairs into a DBValidationRecord; the
// values of max/min sub-selects are numbered and come from the query's aggregate snapshot. Immutable.
class DBClauseProgram {
 public:
  enum class NodeKind : uint8_t { Literal, Column, Aggregate, Compare, And, Or };

  struct Node {
    NodeKind kind;
    // Compare: the operator code (DBOperatorCode); the affinity applied to both operands.
    int32_t op = 0;
    DBSqlValue::Affinity affinity = DBSqlValue::Affinity::None;
    // Column: 0 for the record's own table, n for its n-th related table.
    uint32_t slot = 0;
    // Literal, Column, Aggregate: the number of the literal, column or aggregate.
    uint32_t index = 0;
    // Compare, And, Or: the operands' node numbers.
    int32_t left = -1;
    int32_t right = -1;
  };

  // A program with no condition: it holds for every record.
  DBClauseProgram() = default;
  DBClauseProgram(DBClauseProgram&&) noexcept = default;
  DBClauseProgram& operator=(DBClauseProgram&&) noexcept = default;

  // A program that holds for no record: its conditions named something unknown or were malformed.
  bool rejected() const { return rejected_; }
  bool hasCondition() const { return root_ >= 0; }

  const std::vector<Node>& nodes() const { return nodes_; }
  int32_t root() const { return root_; }
  // The literals, in the order of their parameters in sql().
  const DBSqlRow& literals() const { return literals_; }
  // The condition as an SQL expression over the table and its related tables; empty without condition.
  const std::string& sql() const { return sql_; }
  // Bit n is set when the condition reads related table n (slot n).
  uint32_t relatedSlots() const { return relatedSlots_; }

  // One SELECT giving every max/min sub-select's value in aggregate order; empty when there are none.
  const std::string& aggregateSql() const { return aggregateSql_; }
  // The type of each aggregated column, which tells how to read its value.
  const std::vector<FieldType>& aggregateTypes() const { return aggregateTypes_; }

 private:
  friend class DBClauseCompiler;

  bool rejected_ = false;
  std::vector<Node> nodes_;
  int32_t root_ = -1;
  DBSqlRow literals_;
  std::string sql_;
  uint32_t relatedSlots_ = 0;
  std::string aggregateSql_;
  std::vector<FieldType> aggregateTypes_;
};

}  // namespace dbcore
