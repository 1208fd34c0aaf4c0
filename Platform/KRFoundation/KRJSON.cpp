#include "KRFoundation/KRJSON.hpp"

#include <cmath>
#include <limits>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

using Json = nlohmann::ordered_json;

void reportError(std::shared_ptr<KRError>* error, long long code, const std::string& message) {
  if (!error) return;
  *error = KRError::errorWithDomain(KRJSON::NSCocoaErrorDomain, code,
                                    {{KRError::NSLocalizedDescriptionKey, message}});
}

std::string unrepresentableTypeName(const KRValue& value) {
  switch (value.type()) {
    case KRValue::Type::Nil:
      return "nil";
    case KRValue::Type::Date:
      return "KRDate";
    case KRValue::Type::Set:
      return "KRSet";
    case KRValue::Type::Object:
      return value.object()->className();
    default:
      return "value";
  }
}

bool toJson(const KRValue& value, Json& json, std::string& failure);

bool numberToJson(const KRNumber& number, Json& json, std::string& failure) {
  switch (number.kind()) {
    case KRNumber::Kind::Bool:
      json = number.boolValue();
      return true;
    case KRNumber::Kind::Int:
      json = number.longLongValue();
      return true;
    case KRNumber::Kind::UInt:
      json = number.unsignedLongLongValue();
      return true;
    case KRNumber::Kind::Double:
      break;
  }
  if (!std::isfinite(number.doubleValue())) {
    failure = "Invalid number value (NaN or infinity) in JSON write";
    return false;
  }
  json = number.doubleValue();
  return true;
}

bool arrayToJson(const KRArray& array, Json& json, std::string& failure) {
  json = Json::array();
  for (const KRValue& element : array.values()) {
    if (!toJson(element, json.emplace_back(), failure)) return false;
  }
  return true;
}

bool dictionaryToJson(const KRDictionary& dictionary, Json& json, std::string& failure) {
  json = Json::object();
  for (const auto& [key, value] : dictionary.entries()) {
    if (!key.isString()) {
      failure = "Invalid (non-string) key in JSON dictionary";
      return false;
    }
    if (!toJson(value, json[key.string().str()], failure)) return false;
  }
  return true;
}

// Builds the JSON of the value; false with the reason in `failure` when JSON cannot represent it.
bool toJson(const KRValue& value, Json& json, std::string& failure) {
  switch (value.type()) {
    case KRValue::Type::Null:
      json = nullptr;
      return true;
    case KRValue::Type::Number:
      return numberToJson(value.number(), json, failure);
    case KRValue::Type::String:
      json = value.string().str();
      return true;
    case KRValue::Type::Array:
      return arrayToJson(value.array(), json, failure);
    case KRValue::Type::Dictionary:
      return dictionaryToJson(value.dictionary(), json, failure);
    default:
      failure = "Invalid type in JSON write (" + unrepresentableTypeName(value) + ")";
      return false;
  }
}

KRValue fromJson(const Json& json);

KRValue arrayFromJson(const Json& json) {
  std::vector<KRValue> values;
  values.reserve(json.size());
  for (const Json& element : json) values.push_back(fromJson(element));
  return KRArray(std::move(values));
}

KRValue dictionaryFromJson(const Json& json) {
  std::vector<KRDictionary::Entry> entries;
  entries.reserve(json.size());
  for (const auto& [key, value] : json.items()) entries.emplace_back(KRValue(key), fromJson(value));
  return KRDictionary(entries);
}

// Non-negative integers are signed numbers unless they do not fit.
KRValue unsignedFromJson(const Json& json) {
  const auto value = json.get<unsigned long long>();
  if (value <= static_cast<unsigned long long>(std::numeric_limits<long long>::max())) {
    return KRValue(static_cast<long long>(value));
  }
  return KRValue(value);
}

KRValue fromJson(const Json& json) {
  switch (json.type()) {
    case Json::value_t::null:
      return KRValue::null();
    case Json::value_t::boolean:
      return KRValue(json.get<bool>());
    case Json::value_t::number_integer:
      return KRValue(json.get<long long>());
    case Json::value_t::number_unsigned:
      return unsignedFromJson(json);
    case Json::value_t::number_float:
      return KRValue(json.get<double>());
    case Json::value_t::string:
      return KRValue(json.get_ref<const std::string&>());
    case Json::value_t::array:
      return arrayFromJson(json);
    case Json::value_t::object:
      return dictionaryFromJson(json);
    default:
      return {};
  }
}

// Parser callback that stops documents nested too deeply to be converted without exhausting the stack.
bool refuseDeepNesting(int depth, Json::parse_event_t event, Json&) {
  const bool opens = event == Json::parse_event_t::object_start || event == Json::parse_event_t::array_start;
  if (opens && depth >= KRJSON::maximumDepth) {
    throw std::length_error("nesting deeper than " + std::to_string(KRJSON::maximumDepth) + " levels");
  }
  return true;
}

}  // namespace

KRString KRJSON::stringWithJSONObject(const KRValue& object, std::shared_ptr<KRError>* error) {
  Json json;
  std::string failure;
  if (!toJson(object, json, failure)) {
    reportError(error, NSPropertyListWriteInvalidError, failure);
    return {};
  }
  try {
    return KRString(json.dump());
  } catch (const Json::exception& exception) {
    // The only failure of dump: a string or key that is not valid UTF-8.
    reportError(error, NSPropertyListWriteInvalidError,
                std::string("Invalid string in JSON write: ") + exception.what());
    return {};
  }
}

KRValue KRJSON::JSONObjectWithString(const KRString& text, std::shared_ptr<KRError>* error) {
  // The parser takes a NUL byte for the end of the input, and JSON text never contains one.
  if (const size_t nul = text.str().find('\0'); nul != std::string::npos) {
    reportError(error, NSPropertyListReadCorruptError,
                "Invalid JSON text: NUL character at offset " + std::to_string(nul));
    return {};
  }
  try {
    return fromJson(Json::parse(text.str(), refuseDeepNesting));
  } catch (const std::exception& exception) {
    reportError(error, NSPropertyListReadCorruptError, std::string("Invalid JSON text: ") + exception.what());
    return {};
  }
}
