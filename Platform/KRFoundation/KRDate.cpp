#include "KRFoundation/KRDate.hpp"

#include <bit>
#include <chrono>
#include <cmath>
#include <ctime>

#include "KRFoundation/KRHashing.hpp"

KRDate::KRDate(double seconds) : seconds_(std::make_shared<const double>(seconds)) {}

KRDate KRDate::date() {
  const auto now = std::chrono::system_clock::now().time_since_epoch();
  return KRDate(std::chrono::duration<double>(now).count());
}

KRDate KRDate::dateWithTimeIntervalSince1970(double seconds) { return KRDate(seconds); }

KRDate KRDate::dateWithTimeIntervalSinceNow(double seconds) {
  return KRDate(date().timeIntervalSince1970() + seconds);
}

KRDate KRDate::distantFuture() {
  // 4001-01-01 00:00:00 UTC, as far as the platform's "distant future" reaches.
  return KRDate(64092211200.0);
}

double KRDate::timeIntervalSince1970() const { return seconds_ ? *seconds_ : 0.0; }

double KRDate::timeIntervalSinceNow() const {
  return timeIntervalSince1970() - date().timeIntervalSince1970();
}

std::string KRDate::description() const {
  if (!seconds_) return "(null)";
  const std::time_t whole = static_cast<std::time_t>(std::floor(*seconds_));
  std::tm parts{};
  if (!gmtime_r(&whole, &parts)) return std::to_string(*seconds_);
  char buffer[64];
  const size_t length = std::strftime(buffer, sizeof buffer, "%Y-%m-%d %H:%M:%S +0000", &parts);
  return std::string(buffer, length);
}

KRComparisonResult KRDate::compare(const KRDate& other) const {
  const double a = timeIntervalSince1970();
  const double b = other.timeIntervalSince1970();
  if (a < b) return KROrderedAscending;
  return a > b ? KROrderedDescending : KROrderedSame;
}

bool KRDate::operator==(const KRDate& other) const {
  if (!seconds_ || !other.seconds_) return seconds_ == other.seconds_;
  return *seconds_ == *other.seconds_;
}

uint64_t KRDate::hash() const {
  if (!seconds_) return 0;
  const double value = *seconds_ == 0.0 ? 0.0 : *seconds_;  // -0.0 and 0.0 are the same time
  return KRHashing::mix(std::bit_cast<uint64_t>(value));
}
