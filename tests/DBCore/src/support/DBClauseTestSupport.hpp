#pragma once

#include <memory>
#include <string>

#include "dbclause.hpp"
#include "tvariant.hpp"

// Hand-built condition trees, as type checking leaves them: column references as engine texts,
// literals as typed values, operators with their codes.
namespace clausetest {

using Node = std::shared_ptr<dbcore::token_node>;

inline Node operand(dbcore::TVariant value) {
  auto node = std::make_shared<dbcore::token_node>();
  node->var = std::make_shared<dbcore::TVariant>(std::move(value));
  return node;
}

// A column of the row under test.
inline Node source(const std::string& column) {
  return operand(dbcore::TVariant(dbcore::SOURCE_VAL(column)));
}

// A column of a joined table's row.
inline Node other(const std::string& table, const std::string& column) {
  return operand(dbcore::TVariant(dbcore::OTHER_VAL(table, column)));
}

inline Node text(const std::string& value) { return operand(dbcore::TVariant(value)); }
inline Node wide(const std::wstring& value) { return operand(dbcore::TVariant(value)); }
inline Node boolean(bool value) { return operand(dbcore::TVariant(value)); }
inline Node int32(int32_t value) { return operand(dbcore::TVariant(value)); }
inline Node int64(int64_t value) { return operand(dbcore::TVariant(value)); }
inline Node real(float value) { return operand(dbcore::TVariant(value)); }
inline Node null() { return operand(dbcore::TVariant()); }

// A max/min sub-select as the condition routines make it: a text node.
inline Node textNode(const std::string& engineText) {
  auto node = std::make_shared<dbcore::token_node>(engineText);
  node->op = dbcore::kTextNode;
  return node;
}
inline Node maxOf(const std::string& table, const std::string& column) {
  return textNode(dbcore::SELECT_MAX(column, table));
}
inline Node minOf(const std::string& table, const std::string& column) {
  return textNode(dbcore::SELECT_MIN(column, table));
}

inline Node op(int32_t code, Node left, Node right) {
  auto node = std::make_shared<dbcore::token_node>();
  node->op = code;
  node->left = std::move(left);
  node->right = std::move(right);
  return node;
}

inline Node eq(Node left, Node right) {
  return op(dbcore::kOperatorEqual, std::move(left), std::move(right));
}
inline Node ne(Node left, Node right) {
  return op(dbcore::kOperatorNotEqual, std::move(left), std::move(right));
}
inline Node lt(Node left, Node right) { return op(dbcore::kOperatorLess, std::move(left), std::move(right)); }
inline Node le(Node left, Node right) {
  return op(dbcore::kOperatorLessOrEqual, std::move(left), std::move(right));
}
inline Node gt(Node left, Node right) {
  return op(dbcore::kOperatorGreater, std::move(left), std::move(right));
}
inline Node ge(Node left, Node right) {
  return op(dbcore::kOperatorGreaterOrEqual, std::move(left), std::move(right));
}
inline Node both(Node left, Node right) {
  return op(dbcore::kOperatorAnd, std::move(left), std::move(right));
}
inline Node either(Node left, Node right) {
  return op(dbcore::kOperatorOr, std::move(left), std::move(right));
}

inline std::shared_ptr<dbcore::DBClause> clause(Node root) {
  return std::make_shared<dbcore::DBClause>(std::move(root));
}

}  // namespace clausetest
