#pragma once

#include <cstdint>
#include <string>
#include <variant>

namespace dbcore {

// Column and value types of the engine. The codes are stored and exchanged; they never change.
enum class FieldType : int32_t {
  T_NONE = 0,
  T_BOOL = 1,
  T_INT = 2,
  T_UINT = 3,
  T_INT_64 = 4,
  T_FLOAT = 5,
  T_TEXT = 6,
  T_WIDE_TEXT = 7,
};

// A typed value: a boolean, a 32-bit or 64-bit integer, a float, a narrow or a wide string, with its
// field type. A default value has type T_NONE.
class TVariant {
 public:
  TVariant() = default;
  explicit TVariant(bool value) : value_(value), type_(FieldType::T_BOOL) {}
  explicit TVariant(int32_t value) : value_(value), type_(FieldType::T_INT) {}
  explicit TVariant(int64_t value) : value_(value), type_(FieldType::T_INT_64) {}
  explicit TVariant(float value) : value_(value), type_(FieldType::T_FLOAT) {}
  explicit TVariant(std::string value) : value_(std::move(value)), type_(FieldType::T_TEXT) {}
  explicit TVariant(std::wstring value) : value_(std::move(value)), type_(FieldType::T_WIDE_TEXT) {}

  FieldType type() const { return type_; }

  // Numeric reads convert between the numeric kinds; a string reads as 0.
  bool asBool() const { return asInt64() != 0; }
  int32_t asInt() const { return static_cast<int32_t>(asInt64()); }
  int64_t asInt64() const;
  float asFloat() const;
  double asDouble() const;
  // The narrow text; reading any other type is a programming error and stops the program.
  const std::string& asText() const;
  // The wide text; empty for other types.
  const std::wstring& asWideText() const;

  bool operator==(const TVariant& other) const = default;

 private:
  std::variant<std::monostate, bool, int32_t, int64_t, float, std::string, std::wstring> value_;
  FieldType type_ = FieldType::T_NONE;
};

}  // namespace dbcore
