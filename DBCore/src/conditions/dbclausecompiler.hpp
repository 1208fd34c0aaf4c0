#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "dbclause.hpp"
#include "dbclauseprogram.hpp"
#include "dbenginereference.hpp"

namespace dbcore {

// Compiles condition trees over one table into a DBClauseProgram: SQL with every literal as a bound
// parameter, and the same condition for in-memory evaluation.
//
// Column references (SOURCE_VAL: the table's own columns; OTHER_VAL: the columns of its related tables,
// see DBValidationRecord::relatedTables) and max/min sub-selects (over any engine table) are written as
// SQL only from the engine's own table and column names, after looking them up; no byte of a condition
// reaches the SQL text. A tree that names an unknown table or column, holds an unknown operator or a
// malformed node, is deeper than kMaxDepth, nests parentheses deeper than kMaxNesting (comparisons of
// comparisons, || inside &&), is larger than kMaxNodes or has more than kMaxLiterals literals (limits
// that keep the SQL within what SQLite parses) gives the rejected program, which selects nothing. So does a
// comparison that SQLite would answer by turning a real number into text (a float compared with a text column
// through a literal or a sub-select), the one conversion the evaluator does not reproduce.
//
// Literals are converted as SQLite would convert them in their place, and bound converted: a text
// literal compared with a numeric column is bound as the number it spells, an integer literal compared
// with a text column as its decimal text, and a literal used as a condition (an operand of && or ||, or
// a whole clause) as its truth value.
class DBClauseCompiler {
 public:
  static constexpr int kMaxDepth = 900;
  static constexpr int kMaxNesting = 24;
  static constexpr std::size_t kMaxNodes = 100000;
  static constexpr std::size_t kMaxLiterals = 32000;

  explicit DBClauseCompiler(const std::string& table);

  // One program that holds when every tree holds; empty trees are skipped (no tree: no condition).
  DBClauseProgram compile(const std::vector<std::shared_ptr<token_node>>& trees);

 private:
  // A compiled subexpression: its node and what a comparison needs to know about it.
  struct Operand {
    int32_t node;
    DBSqlValue::Affinity affinity;
    bool mayBeReal;
  };

  int32_t compileCondition(const token_node& token, bool wrap, int depth);
  Operand compileNested(const token_node& token, bool wrap, int depth);
  Operand compileNode(const token_node& token, int depth);
  Operand compileValue(const token_node& token);
  Operand compileReference(const DBEngineReference& reference);
  Operand compileColumn(uint32_t slot, const std::string& table, const std::string& column);
  Operand compileAggregate(const DBEngineReference& reference);
  Operand compileLiteral(const TVariant& value);
  Operand compileComparison(const token_node& token, int depth);
  Operand compileLogical(const token_node& token, int depth);

  void convertLiteral(const Operand& operand, DBSqlValue::Affinity affinity);
  void makeCondition(const Operand& operand);
  int32_t addNode(const DBClauseProgram::Node& node);
  const ColumnTypes& columnsOf(const std::string& table);

  std::string table_;
  DBClauseProgram program_;
  std::vector<DBSqlValue> literals_;
  // Texts the literals view; a deque never moves its elements.
  std::deque<std::string> texts_;
  std::vector<std::string> aggregateSelects_;
  std::map<std::string, ColumnTypes> columns_;
  std::size_t visited_ = 0;
  int nesting_ = 0;
};

}  // namespace dbcore
