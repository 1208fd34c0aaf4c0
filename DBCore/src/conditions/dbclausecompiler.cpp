#include "dbclausecompiler.hpp"

#include <iterator>
#include <tuple>
#include <utility>

#include "dbrecords.hpp"
#include "dbvalidationrecord.hpp"

namespace dbcore {

namespace {

using Affinity = DBSqlValue::Affinity;
using Node = DBClauseProgram::Node;
using NodeKind = DBClauseProgram::NodeKind;

// Thrown while compiling a tree that cannot be compiled; compile() answers the rejected program.
struct Refused {};

[[noreturn]] void refuse() { throw Refused{}; }

template <class... Records>
const char* engineTableName(const std::string& name, std::tuple<Records...>*) {
  const char* found = nullptr;
  static_cast<void>(((name == Records::kTableName && (found = Records::kTableName)) || ...));
  return found;
}

// The engine's own spelling of a table name, or null for a table the engine does not have.
const char* knownTable(const std::string& name) {
  return engineTableName(name, static_cast<DBRecordTypes*>(nullptr));
}

Affinity affinityOf(FieldType type) {
  switch (type) {
    case FieldType::T_TEXT:
    case FieldType::T_WIDE_TEXT:
      return Affinity::Text;
    case FieldType::T_NONE:
      return Affinity::None;
    default:
      return Affinity::Numeric;
  }
}

// SQLite's choice: numeric when either side is a numeric column; two text columns compare as they are;
// a text column against an operand without affinity applies text affinity.
Affinity comparisonAffinity(Affinity left, Affinity right) {
  if (left == Affinity::Numeric || right == Affinity::Numeric) return Affinity::Numeric;
  if (left == Affinity::Text && right == Affinity::Text) return Affinity::None;
  return left == Affinity::Text || right == Affinity::Text ? Affinity::Text : Affinity::None;
}

const char* sqlOperator(int32_t code) {
  switch (code) {
    case kOperatorEqual:
      return " = ";
    case kOperatorNotEqual:
      return " <> ";
    case kOperatorLess:
      return " < ";
    case kOperatorLessOrEqual:
      return " <= ";
    case kOperatorGreater:
      return " > ";
    case kOperatorGreaterOrEqual:
      return " >= ";
    default:
      return nullptr;
  }
}

bool isOperator(const token_node& token) { return token.op != kOperand && token.op != kTextNode; }

DBSqlValue truthValue(const DBSqlValue& value) {
  const std::optional<bool> truth = value.truth();
  return truth ? DBSqlValue::integer(*truth) : DBSqlValue();
}

}  // namespace

// A table the engine does not have reads as one without columns, so every reference to it is refused.
DBClauseCompiler::DBClauseCompiler(const std::string& table) : table_(knownTable(table) ? table : "") {}

DBClauseProgram DBClauseCompiler::compile(const std::vector<std::shared_ptr<token_node>>& trees) {
  try {
    for (const auto& tree : trees) {
      if (!tree) continue;
      if (!program_.sql_.empty()) program_.sql_ += " AND ";
      const int32_t condition = compileCondition(*tree, tree->op == kOperatorOr, 0);
      program_.root_ = program_.root_ < 0
                           ? condition
                           : addNode({.kind = NodeKind::And, .left = program_.root_, .right = condition});
    }
  } catch (const Refused&) {
    DBClauseProgram rejected;
    rejected.rejected_ = true;
    return rejected;
  }
  program_.literals_ = DBSqlRow(literals_);
  for (const std::string& select : aggregateSelects_) {
    program_.aggregateSql_ += program_.aggregateSql_.empty() ? "SELECT " + select : ", " + select;
  }
  return std::move(program_);
}

// A subexpression used as a condition: a literal there is bound as its truth value.
int32_t DBClauseCompiler::compileCondition(const token_node& token, bool wrap, int depth) {
  const Operand operand = compileNested(token, wrap, depth);
  makeCondition(operand);
  return operand.node;
}

// SQLite's parser has a small stack, so parentheses are written only where precedence needs them and
// their nesting is bounded.
DBClauseCompiler::Operand DBClauseCompiler::compileNested(const token_node& token, bool wrap, int depth) {
  if (!wrap) return compileNode(token, depth);
  if (++nesting_ > kMaxNesting) refuse();
  program_.sql_ += "(";
  const Operand operand = compileNode(token, depth);
  program_.sql_ += ")";
  --nesting_;
  return operand;
}

DBClauseCompiler::Operand DBClauseCompiler::compileNode(const token_node& token, int depth) {
  if (depth > kMaxDepth || ++visited_ > kMaxNodes) refuse();
  switch (token.op) {
    case kOperand:
    case kTextNode:
      return compileValue(token);
    case kOperatorAnd:
    case kOperatorOr:
      return compileLogical(token, depth);
    default:
      return compileComparison(token, depth);
  }
}

// A text node must carry an engine reference; an operand carries a reference or a literal.
DBClauseCompiler::Operand DBClauseCompiler::compileValue(const token_node& token) {
  if (!token.var) refuse();
  if (token.var->type() == FieldType::T_TEXT) {
    if (const auto reference = DBEngineReference::parse(token.var->asText()))
      return compileReference(*reference);
  }
  if (token.op == kTextNode) refuse();
  return compileLiteral(*token.var);
}

DBClauseCompiler::Operand DBClauseCompiler::compileReference(const DBEngineReference& reference) {
  if (reference.kind == DBEngineReference::Kind::Max || reference.kind == DBEngineReference::Kind::Min) {
    return compileAggregate(reference);
  }
  if (reference.kind == DBEngineReference::Kind::Source) return compileColumn(0, table_, reference.column);
  const auto& related = DBValidationRecord::relatedTables(table_);
  for (std::size_t index = 0; index < related.size(); ++index) {
    if (reference.table == related[index].table) {
      return compileColumn(static_cast<uint32_t>(index + 1), related[index].table, reference.column);
    }
  }
  refuse();
}

DBClauseCompiler::Operand DBClauseCompiler::compileColumn(uint32_t slot, const std::string& table,
                                                          const std::string& column) {
  const ColumnTypes& columns = columnsOf(table);
  const auto found = columns.find(column);
  if (found == columns.end()) refuse();
  program_.sql_ += table + "." + found->first;
  if (slot > 0) program_.relatedSlots_ |= 1u << slot;
  const auto index = static_cast<uint32_t>(std::distance(columns.begin(), found));
  return {addNode({.kind = NodeKind::Column, .slot = slot, .index = index}), affinityOf(found->second),
          found->second == FieldType::T_FLOAT};
}

DBClauseCompiler::Operand DBClauseCompiler::compileAggregate(const DBEngineReference& reference) {
  const char* table = knownTable(reference.table);
  if (!table) refuse();
  const ColumnTypes& columns = columnsOf(table);
  const auto found = columns.find(reference.column);
  if (found == columns.end()) refuse();
  const char* function = reference.kind == DBEngineReference::Kind::Max ? "max" : "min";
  const std::string select =
      std::string("(SELECT ") + function + "(" + found->first + ") FROM " + table + ")";
  program_.sql_ += select;
  aggregateSelects_.push_back(select);
  program_.aggregateTypes_.push_back(found->second);
  const auto index = static_cast<uint32_t>(aggregateSelects_.size() - 1);
  return {addNode({.kind = NodeKind::Aggregate, .index = index}), Affinity::None,
          found->second == FieldType::T_FLOAT};
}

DBClauseCompiler::Operand DBClauseCompiler::compileLiteral(const TVariant& value) {
  if (literals_.size() >= kMaxLiterals) refuse();
  literals_.push_back(DBSqlRow::storedValue(value, texts_.emplace_back()));
  program_.sql_ += "?";
  const auto index = static_cast<uint32_t>(literals_.size() - 1);
  return {addNode({.kind = NodeKind::Literal, .index = index}), Affinity::None,
          literals_.back().storageClass() == DBSqlValue::Class::Real};
}

DBClauseCompiler::Operand DBClauseCompiler::compileComparison(const token_node& token, int depth) {
  const char* sqlText = sqlOperator(token.op);
  if (!sqlText || !token.left || !token.right) refuse();
  const Operand left = compileNested(*token.left, isOperator(*token.left), depth + 1);
  program_.sql_ += sqlText;
  const Operand right = compileNested(*token.right, isOperator(*token.right), depth + 1);
  const Affinity affinity = comparisonAffinity(left.affinity, right.affinity);
  if (affinity == Affinity::Text && (left.mayBeReal || right.mayBeReal)) refuse();
  convertLiteral(left, affinity);
  convertLiteral(right, affinity);
  return {addNode({.kind = NodeKind::Compare,
                   .op = token.op,
                   .affinity = affinity,
                   .left = left.node,
                   .right = right.node}),
          Affinity::None, false};
}

DBClauseCompiler::Operand DBClauseCompiler::compileLogical(const token_node& token, int depth) {
  if (!token.left || !token.right) refuse();
  // AND binds tighter than OR and both are associative: only an OR below an AND needs parentheses.
  const bool isAnd = token.op == kOperatorAnd;
  const int32_t left = compileCondition(*token.left, isAnd && token.left->op == kOperatorOr, depth + 1);
  program_.sql_ += isAnd ? " AND " : " OR ";
  const int32_t right = compileCondition(*token.right, isAnd && token.right->op == kOperatorOr, depth + 1);
  return {addNode({.kind = isAnd ? NodeKind::And : NodeKind::Or, .left = left, .right = right}),
          Affinity::None, false};
}

// Binds the literal as the comparison will see it; an integer turned into text keeps its text here.
void DBClauseCompiler::convertLiteral(const Operand& operand, Affinity affinity) {
  const Node& node = program_.nodes_[static_cast<std::size_t>(operand.node)];
  if (node.kind != NodeKind::Literal) return;
  DBSqlValue& literal = literals_[node.index];
  char buffer[DBSqlValue::kIntegerTextSize];
  const DBSqlValue converted = literal.withAffinity(affinity, buffer);
  const bool madeText = converted.storageClass() == DBSqlValue::Class::Text &&
                        literal.storageClass() != DBSqlValue::Class::Text;
  literal = madeText ? DBSqlValue::text(texts_.emplace_back(converted.asText())) : converted;
}

void DBClauseCompiler::makeCondition(const Operand& operand) {
  const Node& node = program_.nodes_[static_cast<std::size_t>(operand.node)];
  if (node.kind == NodeKind::Literal) literals_[node.index] = truthValue(literals_[node.index]);
}

int32_t DBClauseCompiler::addNode(const Node& node) {
  program_.nodes_.push_back(node);
  return static_cast<int32_t>(program_.nodes_.size() - 1);
}

const ColumnTypes& DBClauseCompiler::columnsOf(const std::string& table) {
  const auto [found, added] = columns_.try_emplace(table);
  if (added) found->second = DBEntity::T_COLUMN_TYPES(table);
  return found->second;
}

}  // namespace dbcore
