#include "KRFoundation/KRPredicateParser.hpp"

#include <gtest/gtest.h>

#include <limits>
#include <string>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

std::shared_ptr<KRPredicate> parsePredicate(const std::string& format, std::vector<KRValue> arguments = {}) {
  return KRPredicateParser(format, std::move(arguments)).parsePredicate();
}

std::shared_ptr<KRExpression> parseExpression(const std::string& format,
                                              std::vector<KRValue> arguments = {}) {
  return KRPredicateParser(format, std::move(arguments)).parseExpression();
}

// The reason of the parse failure of a predicate format, or "" when it parses.
std::string predicateFailure(const std::string& format, std::vector<KRValue> arguments = {}) {
  try {
    parsePredicate(format, std::move(arguments));
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException)) << format;
    return exception.reason().str();
  }
  return "";
}

std::string repeated(const std::string& text, size_t count) {
  std::string result;
  for (size_t i = 0; i < count; ++i) result += text;
  return result;
}

std::shared_ptr<KRCompoundPredicate> compound(const std::shared_ptr<KRPredicate>& predicate) {
  return std::dynamic_pointer_cast<KRCompoundPredicate>(predicate);
}

}  // namespace

TEST(KRPredicateParserTest, MalformedFormatsRaise) {
  const std::vector<std::string> formats = {
      "",
      "   ",
      "==",
      "a ==",
      "== 1",
      "a",
      "a =",
      "a == 1 AND",
      "AND a == 1",
      "a == 1 OR",
      "a == 1 OR OR b == 2",
      "NOT",
      "!",
      "(a == 1",
      "a == 1)",
      "((a == 1)",
      "()",
      "(a) == (b",
      "a == 'unterminated",
      "a == \"unterminated",
      "a == 'mixed quotes\"",
      "a == 'bad \\q escape'",
      "a == 'trailing backslash\\",
      "a == '\\u12'",
      "a == '\\uZZZZ'",
      "a == '\\uD800'",
      "a == '\\uDC00'",
      "a == '\\uD800\\u0041'",
      "a == 1 b",
      "a == 1 2",
      "a == 1 ;",
      "a == %q",
      "a == %",
      "a == %l",
      "a MATCHES '('",
      "a MATCHES '[a-'",
      "a MATCHES '*x'",
      "a BETWEEN {1}",
      "a BETWEEN {1, 2, 3}",
      "a BETWEEN 5",
      "a ==[x] 1",
      "a ==[] 1",
      "a ==[c 1",
      "a ==[1] 1",
      "a IN {1, 2",
      "a IN {1,, 2}",
      "a IN {,}",
      "a.b. == 1",
      "a..b == 1",
      ".a == 1",
      "a == 1 &&& b == 2",
      "a === 1",
      "a ~ 1",
      "a == 1 | b == 2",
      "FUNCTION(SELF) == 1",
      "FUNCTION(SELF, 1) == 1",
      "FUNCTION(SELF, 'a', 'b') == 1",
      "FUNCTION SELF, 'x' == 1",
      "CAST(1, 'NSString') == 1",
      "CAST('x', 'NSDate') == 1",
      "CAST(1) == 1",
      "a == $",
      "#1 == 2",
      "# == 1",
      "AND == 1",
      "a == in",
      "ANY",
      "ANY == 1",
      "ALL a",
      "NONE a",
      "a == 1 NOT",
      "a + == 1",
      "a ** == 1",
      "- == 1",
      "a == 1e",
      "a == 0x10",
      "a == @",
      "a == @1",
      "TRUEPREDICATE == 1",
      "a == TRUEPREDICATE",
      "a == SELF.in",
      "a CONTAINS",
      "a BEGINSWITH[cd]",
      "a LIKE",
      "{1, 2} == {",
      "a == 'x' 'y'",
      "a == 'invalid \xff byte'",
      "a == \xc3",
      "\xe2\x82",
      "a\x80 == 1",
      "a == (1 == 1)",
      "(a == 1) + 1 == 2",
  };
  ASSERT_GE(formats.size(), 50u);
  for (const std::string& format : formats) {
    SCOPED_TRACE(format);
    EXPECT_FALSE(predicateFailure(format).empty());
  }
}

TEST(KRPredicateParserTest, MissingOrWrongArgumentsRaise) {
  EXPECT_FALSE(predicateFailure("a == %@").empty());
  EXPECT_FALSE(predicateFailure("%K == 1").empty());
  EXPECT_FALSE(predicateFailure("a == %d").empty());
  EXPECT_FALSE(predicateFailure("a == %@ AND b == %@", {1}).empty());
  EXPECT_FALSE(predicateFailure("%K == 1", {5}).empty());
  EXPECT_FALSE(predicateFailure("%K == 1", {""}).empty());
  EXPECT_FALSE(predicateFailure("a == %d", {"x"}).empty());
  EXPECT_FALSE(predicateFailure("a == %f", {KRValue()}).empty());
  EXPECT_FALSE(predicateFailure("FUNCTION(SELF, %@) == 1", {3}).empty());
  EXPECT_EQ(predicateFailure("a == %@", {1, 2}), "");
}

