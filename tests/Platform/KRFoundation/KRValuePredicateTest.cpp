#include "KRFoundation/KRValuePredicate.hpp"

#include <gtest/gtest.h>

TEST(KRValuePredicateTest, AnswersItsValueForAnyObject) {
  const auto yes = KRValuePredicate::predicateWithValue(true);
  const auto no = KRValuePredicate::predicateWithValue(false);
  for (const KRValue& object : {KRValue(), KRValue(1), KRValue("x"), KRValue(KRArray{1})}) {
    EXPECT_TRUE(yes->evaluateWithObject(object));
    EXPECT_FALSE(no->evaluateWithObject(object));
  }
  EXPECT_TRUE(yes->value());
  EXPECT_FALSE(no->value());
}

TEST(KRValuePredicateTest, FormatsAsTheConstantKeywords) {
  EXPECT_EQ(KRValuePredicate::predicateWithValue(true)->predicateFormat(), "TRUEPREDICATE");
  EXPECT_EQ(KRValuePredicate::predicateWithValue(false)->description(), "FALSEPREDICATE");
}

TEST(KRValuePredicateTest, EqualWhenTheValuesAre) {
  const auto yes = KRValuePredicate::predicateWithValue(true);
  EXPECT_TRUE(yes->isEqual(KRValuePredicate::predicateWithValue(true)));
  EXPECT_EQ(yes->hash(), KRValuePredicate::predicateWithValue(true)->hash());
  EXPECT_FALSE(yes->isEqual(KRValuePredicate::predicateWithValue(false)));
  EXPECT_NE(yes->hash(), KRValuePredicate::predicateWithValue(false)->hash());
  EXPECT_FALSE(yes->isEqual(KRPredicate::predicateWithFormat("a == 1")));
}
