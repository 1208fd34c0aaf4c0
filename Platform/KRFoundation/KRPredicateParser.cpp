#include "KRFoundation/KRPredicateParser.hpp"

#include <algorithm>
#include <array>
#include <string_view>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRNumberArithmetic.hpp"

namespace {

using Token = KRPredicateLexer::Token;
using Type = KRComparisonOperator::Type;

constexpr std::array<std::pair<std::string_view, Type>, 17> kComparisonOperators = {{
    {"==", Type::EqualTo},
    {"=", Type::EqualTo},
    {"!=", Type::NotEqualTo},
    {"<>", Type::NotEqualTo},
    {"<", Type::LessThan},
    {"<=", Type::LessThanOrEqualTo},
    {"=<", Type::LessThanOrEqualTo},
    {">", Type::GreaterThan},
    {">=", Type::GreaterThanOrEqualTo},
    {"=>", Type::GreaterThanOrEqualTo},
    {"MATCHES", Type::Matches},
    {"LIKE", Type::Like},
    {"BEGINSWITH", Type::BeginsWith},
    {"ENDSWITH", Type::EndsWith},
    {"IN", Type::In},
    {"CONTAINS", Type::Contains},
    {"BETWEEN", Type::Between},
}};

constexpr std::array<std::string_view, 5> kArithmeticSymbols = {"+", "-", "*", "/", "**"};

bool isArithmeticSymbol(const Token& token) {
  return token.kind == Token::Kind::Symbol && std::find(kArithmeticSymbols.begin(), kArithmeticSymbols.end(),
                                                        token.text) != kArithmeticSymbols.end();
}

bool isConstant(const std::shared_ptr<KRExpression>& expression) {
  return expression->expressionType() == KRExpression::Type::ConstantValue;
}

}  // namespace

template <class Parse>
auto KRPredicateParser::nested(Parse parse) {
  if (++depth_ > kMaximumDepth) fail("nested more than " + std::to_string(kMaximumDepth) + " levels deep");
  auto result = parse();
  --depth_;
  return result;
}

template <class Build>
auto KRPredicateParser::building(size_t position, Build build) {
  try {
    return build();
  } catch (const KRException& exception) {
    fail(position, exception.reason().str());
  }
}

KRPredicateParser::KRPredicateParser(std::string format, std::vector<KRValue> arguments)
    : format_(std::move(format)),
      arguments_(std::move(arguments)),
      tokens_(KRPredicateLexer::tokenize(format_)),
      closingParentheses_(matchParentheses(tokens_)) {}

std::shared_ptr<KRPredicate> KRPredicateParser::parsePredicate() {
  PredicatePtr predicate = parseOr();
  expectEnd();
  return predicate;
}

std::shared_ptr<KRExpression> KRPredicateParser::parseExpression() {
  ExpressionPtr expression = parseAdditive();
  expectEnd();
  return expression;
}

// Predicates

KRPredicateParser::PredicatePtr KRPredicateParser::parseOr() {
  return parseCompound(KRCompoundPredicate::Type::Or, "OR", "||", &KRPredicateParser::parseAnd);
}

KRPredicateParser::PredicatePtr KRPredicateParser::parseAnd() {
  return parseCompound(KRCompoundPredicate::Type::And, "AND", "&&", &KRPredicateParser::parseNot);
}

KRPredicateParser::PredicatePtr KRPredicateParser::parseCompound(
    KRCompoundPredicate::Type type, const char* keyword, const char* symbol,
    PredicatePtr (KRPredicateParser::*parseOperand)()) {
  std::vector<PredicatePtr> subpredicates{(this->*parseOperand)()};
  while (acceptKeyword(keyword) || acceptSymbol(symbol)) subpredicates.push_back((this->*parseOperand)());
  if (subpredicates.size() == 1) return subpredicates.front();
  return KRCompoundPredicate::predicateWithType(type, std::move(subpredicates));
}

KRPredicateParser::PredicatePtr KRPredicateParser::parseNot() {
  if (!acceptKeyword("NOT") && !acceptSymbol("!")) return parsePrimaryPredicate();
  return nested([this] { return KRCompoundPredicate::notPredicateWithSubpredicate(parseNot()); });
}

