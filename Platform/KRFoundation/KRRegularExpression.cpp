#include "KRFoundation/KRRegularExpression.hpp"

#include <unicode/regex.h>
#include <unicode/utypes.h>

#include "KRFoundation/KRException.hpp"

namespace {

// Steps of ICU's match engine before a match gives up: roughly a second of backtracking.
constexpr int32_t kMatchTimeLimit = 1000;

}  // namespace

KRRegularExpression::KRRegularExpression(const std::string& pattern, bool caseInsensitive,
                                         bool diacriticInsensitive)
    : pattern_(pattern), folding_(false, diacriticInsensitive) {
  UParseError where{};
  UErrorCode status = U_ZERO_ERROR;
  // Neither UREGEX_DOTALL nor UREGEX_MULTILINE: line breaks stay ordinary characters.
  const uint32_t flags = caseInsensitive ? UREGEX_CASE_INSENSITIVE : 0;
  compiled_.reset(
      icu::RegexPattern::compile(icu::UnicodeString::fromUTF8(folding_.fold(pattern)), flags, where, status));
  if (U_FAILURE(status) || !compiled_) {
    KRException::raise(KRException::NSInvalidArgumentException,
                       "Invalid regular expression \"" + pattern + "\": " + u_errorName(status) +
                           " at offset " + std::to_string(where.offset));
  }
}

bool KRRegularExpression::matches(const std::string& text) const {
  const icu::UnicodeString input = icu::UnicodeString::fromUTF8(folding_.fold(text));
  UErrorCode status = U_ZERO_ERROR;
  std::unique_ptr<icu::RegexMatcher> matcher(compiled_->matcher(input, status));
  if (U_FAILURE(status)) return false;
  matcher->setTimeLimit(kMatchTimeLimit, status);
  const bool matched = matcher->matches(status);
  return U_SUCCESS(status) && matched;
}
