#include "KRFoundation/KRNumber.hpp"

#include <gtest/gtest.h>

#include <limits>
#include <unordered_set>

TEST(KRNumberTest, NilNumberAnswersZeroAndIsNotEqualToZero) {
  KRNumber nil;
  EXPECT_TRUE(nil.isNil());
  EXPECT_EQ(nil.longLongValue(), 0);
  EXPECT_FALSE(nil == KRNumber::numberWithLongLong(0));
  EXPECT_TRUE(nil == KRNumber());
}

TEST(KRNumberTest, NumbersCompareByValueWhateverTheirKind) {
  EXPECT_EQ(KRNumber::numberWithLongLong(1), KRNumber::numberWithDouble(1.0));
  EXPECT_EQ(KRNumber::numberWithBool(true), KRNumber::numberWithLongLong(1));
  EXPECT_EQ(KRNumber::numberWithBool(false), KRNumber::numberWithUnsignedLongLong(0));
  EXPECT_FALSE(KRNumber::numberWithLongLong(1) == KRNumber::numberWithDouble(1.5));
  EXPECT_EQ(KRNumber::numberWithLongLong(-3).compare(KRNumber::numberWithDouble(-2.5)), KROrderedAscending);
  EXPECT_EQ(KRNumber::numberWithDouble(2.5).compare(KRNumber::numberWithLongLong(2)), KROrderedDescending);
}

TEST(KRNumberTest, LargeUnsignedAndNegativeIntegersOrderExactly) {
  const auto big = KRNumber::numberWithUnsignedLongLong(std::numeric_limits<unsigned long long>::max());
  const auto negative = KRNumber::numberWithLongLong(-1);
  EXPECT_EQ(negative.compare(big), KROrderedAscending);
  EXPECT_EQ(big.compare(negative), KROrderedDescending);
  const auto almost = KRNumber::numberWithLongLong(std::numeric_limits<long long>::max());
  const auto next = KRNumber::numberWithUnsignedLongLong(9223372036854775808ULL);
  EXPECT_EQ(almost.compare(next), KROrderedAscending);
}

TEST(KRNumberTest, EqualNumbersOfDifferentKindsHashAlike) {
  EXPECT_EQ(KRNumber::numberWithLongLong(7).hash(), KRNumber::numberWithDouble(7.0).hash());
  EXPECT_EQ(KRNumber::numberWithBool(true).hash(), KRNumber::numberWithUnsignedLongLong(1).hash());
  EXPECT_EQ(KRNumber::numberWithDouble(-0.0).hash(), KRNumber::numberWithLongLong(0).hash());
  EXPECT_NE(KRNumber::numberWithLongLong(7).hash(), KRNumber::numberWithLongLong(8).hash());
}

TEST(KRNumberTest, ConversionsBetweenKinds) {
  const auto d = KRNumber::numberWithDouble(3.75);
  EXPECT_EQ(d.longLongValue(), 3);
  EXPECT_EQ(d.intValue(), 3);
  EXPECT_TRUE(d.boolValue());
  EXPECT_DOUBLE_EQ(KRNumber::numberWithLongLong(-4).doubleValue(), -4.0);
  EXPECT_EQ(KRNumber::numberWithDouble(1e300).longLongValue(), std::numeric_limits<long long>::max());
  EXPECT_EQ(KRNumber::numberWithDouble(std::numeric_limits<double>::quiet_NaN()).longLongValue(), 0);
  EXPECT_FALSE(KRNumber::numberWithLongLong(0).boolValue());
}

TEST(KRNumberTest, StringValueOfEachKind) {
  EXPECT_EQ(KRNumber::numberWithBool(true).stringValue(), "1");
  EXPECT_EQ(KRNumber::numberWithLongLong(-42).stringValue(), "-42");
  EXPECT_EQ(KRNumber::numberWithUnsignedLongLong(18446744073709551615ULL).stringValue(),
            "18446744073709551615");
  EXPECT_EQ(KRNumber::numberWithDouble(3.0).stringValue(), "3");
  EXPECT_EQ(KRNumber::numberWithDouble(0.1).stringValue(), "0.1");
}

TEST(KRNumberTest, NaNEqualsItselfAndOrdersFirst) {
  const auto nan = KRNumber::numberWithDouble(std::numeric_limits<double>::quiet_NaN());
  EXPECT_EQ(nan.compare(KRNumber::numberWithDouble(std::numeric_limits<double>::quiet_NaN())), KROrderedSame);
  EXPECT_EQ(nan.compare(KRNumber::numberWithLongLong(-100)), KROrderedAscending);
}

TEST(KRNumberTest, EqualButDistinctObjects) {
  const auto a = KRNumber::numberWithLongLong(5);
  const auto b = KRNumber::numberWithLongLong(5);
  EXPECT_EQ(a, b);
  EXPECT_FALSE(identical(a, b));
  const auto c = a;
  EXPECT_TRUE(identical(a, c));
  EXPECT_EQ(a.kind(), KRNumber::Kind::Int);
}
