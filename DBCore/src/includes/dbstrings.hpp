#pragma once

#include <string>

namespace dbcore {

// Lossless conversions between UTF-8 and 32-bit wide strings; invalid input becomes U+FFFD.
std::wstring s2ws(const std::string& utf8);
std::string ws2s(const std::wstring& wide);

}  // namespace dbcore
