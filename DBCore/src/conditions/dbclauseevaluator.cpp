#include "dbclauseevaluator.hpp"

#include <bit>
#include <cstddef>

#include "dbclause.hpp"

namespace dbcore {

namespace {

using NodeKind = DBClauseProgram::NodeKind;

// Whether the order of the left operand against the right (negative, 0, positive) passes the operator.
bool passes(int32_t op, int order) {
  switch (op) {
    case kOperatorEqual:
      return order == 0;
    case kOperatorNotEqual:
      return order != 0;
    case kOperatorLess:
      return order < 0;
    case kOperatorLessOrEqual:
      return order <= 0;
    case kOperatorGreater:
      return order > 0;
    default:
      return order >= 0;
  }
}

}  // namespace

bool DBClauseEvaluator::satisfied(uint32_t joinedSlots) const {
  if (program_.rejected() || !hasRows(joinedSlots | program_.relatedSlots())) return false;
  return !program_.hasCondition() || value(program_.root()).truth() == true;
}

bool DBClauseEvaluator::hasRows(uint32_t slots) const {
  if (!record_.hasRow(0)) return false;
  for (uint32_t rest = slots; rest != 0; rest &= rest - 1) {
    if (!record_.hasRow(static_cast<std::size_t>(std::countr_zero(rest)))) return false;
  }
  return true;
}

DBSqlValue DBClauseEvaluator::value(int32_t index) const {
  const DBClauseProgram::Node& node = program_.nodes()[static_cast<std::size_t>(index)];
  switch (node.kind) {
    case NodeKind::Literal:
      return program_.literals()[node.index];
    case NodeKind::Column:
      return record_.value(node.slot, node.index);
    case NodeKind::Aggregate:
      return aggregates_ ? (*aggregates_)[node.index] : DBSqlValue();
    case NodeKind::Compare:
      return compare(node);
    default:
      return logical(node);
  }
}

DBSqlValue DBClauseEvaluator::compare(const DBClauseProgram::Node& node) const {
  char leftText[DBSqlValue::kIntegerTextSize];
  char rightText[DBSqlValue::kIntegerTextSize];
  const DBSqlValue left = value(node.left).withAffinity(node.affinity, leftText);
  const DBSqlValue right = value(node.right).withAffinity(node.affinity, rightText);
  const std::optional<int> order = DBSqlValue::compare(left, right);
  return order ? DBSqlValue::integer(passes(node.op, *order)) : DBSqlValue();
}

// && is false when either side is false, || true when either side is true; otherwise NULL when either
// side is NULL.
DBSqlValue DBClauseEvaluator::logical(const DBClauseProgram::Node& node) const {
  const bool isAnd = node.kind == NodeKind::And;
  const std::optional<bool> left = value(node.left).truth();
  if (left == !isAnd) return DBSqlValue::integer(!isAnd);
  const std::optional<bool> right = value(node.right).truth();
  if (right == !isAnd) return DBSqlValue::integer(!isAnd);
  return left.has_value() && right.has_value() ? DBSqlValue::integer(isAnd) : DBSqlValue();
}

}  // namespace dbcore
