#include "dbclause.hpp"

#include <array>
#include <cmath>
#include <cstdlib>
#include <limits>
#include <string_view>
#include <utility>

#include "dbassert.hpp"
#include "dbconditiontokenizer.hpp"
#include "dbenginereference.hpp"
#include "dbstrings.hpp"

namespace dbcore {

namespace {

// The operator tokens of the condition language and their node codes.
constexpr std::array<std::pair<std::string_view, DBOperatorCode>, 8> kOperators{{
    {"&&", kOperatorAnd},
    {"||", kOperatorOr},
    {"==", kOperatorEqual},
    {"!=", kOperatorNotEqual},
    {"<", kOperatorLess},
    {"<=", kOperatorLessOrEqual},
    {">", kOperatorGreater},
    {">=", kOperatorGreaterOrEqual},
}};

std::string referenceText(DBEngineReference::Kind kind, const std::string& table, const std::string& column) {
  return DBEngineReference{kind, table, column}.text();
}

// The column name beneath a column-function word.
std::string popColumnName(ConditionStack& stack) {
  DB_ASSERT(!stack.empty());
  std::string column = stack.top();
  stack.pop();
  return column;
}

std::shared_ptr<token_node> makeTextNode(const std::string& text) {
  auto node = std::make_shared<token_node>(text);
  node->op = kTextNode;
  return node;
}

// The stack is postfix, so an operator's right side comes off it first.
std::shared_ptr<token_node> makeOperatorNode(int32_t code, ConditionStack& stack, const std::string& table) {
  auto node = std::make_shared<token_node>();
  node->op = code;
  node->right = makeTokenNodeWithConditionStack(stack, table);
  if (!node->right) return nullptr;
  node->left = makeTokenNodeWithConditionStack(stack, table);
  if (!node->left) return nullptr;
  return node;
}

// What the text-node invariant reads of a node: the type of its value (T_NONE when it has none).
struct TokenValueView {
  FieldType type;
};
struct TokenView {
  const TokenValueView* var;
};

// Stops the program unless a text-carrying node holds text. The view lets the assertion name the
// node's value type as token->var->type.
void assertTextNode(const token_node& node) {
  const TokenValueView value{node.var ? node.var->type() : FieldType::T_NONE};
  const TokenView view{&value};
  const TokenView* const token = &view;
  DB_ASSERT(token->var->type == FieldType::T_TEXT);
}

// Out-of-range values saturate and NaN gives 0, so that every literal converts without undefined
// behaviour; values in range are truncated toward zero.
template <class Integer>
Integer truncateToInteger(float value) {
  if (std::isnan(value)) return 0;
  constexpr auto kLowest = std::numeric_limits<Integer>::lowest();
  constexpr auto kMax = std::numeric_limits<Integer>::max();
  if (value <= static_cast<float>(kLowest)) return kLowest;
  if (value >= static_cast<float>(kMax)) return kMax;
  return static_cast<Integer>(value);
}

// Literals are read as single-precision floats, also for integer columns: 16777217 becomes 16777216.
float parseFloat(const std::string& text) { return std::strtof(text.c_str(), nullptr); }

// Converts a literal to the expected type; false for a type that literals cannot take.
bool convertLiteral(token_node& token, FieldType type) {
  const std::string& text = token.var->asText();
  switch (type) {
    case FieldType::T_NONE:
    case FieldType::T_TEXT:
      return true;
    case FieldType::T_BOOL:
      if (text == "true" || text == "false") token.var = std::make_shared<TVariant>(text == "true");
      return true;
    case FieldType::T_INT:
    case FieldType::T_UINT:
      token.var = std::make_shared<TVariant>(truncateToInteger<int32_t>(parseFloat(text)));
      return true;
    case FieldType::T_INT_64:
      token.var = std::make_shared<TVariant>(truncateToInteger<int64_t>(parseFloat(text)));
      return true;
    case FieldType::T_FLOAT:
      token.var = std::make_shared<TVariant>(parseFloat(text));
      return true;
    case FieldType::T_WIDE_TEXT:
      token.var = std::make_shared<TVariant>(s2ws(text));
      return true;
  }
  return false;
}

// A column met with no expected type gives the type and becomes its reference; met with an expected
// type it is only compared with it.
bool bindColumn(token_node& token, FieldType column_type, FieldType& type, bool joined,
                const std::string& table) {
  if (type != FieldType::T_NONE) return type == column_type;
  type = column_type;
  const std::string& column = token.var->asText();
  token.var = std::make_shared<TVariant>(joined ? OTHER_VAL(table, column) : SOURCE_VAL(column));
  return true;
}

bool validateOperand(token_node& token, FieldType& type, bool joined, const std::string& table) {
  if (!token.var) return false;
  if (token.var->type() != FieldType::T_TEXT) return type == token.var->type();
  const ColumnTypes& columns = DBEntity::T_COLUMN_TYPES(table);
  const auto column = columns.find(token.var->asText());
  if (column == columns.end()) return convertLiteral(token, type);
  return bindColumn(token, column->second, type, joined, table);
}

// Both sides are checked with no expected type; a side left untyped (a literal) is checked again with
// the other side's type, which converts it.
bool validateOperator(token_node& token, FieldType& type, bool joined, const std::string& table) {
  if (!token.left || !token.right) return false;
  type = FieldType::T_BOOL;
  FieldType right = FieldType::T_NONE;
  FieldType left = FieldType::T_NONE;
  if (!validateTypes(token.right, right, joined, table)) return false;
  if (!validateTypes(token.left, left, joined, table)) return false;
  if (right != FieldType::T_NONE && left != FieldType::T_NONE) return right == left;
  if (right != FieldType::T_NONE) return validateTypes(token.left, right, joined, table);
  if (left != FieldType::T_NONE) return validateTypes(token.right, left, joined, table);
  return true;
}

}  // namespace

token_node::token_node(const std::string& text) : var(std::make_shared<TVariant>(text)) {}

token_node::token_node(const DBClause& clause) {
  if (const auto& root = clause.root()) {
    var = root->var;
    left = root->left;
    right = root->right;
    op = root->op;
  }
}

ConditionStack makeConditionStackWithCondition(const std::string& condition) {
  return DBConditionTokenizer::postfix(condition);
}

int32_t operator_for_literal(const std::string& token) {
  for (const auto& [literal, code] : kOperators) {
    if (literal == token) return code;
  }
  return kOperand;
}

std::string SOURCE_VAL(const std::string& column) {
  return referenceText(DBEngineReference::Kind::Source, {}, column);
}

std::string OTHER_VAL(const std::string& table, const std::string& column) {
  return referenceText(DBEngineReference::Kind::Other, table, column);
}

std::string SELECT_MAX(const std::string& column, const std::string& table) {
  return referenceText(DBEngineReference::Kind::Max, table, column);
}

std::string SELECT_MIN(const std::string& column, const std::string& table) {
  return referenceText(DBEngineReference::Kind::Min, table, column);
}

std::shared_ptr<token_node> makeTokenNodeWithConditionStack(ConditionStack& stack, const std::string& table) {
  if (stack.empty()) return nullptr;
  const std::string token = stack.top();
  stack.pop();
  if (const int32_t code = operator_for_literal(token)) return makeOperatorNode(code, stack, table);
  if (token == kMaxFromColumn) return makeTextNode(SELECT_MAX(popColumnName(stack), table));
  if (token == kMinFromColumn) return makeTextNode(SELECT_MIN(popColumnName(stack), table));
  return std::make_shared<token_node>(token);
}

bool validateTypes(const std::shared_ptr<token_node>& token, FieldType& type, bool joined,
                   const std::string& table) {
  if (!token) return false;
  if (token->op == kOperand) return validateOperand(*token, type, joined, table);
  if (token->op == kTextNode) {
    assertTextNode(*token);
    return true;
  }
  return validateOperator(*token, type, joined, table);
}

DBClause clauseWithCondition(const std::string& condition, bool joined, const std::string& table) {
  DBClause clause;
  ConditionStack stack = makeConditionStackWithCondition(condition);
  std::shared_ptr<token_node> root = makeTokenNodeWithConditionStack(stack, table);
  if (!root) return clause;
  FieldType type = FieldType::T_NONE;
  if (validateTypes(root, type, joined, table)) clause.set_root(std::move(root));
  return clause;
}

}  // namespace dbcore
