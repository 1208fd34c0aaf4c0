#include "KRFoundation/KRPredicateLexer.hpp"

#include <unicode/utf16.h>
#include <unicode/utf8.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <limits>

#include "KRFoundation/KRException.hpp"

namespace {

using Token = KRPredicateLexer::Token;

constexpr std::array<std::string_view, 25> kReservedWords = {
    "AND",        "OR",       "NOT",  "IN",    "BETWEEN", "LIKE", "MATCHES",       "CONTAINS",
    "BEGINSWITH", "ENDSWITH", "ANY",  "ALL",   "NONE",    "SOME", "TRUEPREDICATE", "FALSEPREDICATE",
    "YES",        "NO",       "TRUE", "FALSE", "NIL",     "NULL", "SELF",          "FUNCTION",
    "CAST"};

// Longest first, so that "**" wins over "*" and "<=" over "<".
constexpr std::array<std::string_view, 26> kSymbols = {"**", "==", "!=", "<>", "<=", "=<", ">=", "=>", "&&",
                                                       "||", "<",  ">",  "=",  "!",  "(",  ")",  "{",  "}",
                                                       "[",  "]",  ",",  ".",  "+",  "-",  "*",  "/"};

// Longest first, so that "%lld" is not read as "%l" followed by "ld".
constexpr std::array<std::string_view, 15> kConversions = {"lld", "lli", "llu", "ld", "li", "lu", "lf", "@",
                                                           "K",   "d",   "i",   "u",  "f",  "g",  "e"};

// Longest quoted excerpt of the format in a parse failure, in characters.
constexpr size_t kExcerptLength = 200;

bool isDigit(char c) { return c >= '0' && c <= '9'; }

bool isLetter(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); }

bool isWhitespace(char c) {
  return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\f' || c == '\v';
}

// Letters, digits, underscores and every non-ASCII character (the format is valid UTF-8 by then).
bool isWordCharacter(char c) {
  return isLetter(c) || isDigit(c) || c == '_' || static_cast<unsigned char>(c) >= 0x80;
}

bool isWordStart(char c) { return isWordCharacter(c) && !isDigit(c); }

bool isQuote(char c) { return c == '\'' || c == '"'; }

std::string upperCased(std::string_view word) {
  std::string upper(word);
  std::transform(upper.begin(), upper.end(), upper.begin(),
                 [](char c) { return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c; });
  return upper;
}

// The format as printable text for an error message: invalid bytes replaced, long formats shortened.
std::string excerpt(const std::string& format) {
  std::wstring wide = KRString(format).krs_wstring();
  if (wide.size() <= kExcerptLength) return KRString::krs_stringWithWString(wide).str();
  wide.resize(kExcerptLength);
  return KRString::krs_stringWithWString(wide).str() + "...";
}

// A decimal literal beyond the range of double is an overflow (infinity) when its magnitude is at
// least one, which is when its significant integer digits plus its exponent are positive.
double outOfRangeDouble(std::string_view text) {
  const size_t exponentMark = text.find_first_of("eE");
  const std::string_view mantissa = text.substr(0, exponentMark);
  const std::string_view integer = mantissa.substr(0, mantissa.find('.'));
  const size_t firstSignificant = integer.find_first_not_of('0');
  const auto digits = static_cast<long long>(
      firstSignificant == std::string_view::npos ? 0 : integer.size() - firstSignificant);
  long long exponent = 0;
  if (exponentMark != std::string_view::npos) {
    std::string_view exponentText = text.substr(exponentMark + 1);
    if (exponentText.front() == '+') exponentText.remove_prefix(1);
    const auto result =
        std::from_chars(exponentText.data(), exponentText.data() + exponentText.size(), exponent);
    if (result.ec != std::errc()) exponent = exponentText.front() == '-' ? -1'000'000 : 1'000'000;
  }
  return digits + exponent > 0 ? std::numeric_limits<double>::infinity() : 0.0;
}

KRNumber decimalNumber(std::string_view text) {
  double value = 0;
  const auto result = std::from_chars(text.data(), text.data() + text.size(), value);
  if (result.ec == std::errc::result_out_of_range) value = outOfRangeDouble(text);
  return KRNumber::numberWithDouble(value);
}

