#include "KRFoundation/KRStringComparator.hpp"

#include "KRFoundation/KRUTF.hpp"

#include <unicode/normalizer2.h>
#include <unicode/uchar.h>
#include <unicode/unistr.h>

namespace {

// Pattern units of LIKE outside the Unicode range stand for the wildcards.
constexpr char32_t kAnyCharacter = 0x110000;
constexpr char32_t kAnyRun = 0x110001;

std::u32string codePoints(const std::string& text) {
  const std::wstring wide = KRUTF::wideFromUTF8(text);
  return std::u32string(wide.begin(), wide.end());
}

std::u32string wildcardPattern(const std::u32string& pattern) {
  std::u32string units;
  units.reserve(pattern.size());
  for (size_t i = 0; i < pattern.size(); ++i) {
    if (pattern[i] == U'\\' && i + 1 < pattern.size()) {
      units.push_back(pattern[++i]);
    } else if (pattern[i] == U'*') {
      units.push_back(kAnyRun);
    } else {
      units.push_back(pattern[i] == U'?' ? kAnyCharacter : pattern[i]);
    }
  }
  return units;
}

// Greedy wildcard matching that retries only from the last "*": O(text × pattern) at worst.
bool wildcardMatch(const std::u32string& text, const std::u32string& pattern) {
  size_t t = 0;
  size_t p = 0;
  size_t starPattern = std::u32string::npos;
  size_t starText = 0;
  while (t < text.size()) {
    if (p < pattern.size() && (pattern[p] == kAnyCharacter || pattern[p] == text[t])) {
      ++t;
      ++p;
    } else if (p < pattern.size() && pattern[p] == kAnyRun) {
      starPattern = p++;
      starText = t;
    } else if (starPattern != std::u32string::npos) {
      p = starPattern + 1;
      t = ++starText;
    } else {
      return false;
    }
  }
  while (p < pattern.size() && pattern[p] == kAnyRun) ++p;
  return p == pattern.size();
}

icu::UnicodeString withoutDiacritics(const icu::UnicodeString& text) {
  UErrorCode status = U_ZERO_ERROR;
  const icu::Normalizer2* nfd = icu::Normalizer2::getNFDInstance(status);
  if (U_FAILURE(status)) return text;
  const icu::UnicodeString decomposed = nfd->normalize(text, status);
  if (U_FAILURE(status)) return text;
  icu::UnicodeString stripped;
  for (int32_t i = 0; i < decomposed.length();) {
    const UChar32 c = decomposed.char32At(i);
    if (u_charType(c) != U_NON_SPACING_MARK) stripped.append(c);
    i += U16_LENGTH(c);
  }
  return stripped;
}

}  // namespace

std::string KRStringComparator::fold(const std::string& text) const {
  if (!caseInsensitive_ && !diacriticInsensitive_) return text;
  icu::UnicodeString unicode = icu::UnicodeString::fromUTF8(text);
  if (diacriticInsensitive_) unicode = withoutDiacritics(unicode);
  if (caseInsensitive_) unicode.foldCase(U_FOLD_CASE_DEFAULT);
  std::string folded;
  unicode.toUTF8String(folded);
  return folded;
}

KRComparisonResult KRStringComparator::compare(const std::string& a, const std::string& b) const {
  // UTF-8 byte order is code point order.
  const int order = fold(a).compare(fold(b));
  if (order < 0) return KROrderedAscending;
  return order > 0 ? KROrderedDescending : KROrderedSame;
}

bool KRStringComparator::beginsWith(const std::string& text, const std::string& prefix) const {
  return fold(text).starts_with(fold(prefix));
}

bool KRStringComparator::endsWith(const std::string& text, const std::string& suffix) const {
  return fold(text).ends_with(fold(suffix));
}

bool KRStringComparator::contains(const std::string& text, const std::string& part) const {
  return fold(text).find(fold(part)) != std::string::npos;
}

bool KRStringComparator::like(const std::string& text, const std::string& pattern) const {
  return wildcardMatch(codePoints(fold(text)), wildcardPattern(codePoints(fold(pattern))));
}
