#pragma once

#include <string>
#include <string_view>

// Lossless conversion between UTF-8 and 32-bit wide text. Invalid input (malformed UTF-8, surrogate or
// out-of-range wide values) becomes U+FFFD, one per maximal invalid subpart; nothing ever fails.
class KRUTF {
 public:
  static std::wstring wideFromUTF8(std::string_view utf8);
  static std::string utf8FromWide(std::wstring_view wide);
  // Appends the UTF-8 form of the wide text to `out` (lets callers reuse a buffer).
  static void appendUTF8(std::string& out, std::wstring_view wide);
};
