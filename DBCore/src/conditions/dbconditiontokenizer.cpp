#include "dbconditiontokenizer.hpp"

#include <algorithm>
#include <utility>

namespace dbcore {

namespace {

constexpr int kParenthesisPrecedence = 0;

bool isDigit(char c) { return c >= '0' && c <= '9'; }

bool isWordStart(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_'; }

bool isWordCharacter(char c) { return isWordStart(c) || isDigit(c); }

bool isSpace(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f' || c == '\v'; }

bool isColumnFunction(std::string_view word) { return word == kMaxFromColumn || word == kMinFromColumn; }

// Comparisons bind tighter than "&&", which binds tighter than "||".
int precedenceOf(int32_t code) {
  if (code == kOperatorOr) return 1;
  if (code == kOperatorAnd) return 2;
  return 3;
}

}  // namespace

ConditionStack DBConditionTokenizer::postfix(const std::string& condition) {
  if (condition.size() > kMaxConditionLength || condition.find('\0') != std::string::npos) return {};
  DBConditionTokenizer tokenizer(condition);
  if (!tokenizer.run()) return {};
  return std::move(tokenizer.output_);
}

bool DBConditionTokenizer::run() {
  skipSpace();
  while (position_ < text_.size()) {
    if (!readToken()) return false;
    skipSpace();
  }
  return finish();
}

bool DBConditionTokenizer::readToken() {
  const char c = peek();
  if (c == '(') return openParenthesis();
  if (c == ')') return closeParenthesis();
  if (c == '\'' || c == '"') return readQuoted();
  if (isDigit(c) || (c == '-' && isDigit(peek(1)))) return readNumber();
  if (isWordStart(c)) return readWord();
  return readOperator();
}

bool DBConditionTokenizer::readQuoted() {
  const char quote = text_[position_++];
  std::string literal;
  while (position_ < text_.size()) {
    char c = text_[position_++];
    if (c == quote) {
      const bool reserved = operator_for_literal(literal) != kOperand || isColumnFunction(literal);
      return !reserved && pushOperand(std::move(literal));
    }
    if (c == '\\') {
      if (position_ == text_.size()) return false;
      c = text_[position_++];
    }
    literal += c;
  }
  return false;
}

bool DBConditionTokenizer::readNumber() {
  const std::size_t start = position_;
  if (peek() == '-') ++position_;
  skipDigits();
  if (peek() == '.' && isDigit(peek(1))) {
    ++position_;
    skipDigits();
  }
  return pushOperand(std::string(text_.substr(start, position_ - start)));
}

bool DBConditionTokenizer::readWord() {
  std::string word(scanWord());
  if (isColumnFunction(word)) return readColumnFunction(std::move(word));
  return pushOperand(std::move(word));
}

// The column name goes on the output first, the function word directly above it.
bool DBConditionTokenizer::readColumnFunction(std::string function) {
  if (!beginOperand() || !skipExpected('(')) return false;
  skipSpace();
  if (!isWordStart(peek())) return false;
  std::string column(scanWord());
  if (!skipExpected(')')) return false;
  output_.push(std::move(column));
  output_.push(std::move(function));
  return true;
}

bool DBConditionTokenizer::readOperator() {
  for (const std::size_t length : {2, 1}) {
    std::string candidate(text_.substr(position_, length));
    if (const int32_t code = operator_for_literal(candidate)) {
      position_ += candidate.size();
      return pushOperator(code, std::move(candidate));
    }
  }
  return false;
}

bool DBConditionTokenizer::openParenthesis() {
  if (!expect_operand_ || ++parentheses_ > kMaxParenthesesDepth) return false;
  pending_.push_back({"(", kParenthesisPrecedence});
  ++position_;
  return true;
}

bool DBConditionTokenizer::closeParenthesis() {
  if (expect_operand_) return false;
  while (!pending_.empty() && pending_.back().precedence != kParenthesisPrecedence) {
    if (!emit(pending_.back())) return false;
    pending_.pop_back();
  }
  if (pending_.empty()) return false;
  pending_.pop_back();
  --parentheses_;
  ++position_;
  return true;
}

bool DBConditionTokenizer::finish() {
  if (expect_operand_) return false;
  for (auto pending = pending_.rbegin(); pending != pending_.rend(); ++pending) {
    if (pending->precedence == kParenthesisPrecedence || !emit(*pending)) return false;
  }
  return true;
}

bool DBConditionTokenizer::beginOperand() {
  if (!expect_operand_) return false;
  expect_operand_ = false;
  depths_.push_back(0);
  return true;
}

bool DBConditionTokenizer::pushOperand(std::string text) {
  if (!beginOperand()) return false;
  output_.push(std::move(text));
  return true;
}

// Operators of the same or a tighter binding already waiting go out first (left associativity).
bool DBConditionTokenizer::pushOperator(int32_t code, std::string literal) {
  if (expect_operand_) return false;
  const int precedence = precedenceOf(code);
  while (!pending_.empty() && pending_.back().precedence >= precedence) {
    if (!emit(pending_.back())) return false;
    pending_.pop_back();
  }
  pending_.push_back({std::move(literal), precedence});
  expect_operand_ = true;
  return true;
}

// Every operator is emitted in the expect-operator state, so its two sides are on the output.
bool DBConditionTokenizer::emit(const Pending& pending) {
  const std::size_t right = depths_.back();
  depths_.pop_back();
  std::size_t& depth = depths_.back();
  depth = std::max(depth, right) + 1;
  output_.push(pending.literal);
  return depth <= kMaxOperatorDepth;
}

// A NUL byte never occurs in the text, so it marks the end.
char DBConditionTokenizer::peek(std::size_t offset) const {
  return position_ + offset < text_.size() ? text_[position_ + offset] : '\0';
}

std::string_view DBConditionTokenizer::scanWord() {
  const std::size_t start = position_;
  while (isWordCharacter(peek())) ++position_;
  return text_.substr(start, position_ - start);
}

void DBConditionTokenizer::skipDigits() {
  while (isDigit(peek())) ++position_;
}

void DBConditionTokenizer::skipSpace() {
  while (isSpace(peek())) ++position_;
}

bool DBConditionTokenizer::skipExpected(char expected) {
  skipSpace();
  if (peek() != expected) return false;
  ++position_;
  return true;
}

}  // namespace dbcore