KRNumber integerNumber(std::string_view text) {
  const char* end = text.data() + text.size();
  long long signedValue = 0;
  if (std::from_chars(text.data(), end, signedValue).ec == std::errc()) {
    return KRNumber::numberWithLongLong(signedValue);
  }
  unsigned long long unsignedValue = 0;
  if (std::from_chars(text.data(), end, unsignedValue).ec == std::errc()) {
    return KRNumber::numberWithUnsignedLongLong(unsignedValue);
  }
  return decimalNumber(text);
}

void appendUTF8(std::string& text, char32_t character) {
  uint8_t encoded[U8_MAX_LENGTH];
  size_t count = 0;
  U8_APPEND_UNSAFE(encoded, count, character);
  text.append(reinterpret_cast<const char*>(encoded), count);
}

}  // namespace

std::vector<Token> KRPredicateLexer::tokenize(const std::string& format) {
  KRPredicateLexer lexer(format);
  lexer.validateEncoding();
  std::vector<Token> tokens;
  do {
    tokens.push_back(lexer.nextToken());
  } while (tokens.back().kind != Token::Kind::End);
  return tokens;
}

bool KRPredicateLexer::isReservedWord(std::string_view word) {
  const std::string upper = upperCased(word);
  return std::find(kReservedWords.begin(), kReservedWords.end(), upper) != kReservedWords.end();
}

bool KRPredicateLexer::isPlainName(std::string_view name) {
  if (name.starts_with('@')) name.remove_prefix(1);
  return !name.empty() && isWordStart(name.front()) && std::all_of(name.begin(), name.end(), isWordCharacter);
}

void KRPredicateLexer::raiseParseError(const std::string& format, size_t position,
                                       const std::string& detail) {
  KRException::raise(KRException::NSInvalidArgumentException, "Unable to parse the format string \"" +
                                                                  excerpt(format) + "\" at position " +
                                                                  std::to_string(position) + ": " + detail);
}

void KRPredicateLexer::fail(size_t position, const std::string& detail) const {
  raiseParseError(format_, position, detail);
}

void KRPredicateLexer::validateEncoding() const {
  const auto* bytes = reinterpret_cast<const uint8_t*>(format_.data());
  const size_t length = format_.size();
  for (size_t offset = 0; offset < length;) {
    const size_t start = offset;
    UChar32 c;
    U8_NEXT(bytes, offset, length, c);
    if (c < 0) fail(start, "invalid UTF-8");
  }
}

void KRPredicateLexer::skipWhitespace() {
  while (position_ < format_.size() && isWhitespace(format_[position_])) ++position_;
}

Token KRPredicateLexer::nextToken() {
  skipWhitespace();
  if (position_ >= format_.size()) return Token{Token::Kind::End, "", {}, position_};
  const char c = format_[position_];
  if (isDigit(c)) return lexNumber();
  if (isQuote(c)) return lexString();
  if (c == '%') return lexArgument();
  if (c == '#') return lexEscapedKey();
  if (c == '$') return lexPrefixedName(Token::Kind::Variable);
  if (c == '@' || isWordStart(c)) return lexWord();
  return lexSymbol();
}

size_t KRPredicateLexer::wordEnd(size_t from) const {
  size_t end = from;
  while (end < format_.size() && isWordCharacter(format_[end])) ++end;
  return end;
}

std::string KRPredicateLexer::readName(size_t tokenStart) {
  const bool collectionOperator = position_ < format_.size() && format_[position_] == '@';
  const size_t nameStart = collectionOperator ? position_ + 1 : position_;
  const size_t end = wordEnd(nameStart);
  if (end == nameStart || isDigit(format_[nameStart])) fail(tokenStart, "expected a name");
  std::string name = format_.substr(position_, end - position_);
  position_ = end;
  return name;
}

Token KRPredicateLexer::lexWord() {
  const size_t start = position_;
  std::string word = readName(start);
  if (isReservedWord(word)) return Token{Token::Kind::Keyword, upperCased(word), {}, start};
  return Token{Token::Kind::Identifier, std::move(word), {}, start};
}

Token KRPredicateLexer::lexEscapedKey() {
  if (position_ + 1 >= format_.size() || !isQuote(format_[position_ + 1])) {
    return lexPrefixedName(Token::Kind::Identifier);
  }
  const size_t start = position_++;
  Token key = lexString();
  key.kind = Token::Kind::Identifier;
  key.position = start;
  return key;
}