TEST(KRPredicateParserTest, FailuresNameThePosition) {
  EXPECT_EQ(predicateFailure("a == == 1"),
            "Unable to parse the format string \"a == == 1\" at position 5: expected an expression");
  EXPECT_NE(predicateFailure("a == 'x").find("at position 5: unterminated string"), std::string::npos);
  EXPECT_NE(predicateFailure("(a == 1").find("at position 7: expected ')'"), std::string::npos);
  EXPECT_NE(predicateFailure("a == 1 b").find("at position 7: unexpected text"), std::string::npos);
  EXPECT_NE(predicateFailure("a == %@").find("at position 5: too few arguments"), std::string::npos);
  EXPECT_NE(predicateFailure("a MATCHES '('").find("at position 2: Invalid regular expression"),
            std::string::npos);
  EXPECT_NE(predicateFailure("ab == '\xff'").find("at position 7: invalid UTF-8"), std::string::npos);
}

TEST(KRPredicateParserTest, LongFormatsAreShortenedInTheReason) {
  const std::string reason = predicateFailure(repeated("a", 1000) + " ==");
  EXPECT_NE(reason.find("...\" at position 1003"), std::string::npos);
  EXPECT_LT(reason.size(), 400u);
}

TEST(KRPredicateParserTest, NestingIsCappedInsteadOfOverflowingTheStack) {
  const size_t tooDeep = KRPredicateParser::kMaximumDepth + 10;
  const std::vector<std::string> formats = {
      repeated("(", tooDeep) + "a == 1" + repeated(")", tooDeep),
      repeated("NOT ", tooDeep) + "a == 1",
      repeated("!", tooDeep) + "a == 1",
      "a == " + repeated("-", tooDeep) + "x",
      "a == " + repeated("(", tooDeep) + "1" + repeated(")", tooDeep),
      "a == " + repeated("{", tooDeep) + "1" + repeated("}", tooDeep),
      "a == 2" + repeated(" ** 2", tooDeep),
      "a == x" + repeated(" + 1", tooDeep),
      "a == x" + repeated(" * 2", tooDeep),
      repeated("FUNCTION(", tooDeep) + "SELF" + repeated(", 'f')", tooDeep) + " == 1",
      repeated("(", 100000),
      repeated("NOT ", 100000),
  };
  for (const std::string& format : formats) {
    SCOPED_TRACE(format.substr(0, 40));
    EXPECT_NE(predicateFailure(format).find("levels deep"), std::string::npos);
  }
}

TEST(KRPredicateParserTest, NestingWithinTheCapParses) {
  const size_t deep = 200;
  const KRDictionary object{{"a", 1}, {"x", 0}};
  EXPECT_TRUE(
      parsePredicate(repeated("(", deep) + "a == 1" + repeated(")", deep))->evaluateWithObject(object));
  EXPECT_TRUE(parsePredicate(repeated("NOT ", deep) + "a == 1")->evaluateWithObject(object));
  EXPECT_TRUE(
      parsePredicate("a == " + repeated("(", deep) + "1" + repeated(")", deep))->evaluateWithObject(object));
  EXPECT_TRUE(parsePredicate("x" + repeated(" + 1", deep) + " == 200")->evaluateWithObject(object));
  EXPECT_TRUE(parsePredicate("a == --1")->evaluateWithObject(object));
}

TEST(KRPredicateParserTest, LongFlatChainsParse) {
  const std::string format = repeated("a == 1 AND ", 20000) + "a == 1";
  const auto predicate = compound(parsePredicate(format));
  ASSERT_TRUE(predicate);
  EXPECT_EQ(predicate->subpredicates().size(), 20001u);
  EXPECT_TRUE(predicate->evaluateWithObject(KRDictionary{{"a", 1}}));
}

TEST(KRPredicateParserTest, NotBindsTighterThanAndWhichBindsTighterThanOr) {
  const auto orPredicate = compound(parsePredicate("a == 1 OR b == 2 AND NOT c == 3"));
  ASSERT_TRUE(orPredicate);
  EXPECT_EQ(orPredicate->compoundPredicateType(), KRCompoundPredicate::Type::Or);
  ASSERT_EQ(orPredicate->subpredicates().size(), 2u);
  EXPECT_TRUE(std::dynamic_pointer_cast<KRComparisonPredicate>(orPredicate->subpredicates()[0]));
  const auto andPredicate = compound(orPredicate->subpredicates()[1]);
  ASSERT_TRUE(andPredicate);
  EXPECT_EQ(andPredicate->compoundPredicateType(), KRCompoundPredicate::Type::And);
  const auto notPredicate = compound(andPredicate->subpredicates()[1]);
  ASSERT_TRUE(notPredicate);
  EXPECT_EQ(notPredicate->compoundPredicateType(), KRCompoundPredicate::Type::Not);
}

