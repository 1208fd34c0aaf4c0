#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRFoundation/KRObject.hpp"

// Immutable, nullable number handle: a boolean, a signed or unsigned 64-bit integer or a double.
// Numbers compare by value whatever their kind; booleans count as 0 and 1.
class KRNumber {
 public:
  enum class Kind { Bool, Int, UInt, Double };

  KRNumber() = default;  // nil
  static KRNumber numberWithBool(bool value);
  static KRNumber numberWithLongLong(long long value);
  static KRNumber numberWithUnsignedLongLong(unsigned long long value);
  static KRNumber numberWithDouble(double value);

  bool isNil() const { return !repr_; }
  explicit operator bool() const { return repr_ != nullptr; }
  Kind kind() const;

  bool boolValue() const;
  int intValue() const;
  long long longLongValue() const;
  unsigned long long unsignedLongLongValue() const;
  double doubleValue() const;
  std::string stringValue() const;

  KRComparisonResult compare(const KRNumber& other) const;
  bool operator==(const KRNumber& other) const;
  uint64_t hash() const;
  friend bool identical(const KRNumber& a, const KRNumber& b) { return a.repr_ == b.repr_; }

 private:
  struct Repr;
  // The value in a type that holds every kind exactly.
  long double exactValue() const;
  explicit KRNumber(std::shared_ptr<const Repr> repr) : repr_(std::move(repr)) {}
  std::shared_ptr<const Repr> repr_;
};
