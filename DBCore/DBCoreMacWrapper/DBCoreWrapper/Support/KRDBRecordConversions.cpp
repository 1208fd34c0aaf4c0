#include "Support/KRDBRecordConversions.hpp"

#include <cmath>

std::wstring KRDBRecordConversions::wideString(const KRString& string) { return string.krs_wstring(); }

KRString KRDBRecordConversions::string(const std::wstring& wide) {
  // Records hold many empty texts; they all load as one shared object rather than one each.
  static const KRString empty{std::string()};
  return wide.empty() ? empty : KRString::krs_stringWithWString(wide);
}

int64_t KRDBRecordConversions::seconds(const KRDate& date) {
  if (date.isNil()) return 0;
  const double seconds = std::trunc(date.timeIntervalSince1970());
  if (!(seconds > -9.2e18 && seconds < 9.2e18)) return 0;
  return static_cast<int64_t>(seconds);
}

KRDate KRDBRecordConversions::date(int64_t seconds) {
  return KRDate::dateWithTimeIntervalSince1970(static_cast<double>(seconds));
}