TEST(KRPredicateParserTest, ChainsOfOneOperatorBecomeOneCompound) {
  const auto chain = compound(parsePredicate("a == 1 && b == 2 AND c == 3 and d == 4"));
  ASSERT_TRUE(chain);
  EXPECT_EQ(chain->subpredicates().size(), 4u);
  const auto grouped = compound(parsePredicate("(a == 1 AND b == 2) AND c == 3"));
  ASSERT_TRUE(grouped);
  EXPECT_EQ(grouped->subpredicates().size(), 2u);
}

TEST(KRPredicateParserTest, ComparisonParts) {
  const auto comparison =
      std::dynamic_pointer_cast<KRComparisonPredicate>(parsePredicate("ALL tags.name BEGINSWITH[cd] 'a'"));
  ASSERT_TRUE(comparison);
  EXPECT_EQ(comparison->comparisonPredicateModifier(), KRComparisonPredicate::Modifier::All);
  EXPECT_EQ(comparison->predicateOperatorType(), KRComparisonOperator::Type::BeginsWith);
  EXPECT_EQ(comparison->options(),
            KRComparisonOperator::CaseInsensitive | KRComparisonOperator::DiacriticInsensitive);
  EXPECT_EQ(comparison->leftExpression()->keyPath(), "tags.name");
  EXPECT_EQ(comparison->rightExpression()->constantValue(), KRValue("a"));
}

TEST(KRPredicateParserTest, NoneIsNotAny) {
  const auto none = compound(parsePredicate("NONE tags == 'x'"));
  ASSERT_TRUE(none);
  EXPECT_EQ(none->compoundPredicateType(), KRCompoundPredicate::Type::Not);
  const auto any = std::dynamic_pointer_cast<KRComparisonPredicate>(none->subpredicates().front());
  ASSERT_TRUE(any);
  EXPECT_EQ(any->comparisonPredicateModifier(), KRComparisonPredicate::Modifier::Any);
}

TEST(KRPredicateParserTest, ParenthesesBeforeAnOperatorOpenAnExpression) {
  const auto comparison =
      std::dynamic_pointer_cast<KRComparisonPredicate>(parsePredicate("(a + 1) * 2 > (b)"));
  ASSERT_TRUE(comparison);
  EXPECT_EQ(comparison->leftExpression()->expressionType(), KRExpression::Type::Arithmetic);
  EXPECT_EQ(comparison->rightExpression()->expressionType(), KRExpression::Type::KeyPath);
}

TEST(KRPredicateParserTest, KeywordsAnyCaseAndEscapedKeys) {
  EXPECT_TRUE(parsePredicate("a == 1 aNd b == 2 Or NoT c == 3")
                  ->evaluateWithObject(KRDictionary{{"a", 1}, {"b", 2}}));
  const auto comparison = std::dynamic_pointer_cast<KRComparisonPredicate>(parsePredicate("#and.#Or == nil"));
  ASSERT_TRUE(comparison);
  EXPECT_EQ(comparison->leftExpression()->keyPath(), "and.Or");
}

TEST(KRPredicateParserTest, NegativeLiteralsAreConstants) {
  const auto negative = parseExpression("-5");
  EXPECT_EQ(negative->expressionType(), KRExpression::Type::ConstantValue);
  EXPECT_EQ(negative->constantValue(), KRValue(-5));
  EXPECT_EQ(parseExpression("-9223372036854775808")->constantValue().number().longLongValue(),
            std::numeric_limits<long long>::min());
  const auto negation = parseExpression("-x");
  EXPECT_EQ(negation->expressionType(), KRExpression::Type::Arithmetic);
  EXPECT_EQ(negation->arithmeticOperator(), KRExpression::ArithmeticOperator::Negate);
}

TEST(KRPredicateParserTest, ConstantArrayLiteralsFold) {
  EXPECT_EQ(parseExpression("{1, 'a', nil}")->constantValue(), KRValue(KRArray{1, "a", KRValue()}));
  EXPECT_EQ(parseExpression("{}")->constantValue(), KRValue(KRArray::array()));
  EXPECT_EQ(parseExpression("{1, x}")->expressionType(), KRExpression::Type::Aggregate);
}

TEST(KRPredicateParserTest, NumberConversionsOfArguments) {
  EXPECT_EQ(parseExpression("%d", {3.9})->constantValue().number().kind(), KRNumber::Kind::Int);
  EXPECT_EQ(parseExpression("%d", {3.9})->constantValue(), KRValue(3));
  EXPECT_EQ(parseExpression("%lu", {7})->constantValue().number().kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(parseExpression("%f", {2})->constantValue().number().kind(), KRNumber::Kind::Double);
  EXPECT_EQ(parseExpression("%lld", {true})->constantValue(), KRValue(1));
}

TEST(KRPredicateParserTest, ExpressionsRejectPredicateSyntax) {
  EXPECT_THROW(parseExpression("a == 1"), KRException);
  EXPECT_THROW(parseExpression("a AND b"), KRException);
  EXPECT_THROW(parseExpression("TRUEPREDICATE"), KRException);
  EXPECT_THROW(parseExpression(""), KRException);
}
