#include "KRFoundation/KRPredicate.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "KRFoundation/KRComparisonPredicate.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRExpression.hpp"

namespace {

// A small model object that answers its keys through key-value coding.
class Photo : public KRObject {
 public:
  Photo(std::string name, int rating, double date, KRArray tags, std::shared_ptr<Photo> original = nullptr)
      : name_(std::move(name)),
        rating_(rating),
        date_(date),
        tags_(std::move(tags)),
        original_(std::move(original)) {}

  KRValue valueForKey(const std::string& key) const override {
    if (key == "name") return name_;
    if (key == "rating") return rating_;
    if (key == "date") return KRDate::dateWithTimeIntervalSince1970(date_);
    if (key == "tags") return tags_;
    if (key == "original") return original_;
    if (key == "flagged") return rating_ >= 4;
    return KRObject::valueForKey(key);
  }

 private:
  const std::string name_;
  const int rating_;
  const double date_;
  const KRArray tags_;
  const std::shared_ptr<Photo> original_;
};

struct Case {
  std::string format;
  KRValue object;
  bool expected;
};

// Evaluates every case, naming the failing format.
void expectCases(const std::vector<Case>& cases, const std::vector<KRValue>& arguments = {}) {
  for (const Case& test : cases) {
    SCOPED_TRACE(test.format);
    EXPECT_EQ(KRPredicate::predicateWithFormat(test.format, arguments)->evaluateWithObject(test.object),
              test.expected);
  }
}

const KRDictionary kNumbers{{"n", 5}, {"d", 2.5}, {"big", 18446744073709551615ull}, {"negative", -3}};
const KRDictionary kStrings{{"s", "Hello"}, {"e", ""}, {"accent", "Résumé"}, {"german", "Straße"}};

std::shared_ptr<Photo> samplePhoto() {
  auto original = std::make_shared<Photo>("original.raw", 5, 1000.0, KRArray{"raw"});
  return std::make_shared<Photo>("beach.jpg", 4, 1700000000.0, KRArray{"sea", "sun"}, original);
}

}  // namespace

TEST(KRPredicateTest, NumbersCompareByValue) {
  expectCases({
      {"n == 5", kNumbers, true},
      {"n = 5", kNumbers, true},
      {"n == 5.0", kNumbers, true},
      {"n == 6", kNumbers, false},
      {"n != 6", kNumbers, true},
      {"n <> 5", kNumbers, false},
      {"n < 6", kNumbers, true},
      {"n < 5", kNumbers, false},
      {"n <= 5", kNumbers, true},
      {"n =< 4", kNumbers, false},
      {"n > 4.5", kNumbers, true},
      {"n > 5", kNumbers, false},
      {"n >= 5", kNumbers, true},
      {"n => 6", kNumbers, false},
      {"d == 2.5", kNumbers, true},
      {"d < 3", kNumbers, true},
      {"d > 2.49", kNumbers, true},
      {"negative == -3", kNumbers, true},
      {"negative < -2.5", kNumbers, true},
      {"big > 9223372036854775807", kNumbers, true},
      {"big == 18446744073709551615", kNumbers, true},
      {"1e3 == 1000", kNumbers, true},
      {"n == 1", KRDictionary{{"n", true}}, true},
      {"n > 0", KRDictionary{{"n", true}}, true},
  });
}

TEST(KRPredicateTest, StringsCompareByCodePoint) {
  expectCases({
      {"s == 'Hello'", kStrings, true},
      {"s == \"Hello\"", kStrings, true},
      {"s == 'hello'", kStrings, false},
      {"s ==[c] 'hello'", kStrings, true},
      {"s != 'World'", kStrings, true},
      {"s < 'World'", kStrings, true},
      {"s < 'hello'", kStrings, true},
      {"s > 'Hell'", kStrings, true},
      {"s >= 'Hello'", kStrings, true},
      {"s <= 'Help'", kStrings, true},
      {"e == ''", kStrings, true},
      {"accent ==[d] 'Resume'", kStrings, true},
      {"accent ==[cd] 'resume'", kStrings, true},
      {"accent == 'Resume'", kStrings, false},
      {"german ==[c] 'STRASSE'", kStrings, true},
      {"'\\u00e9' == 'é'", kStrings, true},
  });
}

