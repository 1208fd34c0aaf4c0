#include "tvariant.hpp"

#include "dbassert.hpp"

namespace dbcore {

int64_t TVariant::asInt64() const {
  return std::visit(
      [](const auto& held) -> int64_t {
        using T = std::decay_t<decltype(held)>;
        if constexpr (std::is_same_v<T, bool> || std::is_same_v<T, int32_t> || std::is_same_v<T, int64_t>) {
          return static_cast<int64_t>(held);
        } else if constexpr (std::is_same_v<T, float>) {
          return static_cast<int64_t>(held);
        } else {
          return 0;
        }
      },
      value_);
}

double TVariant::asDouble() const {
  if (const float* value = std::get_if<float>(&value_)) return *value;
  return static_cast<double>(asInt64());
}

float TVariant::asFloat() const { return static_cast<float>(asDouble()); }

const std::string& TVariant::asText() const {
  const FieldType type = type_;
  DB_ASSERT(type == FieldType::T_TEXT);
  return std::get<std::string>(value_);
}

const std::wstring& TVariant::asWideText() const {
  static const std::wstring empty;
  const std::wstring* text = std::get_if<std::wstring>(&value_);
  return text ? *text : empty;
}

}  // namespace dbcore
