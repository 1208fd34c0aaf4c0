#pragma once

#include <string>

#include "KRFoundation/KRObject.hpp"

// String tests of predicates on UTF-8 text, optionally case-insensitive ([c]: Unicode case folding, so
// "STRASSE" equals "straße") and diacritic-insensitive ([d]: canonical decomposition with the nonspacing
// marks removed, so "résumé" equals "resume"). Both sides are folded the same way, then compared by
// code point. Invalid UTF-8 counts as U+FFFD once folded. Stateless apart from its options, so one
// comparator may be used from several threads.
class KRStringComparator {
 public:
  KRStringComparator(bool caseInsensitive, bool diacriticInsensitive)
      : caseInsensitive_(caseInsensitive), diacriticInsensitive_(diacriticInsensitive) {}

  bool caseInsensitive() const { return caseInsensitive_; }
  bool diacriticInsensitive() const { return diacriticInsensitive_; }

  // The text as compared: unchanged without options.
  std::string fold(const std::string& text) const;
  KRComparisonResult compare(const std::string& a, const std::string& b) const;
  // An empty prefix, suffix or part is found in every text.
  bool beginsWith(const std::string& text, const std::string& prefix) const;
  bool endsWith(const std::string& text, const std::string& suffix) const;
  bool contains(const std::string& text, const std::string& part) const;
  // Whole-text wildcard match: "*" matches any run of characters, "?" one character, and a backslash
  // makes the next pattern character literal.
  bool like(const std::string& text, const std::string& pattern) const;

 private:
  bool caseInsensitive_;
  bool diacriticInsensitive_;
};