TEST(KRPredicateTest, StringOperators) {
  expectCases(
      {
          {"s BEGINSWITH 'He'", kStrings, true},
          {"s BEGINSWITH 'he'", kStrings, false},
          {"s BEGINSWITH[c] 'he'", kStrings, true},
          {"s beginswith ''", kStrings, true},
          {"s ENDSWITH 'llo'", kStrings, true},
          {"s ENDSWITH 'LLO'", kStrings, false},
          {"s ENDSWITH[c] 'LLO'", kStrings, true},
          {"s CONTAINS 'ell'", kStrings, true},
          {"s CONTAINS 'xyz'", kStrings, false},
          {"s contains[c] 'ELL'", kStrings, true},
          {"accent CONTAINS 'sume'", kStrings, false},
          {"accent CONTAINS[d] 'sume'", kStrings, true},
          {"accent BEGINSWITH[cd] 'RES'", kStrings, true},
          {"accent ENDSWITH[d] 'me'", kStrings, true},
          {"s LIKE 'H*o'", kStrings, true},
          {"s LIKE 'H?llo'", kStrings, true},
          {"s LIKE 'H?lo'", kStrings, false},
          {"s LIKE '*'", kStrings, true},
          {"s LIKE 'h*'", kStrings, false},
          {"s LIKE[c] 'h*'", kStrings, true},
          {"accent LIKE[cd] 'r?sum?'", kStrings, true},
          {"s LIKE 'Hel\\\\*'", kStrings, false},
          {"'Hel*' LIKE 'Hel\\\\*'", kStrings, true},
          {"s MATCHES 'H.*o'", kStrings, true},
          {"s MATCHES 'ell'", kStrings, false},
          {"s MATCHES '[A-Z][a-z]+'", kStrings, true},
          {"s MATCHES 'hello'", kStrings, false},
          {"s MATCHES[c] 'hello'", kStrings, true},
          {"accent MATCHES[d] 'Resume'", kStrings, true},
          {"accent MATCHES[cd] 'r.sume'", kStrings, true},
          {"s MATCHES %@", kStrings, true},
      },
      {"\\w+"});
}

TEST(KRPredicateTest, StringOperatorsNeedStrings) {
  expectCases({
      {"n BEGINSWITH '5'", kNumbers, false},
      {"n CONTAINS '5'", kNumbers, false},
      {"n LIKE '*'", kNumbers, false},
      {"n MATCHES '.*'", kNumbers, false},
      {"missing BEGINSWITH ''", kNumbers, false},
      {"'abc' ENDSWITH nil", kNumbers, false},
  });
}

// Membership tests evaluate predicates in parallel, so ordering unordered values answers false instead
// of raising.
TEST(KRPredicateTest, OrderingAStringAgainstANumberIsFalse) {
  const KRDictionary object{{"s", "abc"}, {"n", 5}};
  for (const char* format : {"'abc' < 5", "'abc' >= 5", "5 > 'abc'", "s <= n", "s > n", "ANY {s} < 5",
                             "s BETWEEN {1, 9}", "n BETWEEN {'a', 'z'}"}) {
    SCOPED_TRACE(format);
    bool holds = true;
    EXPECT_NO_THROW(holds = KRPredicate::predicateWithFormat(format)->evaluateWithObject(object));
    EXPECT_FALSE(holds);
  }
  EXPECT_TRUE(KRPredicate::predicateWithFormat("NOT 'abc' < 5")->evaluateWithObject(object));
}

