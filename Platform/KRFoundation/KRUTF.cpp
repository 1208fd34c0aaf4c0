#include "KRFoundation/KRUTF.hpp"

#include <unicode/utf8.h>

#include <cstdint>

namespace {

constexpr char32_t kReplacementCharacter = 0xFFFD;
constexpr char32_t kLastCodePoint = 0x10FFFF;

bool isScalarValue(wchar_t character) {
  const auto value = static_cast<uint32_t>(character);
  return value <= kLastCodePoint && !U_IS_SURROGATE(value);
}

}  // namespace

std::wstring KRUTF::wideFromUTF8(std::string_view utf8) {
  const auto* bytes = reinterpret_cast<const uint8_t*>(utf8.data());
  const size_t length = utf8.size();
  std::wstring wide;
  wide.reserve(length);
  for (size_t i = 0; i < length;) {
    UChar32 c;
    U8_NEXT_OR_FFFD(bytes, i, length, c);
    wide.push_back(static_cast<wchar_t>(c));
  }
  return wide;
}

std::string KRUTF::utf8FromWide(std::wstring_view wide) {
  std::string text;
  appendUTF8(text, wide);
  return text;
}

void KRUTF::appendUTF8(std::string& out, std::wstring_view wide) {
  out.reserve(out.size() + wide.size());
  for (wchar_t character : wide) {
    if (static_cast<uint32_t>(character) < 0x80) {
      out.push_back(static_cast<char>(character));
      continue;
    }
    const char32_t c = isScalarValue(character) ? static_cast<char32_t>(character) : kReplacementCharacter;
    uint8_t encoded[U8_MAX_LENGTH];
    size_t count = 0;
    U8_APPEND_UNSAFE(encoded, count, c);
    out.append(reinterpret_cast<const char*>(encoded), count);
  }
}
