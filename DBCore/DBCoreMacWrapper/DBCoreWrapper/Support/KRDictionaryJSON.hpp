#pragma once

#include <string>

#include "KRFoundation/KRValue.hpp"

// Dictionaries as JSON text, narrow and wide (the engine's text type). Failures never raise: they give
// nil (or an empty wide string), which callers treat as a missing dictionary. Thread-safe.
class KRDictionaryJSON {
 public:
  // Compact JSON text, or nil when the dictionary holds a value that JSON cannot represent.
  static KRString jsonString(const KRDictionary& dictionary);
  // The same as a wide string; empty where jsonString gives nil.
  static std::wstring jsonWString(const KRDictionary& dictionary);
  // The dictionary that JSON text describes, or nil for bad text or a document that is not an object.
  static KRDictionary dictionaryWithJsonString(const KRString& string);
  static KRDictionary dictionaryWithJsonWString(const std::wstring& string);
};
