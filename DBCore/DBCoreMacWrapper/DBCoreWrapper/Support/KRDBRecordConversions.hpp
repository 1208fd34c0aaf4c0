#pragma once

#include <cstdint>
#include <string>

#include "KRFoundation/KRValue.hpp"

// How entity values cross to engine records: strings as wide strings (nil as the empty wide string),
// dates as whole seconds since 1970 truncated toward zero (nil as 0). Stateless; any thread.
class KRDBRecordConversions {
 public:
  static std::wstring wideString(const KRString& string);
  static KRString string(const std::wstring& wide);
  static int64_t seconds(const KRDate& date);
  static KRDate date(int64_t seconds);
};
