#pragma once

#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

#include "KRFoundation/KRRegularExpression.hpp"
#include "KRFoundation/KRStringComparator.hpp"
#include "KRFoundation/KRValue.hpp"

// The operator of a comparison predicate with its options, applied to two evaluated values.
//
// - Equality: nil and null equal each other and nothing else; numbers compare by value whatever their
//   kind (booleans are 0 and 1), strings by code point (folded with [c]/[d]), dates by time; values of
//   different types are unequal; other values of one type (arrays, sets, dictionaries, objects) use
//   their own equality.
// - Order (< <= > >= BETWEEN) exists between two numbers, two strings or two dates only; anything else
//   (nil included, and a string against a number: "abc" < 5) is unordered and every ordering test is
//   false. Unlike the platform, which raises there, it never throws: membership tests evaluate
//   predicates in parallel and must not throw.
// - BEGINSWITH, ENDSWITH, LIKE and MATCHES need two strings, otherwise they are false.
// - IN: the left value is an element of the right array or set (by the equality above), or a
//   substring of the right string. CONTAINS is IN with the sides swapped.
// - BETWEEN: the right value is an array of two bounds; the test is inclusive.
// - MATCHES compiles a constant pattern once, at construction; a pattern only known at evaluation is
//   compiled then, and an invalid one raises NSInvalidArgumentException.
// Immutable after construction: evaluate may run on several threads at once.
class KRComparisonOperator {
 public:
  enum class Type {
    LessThan,
    LessThanOrEqualTo,
    GreaterThan,
    GreaterThanOrEqualTo,
    EqualTo,
    NotEqualTo,
    Matches,
    Like,
    BeginsWith,
    EndsWith,
    In,
    Contains,
    Between
  };
  enum Option : unsigned { CaseInsensitive = 1, DiacriticInsensitive = 2 };

  // `constantRight` is the right value when known before evaluation (it compiles MATCHES patterns).
  KRComparisonOperator(Type type, unsigned options, const KRValue& constantRight = {});

  Type type() const { return type_; }
  unsigned options() const { return options_; }
  bool evaluate(const KRValue& left, const KRValue& right) const;
  // The members of an array or set; empty for any other value.
  static std::vector<KRValue> elements(const KRValue& collection);
  // The operator as written in a format, with its options: "==", "BEGINSWITH[cd]".
  std::string symbol() const;

 private:
  bool isEqual(const KRValue& left, const KRValue& right) const;
  std::optional<KRComparisonResult> order(const KRValue& left, const KRValue& right) const;
  // Whether the two values are ordered and their order is one of the accepted ones.
  bool orderIs(const KRValue& left, const KRValue& right,
               std::initializer_list<KRComparisonResult> accepted) const;
  bool contains(const KRValue& container, const KRValue& element) const;
  bool isBetween(const KRValue& value, const KRValue& bounds) const;
  bool matches(const KRValue& text, const KRValue& pattern) const;
  bool testStrings(const KRValue& left, const KRValue& right,
                   bool (KRStringComparator::*test)(const std::string&, const std::string&) const) const;

  Type type_;
  unsigned options_;
  KRStringComparator strings_;
  std::optional<KRRegularExpression> regularExpression_;
};
