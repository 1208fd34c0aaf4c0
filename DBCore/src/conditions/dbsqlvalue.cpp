#include "dbsqlvalue.hpp"

#include <charconv>
#include <cmath>
#include <cstring>

#include "dbsqltextnumber.hpp"

namespace dbcore {

DBSqlValue DBSqlValue::integer(int64_t value) {
  DBSqlValue result;
  result.payload_.integer = value;
  result.class_ = Class::Integer;
  return result;
}

DBSqlValue DBSqlValue::real(double value) {
  DBSqlValue result;
  if (std::isnan(value)) return result;
  result.payload_.real = value;
  result.class_ = Class::Real;
  return result;
}

DBSqlValue DBSqlValue::text(std::string_view bytes) {
  DBSqlValue result;
  result.size_ = static_cast<uint32_t>(bytes.size());
  result.inline_ = bytes.size() <= kInlineTextSize;
  if (result.inline_) {
    if (!bytes.empty()) std::memcpy(result.payload_.bytes, bytes.data(), bytes.size());
  } else {
    result.payload_.text = bytes.data();
  }
  result.class_ = Class::Text;
  return result;
}

std::optional<bool> DBSqlValue::truth() const {
  switch (class_) {
    case Class::Null:
      return std::nullopt;
    case Class::Integer:
      return payload_.integer != 0;
    case Class::Real:
      return payload_.real != 0.0;
    case Class::Text:
      return DBSqlTextNumber::leadingValue(asText()) != 0.0;
  }
  return std::nullopt;
}

DBSqlValue DBSqlValue::withAffinity(Affinity affinity, char (&buffer)[kIntegerTextSize]) const {
  if (affinity == Affinity::Numeric && class_ == Class::Text) {
    return DBSqlTextNumber::numeric(asText()).value_or(*this);
  }
  if (affinity == Affinity::Text && class_ == Class::Integer) {
    const auto written = std::to_chars(buffer, buffer + kIntegerTextSize, payload_.integer);
    return text(std::string_view(buffer, static_cast<std::size_t>(written.ptr - buffer)));
  }
  return *this;
}

std::optional<int> DBSqlValue::compare(const DBSqlValue& left, const DBSqlValue& right) {
  if (left.isNull() || right.isNull()) return std::nullopt;
  const bool leftIsText = left.class_ == Class::Text;
  const bool rightIsText = right.class_ == Class::Text;
  if (leftIsText && rightIsText) return compareTexts(left.asText(), right.asText());
  if (leftIsText || rightIsText) return leftIsText ? 1 : -1;
  return compareNumbers(left, right);
}

int DBSqlValue::compareNumbers(const DBSqlValue& left, const DBSqlValue& right) {
  if (left.class_ == Class::Integer && right.class_ == Class::Integer) {
    return left.payload_.integer < right.payload_.integer ? -1
                                                          : left.payload_.integer > right.payload_.integer;
  }
  if (left.class_ == Class::Integer)
    return compareIntegerWithReal(left.payload_.integer, right.payload_.real);
  if (right.class_ == Class::Integer)
    return -compareIntegerWithReal(right.payload_.integer, left.payload_.real);
  return left.payload_.real < right.payload_.real ? -1 : left.payload_.real > right.payload_.real;
}

// Exact, as SQLite's comparison with an extended-precision integer is: the real's whole part is
// compared first, then its fraction.
int DBSqlValue::compareIntegerWithReal(int64_t integer, double real) {
  constexpr double kTwoTo63 = 9223372036854775808.0;
  if (real < -kTwoTo63) return 1;
  if (real >= kTwoTo63) return -1;
  const double whole = std::trunc(real);
  const auto wholeInteger = static_cast<int64_t>(whole);
  if (integer != wholeInteger) return integer < wholeInteger ? -1 : 1;
  return real > whole ? -1 : real < whole;
}

int DBSqlValue::compareTexts(std::string_view left, std::string_view right) {
  const std::size_t common = left.size() < right.size() ? left.size() : right.size();
  const int bytes = common == 0 ? 0 : std::memcmp(left.data(), right.data(), common);
  if (bytes != 0) return bytes < 0 ? -1 : 1;
  return left.size() < right.size() ? -1 : left.size() > right.size();
}

}  // namespace dbcore
