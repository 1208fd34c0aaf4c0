#include "KRFoundation/KRCompoundPredicate.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

// A predicate that records that it ran and answers a fixed value.
KRPredicatePtr recording(bool answer, std::vector<int>& calls, int name) {
  return KRPredicate::predicateWithBlock([answer, &calls, name](const KRValue&, const KRDictionary&) {
    calls.push_back(name);
    return answer;
  });
}

KRPredicatePtr format(const std::string& text) { return KRPredicate::predicateWithFormat(text); }

}  // namespace

TEST(KRCompoundPredicateTest, AndStopsAtTheFirstFalse) {
  std::vector<int> calls;
  const auto predicate = KRCompoundPredicate::andPredicateWithSubpredicates(
      {recording(true, calls, 1), recording(false, calls, 2), recording(true, calls, 3)});
  EXPECT_FALSE(predicate->evaluateWithObject(KRValue()));
  EXPECT_EQ(calls, (std::vector<int>{1, 2}));
}

TEST(KRCompoundPredicateTest, OrStopsAtTheFirstTrue) {
  std::vector<int> calls;
  const auto predicate = KRCompoundPredicate::orPredicateWithSubpredicates(
      {recording(false, calls, 1), recording(true, calls, 2), recording(false, calls, 3)});
  EXPECT_TRUE(predicate->evaluateWithObject(KRValue()));
  EXPECT_EQ(calls, (std::vector<int>{1, 2}));
}

TEST(KRCompoundPredicateTest, EmptyCompounds) {
  EXPECT_TRUE(KRCompoundPredicate::andPredicateWithSubpredicates({})->evaluateWithObject(KRValue()));
  EXPECT_FALSE(KRCompoundPredicate::orPredicateWithSubpredicates({})->evaluateWithObject(KRValue()));
  EXPECT_EQ(KRCompoundPredicate::andPredicateWithSubpredicates({})->predicateFormat(), "TRUEPREDICATE");
  EXPECT_EQ(KRCompoundPredicate::orPredicateWithSubpredicates({})->predicateFormat(), "FALSEPREDICATE");
}

TEST(KRCompoundPredicateTest, NotInverts) {
  const auto predicate = KRCompoundPredicate::notPredicateWithSubpredicate(format("a == 1"));
  EXPECT_FALSE(predicate->evaluateWithObject(KRDictionary{{"a", 1}}));
  EXPECT_TRUE(predicate->evaluateWithObject(KRDictionary{{"a", 2}}));
  EXPECT_EQ(predicate->compoundPredicateType(), KRCompoundPredicate::Type::Not);
  EXPECT_EQ(predicate->subpredicates().size(), 1u);
}

TEST(KRCompoundPredicateTest, BindingsReachTheSubpredicates) {
  const auto predicate =
      KRCompoundPredicate::andPredicateWithSubpredicates({format("a >= $low"), format("a <= $high")});
  const KRDictionary object{{"a", 5}};
  EXPECT_TRUE(predicate->evaluateWithObject(object, KRDictionary{{"low", 1}, {"high", 9}}));
  EXPECT_FALSE(predicate->evaluateWithObject(object, KRDictionary{{"low", 6}, {"high", 9}}));
}

TEST(KRCompoundPredicateTest, FormatsGroupNestedCompounds) {
  const auto inner = KRCompoundPredicate::orPredicateWithSubpredicates({format("a == 1"), format("b == 2")});
  const auto outer = KRCompoundPredicate::andPredicateWithSubpredicates(
      {inner, KRCompoundPredicate::notPredicateWithSubpredicate(format("c == 3"))});
  EXPECT_EQ(outer->predicateFormat(), "(a == 1 OR b == 2) AND NOT c == 3");
  EXPECT_EQ(KRCompoundPredicate::notPredicateWithSubpredicate(inner)->predicateFormat(),
            "NOT (a == 1 OR b == 2)");
  EXPECT_EQ(KRCompoundPredicate::orPredicateWithSubpredicates({format("a == 1")})->predicateFormat(),
            "a == 1");
  EXPECT_TRUE(KRPredicate::predicateWithFormat(outer->predicateFormat())->isEqual(outer));
}

TEST(KRCompoundPredicateTest, FactoriesRejectMissingSubpredicates) {
  EXPECT_THROW(KRCompoundPredicate::andPredicateWithSubpredicates({nullptr}), KRException);
  EXPECT_THROW(KRCompoundPredicate::notPredicateWithSubpredicate(nullptr), KRException);
  EXPECT_THROW(KRCompoundPredicate::predicateWithType(KRCompoundPredicate::Type::Not, {}), KRException);
}

TEST(KRCompoundPredicateTest, FactoriesRejectUnknownTypes) {
  for (const int value : {-1, 3, 42}) {
    SCOPED_TRACE(value);
    try {
      KRCompoundPredicate::predicateWithType(static_cast<KRCompoundPredicate::Type>(value),
                                             {format("a == 1"), format("b == 2")});
      ADD_FAILURE() << "no exception";
    } catch (const KRException& exception) {
      EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
      EXPECT_NE(exception.reason().str().find("Unknown compound predicate type"), std::string::npos);
    }
  }
}

TEST(KRCompoundPredicateTest, EqualityComparesTypeAndSubpredicatesInOrder) {
  const auto a = format("a == 1");
  const auto b = format("b == 2");
  const auto both = KRCompoundPredicate::andPredicateWithSubpredicates({a, b});
  EXPECT_TRUE(both->isEqual(
      KRCompoundPredicate::andPredicateWithSubpredicates({format("a == 1"), format("b == 2")})));
  EXPECT_EQ(both->hash(), KRCompoundPredicate::andPredicateWithSubpredicates({a, b})->hash());
  EXPECT_FALSE(both->isEqual(KRCompoundPredicate::andPredicateWithSubpredicates({b, a})));
  EXPECT_FALSE(both->isEqual(KRCompoundPredicate::orPredicateWithSubpredicates({a, b})));
  EXPECT_FALSE(both->isEqual(KRCompoundPredicate::andPredicateWithSubpredicates({a})));
}
