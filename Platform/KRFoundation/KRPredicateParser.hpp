#pragma once

#include <cstddef>
#include <initializer_list>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "KRFoundation/KRComparisonOperator.hpp"
#include "KRFoundation/KRComparisonPredicate.hpp"
#include "KRFoundation/KRCompoundPredicate.hpp"
#include "KRFoundation/KRExpression.hpp"
#include "KRFoundation/KRPredicateLexer.hpp"

// Recursive-descent parser of the predicate and expression formats (one use per instance).
//
// Predicates, loosest binding first: OR (||), AND (&&), NOT (!), then comparisons
// "[ANY|SOME|ALL|NONE] expression operator[c|d|cd] expression", TRUEPREDICATE, FALSEPREDICATE and
// parenthesised predicates. Expressions: + -, then * /, then unary minus, then ** (right-associative),
// then operands. AND and OR chains become one compound each; NONE becomes NOT ANY.
//
// A parenthesis where a predicate may start opens an expression when the token after its closing
// parenthesis continues an expression (a comparison or arithmetic operator), and a predicate otherwise.
//
// Failures raise NSInvalidArgumentException "Unable to parse the format string ... at position N: ..."
// (a byte offset). Nesting (parentheses, NOT, unary minus, **, FUNCTION, array literals) deeper than
// kMaximumDepth, and expressions taller than KRExpression::kMaximumHeight, fail the same way, so parsing
// and evaluating never exhaust the stack.
class KRPredicateParser {
 public:
  static constexpr size_t kMaximumDepth = 256;

  KRPredicateParser(std::string format, std::vector<KRValue> arguments);

  // The whole format as a predicate or as an expression; text after it fails.
  std::shared_ptr<KRPredicate> parsePredicate();
  std::shared_ptr<KRExpression> parseExpression();

 private:
  using Token = KRPredicateLexer::Token;
  using PredicatePtr = std::shared_ptr<KRPredicate>;
  using ExpressionPtr = std::shared_ptr<KRExpression>;
  using Operator = KRExpression::ArithmeticOperator;

  // Predicates
  PredicatePtr parseOr();
  PredicatePtr parseAnd();
  PredicatePtr parseCompound(KRCompoundPredicate::Type type, const char* keyword, const char* symbol,
                             PredicatePtr (KRPredicateParser::*parseOperand)());
  PredicatePtr parseNot();
  PredicatePtr parsePrimaryPredicate();
  PredicatePtr parseComparison();
  KRComparisonPredicate::Modifier parseModifier();
  KRComparisonOperator::Type parseOperatorType();
  unsigned parseOptions();
  bool parenthesesEnclosePredicate() const;
  // For each "(" token, the index of its ")" token; kUnmatched elsewhere.
  static std::vector<size_t> matchParentheses(const std::vector<Token>& tokens);
  static constexpr size_t kUnmatched = static_cast<size_t>(-1);
  static std::optional<KRComparisonOperator::Type> comparisonOperator(const Token& token);

  // Expressions
  ExpressionPtr parseAdditive();
  ExpressionPtr parseMultiplicative();
  ExpressionPtr parseLeftAssociative(std::initializer_list<std::pair<const char*, Operator>> operators,
                                     ExpressionPtr (KRPredicateParser::*parseOperand)());
  ExpressionPtr parseUnary();
  ExpressionPtr parsePower();
  ExpressionPtr parsePrimary();
  ExpressionPtr parseKeyword();
  ExpressionPtr parseKeyPath(std::string keyPath);
  ExpressionPtr parseParenthesizedExpression();
  ExpressionPtr parseAggregate();
  ExpressionPtr parseFunction();
  ExpressionPtr parseCast();
  ExpressionPtr parseArgument();
  // A constant operand of the expected type (FUNCTION names, CAST operands).
  KRValue parseConstant(const char* expected, bool (KRValue::*isExpectedType)() const);
  ExpressionPtr negated(ExpressionPtr operand, size_t position);
  ExpressionPtr arithmetic(Operator op, std::vector<ExpressionPtr> operands, size_t position);

  // Tokens and failures
  const Token& current() const { return tokens_[index_]; }
  void advance();
  bool isSymbol(const char* symbol) const;
  bool acceptSymbol(const char* symbol);
  bool acceptKeyword(const char* keyword);
  void expectSymbol(const char* symbol);
  void expectEnd();
  const KRValue& nextArgument();
  // Runs a nested parse one level deeper, failing beyond kMaximumDepth.
  template <class Parse>
  auto nested(Parse parse);
  // Runs a factory, turning its KRException into a parse failure at the position.
  template <class Build>
  auto building(size_t position, Build build);
  [[noreturn]] void fail(const std::string& detail) const;
  [[noreturn]] void fail(size_t position, const std::string& detail) const;

  std::string format_;
  std::vector<KRValue> arguments_;
  std::vector<Token> tokens_;
  std::vector<size_t> closingParentheses_;
  size_t index_ = 0;
  size_t argumentIndex_ = 0;
  size_t depth_ = 0;
};
