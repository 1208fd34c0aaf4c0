#include "dbstrings.hpp"

#include "KRFoundation/KRString.hpp"

namespace dbcore {

std::wstring s2ws(const std::string& utf8) { return KRString(utf8).krs_wstring(); }

std::string ws2s(const std::wstring& wide) { return KRString::krs_stringWithWString(wide).str(); }

}  // namespace dbcore
