#pragma once

#include <cstdint>
#include <deque>
#include <memory>
#include <stack>
#include <string>

#include "dbentity.hpp"
#include "tvariant.hpp"

namespace dbcore {

// Operator codes of token nodes. 0 is an operand; 10 is a node that carries engine text (a column
// function's sub-select) and is never type-checked.
enum DBOperatorCode : int32_t {
  kOperand = 0,
  kOperatorAnd = 1,
  kOperatorOr = 2,
  kOperatorEqual = 3,
  kOperatorNotEqual = 4,
  kOperatorLess = 5,
  kOperatorLessOrEqual = 6,
  kOperatorGreater = 7,
  kOperatorGreaterOrEqual = 8,
  kTextNode = 10,
};

// The column-function words of the condition language.
inline constexpr const char* kMaxFromColumn = "max_from_column";
inline constexpr const char* kMinFromColumn = "min_from_column";

class DBClause;

// One node of a condition's expression tree: an operand with its value, or an operator with two sides.
class token_node {
 public:
  token_node() = default;
  // An operand holding the text as a T_TEXT value.
  explicit token_node(const std::string& text);
  // A node over the root of a clause (the clause's tree is shared, not copied).
  explicit token_node(const DBClause& clause);
  virtual ~token_node() = default;

  std::shared_ptr<TVariant> var;
  std::shared_ptr<token_node> left;
  std::shared_ptr<token_node> right;
  int32_t op = kOperand;
};

// A condition ready for a select query: the root of a type-checked tree, or nothing (the empty clause,
// which restricts nothing).
class DBClause {
 public:
  DBClause() = default;
  explicit DBClause(std::shared_ptr<token_node> root) : root_(std::move(root)) {}

  const std::shared_ptr<token_node>& root() const { return root_; }
  void set_root(std::shared_ptr<token_node> root) { root_ = std::move(root); }
  bool empty() const { return root_ == nullptr; }

 private:
  std::shared_ptr<token_node> root_;
};

// The tokens of a condition in postfix order, the root operator on top.
using ConditionStack = std::stack<std::string, std::deque<std::string>>;

// Reads a condition into its postfix token stack. Operands are column names and literal texts (quotes
// removed); a column function max_from_column(column) / min_from_column(column) is pushed as the column
// name with the function word directly above it. A malformed condition gives an empty stack.
ConditionStack makeConditionStackWithCondition(const std::string& condition);

// The operator code of an operator token ("&&", "||", "==", "!=", "<", "<=", ">", ">="); 0 for any
// other token.
int32_t operator_for_literal(const std::string& token);

// Engine texts that stand for columns and sub-selects inside type-checked trees. They start with a NUL
// byte, which no condition token can hold, so no literal of a condition can spell one. Their layout
// is DBEngineReference's, which also reads them back.
std::string SOURCE_VAL(const std::string& column);
std::string OTHER_VAL(const std::string& table, const std::string& column);
std::string SELECT_MAX(const std::string& column, const std::string& table);
std::string SELECT_MIN(const std::string& column, const std::string& table);

// The condition routines for a table named at run time; the record-type templates below call them with
// the record type's table.

// Takes one subexpression off the stack (operators take their right side first) and returns its root,
// or an empty pointer when the stack runs out. A column function becomes a text node (op kTextNode)
// carrying the sub-select text, so that type checking keeps it as it is instead of reading it as a
// literal of the other side's type.
std::shared_ptr<token_node> makeTokenNodeWithConditionStack(ConditionStack& stack, const std::string& table);

// Type-checks the tree in place: literals take the type of the column they are compared with and are
// converted to it, a column met with no expected type becomes its reference (OTHER_VAL of the table
// when joined, SOURCE_VAL otherwise). `type` is the expected type on entry (T_NONE for none) and the
// determined type on return; an operator node is always T_BOOL.
bool validateTypes(const std::shared_ptr<token_node>& token, FieldType& type, bool joined,
                   const std::string& table);

// The clause of a condition: its type-checked tree, or the empty clause when the condition is empty,
// malformed or ill-typed.
DBClause clauseWithCondition(const std::string& condition, bool joined, const std::string& table);

// The same routines for a record type T, over its table T::kTableName ("images", "paths", ...).
template <class T>
std::shared_ptr<token_node> makeTokenNodeWithConditionStack(ConditionStack& stack) {
  return makeTokenNodeWithConditionStack(stack, T::kTableName);
}

template <class T>
bool validateTypes(const std::shared_ptr<token_node>& token, FieldType& type, bool joined) {
  return validateTypes(token, type, joined, T::kTableName);
}

template <class T>
DBClause clauseWithCondition(const std::string& condition, bool joined) {
  return clauseWithCondition(condition, joined, T::kTableName);
}

}  // namespace dbcore
