#include "KRFoundation/KRComparisonPredicate.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"

namespace {

using Modifier = KRComparisonPredicate::Modifier;
using Type = KRComparisonOperator::Type;

std::shared_ptr<KRExpression> key(const std::string& keyPath) {
  return KRExpression::expressionForKeyPath(keyPath);
}
std::shared_ptr<KRExpression> constant(const KRValue& value) {
  return KRExpression::expressionForConstantValue(value);
}

std::shared_ptr<KRComparisonPredicate> comparison(const std::string& keyPath, Type type, const KRValue& value,
                                                  Modifier modifier = Modifier::Direct,
                                                  unsigned options = 0) {
  return KRComparisonPredicate::predicateWithLeftExpression(key(keyPath), constant(value), modifier, type,
                                                            options);
}

const KRDictionary kAlbum{
    {"title", "Summer"}, {"year", 2021}, {"ratings", KRArray{2, 4, 5}}, {"tags", KRSet{"sea", "Sun"}}};

}  // namespace

TEST(KRComparisonPredicateTest, BuiltComparisonsEvaluate) {
  EXPECT_TRUE(comparison("title", Type::EqualTo, "Summer")->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("year", Type::GreaterThan, 2000)->evaluateWithObject(kAlbum));
  EXPECT_FALSE(comparison("year", Type::LessThanOrEqualTo, 2020)->evaluateWithObject(kAlbum));
  EXPECT_TRUE(
      comparison("title", Type::BeginsWith, "sum", Modifier::Direct, KRComparisonOperator::CaseInsensitive)
          ->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("year", Type::Between, KRArray{2020, 2022})->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("title", Type::Matches, "S[a-z]+")->evaluateWithObject(kAlbum));
}

TEST(KRComparisonPredicateTest, ModifiersApplyToEachElement) {
  EXPECT_TRUE(
      comparison("ratings", Type::GreaterThanOrEqualTo, 5, Modifier::Any)->evaluateWithObject(kAlbum));
  EXPECT_FALSE(comparison("ratings", Type::GreaterThan, 5, Modifier::Any)->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("ratings", Type::GreaterThan, 1, Modifier::All)->evaluateWithObject(kAlbum));
  EXPECT_FALSE(comparison("ratings", Type::GreaterThan, 2, Modifier::All)->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("tags", Type::EqualTo, "sun", Modifier::Any, KRComparisonOperator::CaseInsensitive)
                  ->evaluateWithObject(kAlbum));
  EXPECT_FALSE(comparison("tags", Type::EqualTo, "sun", Modifier::Any)->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("ratings", Type::In, KRArray{2, 4, 5}, Modifier::All)->evaluateWithObject(kAlbum));
  EXPECT_THROW(comparison("title", Type::EqualTo, "S", Modifier::Any)->evaluateWithObject(kAlbum),
               KRException);
}

TEST(KRComparisonPredicateTest, ModifierOnAMissingCollection) {
  EXPECT_FALSE(comparison("missing", Type::EqualTo, 1, Modifier::Any)->evaluateWithObject(kAlbum));
  EXPECT_TRUE(comparison("missing", Type::EqualTo, 1, Modifier::All)->evaluateWithObject(kAlbum));
}

TEST(KRComparisonPredicateTest, FactoryValidatesItsParts) {
  EXPECT_THROW(KRComparisonPredicate::predicateWithLeftExpression(nullptr, constant(1), Modifier::Direct,
                                                                  Type::EqualTo),
               KRException);
  EXPECT_THROW(comparison("title", Type::Matches, "[unclosed"), KRException);
  EXPECT_THROW(comparison("year", Type::Between, KRArray{1}), KRException);
  EXPECT_THROW(comparison("year", Type::Between, 5), KRException);
  EXPECT_NO_THROW(KRComparisonPredicate::predicateWithLeftExpression(key("year"), key("bounds"),
                                                                     Modifier::Direct, Type::Between));
}

TEST(KRComparisonPredicateTest, PatternsFromKeyPathsCompileAtEvaluation) {
  const auto predicate = KRComparisonPredicate::predicateWithLeftExpression(key("text"), key("pattern"),
                                                                            Modifier::Direct, Type::Matches);
  EXPECT_TRUE(predicate->evaluateWithObject(KRDictionary{{"text", "abc"}, {"pattern", "a.c"}}));
  EXPECT_FALSE(predicate->evaluateWithObject(KRDictionary{{"text", "abd"}, {"pattern", "a.c"}}));
  EXPECT_THROW(predicate->evaluateWithObject(KRDictionary{{"text", "abc"}, {"pattern", "("}}), KRException);
}

TEST(KRComparisonPredicateTest, Accessors) {
  const auto predicate =
      comparison("tags", Type::Contains, "x", Modifier::All, KRComparisonOperator::DiacriticInsensitive);
  EXPECT_EQ(predicate->leftExpression()->keyPath(), "tags");
  EXPECT_EQ(predicate->rightExpression()->constantValue(), KRValue("x"));
  EXPECT_EQ(predicate->comparisonPredicateModifier(), Modifier::All);
  EXPECT_EQ(predicate->predicateOperatorType(), Type::Contains);
  EXPECT_EQ(predicate->options(), KRComparisonOperator::DiacriticInsensitive);
}

TEST(KRComparisonPredicateTest, Formats) {
  EXPECT_EQ(comparison("a.b", Type::EqualTo, 1)->predicateFormat(), "a.b == 1");
  EXPECT_EQ(comparison("name", Type::Like, "x*", Modifier::Direct, 3)->predicateFormat(),
            "name LIKE[cd] \"x*\"");
  EXPECT_EQ(comparison("tags", Type::In, KRArray{1, 2}, Modifier::Any)->predicateFormat(),
            "ANY tags IN {1, 2}");
  EXPECT_EQ(comparison("tags", Type::GreaterThan, 0, Modifier::All)->predicateFormat(), "ALL tags > 0");
  EXPECT_EQ(comparison("SELF", Type::NotEqualTo, KRValue())->predicateFormat(), "SELF != nil");
  EXPECT_EQ(comparison("in", Type::EqualTo, true)->predicateFormat(), "#in == YES");
}

TEST(KRComparisonPredicateTest, EqualityComparesStructure) {
  const auto predicate = comparison("year", Type::EqualTo, 2021);
  EXPECT_TRUE(predicate->isEqual(comparison("year", Type::EqualTo, 2021)));
  EXPECT_EQ(predicate->hash(), comparison("year", Type::EqualTo, 2021)->hash());
  EXPECT_FALSE(predicate->isEqual(comparison("year", Type::EqualTo, 2022)));
  EXPECT_FALSE(predicate->isEqual(comparison("year", Type::NotEqualTo, 2021)));
  EXPECT_FALSE(predicate->isEqual(comparison("year", Type::EqualTo, 2021, Modifier::Any)));
  EXPECT_FALSE(predicate->isEqual(comparison("year", Type::EqualTo, 2021, Modifier::Direct, 1)));
  EXPECT_FALSE(predicate->isEqual(comparison("month", Type::EqualTo, 2021)));
  EXPECT_FALSE(predicate->isEqual(KRPredicate::predicateWithValue(true)));
}
