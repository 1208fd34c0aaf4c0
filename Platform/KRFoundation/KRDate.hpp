#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRFoundation/KRObject.hpp"

// Immutable, nullable point in time, in seconds since 1970-01-01 00:00:00 UTC.
class KRDate {
 public:
  KRDate() = default;    // nil
  static KRDate date();  // now
  static KRDate dateWithTimeIntervalSince1970(double seconds);
  static KRDate dateWithTimeIntervalSinceNow(double seconds);
  static KRDate distantFuture();

  bool isNil() const { return !seconds_; }
  explicit operator bool() const { return seconds_ != nullptr; }
  double timeIntervalSince1970() const;
  double timeIntervalSinceNow() const;
  // "2001-01-01 00:00:00 +0000"
  std::string description() const;

  KRComparisonResult compare(const KRDate& other) const;
  bool operator==(const KRDate& other) const;
  uint64_t hash() const;
  friend bool identical(const KRDate& a, const KRDate& b) { return a.seconds_ == b.seconds_; }

 private:
  explicit KRDate(double seconds);
  std::shared_ptr<const double> seconds_;
};
