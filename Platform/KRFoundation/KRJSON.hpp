#pragma once

#include <memory>

#include "KRFoundation/KRError.hpp"
#include "KRFoundation/KRValue.hpp"

// Conversion between values and JSON text.
class KRJSON {
 public:
  static constexpr const char* NSCocoaErrorDomain = "NSCocoaErrorDomain";
  // Error codes: text that is not valid JSON, and a value that JSON cannot represent.
  static constexpr long long NSPropertyListReadCorruptError = 3840;
  static constexpr long long NSPropertyListWriteInvalidError = 3851;
  // Documents nested deeper than this are refused.
  static constexpr int maximumDepth = 512;

  // Compact UTF-8 JSON text of a dictionary, array, number, string, boolean or KRNull (JSON null).
  // Nil result and *error set (when error is given) for a value JSON cannot represent: NaN or infinite
  // doubles, dates, sets, objects, nil inside a collection, non-string dictionary keys, invalid UTF-8 in
  // strings.
  static KRString stringWithJSONObject(const KRValue& object, std::shared_ptr<KRError>* error = nullptr);
  // Parses JSON text: objects -> KRDictionary (document order kept), arrays -> KRArray, integers ->
  // KRNumber long long (or unsigned long long when larger), reals -> double, true/false -> bool numbers,
  // null -> KRNull. Nil result and *error set on any parse error (never throws).
  static KRValue JSONObjectWithString(const KRString& text, std::shared_ptr<KRError>* error = nullptr);
};
