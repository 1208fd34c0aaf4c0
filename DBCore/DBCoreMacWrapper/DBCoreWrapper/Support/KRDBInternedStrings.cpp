#include "Support/KRDBInternedStrings.hpp"

#include <unordered_map>

KRString KRDBInternedStrings::string(const std::wstring& wide) {
  if (wide.size() > kLongestInterned) return KRString::krs_stringWithWString(wide);
  thread_local std::unordered_map<std::wstring, KRString> table;
  if (const auto found = table.find(wide); found != table.end()) return found->second;
  if (table.size() >= kCapacity) table.clear();
  return table.emplace(wide, KRString::krs_stringWithWString(wide)).first->second;
}
