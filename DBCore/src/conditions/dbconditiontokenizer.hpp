#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "dbclause.hpp"

namespace dbcore {

// Reads a condition string into its postfix token stack (shunting-yard), the root operator on top:
//
//   condition   := expression | nothing
//   expression  := operand | expression operator expression | "(" expression ")"
//   operator    := "||" | "&&" | "==" | "!=" | "<" | "<=" | ">" | ">="
//   operand     := word | number | quoted | function
//   word        := [A-Za-z_][A-Za-z0-9_]*           a column name, or a literal such as true
//   number      := "-"? [0-9]+ ("." [0-9]+)?
//   quoted      := "'" ... "'" | '"' ... '"'        quotes removed; a backslash takes the next character
//   function    := ("max_from_column" | "min_from_column") "(" word ")"
//
// Comparisons bind tighter than "&&", which binds tighter than "||"; all are left-associative. White
// space (space, tab, line breaks) separates tokens and is otherwise ignored.
//
// Anything else gives an empty stack: unbalanced parentheses, an operator without both operands, two
// operands in a row, an unterminated quote, an unknown character, a NUL byte anywhere, more than
// kMaxConditionLength characters, parentheses nested deeper than kMaxParenthesesDepth, or a tree deeper
// than kMaxOperatorDepth operators (a chain of n "&&" is n deep), which keeps the recursive tree
// routines shallow. A quoted literal that spells an operator or a function word is refused too: on
// the token stack it would read back as that operator or function.
class DBConditionTokenizer {
 public:
  static constexpr std::size_t kMaxConditionLength = 100000;
  static constexpr std::size_t kMaxParenthesesDepth = 256;
  static constexpr std::size_t kMaxOperatorDepth = 1024;

  // The postfix token stack of a condition; empty for an empty or malformed condition.
  static ConditionStack postfix(const std::string& condition);

 private:
  // An operator or an open parenthesis waiting for its right side.
  struct Pending {
    std::string literal;
    int precedence;  // 0 for an open parenthesis
  };

  explicit DBConditionTokenizer(std::string_view condition) : text_(condition) {}

  bool run();
  bool readToken();
  bool readQuoted();
  bool readNumber();
  bool readWord();
  bool readColumnFunction(std::string function);
  bool readOperator();
  bool openParenthesis();
  bool closeParenthesis();
  bool finish();

  bool beginOperand();
  bool pushOperand(std::string text);
  bool pushOperator(int32_t code, std::string literal);
  bool emit(const Pending& pending);

  char peek(std::size_t offset = 0) const;
  std::string_view scanWord();
  void skipDigits();
  void skipSpace();
  bool skipExpected(char expected);

  std::string_view text_;
  std::size_t position_ = 0;
  bool expect_operand_ = true;
  std::size_t parentheses_ = 0;
  std::vector<Pending> pending_;
  // Depth in operators of each subexpression already on the output, the last one on top.
  std::vector<std::size_t> depths_;
  ConditionStack output_;
};

}  // namespace dbcore