// The pattern matches the whole text; "." stops at line breaks and ^ $ anchor at its ends only.
TEST(KRPredicateTest, MatchesTreatsLineBreaksAsPlainCharacters) {
  const KRDictionary object{{"s", "a\nb"}};
  const std::vector<std::pair<std::string, bool>> cases = {
      {"a.b", false},  {"^a$.*", false},     {"a", false},      {"b", false},      {".*", false},
      {"a\\nb", true}, {"a[\\s\\S]b", true}, {"^a\\nb$", true}, {"(?s)a.b", true},
  };
  for (const auto& [pattern, expected] : cases) {
    SCOPED_TRACE(pattern);
    EXPECT_EQ(KRPredicate::predicateWithFormat("s MATCHES %@", {pattern})->evaluateWithObject(object),
              expected);
  }
  EXPECT_FALSE(KRPredicate::predicateWithFormat("'a\\nb' MATCHES 'a.b'")->evaluateWithObject(KRValue()));
  EXPECT_TRUE(KRPredicate::predicateWithFormat("'a\\nb' MATCHES 'a\\\\nb'")->evaluateWithObject(KRValue()));
}

TEST(KRPredicateTest, DatesCompareByTime) {
  const KRDate early = KRDate::dateWithTimeIntervalSince1970(1000);
  const KRDate late = KRDate::dateWithTimeIntervalSince1970(2000);
  const KRDictionary object{{"date", early}};
  const std::vector<std::pair<std::string, bool>> cases = {
      {"date == %@", true}, {"date != %@", false}, {"date < %@", false},
      {"date <= %@", true}, {"date >= %@", true},  {"date == CAST(-978306200, 'NSDate')", true},
  };
  for (const auto& [format, expected] : cases) {
    SCOPED_TRACE(format);
    EXPECT_EQ(KRPredicate::predicateWithFormat(format, {early})->evaluateWithObject(object), expected);
  }
  EXPECT_TRUE(KRPredicate::predicateWithFormat("date < %@", {late})->evaluateWithObject(object));
  EXPECT_FALSE(KRPredicate::predicateWithFormat("date > %@", {late})->evaluateWithObject(object));
  EXPECT_TRUE(KRPredicate::predicateWithFormat("date BETWEEN %@", {KRArray{early, late}})
                  ->evaluateWithObject(object));
  EXPECT_FALSE(KRPredicate::predicateWithFormat("date == 1000")->evaluateWithObject(object));
}

TEST(KRPredicateTest, Booleans) {
  const KRDictionary object{{"on", true}, {"off", false}};
  expectCases({
      {"on == YES", object, true},
      {"on == TRUE", object, true},
      {"on == true", object, true},
      {"off == NO", object, true},
      {"off == FALSE", object, true},
      {"on == NO", object, false},
      {"off == yes", object, false},
      {"on == 1", object, true},
      {"off == 0", object, true},
      {"on == 2", object, false},
      {"on > off", object, true},
      {"on != off", object, true},
      {"on == 'YES'", object, false},
  });
}

TEST(KRPredicateTest, NilEqualsOnlyNilAndNull) {
  const KRDictionary object{{"nothing", KRValue::null()}, {"n", 0}, {"s", ""}};
  expectCases({
      {"missing == nil", object, true},
      {"missing == NULL", object, true},
      {"nothing == nil", object, true},
      {"missing == nothing", object, true},
      {"n == nil", object, false},
      {"s == nil", object, false},
      {"missing != nil", object, false},
      {"n != nil", object, true},
      {"missing < 1", object, false},
      {"missing <= 1", object, false},
      {"missing > 1", object, false},
      {"missing >= nil", object, false},
      {"nil == nil", object, true},
      {"missing IN {1, 2}", object, false},
  });
}

TEST(KRPredicateTest, MismatchedTypesAreUnequalAndUnordered) {
  const KRDictionary object{{"n", 5}, {"s", "5"}};
  expectCases({
      {"n == '5'", object, false},
      {"s == 5", object, false},
      {"n != '5'", object, true},
      {"n < 'a'", object, false},
      {"n >= '5'", object, false},
      {"s > 4", object, false},
      {"s BETWEEN {1, 9}", object, false},
  });
}

