#include "KRFoundation/KRNumberArithmetic.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

KRNumber integer(long long value) { return KRNumber::numberWithLongLong(value); }
KRNumber unsignedInteger(unsigned long long value) { return KRNumber::numberWithUnsignedLongLong(value); }
KRNumber real(double value) { return KRNumber::numberWithDouble(value); }

constexpr long long kMax = std::numeric_limits<long long>::max();
constexpr long long kMin = std::numeric_limits<long long>::min();
constexpr unsigned long long kUnsignedMax = std::numeric_limits<unsigned long long>::max();

}  // namespace

TEST(KRNumberArithmeticTest, IntegersStayIntegers) {
  const KRNumber sum = KRNumberArithmetic::add(integer(2), integer(3));
  EXPECT_EQ(sum.kind(), KRNumber::Kind::Int);
  EXPECT_EQ(sum.longLongValue(), 5);
  EXPECT_EQ(KRNumberArithmetic::subtract(integer(2), integer(3)).longLongValue(), -1);
  EXPECT_EQ(KRNumberArithmetic::multiply(integer(-4), integer(3)).longLongValue(), -12);
  EXPECT_EQ(KRNumberArithmetic::add(KRNumber::numberWithBool(true), integer(1)).kind(), KRNumber::Kind::Int);
  EXPECT_EQ(KRNumberArithmetic::add(KRNumber::numberWithBool(true), integer(1)).longLongValue(), 2);
}

TEST(KRNumberArithmeticTest, OverflowMovesToUnsignedThenDouble) {
  const KRNumber past = KRNumberArithmetic::add(integer(kMax), integer(1));
  EXPECT_EQ(past.kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(past.unsignedLongLongValue(), 9223372036854775808ULL);
  const KRNumber beyond = KRNumberArithmetic::add(unsignedInteger(kUnsignedMax), integer(1));
  EXPECT_EQ(beyond.kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(beyond.doubleValue(), 18446744073709551616.0);
  EXPECT_EQ(KRNumberArithmetic::subtract(integer(kMin), integer(1)).kind(), KRNumber::Kind::Double);
  const KRNumber product =
      KRNumberArithmetic::multiply(unsignedInteger(kUnsignedMax), unsignedInteger(kUnsignedMax));
  EXPECT_EQ(product.kind(), KRNumber::Kind::Double);
  EXPECT_GT(product.doubleValue(), 3.4e38);
  EXPECT_EQ(KRNumberArithmetic::subtract(unsignedInteger(0), unsignedInteger(1)).longLongValue(), -1);
}

TEST(KRNumberArithmeticTest, DoublesWinOverIntegers) {
  const KRNumber sum = KRNumberArithmetic::add(integer(1), real(0.5));
  EXPECT_EQ(sum.kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(sum.doubleValue(), 1.5);
  EXPECT_EQ(KRNumberArithmetic::multiply(real(2.0), integer(3)).kind(), KRNumber::Kind::Double);
}

TEST(KRNumberArithmeticTest, DivisionAlwaysGivesADouble) {
  const KRNumber quotient = KRNumberArithmetic::divide(integer(6), integer(3));
  EXPECT_EQ(quotient.kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(quotient.doubleValue(), 2.0);
  EXPECT_DOUBLE_EQ(KRNumberArithmetic::divide(integer(1), integer(4)).doubleValue(), 0.25);
  EXPECT_TRUE(std::isinf(KRNumberArithmetic::divide(integer(1), integer(0)).doubleValue()));
  EXPECT_TRUE(std::isnan(KRNumberArithmetic::divide(integer(0), integer(0)).doubleValue()));
}

TEST(KRNumberArithmeticTest, Powers) {
  EXPECT_EQ(KRNumberArithmetic::power(integer(2), integer(62)).longLongValue(), 1LL << 62);
  EXPECT_EQ(KRNumberArithmetic::power(integer(2), integer(63)).kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(KRNumberArithmetic::power(integer(2), integer(64)).kind(), KRNumber::Kind::Double);
  EXPECT_EQ(KRNumberArithmetic::power(integer(-3), integer(3)).longLongValue(), -27);
  EXPECT_EQ(KRNumberArithmetic::power(integer(5), integer(0)).longLongValue(), 1);
  EXPECT_EQ(KRNumberArithmetic::power(integer(1), integer(kMax)).longLongValue(), 1);
  EXPECT_EQ(KRNumberArithmetic::power(integer(-1), integer(kMax)).longLongValue(), -1);
  EXPECT_DOUBLE_EQ(KRNumberArithmetic::power(integer(2), integer(-2)).doubleValue(), 0.25);
  EXPECT_DOUBLE_EQ(KRNumberArithmetic::power(real(9), real(0.5)).doubleValue(), 3.0);
  EXPECT_TRUE(std::isinf(KRNumberArithmetic::power(integer(10), integer(400)).doubleValue()));
}

TEST(KRNumberArithmeticTest, Negation) {
  EXPECT_EQ(KRNumberArithmetic::negate(integer(5)).longLongValue(), -5);
  EXPECT_EQ(KRNumberArithmetic::negate(unsignedInteger(9223372036854775808ULL)).longLongValue(), kMin);
  EXPECT_EQ(KRNumberArithmetic::negate(integer(kMin)).kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(KRNumberArithmetic::negate(unsignedInteger(kUnsignedMax)).kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(KRNumberArithmetic::negate(real(2.5)).doubleValue(), -2.5);
  EXPECT_EQ(KRNumberArithmetic::negate(KRNumber::numberWithBool(true)).longLongValue(), -1);
}

TEST(KRNumberArithmeticTest, NilOperandsGiveNil) {
  EXPECT_TRUE(KRNumberArithmetic::add(KRNumber(), integer(1)).isNil());
  EXPECT_TRUE(KRNumberArithmetic::subtract(integer(1), KRNumber()).isNil());
  EXPECT_TRUE(KRNumberArithmetic::multiply(KRNumber(), KRNumber()).isNil());
  EXPECT_TRUE(KRNumberArithmetic::divide(KRNumber(), integer(1)).isNil());
  EXPECT_TRUE(KRNumberArithmetic::power(integer(2), KRNumber()).isNil());
  EXPECT_TRUE(KRNumberArithmetic::negate(KRNumber()).isNil());
}
