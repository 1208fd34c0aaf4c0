#include "Support/KRDictionaryJSON.hpp"

#include "KRFoundation/KRJSON.hpp"

KRString KRDictionaryJSON::jsonString(const KRDictionary& dictionary) {
  if (dictionary.isNil()) return {};
  return KRJSON::stringWithJSONObject(dictionary);
}

std::wstring KRDictionaryJSON::jsonWString(const KRDictionary& dictionary) {
  const KRString text = jsonString(dictionary);
  return text ? text.krs_wstring() : std::wstring();
}

KRDictionary KRDictionaryJSON::dictionaryWithJsonString(const KRString& string) {
  if (string.isNil()) return {};
  return KRJSON::JSONObjectWithString(string).dictionary();
}

KRDictionary KRDictionaryJSON::dictionaryWithJsonWString(const std::wstring& string) {
  return dictionaryWithJsonString(KRString::krs_stringWithWString(string));
}