TEST(KRPredicateTest, InAndBetween) {
  const KRDictionary object{{"n", 5}, {"s", "sun"}, {"list", KRArray{1, 2, 3}}, {"set", KRSet{"a", "b"}}};
  expectCases(
      {
          {"n IN {1, 5, 9}", object, true},
          {"n IN {1, 2}", object, false},
          {"n IN {}", object, false},
          {"n IN {5.0}", object, true},
          {"s IN {'sea', 'sun'}", object, true},
          {"s IN {'SUN'}", object, false},
          {"s IN[c] {'SUN'}", object, true},
          {"2 IN list", object, true},
          {"7 IN list", object, false},
          {"'a' IN set", object, true},
          {"'c' IN set", object, false},
          {"s IN 'sunny day'", object, true},
          {"s IN 'moon'", object, false},
          {"list CONTAINS 3", object, true},
          {"set CONTAINS 'b'", object, true},
          {"n BETWEEN {1, 10}", object, true},
          {"n BETWEEN {5, 5}", object, true},
          {"n BETWEEN {6, 10}", object, false},
          {"n BETWEEN {1, 4.99}", object, false},
          {"s BETWEEN {'a', 'z'}", object, true},
          {"n between %@", object, true},
          {"n IN %@", object, true},
      },
      {KRArray{0, 5}});
}

TEST(KRPredicateTest, LogicPrecedenceAndParentheses) {
  const KRDictionary object{{"a", 1}, {"b", 2}};
  expectCases({
      {"a == 1 AND b == 2", object, true},
      {"a == 1 && b == 3", object, false},
      {"a == 0 OR b == 2", object, true},
      {"a == 0 || b == 3", object, false},
      {"NOT a == 0", object, true},
      {"!(a == 1)", object, false},
      {"not a == 1", object, false},
      {"a == 0 AND b == 2 OR a == 1", object, true},
      {"a == 0 AND (b == 2 OR a == 1)", object, false},
      {"a == 1 OR b == 0 AND a == 0", object, true},
      {"(a == 1 OR b == 0) AND a == 0", object, false},
      {"NOT a == 1 OR b == 2", object, true},
      {"NOT (a == 1 OR b == 2)", object, false},
      {"NOT NOT a == 1", object, true},
      {"a == 1 and b == 2 or a == 5", object, true},
      {"((a == 1))", object, true},
      {"(a) + (b) == 3", object, true},
      {"TRUEPREDICATE", object, true},
      {"FALSEPREDICATE", object, false},
      {"FALSEPREDICATE OR TRUEPREDICATE", object, true},
      {"NOT FALSEPREDICATE AND TRUEPREDICATE", object, true},
  });
}

TEST(KRPredicateTest, KeyPathsThroughObjectsDictionariesAndArrays) {
  const KRValue photo = samplePhoto();
  const KRDictionary nested{{"a", KRDictionary{{"b", KRDictionary{{"c", 7}}}}},
                            {"items", KRArray{KRDictionary{{"x", 1}}}}};
  expectCases({
      {"name == 'beach.jpg'", photo, true},
      {"SELF.name ENDSWITH '.jpg'", photo, true},
      {"rating >= 4 AND flagged == YES", photo, true},
      {"original.name == 'original.raw'", photo, true},
      {"original.rating == 5", photo, true},
      {"original.original == nil", photo, true},
      {"original.flagged == YES", photo, true},
      {"date > original.date", photo, true},
      {"tags.@count == 2", photo, true},
      {"'sun' IN tags", photo, true},
      {"a.b.c == 7", nested, true},
      {"a.b.c < 7", nested, false},
      {"a.missing.c == nil", nested, true},
      {"items.x CONTAINS 1", nested, true},
      {"items.@count == 1", nested, true},
      {"SELF == 3", 3, true},
      {"SELF BEGINSWITH 'ab'", "abc", true},
      {"SELF IN {1, 2}", 2, true},
  });
}

TEST(KRPredicateTest, UnknownKeysRaiseDuringEvaluation) {
  const auto predicate = KRPredicate::predicateWithFormat("undefinedKey == 1");
  try {
    predicate->evaluateWithObject(samplePhoto());
    FAIL() << "expected an unknown-key exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSUnknownKeyException));
  }
  EXPECT_THROW(KRPredicate::predicateWithFormat("length == 1")->evaluateWithObject("text"), KRException);
}

