#include "KRFoundation/KRString.hpp"

#include "KRFoundation/KRUTF.hpp"

#include <unicode/coll.h>
#include <unicode/locid.h>
#include <unicode/unistr.h>

#include <functional>
#include <string_view>
#include <unordered_map>

namespace {

enum class CollationStyle { Localized, Standard };

KRComparisonResult resultOfOrder(int order) {
  if (order < 0) return KROrderedAscending;
  return order > 0 ? KROrderedDescending : KROrderedSame;
}

// The default locale, except the POSIX locale that ICU picks when no locale is configured: its
// collation is plain ASCII order (upper case before lower case), so the root collation stands in.
icu::Locale collationLocale() {
  const icu::Locale& locale = icu::Locale::getDefault();
  if (std::string_view(locale.getName()) == "en_US_POSIX") return icu::Locale::getRoot();
  return locale;
}

std::unique_ptr<icu::Collator> makeCollator(const icu::Locale& locale, CollationStyle style) {
  UErrorCode status = U_ZERO_ERROR;
  std::unique_ptr<icu::Collator> collator(icu::Collator::createInstance(locale, status));
  if (U_FAILURE(status)) return nullptr;
  if (style == CollationStyle::Localized) {
    collator->setStrength(icu::Collator::TERTIARY);
  } else {
    collator->setStrength(icu::Collator::SECONDARY);
    collator->setAttribute(UCOL_NUMERIC_COLLATION, UCOL_ON, status);
  }
  return U_SUCCESS(status) ? std::move(collator) : nullptr;
}

// Collators are not shared between threads: each thread keeps its own, per locale and style.
const icu::Collator* collatorFor(CollationStyle style) {
  thread_local std::unordered_map<std::string, std::unique_ptr<icu::Collator>> collators;
  const icu::Locale locale = collationLocale();
  const std::string key = std::string(style == CollationStyle::Localized ? "L:" : "S:") + locale.getName();
  std::unique_ptr<icu::Collator>& collator = collators[key];
  if (!collator) collator = makeCollator(locale, style);
  return collator.get();
}

KRComparisonResult collate(const std::string& a, const std::string& b, CollationStyle style) {
  if (const icu::Collator* collator = collatorFor(style)) {
    UErrorCode status = U_ZERO_ERROR;
    const UCollationResult order = collator->compareUTF8(a, b, status);
    if (U_SUCCESS(status)) return resultOfOrder(order);
  }
  return resultOfOrder(a.compare(b));
}

// The path without its trailing slashes; the root stays "/".
std::string_view withoutTrailingSlashes(std::string_view path) {
  while (path.size() > 1 && path.back() == '/') path.remove_suffix(1);
  return path;
}

// Runs of slashes become one, and a trailing slash goes (except for the root).
std::string withSingleSlashes(std::string_view path) {
  std::string result;
  result.reserve(path.size());
  for (char c : path) {
    if (c != '/' || result.empty() || result.back() != '/') result.push_back(c);
  }
  return std::string(withoutTrailingSlashes(result));
}

// Offset of the dot that starts the extension of the last component, or npos when it has none.
// A leading dot names a hidden file, not an extension.
size_t extensionDotOffset(std::string_view path) {
  const size_t slash = path.rfind('/');
  const size_t componentStart = slash == std::string_view::npos ? 0 : slash + 1;
  const size_t dot = path.rfind('.');
  if (dot == std::string_view::npos || dot <= componentStart) return std::string_view::npos;
  return dot;
}

}  // namespace

KRString::KRString(const char* utf8) {
  if (utf8) text_ = std::make_shared<const std::string>(utf8);
}

KRString::KRString(std::string utf8) : text_(std::make_shared<const std::string>(std::move(utf8))) {}

KRString::KRString(std::string_view utf8) : text_(std::make_shared<const std::string>(utf8)) {}

const std::string& KRString::str() const {
  static const std::string empty;
  return text_ ? *text_ : empty;
}

bool KRString::operator==(const KRString& other) const {
  if (text_ == other.text_) return true;
  if (!text_ || !other.text_) return false;
  return *text_ == *other.text_;
}

uint64_t KRString::hash() const { return text_ ? std::hash<std::string>{}(*text_) : 0; }

std::wstring KRString::krs_wstring() const { return KRUTF::wideFromUTF8(str()); }

KRString KRString::krs_stringWithWString(const std::wstring& wide) {
  return KRString(KRUTF::utf8FromWide(wide));
}

KRComparisonResult KRString::compare(const KRString& other) const {
  return resultOfOrder(str().compare(other.str()));
}

KRComparisonResult KRString::localizedCompare(const KRString& other) const {
  return collate(str(), other.str(), CollationStyle::Localized);
}

KRComparisonResult KRString::caseInsensitiveCompare(const KRString& other) const {
  const icu::UnicodeString a = icu::UnicodeString::fromUTF8(str());
  const icu::UnicodeString b = icu::UnicodeString::fromUTF8(other.str());
  return resultOfOrder(a.caseCompare(b, U_FOLD_CASE_DEFAULT | U_COMPARE_CODE_POINT_ORDER));
}

KRComparisonResult KRString::localizedStandardCompare(const KRString& other) const {
  return collate(str(), other.str(), CollationStyle::Standard);
}

KRString KRString::lastPathComponent() const {
  if (!text_) return {};
  const std::string_view path = withoutTrailingSlashes(*text_);
  const size_t slash = path.rfind('/');
  if (slash == std::string_view::npos || path.size() == 1) return KRString(path);
  return KRString(path.substr(slash + 1));
}

KRString KRString::stringByAppendingPathComponent(const KRString& component) const {
  if (!text_) return {};
  if (text_->empty()) return KRString(withSingleSlashes(component.str()));
  return KRString(withSingleSlashes(*text_ + "/" + component.str()));
}

KRString KRString::pathExtension() const {
  if (!text_) return {};
  const std::string_view path = withoutTrailingSlashes(*text_);
  const size_t dot = extensionDotOffset(path);
  return KRString(dot == std::string_view::npos ? std::string_view() : path.substr(dot + 1));
}

KRString KRString::stringByDeletingPathExtension() const {
  if (!text_) return {};
  const std::string_view path = withoutTrailingSlashes(*text_);
  return KRString(path.substr(0, extensionDotOffset(path)));
}

bool KRString::hasPrefix(const KRString& prefix) const {
  return text_ && !prefix.empty() && text_->starts_with(prefix.str());
}

bool KRString::hasSuffix(const KRString& suffix) const {
  return text_ && !suffix.empty() && text_->ends_with(suffix.str());
}

KRString KRString::stringByReplacingOccurrencesOfString(const KRString& target,
                                                        const KRString& replacement) const {
  if (!text_ || target.empty()) return *this;
  const std::string& needle = target.str();
  std::string result;
  size_t start = 0;
  for (size_t found = text_->find(needle); found != std::string::npos; found = text_->find(needle, start)) {
    result.append(*text_, start, found - start).append(replacement.str());
    start = found + needle.size();
  }
  if (start == 0) return *this;
  result.append(*text_, start);
  return KRString(std::move(result));
}