KRPredicateParser::PredicatePtr KRPredicateParser::parsePrimaryPredicate() {
  if (acceptKeyword("TRUEPREDICATE")) return KRPredicate::predicateWithValue(true);
  if (acceptKeyword("FALSEPREDICATE")) return KRPredicate::predicateWithValue(false);
  if (!isSymbol("(") || !parenthesesEnclosePredicate()) return parseComparison();
  return nested([this] {
    advance();
    PredicatePtr predicate = parseOr();
    expectSymbol(")");
    return predicate;
  });
}

KRPredicateParser::PredicatePtr KRPredicateParser::parseComparison() {
  const bool none = acceptKeyword("NONE");
  const KRComparisonPredicate::Modifier modifier =
      none ? KRComparisonPredicate::Modifier::Any : parseModifier();
  ExpressionPtr left = parseAdditive();
  const size_t operatorPosition = current().position;
  const Type type = parseOperatorType();
  const unsigned options = parseOptions();
  ExpressionPtr right = parseAdditive();
  PredicatePtr comparison = building(operatorPosition, [&] {
    return KRComparisonPredicate::predicateWithLeftExpression(std::move(left), std::move(right), modifier,
                                                              type, options);
  });
  return none ? KRCompoundPredicate::notPredicateWithSubpredicate(std::move(comparison)) : comparison;
}

KRComparisonPredicate::Modifier KRPredicateParser::parseModifier() {
  if (acceptKeyword("ANY") || acceptKeyword("SOME")) return KRComparisonPredicate::Modifier::Any;
  if (acceptKeyword("ALL")) return KRComparisonPredicate::Modifier::All;
  return KRComparisonPredicate::Modifier::Direct;
}

std::optional<KRComparisonOperator::Type> KRPredicateParser::comparisonOperator(const Token& token) {
  if (token.kind != Token::Kind::Symbol && token.kind != Token::Kind::Keyword) return std::nullopt;
  for (const auto& [text, type] : kComparisonOperators) {
    if (token.text == text) return type;
  }
  return std::nullopt;
}

KRComparisonOperator::Type KRPredicateParser::parseOperatorType() {
  const std::optional<Type> type = comparisonOperator(current());
  if (!type) fail("expected a comparison operator");
  advance();
  return *type;
}

unsigned KRPredicateParser::parseOptions() {
  if (!acceptSymbol("[")) return 0;
  const Token& letters = current();
  unsigned options = 0;
  if (letters.kind != Token::Kind::Identifier) fail("expected comparison options");
  for (const char letter : letters.text) {
    if (letter == 'c' || letter == 'C') {
      options |= KRComparisonOperator::CaseInsensitive;
    } else if (letter == 'd' || letter == 'D') {
      options |= KRComparisonOperator::DiacriticInsensitive;
    } else {
      fail("unknown comparison option");
    }
  }
  advance();
  expectSymbol("]");
  return options;
}

bool KRPredicateParser::parenthesesEnclosePredicate() const {
  const size_t closing = closingParentheses_[index_];
  if (closing == kUnmatched) return true;
  const Token& following = tokens_[closing + 1];
  return !comparisonOperator(following) && !isArithmeticSymbol(following);
}

std::vector<size_t> KRPredicateParser::matchParentheses(const std::vector<Token>& tokens) {
  std::vector<size_t> closing(tokens.size(), kUnmatched);
  std::vector<size_t> open;
  for (size_t i = 0; i < tokens.size(); ++i) {
    if (tokens[i].kind != Token::Kind::Symbol) continue;
    if (tokens[i].text == "(") open.push_back(i);
    if (tokens[i].text == ")" && !open.empty()) {
      closing[open.back()] = i;
      open.pop_back();
    }
  }
  return closing;
}

// Expressions