TEST(KRPredicateTest, FormatArguments) {
  const KRValue photo = samplePhoto();
  expectCases({{"name == %@", photo, true}}, {"beach.jpg"});
  expectCases({{"%K == %@", photo, true}}, {"rating", 4});
  expectCases({{"%K == 'original.raw'", photo, true}}, {"original.name"});
  expectCases({{"rating == %d", photo, true}, {"rating == %i", photo, true}, {"rating == %ld", photo, true}},
              {4});
  expectCases({{"rating < %f", photo, true}, {"rating > %lf", photo, false}}, {4.5});
  expectCases({{"name == %@ AND rating == %d AND %K CONTAINS %@", photo, true}},
              {"beach.jpg", 4, "tags", "sea"});
  expectCases({{"tags == %@", photo, true}}, {KRArray{"sea", "sun"}});
  expectCases({{"original == %@", photo, false}, {"original != %@", photo, true}}, {KRValue()});
  expectCases({{"%K == nil", photo, false}}, {"SELF"});
  expectCases({{"rating == %u", photo, true}}, {4u});
}

TEST(KRPredicateTest, StringArgumentsAreNeverParsedAsSyntax) {
  const KRDictionary object{{"s", "a' OR 1 == 1 OR 'b"}};
  EXPECT_TRUE(
      KRPredicate::predicateWithFormat("s == %@", {"a' OR 1 == 1 OR 'b"})->evaluateWithObject(object));
  EXPECT_FALSE(
      KRPredicate::predicateWithFormat("s == %@", {"x' OR 1 == 1 OR 'y"})->evaluateWithObject(object));
}

TEST(KRPredicateTest, CollectionModifiers) {
  const KRDictionary object{
      {"scores", KRArray{3, 5, 8}}, {"names", KRSet{"Ann", "Bob"}}, {"empty", KRArray::array()}};
  expectCases({
      {"ANY scores > 7", object, true},
      {"ANY scores > 8", object, false},
      {"SOME scores == 5", object, true},
      {"ALL scores > 2", object, true},
      {"ALL scores > 3", object, false},
      {"NONE scores > 8", object, true},
      {"NONE scores == 3", object, false},
      {"ANY names BEGINSWITH[c] 'b'", object, true},
      {"ALL names LIKE '\?\?\?'", object, true},
      {"ANY empty == 1", object, false},
      {"ALL empty == 1", object, true},
      {"ANY missing == 1", object, false},
      {"any scores IN {8, 9}", object, true},
      {"ALL scores BETWEEN {3, 8}", object, true},
  });
  EXPECT_THROW(KRPredicate::predicateWithFormat("ANY n == 1")->evaluateWithObject(KRDictionary{{"n", 1}}),
               KRException);
}

TEST(KRPredicateTest, ArithmeticOperands) {
  const KRDictionary object{{"width", 4000}, {"height", 3000}, {"seconds", 90}};
  expectCases({
      {"width * height > 10000000", object, true},
      {"width / height > 1.3", object, true},
      {"width - height == 1000", object, true},
      {"seconds / 60 == 1.5", object, true},
      {"2 ** 3 ** 2 == 512", object, true},
      {"-2 ** 2 == -4", object, true},
      {"width + 'a' == nil", object, true},
      {"-width < 0", object, true},
  });
}

TEST(KRPredicateTest, BlockPredicatesReceiveObjectAndBindings) {
  const auto predicate =
      KRPredicate::predicateWithBlock([](const KRValue& object, const KRDictionary& bindings) {
        return object.valueForKey("rating").number().intValue() >=
               bindings.objectForKey("minimum").number().intValue();
      });
  EXPECT_TRUE(predicate->evaluateWithObject(samplePhoto(), KRDictionary{{"minimum", 4}}));
  EXPECT_FALSE(predicate->evaluateWithObject(samplePhoto(), KRDictionary{{"minimum", 5}}));
  EXPECT_TRUE(predicate->evaluateWithObject(samplePhoto()));
}

