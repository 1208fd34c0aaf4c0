#pragma once

#include "KRFoundation/KRNumber.hpp"

// Arithmetic on numbers for expressions. Booleans count as the integers 0 and 1.
//
// - add, subtract, multiply: integers give an integer (signed, or unsigned when only that holds the
//   result) and fall back to a double when the exact result does not fit 64 bits; any double operand
//   gives a double.
// - divide always gives a double (IEEE: x/0 is infinite, 0/0 is NaN).
// - power: an integer raised to a non-negative integer is an integer while it fits; otherwise a double.
// - A nil operand gives nil.
class KRNumberArithmetic {
 public:
  static KRNumber add(const KRNumber& a, const KRNumber& b);
  static KRNumber subtract(const KRNumber& a, const KRNumber& b);
  static KRNumber multiply(const KRNumber& a, const KRNumber& b);
  static KRNumber divide(const KRNumber& a, const KRNumber& b);
  static KRNumber power(const KRNumber& base, const KRNumber& exponent);
  static KRNumber negate(const KRNumber& a);
};
