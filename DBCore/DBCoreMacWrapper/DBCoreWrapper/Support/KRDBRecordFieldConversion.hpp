#pragma once

#include <cmath>
#include <cstdint>
#include <limits>
#include <type_traits>

#include "Support/KRDBRecordConversions.hpp"

// How a cached value crosses into a record field of another type: strings as wide strings, dates as whole
// seconds, floats into integer fields truncated toward zero (NaN as 0, saturating at the field's range),
// 64-bit values into 32-bit fields keeping their low 32 bits. Stateless; any thread.
struct KRDBRecordFieldConversion {
  template <class Field, class T>
  static Field toRecord(const T& value) {
    if constexpr (std::is_same_v<T, KRString>) {
      return KRDBRecordConversions::wideString(value);
    } else if constexpr (std::is_same_v<T, KRDate>) {
      return KRDBRecordConversions::seconds(value);
    } else if constexpr (std::is_floating_point_v<T> && std::is_integral_v<Field>) {
      return truncated<Field>(value);
    } else if constexpr (std::is_integral_v<T> && std::is_integral_v<Field> && sizeof(Field) < sizeof(T)) {
      return static_cast<Field>(static_cast<std::make_unsigned_t<Field>>(value));
    } else {
      return static_cast<Field>(value);
    }
  }

  template <class T, class Field>
  static T fromRecord(const Field& field) {
    if constexpr (std::is_same_v<T, KRString>) {
      return KRDBRecordConversions::string(field);
    } else if constexpr (std::is_same_v<T, KRDate>) {
      return KRDBRecordConversions::date(field);
    } else {
      return static_cast<T>(field);
    }
  }

 private:
  template <class Field, class T>
  static Field truncated(T value) {
    if (std::isnan(value)) return 0;
    if (value <= static_cast<T>(std::numeric_limits<Field>::min())) return std::numeric_limits<Field>::min();
    if (value >= static_cast<T>(std::numeric_limits<Field>::max())) return std::numeric_limits<Field>::max();
    return static_cast<Field>(value);
  }
};