KRPredicateParser::ExpressionPtr KRPredicateParser::parseAdditive() {
  return parseLeftAssociative({{"+", Operator::Add}, {"-", Operator::Subtract}},
                              &KRPredicateParser::parseMultiplicative);
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseMultiplicative() {
  return parseLeftAssociative({{"*", Operator::Multiply}, {"/", Operator::Divide}},
                              &KRPredicateParser::parseUnary);
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseLeftAssociative(
    std::initializer_list<std::pair<const char*, Operator>> operators,
    ExpressionPtr (KRPredicateParser::*parseOperand)()) {
  ExpressionPtr left = (this->*parseOperand)();
  while (true) {
    const auto found = std::find_if(operators.begin(), operators.end(),
                                    [this](const auto& entry) { return isSymbol(entry.first); });
    if (found == operators.end()) return left;
    const size_t position = current().position;
    advance();
    ExpressionPtr right = (this->*parseOperand)();
    left = arithmetic(found->second, {std::move(left), std::move(right)}, position);
  }
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseUnary() {
  if (!isSymbol("-")) return parsePower();
  const size_t position = current().position;
  advance();
  return nested([this, position] { return negated(parseUnary(), position); });
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parsePower() {
  ExpressionPtr base = parsePrimary();
  if (!isSymbol("**")) return base;
  const size_t position = current().position;
  advance();
  ExpressionPtr exponent = nested([this] { return parseUnary(); });
  return arithmetic(Operator::Power, {std::move(base), std::move(exponent)}, position);
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parsePrimary() {
  const Token& token = current();
  switch (token.kind) {
    case Token::Kind::Number:
      advance();
      return KRExpression::expressionForConstantValue(token.number);
    case Token::Kind::String:
      advance();
      return KRExpression::expressionForConstantValue(token.text);
    case Token::Kind::Variable:
      advance();
      return KRExpression::expressionForVariable(token.text);
    case Token::Kind::Identifier:
      advance();
      return parseKeyPath(token.text);
    case Token::Kind::Argument:
      return parseArgument();
    case Token::Kind::Keyword:
      return parseKeyword();
    case Token::Kind::Symbol:
      if (token.text == "(") return parseParenthesizedExpression();
      if (token.text == "{") return parseAggregate();
      break;
    case Token::Kind::End:
      break;
  }
  fail("expected an expression");
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseKeyword() {
  if (acceptKeyword("YES") || acceptKeyword("TRUE")) return KRExpression::expressionForConstantValue(true);
  if (acceptKeyword("NO") || acceptKeyword("FALSE")) return KRExpression::expressionForConstantValue(false);
  if (acceptKeyword("NIL") || acceptKeyword("NULL")) return KRExpression::expressionForConstantValue({});
  if (acceptKeyword("SELF")) return parseKeyPath("SELF");
  if (acceptKeyword("FUNCTION")) return parseFunction();
  if (acceptKeyword("CAST")) return parseCast();
  fail("expected an expression");
}

// Reads the ".key" components that follow the first one.
KRPredicateParser::ExpressionPtr KRPredicateParser::parseKeyPath(std::string keyPath) {
  while (acceptSymbol(".")) {
    if (current().kind != Token::Kind::Identifier) fail("expected a key");
    keyPath += "." + current().text;
    advance();
  }
  return KRExpression::expressionForKeyPath(std::move(keyPath));
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseParenthesizedExpression() {
  return nested([this] {
    advance();
    ExpressionPtr expression = parseAdditive();
    expectSymbol(")");
    return expression;
  });
}

// "{a, b}": an array constant when every element is constant, an aggregate expression otherwise.
KRPredicateParser::ExpressionPtr KRPredicateParser::parseAggregate() {
  const size_t position = current().position;
  return nested([this, position] {
    advance();
    std::vector<ExpressionPtr> elements;
    if (!isSymbol("}")) {
      do {
        elements.push_back(parseAdditive());
      } while (acceptSymbol(","));
    }
    expectSymbol("}");
    if (!std::all_of(elements.begin(), elements.end(), isConstant)) {
      return building(position, [&] { return KRExpression::expressionForAggregate(std::move(elements)); });
    }
    std::vector<KRValue> values;
    for (const ExpressionPtr& element : elements) values.push_back(element->constantValue());
    return KRExpression::expressionForConstantValue(KRArray(std::move(values)));
  });
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseFunction() {
  const size_t position = current().position;
  return nested([this, position] {
    expectSymbol("(");
    ExpressionPtr receiver = parseAdditive();
    expectSymbol(",");
    const std::string name = parseConstant("a function name", &KRValue::isString).string().str();
    expectSymbol(")");
    return building(position, [&] { return KRExpression::expressionForFunction(std::move(receiver), name); });
  });
}

// CAST(seconds, "NSDate"): the date that many seconds after 2001-01-01 UTC.
KRPredicateParser::ExpressionPtr KRPredicateParser::parseCast() {
  return nested([this] {
    expectSymbol("(");
    const double seconds = parseConstant("a number of seconds", &KRValue::isNumber).number().doubleValue();
    expectSymbol(",");
    const size_t typePosition = current().position;
    if (parseConstant("a class name", &KRValue::isString).string().str() != "NSDate") {
      fail(typePosition, "CAST only converts numbers to \"NSDate\"");
    }
    expectSymbol(")");
    return KRExpression::expressionForConstantValue(
        KRDate::dateWithTimeIntervalSince1970(seconds + KRExpression::kReferenceDateOffset));
  });
}

KRValue KRPredicateParser::parseConstant(const char* expected, bool (KRValue::*isExpectedType)() const) {
  const size_t position = current().position;
  const ExpressionPtr operand = parseAdditive();
  const bool found = isConstant(operand) && (operand->constantValue().*isExpectedType)();
  if (!found) fail(position, std::string("expected ") + expected);
  return operand->constantValue();
}

KRPredicateParser::ExpressionPtr KRPredicateParser::parseArgument() {
  const std::string conversion = current().text;
  const size_t position = current().position;
  const KRValue& argument = nextArgument();
  if (conversion == "@") return KRExpression::expressionForConstantValue(argument);
  if (conversion == "K") {
    if (!argument.isString() || argument.string().empty()) fail(position, "%K needs a key path string");
    return KRExpression::expressionForKeyPath(argument.string().str());
  }
  const KRNumber number = argument.number();
  if (number.isNil()) fail(position, "%" + conversion + " needs a number");
  switch (conversion.back()) {
    case 'd':
    case 'i':
      return KRExpression::expressionForConstantValue(number.longLongValue());
    case 'u':
      return KRExpression::expressionForConstantValue(number.unsignedLongLongValue());
    default:
      return KRExpression::expressionForConstantValue(number.doubleValue());
  }
}

// A minus before a number literal makes a negative number; before anything else, a negation.
KRPredicateParser::ExpressionPtr KRPredicateParser::negated(ExpressionPtr operand, size_t position) {
  if (isConstant(operand) && operand->constantValue().isNumber()) {
    return KRExpression::expressionForConstantValue(
        KRNumberArithmetic::negate(operand->constantValue().number()));
  }
  return arithmetic(Operator::Negate, {std::move(operand)}, position);
}

KRPredicateParser::ExpressionPtr KRPredicateParser::arithmetic(Operator op,
                                                               std::vector<ExpressionPtr> operands,
                                                               size_t position) {
  return building(position, [&] { return KRExpression::expressionForArithmetic(op, std::move(operands)); });
}

// Tokens and failures

void KRPredicateParser::advance() {
  if (current().kind != Token::Kind::End) ++index_;
}

bool KRPredicateParser::isSymbol(const char* symbol) const {
  return current().kind == Token::Kind::Symbol && current().text == symbol;
}

bool KRPredicateParser::acceptSymbol(const char* symbol) {
  if (!isSymbol(symbol)) return false;
  advance();
  return true;
}

bool KRPredicateParser::acceptKeyword(const char* keyword) {
  if (current().kind != Token::Kind::Keyword || current().text != keyword) return false;
  advance();
  return true;
}

void KRPredicateParser::expectSymbol(const char* symbol) {
  if (!acceptSymbol(symbol)) fail(std::string("expected '") + symbol + "'");
}

void KRPredicateParser::expectEnd() {
  if (current().kind != Token::Kind::End) fail("unexpected text after the end");
}

const KRValue& KRPredicateParser::nextArgument() {
  if (argumentIndex_ >= arguments_.size()) fail("too few arguments for the format");
  advance();
  return arguments_[argumentIndex_++];
}

void KRPredicateParser::fail(const std::string& detail) const { fail(current().position, detail); }

void KRPredicateParser::fail(size_t position, const std::string& detail) const {
  KRPredicateLexer::raiseParseError(format_, position, detail);
}