Token KRPredicateLexer::lexPrefixedName(Token::Kind kind) {
  const size_t start = position_++;
  return Token{kind, readName(start), {}, start};
}

bool KRPredicateLexer::atDigit(size_t offset) const {
  return offset < format_.size() && isDigit(format_[offset]);
}

Token KRPredicateLexer::lexNumber() {
  const size_t start = position_;
  bool integral = true;
  while (atDigit(position_)) ++position_;
  if (position_ < format_.size() && format_[position_] == '.' && atDigit(position_ + 1)) {
    integral = false;
    for (++position_; atDigit(position_);) ++position_;
  }
  if (position_ < format_.size() && (format_[position_] == 'e' || format_[position_] == 'E')) {
    const bool signedExponent =
        position_ + 1 < format_.size() && (format_[position_ + 1] == '+' || format_[position_ + 1] == '-');
    const size_t digits = position_ + (signedExponent ? 2 : 1);
    if (atDigit(digits)) {
      integral = false;
      for (position_ = digits; atDigit(position_);) ++position_;
    }
  }
  const std::string_view text(format_.data() + start, position_ - start);
  return Token{Token::Kind::Number, std::string(text), integral ? integerNumber(text) : decimalNumber(text),
               start};
}

Token KRPredicateLexer::lexString() {
  const size_t start = position_;
  const char quote = format_[position_++];
  std::string text;
  while (position_ < format_.size() && format_[position_] != quote) {
    if (format_[position_] == '\\') {
      appendEscape(text);
    } else {
      text.push_back(format_[position_++]);
    }
  }
  if (position_ >= format_.size()) fail(start, "unterminated string");
  ++position_;
  return Token{Token::Kind::String, std::move(text), {}, start};
}

void KRPredicateLexer::appendEscape(std::string& text) {
  const size_t start = position_++;
  if (position_ >= format_.size()) fail(start, "unterminated escape");
  switch (format_[position_++]) {
    case 'n':
      text.push_back('\n');
      return;
    case 't':
      text.push_back('\t');
      return;
    case 'r':
      text.push_back('\r');
      return;
    case '\\':
      text.push_back('\\');
      return;
    case '"':
      text.push_back('"');
      return;
    case '\'':
      text.push_back('\'');
      return;
    case 'u':
      break;
    default:
      fail(start, "unknown escape");
  }
  const char32_t unit = readHexCharacter();
  if (U16_IS_TRAIL(unit)) fail(start, "unpaired surrogate");
  if (!U16_IS_LEAD(unit)) {
    appendUTF8(text, unit);
    return;
  }
  if (format_.compare(position_, 2, "\\u") != 0) fail(start, "unpaired surrogate");
  position_ += 2;
  const char32_t trail = readHexCharacter();
  if (!U16_IS_TRAIL(trail)) fail(start, "unpaired surrogate");
  appendUTF8(text, U16_GET_SUPPLEMENTARY(unit, trail));
}

char32_t KRPredicateLexer::readHexCharacter() {
  unsigned value = 0;
  const char* begin = format_.data() + position_;
  const size_t available = std::min<size_t>(4, format_.size() - position_);
  const auto result = std::from_chars(begin, begin + available, value, 16);
  if (available < 4 || result.ptr != begin + 4) fail(position_, "expected four hexadecimal digits");
  position_ += 4;
  return value;
}

Token KRPredicateLexer::lexArgument() {
  const size_t start = position_++;
  const std::string_view rest(format_.data() + position_, format_.size() - position_);
  for (std::string_view conversion : kConversions) {
    if (rest.starts_with(conversion)) {
      position_ += conversion.size();
      return Token{Token::Kind::Argument, std::string(conversion), {}, start};
    }
  }
  fail(start, "unknown format conversion");
}

Token KRPredicateLexer::lexSymbol() {
  const std::string_view rest(format_.data() + position_, format_.size() - position_);
  for (std::string_view symbol : kSymbols) {
    if (rest.starts_with(symbol)) {
      const size_t start = position_;
      position_ += symbol.size();
      return Token{Token::Kind::Symbol, std::string(symbol), {}, start};
    }
  }
  fail(position_, "unexpected character");
}
