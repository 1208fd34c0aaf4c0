#pragma once

#include <unicode/uversion.h>

#include <memory>
#include <string>

#include "KRFoundation/KRStringComparator.hpp"

U_NAMESPACE_BEGIN
class RegexPattern;
U_NAMESPACE_END

// An ICU regular expression for MATCHES: compiled once, then matched against whole texts.
//
// Line breaks are ordinary characters: "." does not match a line terminator, and ^ and $ anchor at the
// start and end of the whole text only, so "a\nb" matches neither "a.b" nor "^a$.*" (the inline flags
// (?s) and (?m) turn these on for one pattern).
// The compiled pattern is immutable and shared; every match makes its own matcher, so one expression
// may be matched from several threads at once. Diacritic-insensitive expressions strip the diacritics
// of the pattern and of every text (KRStringComparator folding); case-insensitive ones use ICU's
// case-insensitive matching. A match that runs past a time limit (runaway backtracking) counts as no
// match, so matching always ends.
class KRRegularExpression {
 public:
  // Raises NSInvalidArgumentException when the pattern is not a valid regular expression.
  KRRegularExpression(const std::string& pattern, bool caseInsensitive, bool diacriticInsensitive);

  const std::string& pattern() const { return pattern_; }
  // Whether the whole text matches.
  bool matches(const std::string& text) const;

 private:
  std::string pattern_;
  KRStringComparator folding_;
  std::shared_ptr<const icu::RegexPattern> compiled_;
};
