#include "KRFoundation/KRComparisonOperator.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"

namespace {

using Type = KRComparisonOperator::Type;

bool holds(Type type, const KRValue& left, const KRValue& right, unsigned options = 0) {
  return KRComparisonOperator(type, options).evaluate(left, right);
}

class Tag : public KRObject {};

}  // namespace

TEST(KRComparisonOperatorTest, EqualityOfNumbersIgnoresTheirKind) {
  EXPECT_TRUE(holds(Type::EqualTo, 1, 1.0));
  EXPECT_TRUE(holds(Type::EqualTo, true, 1));
  EXPECT_TRUE(holds(Type::EqualTo, 18446744073709551615ull, 18446744073709551615ull));
  EXPECT_FALSE(holds(Type::EqualTo, 18446744073709551615ull, -1));
  EXPECT_FALSE(holds(Type::EqualTo, 9007199254740993LL, 9007199254740992.0));
}

TEST(KRComparisonOperatorTest, NilEqualsOnlyNilAndNull) {
  EXPECT_TRUE(holds(Type::EqualTo, KRValue(), KRValue()));
  EXPECT_TRUE(holds(Type::EqualTo, KRValue(), KRValue::null()));
  EXPECT_FALSE(holds(Type::EqualTo, KRValue(), 0));
  EXPECT_FALSE(holds(Type::EqualTo, "", KRValue()));
  EXPECT_TRUE(holds(Type::NotEqualTo, KRValue(), false));
  EXPECT_FALSE(holds(Type::LessThan, KRValue(), 1));
  EXPECT_FALSE(holds(Type::GreaterThanOrEqualTo, KRValue(), KRValue()));
}

TEST(KRComparisonOperatorTest, OrderExistsOnlyWithinNumbersStringsAndDates) {
  EXPECT_TRUE(holds(Type::LessThan, 1, 2.5));
  EXPECT_TRUE(holds(Type::LessThan, "B", "a"));
  EXPECT_TRUE(holds(Type::GreaterThan, "é", "z"));
  EXPECT_TRUE(holds(Type::LessThanOrEqualTo, KRDate::dateWithTimeIntervalSince1970(1),
                    KRDate::dateWithTimeIntervalSince1970(1)));
  EXPECT_FALSE(holds(Type::LessThan, 1, "2"));
  EXPECT_FALSE(holds(Type::GreaterThan, "2", 1));
  EXPECT_FALSE(holds(Type::LessThan, "abc", 5));
  EXPECT_FALSE(holds(Type::GreaterThanOrEqualTo, "abc", 5));
  EXPECT_FALSE(holds(Type::Between, "abc", KRArray{1, 9}));
  EXPECT_FALSE(holds(Type::LessThan, KRArray{1}, KRArray{2}));
  EXPECT_FALSE(holds(Type::LessThan, KRDate::dateWithTimeIntervalSince1970(1), 2));
}

TEST(KRComparisonOperatorTest, OtherValuesUseTheirOwnEquality) {
  const auto tag = std::make_shared<Tag>();
  EXPECT_TRUE(holds(Type::EqualTo, tag, tag));
  EXPECT_FALSE(holds(Type::EqualTo, tag, std::make_shared<Tag>()));
  EXPECT_TRUE(holds(Type::EqualTo, KRArray{1, "a"}, KRArray{1, "a"}));
  EXPECT_TRUE(holds(Type::EqualTo, KRDictionary{{"k", 1}}, KRDictionary{{"k", 1}}));
  EXPECT_FALSE(holds(Type::EqualTo, KRArray{1}, KRSet{1}));
}

