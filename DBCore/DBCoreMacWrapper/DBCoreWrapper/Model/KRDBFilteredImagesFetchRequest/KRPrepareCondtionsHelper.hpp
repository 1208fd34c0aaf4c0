#pragma once

#include <cstddef>
#include <string>

#include "KRFoundation/KRString.hpp"

// Opens and closes a computed sub-expression of a condition: "$MAT_FUNCTION[" formula "]".
extern const char* const KRPrepareConditionsStartMatFormula;
extern const char* const KRPrepareConditionsEndMatFormula;

// Expands the computed sub-expressions of condition strings: each "$MAT_FUNCTION[" formula "]" becomes
// the integer value of its formula, an expression of the platform's expression format that may call
// FUNCTION(SELF, 'currentDate'), FUNCTION(SELF, 'currentDayInterval') and FUNCTION(SELF, 'dayInterval').
// Class operations only; any thread.
class KRPrepareCondtionsHelper {
 public:
  // A range of bytes in a string; location npos when nothing was found.
  struct Range {
    static constexpr size_t npos = std::string::npos;
    size_t location = npos;
    size_t length = 0;
    bool found() const { return location != npos; }
  };

  // The condition with every sub-expression replaced by its value, left to right. Nil when a marker has
  // no closing "]" or a formula cannot be evaluated: the whole condition is then dropped.
  static KRString prepareCondition(const KRString& condition);
  // The first "$MAT_FUNCTION[", in any case.
  static Range matRangeForString(const KRString& string);
  // The decimal text of the formula's value, its fractional part cut; "0" for a value that is not a
  // number. Raises the platform's parse error for a formula that does not parse.
  static KRString calculateFormula(const KRString& formula);

  // Now, in seconds since 1970.
  static double currentDate();
  // Seconds from the start of today, in the local time zone, to now.
  static double currentDayInterval();
  static double dayInterval() { return 86400.0; }
};