TEST(KRPredicateTest, VariablesComeFromTheBindings) {
  const auto predicate = KRPredicate::predicateWithFormat("rating >= $minimum");
  EXPECT_TRUE(predicate->evaluateWithObject(samplePhoto(), KRDictionary{{"minimum", 3}}));
  EXPECT_FALSE(predicate->evaluateWithObject(samplePhoto(), KRDictionary{{"minimum", 5}}));
  EXPECT_THROW(predicate->evaluateWithObject(samplePhoto()), KRException);
}

TEST(KRPredicateTest, CompoundHelpers) {
  const auto high = KRPredicate::predicateWithFormat("rating > 3");
  const auto named = KRPredicate::predicateWithFormat("name == 'x'");
  EXPECT_TRUE(KRPredicate::orPredicateWithSubpredicates({high, named})->evaluateWithObject(samplePhoto()));
  EXPECT_FALSE(KRPredicate::andPredicateWithSubpredicates({high, named})->evaluateWithObject(samplePhoto()));
  EXPECT_TRUE(KRPredicate::notPredicateWithSubpredicate(named)->evaluateWithObject(samplePhoto()));
  EXPECT_EQ(KRPredicate::andPredicateWithSubpredicates({high, named})->predicateFormat(),
            "rating > 3 AND name == \"x\"");
}

TEST(KRPredicateTest, ConstantPredicates) {
  EXPECT_TRUE(KRPredicate::predicateWithValue(true)->evaluateWithObject(KRValue()));
  EXPECT_FALSE(KRPredicate::predicateWithValue(false)->evaluateWithObject(KRValue()));
  EXPECT_TRUE(
      KRPredicate::predicateWithValue(true)->isEqual(KRPredicate::predicateWithFormat("TRUEPREDICATE")));
}

TEST(KRPredicateTest, FormatsParseBackToEqualPredicates) {
  const std::vector<std::string> formats = {
      "a == 1",
      "a.b.c != 'text'",
      "SELF.name BEGINSWITH[c] 'x'",
      "name ENDSWITH[d] \"e\" AND rating >= 2.5",
      "a == 1 OR b == 2 AND NOT c == 3",
      "(a == 1 OR b == 2) AND c == 3",
      "NOT (a == 1 AND b == 2)",
      "NONE tags == 'x'",
      "ALL scores BETWEEN {1, 5}",
      "ANY tags IN[cd] {'a', \"b\"}",
      "name MATCHES '[a-z]+\\\\.jpg'",
      "name LIKE 'a*b?'",
      "s == 'quote \" and \\\\ and \\n'",
      "width * (height + 1) > -5 ** 2",
      "(a - b) - (c - d) == a / (b * c)",
      "2 ** 3 ** 2 == (2 ** 3) ** 2",
      "-x < (-2) ** 2",
      "date > CAST(1000.5, \"NSDate\")",
      "value == nil AND flag == YES AND other == NO",
      "FUNCTION(SELF, 'rank') > 2",
      "rating >= $minimum",
      "#in == 1 AND a.#self == 2",
      "TRUEPREDICATE AND FALSEPREDICATE",
      "big == 18446744073709551615 AND tiny == 1.5e-300",
      "{a, 1} CONTAINS 1",
  };
  const KRDictionary object{{"a", 1}, {"b", 2},          {"c", 3},
                            {"d", 4}, {"name", "a.jpg"}, {"tags", KRArray{"a"}}};
  for (const std::string& format : formats) {
    SCOPED_TRACE(format);
    const auto parsed = KRPredicate::predicateWithFormat(format);
    const auto reparsed = KRPredicate::predicateWithFormat(parsed->predicateFormat());
    EXPECT_TRUE(parsed->isEqual(reparsed)) << parsed->predicateFormat();
    EXPECT_EQ(parsed->hash(), reparsed->hash());
    EXPECT_EQ(reparsed->predicateFormat(), parsed->predicateFormat());
    EXPECT_EQ(parsed->description(), parsed->predicateFormat());
  }
}

