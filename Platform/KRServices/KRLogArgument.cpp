#include "KRServices/KRLogArgument.hpp"

#include <array>
#include <charconv>
#include <cstdio>

KRLogArgument::KRLogArgument(const char* text)
    : KRLogArgument(text ? KRLogArgument(Kind::Text, text) : KRLogArgument(nullptr)) {}

KRLogArgument::KRLogArgument(std::string_view text) : KRLogArgument(Kind::Text, std::string(text)) {}

KRLogArgument::KRLogArgument(const std::string& text) : KRLogArgument(Kind::Text, text) {}

KRLogArgument::KRLogArgument(const std::wstring& text)
    : KRLogArgument(KRString::krs_stringWithWString(text)) {}

KRLogArgument::KRLogArgument(const KRString& text)
    : KRLogArgument(text.isNil() ? KRLogArgument(nullptr) : KRLogArgument(Kind::Text, text.str())) {}

KRLogArgument::KRLogArgument(const KRValue& value) : KRLogArgument(fromValue(value)) {}

KRLogArgument::KRLogArgument(const KRException& exception)
    : KRLogArgument(Kind::Text, exception.description()) {}

KRLogArgument::KRLogArgument(const std::exception& exception) : KRLogArgument(Kind::Text, exception.what()) {}

KRLogArgument KRLogArgument::fromValue(const KRValue& value) {
  switch (value.type()) {
    case KRValue::Type::Nil:
      return KRLogArgument(nullptr);
    case KRValue::Type::Object:
      return fromObject(value.object().get());
    case KRValue::Type::Number: {
      KRLogArgument argument = fromNumber(value.number());
      argument.text_ = value.description();
      return argument;
    }
    default:
      return KRLogArgument(Kind::Text, value.description());
  }
}

KRLogArgument KRLogArgument::fromNumber(const KRNumber& number) {
  switch (number.kind()) {
    case KRNumber::Kind::Bool:
      return KRLogArgument(number.boolValue());
    case KRNumber::Kind::Int:
      return KRLogArgument(number.longLongValue());
    case KRNumber::Kind::UInt:
      return KRLogArgument(number.unsignedLongLongValue());
    case KRNumber::Kind::Double:
      break;
  }
  return KRLogArgument(number.doubleValue());
}

KRLogArgument KRLogArgument::fromObject(const KRObject* object) {
  if (!object) return KRLogArgument(nullptr);
  return KRLogArgument(static_cast<const void*>(object), object->description());
}

long long KRLogArgument::signedValue() const {
  const size_t bits = byteWidth_ * 8;
  if (bits == 0 || bits >= 64) return static_cast<long long>(bits_);
  // Sign-extends the value from the width of its own type.
  const unsigned long long sign = 1ULL << (bits - 1);
  return static_cast<long long>((unsignedValue() ^ sign) - sign);
}

unsigned long long KRLogArgument::unsignedValue() const {
  const size_t bits = byteWidth_ * 8;
  if (bits == 0 || bits >= 64) return bits_;
  return bits_ & ((1ULL << bits) - 1);
}

double KRLogArgument::doubleValue() const {
  switch (kind_) {
    case Kind::Floating:
      return floating_;
    case Kind::Signed:
      return static_cast<double>(signedValue());
    case Kind::Unsigned:
      return static_cast<double>(unsignedValue());
    default:
      return 0;
  }
}

std::string KRLogArgument::description() const {
  if (text_) return *text_;
  std::array<char, 32> buffer{};
  switch (kind_) {
    case Kind::Signed:
      return std::to_string(signedValue());
    case Kind::Unsigned:
      return std::to_string(unsignedValue());
    case Kind::Floating:
      return std::string(buffer.data(),
                         std::to_chars(buffer.data(), buffer.data() + buffer.size(), floating_).ptr);
    case Kind::Pointer:
      std::snprintf(buffer.data(), buffer.size(), "%p", pointer_);
      return buffer.data();
    default:
      return "(null)";
  }
}
