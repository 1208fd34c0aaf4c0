#include "KRFoundation/KRNumberArithmetic.hpp"

#include <cmath>
#include <limits>
#include <optional>

namespace {

// Wide enough for the exact sum, difference or negation of any two 64-bit integers.
using Wide = __int128;

bool isIntegral(const KRNumber& number) { return number.kind() != KRNumber::Kind::Double; }

Wide wide(const KRNumber& number) {
  if (number.kind() == KRNumber::Kind::UInt) return static_cast<Wide>(number.unsignedLongLongValue());
  return static_cast<Wide>(number.longLongValue());
}

// The integer as a signed or unsigned 64-bit number, or nothing when neither holds it.
std::optional<KRNumber> narrowed(Wide value) {
  if (value >= std::numeric_limits<long long>::min() && value <= std::numeric_limits<long long>::max()) {
    return KRNumber::numberWithLongLong(static_cast<long long>(value));
  }
  if (value >= 0 && value <= static_cast<Wide>(std::numeric_limits<unsigned long long>::max())) {
    return KRNumber::numberWithUnsignedLongLong(static_cast<unsigned long long>(value));
  }
  return std::nullopt;
}

std::optional<Wide> product(Wide a, Wide b) {
  Wide result = 0;
  if (__builtin_mul_overflow(a, b, &result)) return std::nullopt;
  return result;
}

// base ** exponent by squaring, or nothing once the result leaves the 64-bit range.
std::optional<Wide> integerPower(Wide base, Wide exponent) {
  Wide result = 1;
  while (exponent > 0) {
    if (exponent & 1) {
      const auto next = product(result, base);
      if (!next || !narrowed(*next)) return std::nullopt;
      result = *next;
    }
    exponent >>= 1;
    if (exponent == 0) break;
    const auto squared = product(base, base);
    if (!squared || !narrowed(*squared)) return std::nullopt;
    base = *squared;
  }
  return result;
}

// Applies the integer form when both operands are integral and it gives a 64-bit result, else the
// double form.
template <class IntegerOperation, class DoubleOperation>
KRNumber combine(const KRNumber& a, const KRNumber& b, IntegerOperation integerOperation,
                 DoubleOperation doubleOperation) {
  if (!a || !b) return {};
  if (isIntegral(a) && isIntegral(b)) {
    const std::optional<Wide> exact = integerOperation(wide(a), wide(b));
    if (exact) {
      if (auto number = narrowed(*exact)) return *number;
    }
  }
  return KRNumber::numberWithDouble(doubleOperation(a.doubleValue(), b.doubleValue()));
}

}  // namespace

KRNumber KRNumberArithmetic::add(const KRNumber& a, const KRNumber& b) {
  return combine(
      a, b, [](Wide x, Wide y) -> std::optional<Wide> { return x + y; },
      [](double x, double y) { return x + y; });
}

KRNumber KRNumberArithmetic::subtract(const KRNumber& a, const KRNumber& b) {
  return combine(
      a, b, [](Wide x, Wide y) -> std::optional<Wide> { return x - y; },
      [](double x, double y) { return x - y; });
}

KRNumber KRNumberArithmetic::multiply(const KRNumber& a, const KRNumber& b) {
  return combine(a, b, product, [](double x, double y) { return x * y; });
}

KRNumber KRNumberArithmetic::divide(const KRNumber& a, const KRNumber& b) {
  if (!a || !b) return {};
  return KRNumber::numberWithDouble(a.doubleValue() / b.doubleValue());
}

KRNumber KRNumberArithmetic::power(const KRNumber& base, const KRNumber& exponent) {
  return combine(
      base, exponent,
      [](Wide x, Wide y) -> std::optional<Wide> { return y < 0 ? std::nullopt : integerPower(x, y); },
      [](double x, double y) { return std::pow(x, y); });
}

KRNumber KRNumberArithmetic::negate(const KRNumber& a) {
  if (!a) return {};
  if (isIntegral(a)) {
    if (auto number = narrowed(-wide(a))) return *number;
  }
  return KRNumber::numberWithDouble(-a.doubleValue());
}