TEST(KRPredicateTest, EveryKeyGivenThroughKParsesBack) {
  // Every reserved word of the format, and words other formats reserve that are plain keys here.
  std::vector<std::string> keys = {
      "AND",      "OR",         "NOT",      "IN",       "BETWEEN", "LIKE",          "MATCHES",
      "CONTAINS", "BEGINSWITH", "ENDSWITH", "ANY",      "ALL",     "NONE",          "SOME",
      "YES",      "NO",         "TRUE",     "FALSE",    "NIL",     "NULL",          "SELF",
      "FUNCTION", "CAST",       "and",      "In",       "self",    "TruePredicate", "falsepredicate",
      "FIRST",    "LAST",       "SIZE",     "SUBQUERY", "ANYKEY",  "UNIQUE",        "TRUEPREDICATE",
  };
  // Keys that are not plain names, and key paths whose components are not.
  const std::vector<std::string> oddKeys = {
      "first name",  " lead", "trail ", "a-b",       "a+b",       "a,b",
      "(x)",         "x==1",  "x[c]",   "'q'",       "\"dq\"",    "back\\slash",
      "line\nbreak", "tab\t", "\x01",   "1abc",      "2",         "_x",
      "été",         "日本",  "😀",      "$x",        "$",         "#",
      "#x",          "%K",    "%@",     "@count",    "@",         "@1",
      "a.@count",    "a..b",  ".a",     "a.",        ".",         "a.first name.b",
      "a.1.b",       "a.AND", "IN.x",   "SELF.name", "SELF.SELF", "SELF.SELF.x",
      "a.SELF",      "SELF.", ".SELF",
  };
  keys.insert(keys.end(), oddKeys.begin(), oddKeys.end());
  for (const std::string& key : keys) {
    SCOPED_TRACE(key);
    const auto parsed = KRPredicate::predicateWithFormat("%K == 1 AND ANY %K IN {%K}", {key, key, key});
    const auto reparsed = KRPredicate::predicateWithFormat(parsed->predicateFormat());
    EXPECT_TRUE(parsed->isEqual(reparsed)) << parsed->predicateFormat();
    EXPECT_EQ(reparsed->predicateFormat(), parsed->predicateFormat());
  }
}

TEST(KRPredicateTest, KeysAreEscapedInFormats) {
  const auto format = [](const std::string& key) {
    return KRPredicate::predicateWithFormat("%K == 1", {key})->predicateFormat();
  };
  EXPECT_EQ(format("IN"), "#IN == 1");
  EXPECT_EQ(format("a.in"), "a.#in == 1");
  EXPECT_EQ(format("first name"), "#\"first name\" == 1");
  EXPECT_EQ(format("$x"), "#\"$x\" == 1");
  EXPECT_EQ(format("rating"), "rating == 1");
  EXPECT_TRUE(KRPredicate::predicateWithFormat("#\"first name\" == 1")
                  ->evaluateWithObject(KRDictionary{{"first name", 1}}));
}

// %K refuses an empty key path; one made directly is written as the quoted empty key and reads back.
TEST(KRPredicateTest, EmptyKeyPathsParseBack) {
  const auto empty = KRComparisonPredicate::predicateWithLeftExpression(
      KRExpression::expressionForKeyPath(""), KRExpression::expressionForConstantValue(1),
      KRComparisonPredicate::Modifier::Direct, KRComparisonPredicate::Type::EqualTo);
  EXPECT_EQ(empty->predicateFormat(), "#\"\" == 1");
  EXPECT_TRUE(KRPredicate::predicateWithFormat(empty->predicateFormat())->isEqual(empty));
  EXPECT_THROW(KRPredicate::predicateWithFormat("%K == 1", {""}), KRException);
}

TEST(KRPredicateTest, FormatsWithArgumentsParseBackToEqualPredicates) {
  const std::vector<KRValue> arguments = {"it's \"quoted\"",
                                          KRDate::dateWithTimeIntervalSince1970(1700000000.25),
                                          KRArray{1, "two", 3.5}, KRValue(), -7};
  const auto parsed =
      KRPredicate::predicateWithFormat("s == %@ AND d < %@ AND n IN %@ AND x == %@ AND y > %@", arguments);
  const auto reparsed = KRPredicate::predicateWithFormat(parsed->predicateFormat());
  EXPECT_TRUE(parsed->isEqual(reparsed)) << parsed->predicateFormat();
  const KRDictionary object{
      {"s", "it's \"quoted\""}, {"d", KRDate::dateWithTimeIntervalSince1970(0)}, {"n", "two"}, {"y", 0}};
  EXPECT_TRUE(parsed->evaluateWithObject(object));
  EXPECT_TRUE(reparsed->evaluateWithObject(object));
}

