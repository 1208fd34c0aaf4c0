#include "KRFoundation/KRBlockPredicate.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"

TEST(KRBlockPredicateTest, CallsTheBlockWithObjectAndBindings) {
  KRValue seenObject;
  KRDictionary seenBindings;
  const auto predicate =
      KRBlockPredicate::predicateWithBlock([&](const KRValue& object, const KRDictionary& bindings) {
        seenObject = object;
        seenBindings = bindings;
        return object == KRValue("yes");
      });
  EXPECT_TRUE(predicate->evaluateWithObject("yes", KRDictionary{{"k", 1}}));
  EXPECT_EQ(seenObject, KRValue("yes"));
  EXPECT_EQ(seenBindings, (KRDictionary{{"k", 1}}));
  EXPECT_FALSE(predicate->evaluateWithObject("no"));
  EXPECT_TRUE(seenBindings.isNil());
}

TEST(KRBlockPredicateTest, EqualOnlyToItself) {
  const auto block = [](const KRValue&, const KRDictionary&) { return true; };
  const auto predicate = KRBlockPredicate::predicateWithBlock(block);
  EXPECT_TRUE(predicate->isEqual(predicate));
  EXPECT_FALSE(predicate->isEqual(KRBlockPredicate::predicateWithBlock(block)));
}

TEST(KRBlockPredicateTest, FormatNamesTheBlockAndDoesNotParse) {
  const auto predicate =
      KRBlockPredicate::predicateWithBlock([](const KRValue&, const KRDictionary&) { return true; });
  EXPECT_EQ(predicate->predicateFormat().rfind("BLOCKPREDICATE(0x", 0), 0u);
  EXPECT_THROW(KRPredicate::predicateWithFormat(predicate->predicateFormat()), KRException);
}

TEST(KRBlockPredicateTest, EmptyBlocksAreRefused) {
  EXPECT_THROW(KRBlockPredicate::predicateWithBlock({}), KRException);
  EXPECT_THROW(KRPredicate::predicateWithBlock({}), KRException);
}
