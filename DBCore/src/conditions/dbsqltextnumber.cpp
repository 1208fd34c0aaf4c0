#include "dbsqltextnumber.hpp"

#include <cmath>
#include <cstddef>
#include <limits>

namespace dbcore {

namespace {

constexpr int64_t kLargest = std::numeric_limits<int64_t>::max();
// Beyond this significand SQLite stops taking digits into it.
constexpr int64_t kSignificandLimit = (kLargest - 9) / 10;
constexpr int kExponentLimit = 10000;

bool isSpace(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }
bool isDigit(char c) { return c >= '0' && c <= '9'; }
int digitOf(char c) { return c - '0'; }

// A decimal number taken apart the way sqlite3AtoF reads it: sign * significand * 10^(exponent + shift).
struct Decimal {
  int sign = 1;
  int64_t significand = 0;
  int shift = 0;
  int exponent = 0;
  int digits = 0;
  int kind = 1;  // 1 whole, +1 for a decimal point, +1 for an exponent
  bool exponentValid = true;
  bool consumedAll = false;
};

class DecimalReader {
 public:
  explicit DecimalReader(std::string_view text) : text_(text) {}

  // Nothing when the text is empty or only white space.
  std::optional<Decimal> read() {
    skipSpaces();
    if (atEnd()) return std::nullopt;
    readSign(decimal_.sign);
    readWholeDigits();
    if (take('.')) readFraction();
    if (take('e') || take('E')) readExponent();
    skipSpaces();
    decimal_.consumedAll = atEnd();
    return decimal_;
  }

 private:
  bool atEnd() const { return position_ >= text_.size(); }
  bool atDigit() const { return !atEnd() && isDigit(text_[position_]); }
  char next() { return text_[position_++]; }

  bool take(char c) {
    if (atEnd() || text_[position_] != c) return false;
    ++position_;
    return true;
  }

  void skipSpaces() {
    while (!atEnd() && isSpace(text_[position_])) ++position_;
  }

  void readSign(int& sign) {
    if (take('-')) {
      sign = -1;
    } else {
      take('+');
    }
  }

  // Digits past the significand's room only move the decimal point.
  void readWholeDigits() {
    while (atDigit()) {
      decimal_.significand = decimal_.significand * 10 + digitOf(next());
      ++decimal_.digits;
      if (decimal_.significand >= kSignificandLimit) {
        while (atDigit()) {
          next();
          ++decimal_.shift;
        }
      }
    }
  }

  void readFraction() {
    ++decimal_.kind;
    while (atDigit()) {
      const int digit = digitOf(next());
      if (decimal_.significand < kSignificandLimit) {
        decimal_.significand = decimal_.significand * 10 + digit;
        --decimal_.shift;
        ++decimal_.digits;
      }
    }
  }

  void readExponent() {
    ++decimal_.kind;
    decimal_.exponentValid = false;
    if (atEnd()) return;
    int sign = 1;
    readSign(sign);
    int exponent = 0;
    while (atDigit()) {
      const int digit = digitOf(next());
      exponent = exponent < kExponentLimit ? exponent * 10 + digit : kExponentLimit;
      decimal_.exponentValid = true;
    }
    decimal_.exponent = exponent * sign;
  }

  std::string_view text_;
  std::size_t position_ = 0;
  Decimal decimal_;
};

// sqlite3AtoF's verdict on what it read.
int verdictOf(const Decimal& decimal) {
  if (decimal.consumedAll && decimal.digits > 0 && decimal.exponentValid) return decimal.kind;
  if (decimal.kind >= 2 && (decimal.kind == 3 || decimal.exponentValid) && decimal.digits > 0) return -1;
  return 0;
}

// 10^exponent by repeated squaring in long double, as sqlite3Pow10 computes it.
long double powerOfTen(int exponent) {
  long double power = 10.0L;
  long double result = 1.0L;
  for (; exponent != 0; exponent >>= 1) {
    if (exponent & 1) result *= power;
    power *= power;
  }
  return result;
}

// significand * 10^(sign * exponent) as sqlite3AtoF scales it, for exponents that are not 0: beyond
// 10^307 in two steps, the last one in double precision; beyond 10^341 to 0 or infinity.
double scaled(int64_t significand, int exponent, int sign) {
  if (exponent >= 342) {
    return sign < 0 ? 0.0 * static_cast<double>(significand) : HUGE_VALF * static_cast<float>(significand);
  }
  if (exponent > 307) {
    const long double scale = powerOfTen(exponent - 308);
    const auto result = static_cast<double>(sign < 0 ? significand / scale : significand * scale);
    return sign < 0 ? result / 1.0e+308 : result * 1.0e+308;
  }
  const long double scale = powerOfTen(exponent);
  return static_cast<double>(sign < 0 ? significand / scale : significand * scale);
}

// The value of the decimal, as sqlite3AtoF computes it: powers of ten are first moved into the
// significand while it has room (or taken out of it while it divides evenly).
double valueOf(const Decimal& decimal) {
  int exponent = decimal.exponent + decimal.shift;
  const int sign = exponent < 0 ? -1 : 1;
  exponent = exponent < 0 ? -exponent : exponent;
  int64_t significand = decimal.significand;
  if (significand == 0) return decimal.sign < 0 ? -0.0 : 0.0;
  for (; exponent > 0; --exponent) {
    if (sign > 0 ? significand >= kLargest / 10 : significand % 10 != 0) break;
    significand = sign > 0 ? significand * 10 : significand / 10;
  }
  significand = decimal.sign < 0 ? -significand : significand;
  if (exponent == 0) return static_cast<double>(significand);
  return scaled(significand, exponent, sign);
}

}  // namespace

DBSqlTextNumber::Reading DBSqlTextNumber::read(std::string_view text) {
  const std::optional<Decimal> decimal = DecimalReader(text).read();
  if (!decimal) return {0, 0.0};
  return {verdictOf(*decimal), valueOf(*decimal)};
}

// [spaces] [sign] digits [spaces] in 64 bits, like sqlite3Atoi64 answering 0; nothing on overflow.
std::optional<int64_t> DBSqlTextNumber::wholeNumber(std::string_view text) {
  std::size_t position = 0;
  while (position < text.size() && isSpace(text[position])) ++position;
  const bool negative = position < text.size() && text[position] == '-';
  if (position < text.size() && (text[position] == '-' || text[position] == '+')) ++position;
  // Accumulated as a negative number, whose range holds the smallest 64-bit integer.
  int64_t value = 0;
  for (; position < text.size() && isDigit(text[position]); ++position) {
    const int digit = digitOf(text[position]);
    if (value < (std::numeric_limits<int64_t>::min() + digit) / 10) return std::nullopt;
    value = value * 10 - digit;
  }
  if (negative) return value;
  if (value == std::numeric_limits<int64_t>::min()) return std::nullopt;
  return -value;
}

std::optional<DBSqlValue> DBSqlTextNumber::numeric(std::string_view text) {
  const Reading reading = read(text);
  if (reading.verdict <= 0) return std::nullopt;
  if (reading.verdict == 1) {
    if (const std::optional<int64_t> whole = wholeNumber(text)) return DBSqlValue::integer(*whole);
  }
  return DBSqlValue::real(reading.value);
}

double DBSqlTextNumber::leadingValue(std::string_view text) { return read(text).value; }

}  // namespace dbcore
