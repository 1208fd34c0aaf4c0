#include "dbstrings.hpp"

#include "KRFoundation/KRUTF.hpp"

namespace dbcore {

std::wstring s2ws(const std::string& utf8) { return KRUTF::wideFromUTF8(utf8); }

std::string ws2s(const std::wstring& wide) { return KRUTF::utf8FromWide(wide); }

}  // namespace dbcore