TEST(KRComparisonOperatorTest, OptionsFoldStrings) {
  EXPECT_TRUE(holds(Type::EqualTo, "ÉCOLE", "école", KRComparisonOperator::CaseInsensitive));
  EXPECT_FALSE(holds(Type::EqualTo, "ÉCOLE", "ecole", KRComparisonOperator::CaseInsensitive));
  EXPECT_TRUE(holds(Type::EqualTo, "ÉCOLE", "ecole",
                    KRComparisonOperator::CaseInsensitive | KRComparisonOperator::DiacriticInsensitive));
  EXPECT_TRUE(holds(Type::LessThan, "b", "C", KRComparisonOperator::CaseInsensitive));
  EXPECT_TRUE(holds(Type::NotEqualTo, "a", "A"));
}

TEST(KRComparisonOperatorTest, MembershipInCollectionsAndStrings) {
  EXPECT_TRUE(holds(Type::In, 2, KRArray{1, 2}));
  EXPECT_TRUE(holds(Type::In, 2, KRSet{2.0}));
  EXPECT_TRUE(holds(Type::In, KRValue(), KRArray{KRValue::null()}));
  EXPECT_FALSE(holds(Type::In, 3, KRArray{1, 2}));
  EXPECT_FALSE(holds(Type::In, 1, 1));
  EXPECT_FALSE(holds(Type::In, 1, KRDictionary{{"k", 1}}));
  EXPECT_TRUE(holds(Type::In, "ell", "Hello"));
  EXPECT_FALSE(holds(Type::In, 1, "1"));
  EXPECT_TRUE(holds(Type::In, "A", KRArray{"a"}, KRComparisonOperator::CaseInsensitive));
  EXPECT_TRUE(holds(Type::Contains, KRArray{"x", "y"}, "y"));
  EXPECT_TRUE(holds(Type::Contains, "Hello", "ELL", KRComparisonOperator::CaseInsensitive));
}

TEST(KRComparisonOperatorTest, BetweenIsInclusiveAndNeedsTwoBounds) {
  EXPECT_TRUE(holds(Type::Between, 1, KRArray{1, 3}));
  EXPECT_TRUE(holds(Type::Between, 3, KRArray{1, 3}));
  EXPECT_FALSE(holds(Type::Between, 4, KRArray{1, 3}));
  EXPECT_FALSE(holds(Type::Between, 2, KRArray{3, 1}));
  EXPECT_FALSE(holds(Type::Between, 2, KRArray{1}));
  EXPECT_FALSE(holds(Type::Between, 2, KRSet{1, 3}));
  EXPECT_FALSE(holds(Type::Between, KRValue(), KRArray{1, 3}));
}

TEST(KRComparisonOperatorTest, ConstantPatternsCompileOnceAndInvalidOnesRaise) {
  const KRComparisonOperator matches(Type::Matches, 0, "[0-9]+");
  EXPECT_TRUE(matches.evaluate("2024", "[0-9]+"));
  EXPECT_FALSE(matches.evaluate("20x4", "[0-9]+"));
  EXPECT_TRUE(matches.evaluate("abc", "[a-z]+"));
  EXPECT_THROW(KRComparisonOperator(Type::Matches, 0, "(unclosed"), KRException);
  EXPECT_THROW(holds(Type::Matches, "text", "(unclosed"), KRException);
  EXPECT_NO_THROW(KRComparisonOperator(Type::EqualTo, 0, "(unclosed"));
}

TEST(KRComparisonOperatorTest, Symbols) {
  EXPECT_EQ(KRComparisonOperator(Type::LessThanOrEqualTo, 0).symbol(), "<=");
  EXPECT_EQ(KRComparisonOperator(Type::NotEqualTo, 0).symbol(), "!=");
  EXPECT_EQ(KRComparisonOperator(Type::BeginsWith, KRComparisonOperator::CaseInsensitive).symbol(),
            "BEGINSWITH[c]");
  EXPECT_EQ(KRComparisonOperator(Type::Like, KRComparisonOperator::DiacriticInsensitive).symbol(), "LIKE[d]");
  EXPECT_EQ(KRComparisonOperator(Type::In, 3).symbol(), "IN[cd]");
  EXPECT_EQ(KRComparisonOperator(Type::Between, 8).options(), 0u);
}