TEST(KRPredicateTest, RoundTripsKeepResults) {
  const std::vector<std::string> formats = {"rating > 3 AND NOT name CONTAINS[c] 'SEA'", "ANY tags LIKE 's*'",
                                            "original.rating - rating == 1 OR date < original.date"};
  const std::vector<KRValue> objects = {samplePhoto(),
                                        std::make_shared<Photo>("Sea.png", 2, 0.0, KRArray{"x"})};
  for (const std::string& format : formats) {
    SCOPED_TRACE(format);
    const auto parsed = KRPredicate::predicateWithFormat(format);
    const auto reparsed = KRPredicate::predicateWithFormat(parsed->predicateFormat());
    for (const KRValue& object : objects) {
      EXPECT_EQ(parsed->evaluateWithObject(object), reparsed->evaluateWithObject(object));
    }
  }
}

TEST(KRPredicateTest, DifferentPredicatesAreNotEqual) {
  const auto base = KRPredicate::predicateWithFormat("a == 1");
  for (const char* other :
       {"a == 2", "b == 1", "a != 1", "a ==[c] 1", "ANY a == 1", "NOT a == 1", "a == '1'"}) {
    SCOPED_TRACE(other);
    EXPECT_FALSE(base->isEqual(KRPredicate::predicateWithFormat(other)));
  }
  EXPECT_TRUE(base->isEqual(KRPredicate::predicateWithFormat("a = 1")));
  EXPECT_TRUE(base->isEqual(KRPredicate::predicateWithFormat("SELF.a == 1")));
}

TEST(KRPredicateTest, EvaluatesFromFourThreadsAtOnce) {
  KRExpression::registerFunction("predicateTestStars", [](const KRValue& receiver) {
    return KRValue(receiver.valueForKey("rating").number().longLongValue() * 2);
  });
  const std::vector<KRValue> photos = {samplePhoto(),
                                       std::make_shared<Photo>("Été.JPG", 2, 5.0, KRArray{"sun"})};
  const std::vector<std::pair<KRPredicatePtr, std::vector<bool>>> checks = {
      {KRPredicate::predicateWithFormat("name MATCHES[c] '[a-z]+\\\\.jpg'"), {true, false}},
      {KRPredicate::predicateWithFormat("name LIKE[cd] 'ete.*'"), {false, true}},
      {KRPredicate::predicateWithFormat("ANY tags == 'sun' AND rating BETWEEN {2, 4}"), {true, true}},
      {KRPredicate::predicateWithFormat("FUNCTION(SELF, 'predicateTestStars') >= 8"), {true, false}},
      {KRPredicate::predicateWithFormat("original.name BEGINSWITH 'orig' OR date < %@",
                                        {KRDate::dateWithTimeIntervalSince1970(10)}),
       {true, true}},
  };
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&] {
      for (int round = 0; round < 200; ++round) {
        for (const auto& [predicate, expected] : checks) {
          for (size_t i = 0; i < photos.size(); ++i) {
            if (predicate->evaluateWithObject(photos[i]) != expected[i]) ++mismatches;
          }
        }
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(mismatches.load(), 0);
}

TEST(KRPredicateTest, ParsesFromFourThreadsAtOnce) {
  std::atomic<int> failures{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&failures, t] {
      for (int round = 0; round < 100; ++round) {
        const auto predicate = KRPredicate::predicateWithFormat("n == %d AND s MATCHES '[0-9]+'", {t});
        if (!predicate->evaluateWithObject(KRDictionary{{"n", t}, {"s", "42"}})) ++failures;
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(failures.load(), 0);
}
