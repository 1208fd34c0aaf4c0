#include "KRFoundation/KRNumber.hpp"

#include <bit>
#include <charconv>
#include <cmath>
#include <limits>

#include "KRFoundation/KRHashing.hpp"

struct KRNumber::Repr {
  Kind kind;
  union {
    bool b;
    long long i;
    unsigned long long u;
    double d;
  };
};

namespace {

// Exact ordering of two values given as long double: x86-64's 64-bit mantissa holds every 64-bit integer.
KRComparisonResult order(long double a, long double b) {
  if (std::isnan(a) || std::isnan(b)) {
    if (std::isnan(a) && std::isnan(b)) return KROrderedSame;
    return std::isnan(a) ? KROrderedAscending : KROrderedDescending;
  }
  if (a < b) return KROrderedAscending;
  return a > b ? KROrderedDescending : KROrderedSame;
}

template <class T>
KRComparisonResult orderIntegers(T a, T b) {
  if (a < b) return KROrderedAscending;
  return a > b ? KROrderedDescending : KROrderedSame;
}

}  // namespace

KRNumber KRNumber::numberWithBool(bool value) {
  auto repr = std::make_shared<Repr>();
  repr->kind = Kind::Bool;
  repr->b = value;
  return KRNumber(std::move(repr));
}

KRNumber KRNumber::numberWithLongLong(long long value) {
  auto repr = std::make_shared<Repr>();
  repr->kind = Kind::Int;
  repr->i = value;
  return KRNumber(std::move(repr));
}

KRNumber KRNumber::numberWithUnsignedLongLong(unsigned long long value) {
  auto repr = std::make_shared<Repr>();
  repr->kind = Kind::UInt;
  repr->u = value;
  return KRNumber(std::move(repr));
}

KRNumber KRNumber::numberWithDouble(double value) {
  auto repr = std::make_shared<Repr>();
  repr->kind = Kind::Double;
  repr->d = value;
  return KRNumber(std::move(repr));
}

KRNumber::Kind KRNumber::kind() const { return repr_ ? repr_->kind : Kind::Int; }

bool KRNumber::boolValue() const {
  if (!repr_) return false;
  switch (repr_->kind) {
    case Kind::Bool:
      return repr_->b;
    case Kind::Int:
      return repr_->i != 0;
    case Kind::UInt:
      return repr_->u != 0;
    case Kind::Double:
      return repr_->d != 0.0;
  }
  return false;
}

int KRNumber::intValue() const { return static_cast<int>(longLongValue()); }

long long KRNumber::longLongValue() const {
  if (!repr_) return 0;
  switch (repr_->kind) {
    case Kind::Bool:
      return repr_->b ? 1 : 0;
    case Kind::Int:
      return repr_->i;
    case Kind::UInt:
      return static_cast<long long>(repr_->u);
    case Kind::Double: {
      const double d = repr_->d;
      if (std::isnan(d)) return 0;
      if (d >= 9223372036854775807.0) return std::numeric_limits<long long>::max();
      if (d <= -9223372036854775808.0) return std::numeric_limits<long long>::min();
      return static_cast<long long>(d);
    }
  }
  return 0;
}

unsigned long long KRNumber::unsignedLongLongValue() const {
  if (repr_ && repr_->kind == Kind::UInt) return repr_->u;
  if (repr_ && repr_->kind == Kind::Double && repr_->d >= 9223372036854775807.0) {
    return repr_->d >= 18446744073709551615.0 ? std::numeric_limits<unsigned long long>::max()
                                              : static_cast<unsigned long long>(repr_->d);
  }
  return static_cast<unsigned long long>(longLongValue());
}

double KRNumber::doubleValue() const {
  if (!repr_) return 0.0;
  switch (repr_->kind) {
    case Kind::Bool:
      return repr_->b ? 1.0 : 0.0;
    case Kind::Int:
      return static_cast<double>(repr_->i);
    case Kind::UInt:
      return static_cast<double>(repr_->u);
    case Kind::Double:
      return repr_->d;
  }
  return 0.0;
}

std::string KRNumber::stringValue() const {
  if (!repr_) return "";
  switch (repr_->kind) {
    case Kind::Bool:
      return repr_->b ? "1" : "0";
    case Kind::Int:
      return std::to_string(repr_->i);
    case Kind::UInt:
      return std::to_string(repr_->u);
    case Kind::Double: {
      if (std::isnan(repr_->d)) return "nan";
      if (std::isinf(repr_->d)) return repr_->d > 0 ? "inf" : "-inf";
      char buffer[64];
      const auto result = std::to_chars(buffer, buffer + sizeof buffer, repr_->d);
      return std::string(buffer, result.ptr);
    }
  }
  return "";
}

KRComparisonResult KRNumber::compare(const KRNumber& other) const {
  const Kind a = kind();
  const Kind b = other.kind();
  if (a == Kind::UInt && b == Kind::UInt)
    return orderIntegers(unsignedLongLongValue(), other.unsignedLongLongValue());
  if (a != Kind::Double && b != Kind::Double && a != Kind::UInt && b != Kind::UInt) {
    return orderIntegers(longLongValue(), other.longLongValue());
  }
  return order(exactValue(), other.exactValue());
}

long double KRNumber::exactValue() const {
  if (repr_ && repr_->kind == Kind::UInt) return static_cast<long double>(repr_->u);
  if (repr_ && repr_->kind == Kind::Double) return repr_->d;
  return static_cast<long double>(longLongValue());
}

bool KRNumber::operator==(const KRNumber& other) const {
  if (!repr_ || !other.repr_) return repr_ == other.repr_;
  return compare(other) == KROrderedSame;
}

uint64_t KRNumber::hash() const {
  if (!repr_) return 0;
  // Equal numbers of different kinds must hash alike: integral values hash as their integer.
  const long double value = exactValue();
  if (std::isnan(value)) return KRHashing::mix(0x7ff8000000000000ULL);
  if (value >= -9223372036854775808.0L && value < 9223372036854775808.0L && value == std::trunc(value)) {
    return KRHashing::mix(static_cast<uint64_t>(static_cast<long long>(value)));
  }
  if (value >= 0 && value < 18446744073709551616.0L && value == std::trunc(value)) {
    return KRHashing::mix(static_cast<uint64_t>(value));
  }
  return KRHashing::mix(std::bit_cast<uint64_t>(static_cast<double>(value)));
}
