#include "KRFoundation/KRExpression.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>
#include <limits>
#include <string>
#include <thread>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

// Stands for a helper class whose class operations formulas call through FUNCTION(SELF, 'name').
class FormulaHelper : public KRObject {};

KRValue evaluate(const std::string& format, const KRValue& object = {}, std::vector<KRValue> arguments = {}) {
  return KRExpression::expressionWithFormat(format, std::move(arguments))->expressionValueWithObject(object);
}

class KRExpressionTest : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    KRExpression::registerFunction("dayInterval", [](const KRValue&) { return KRValue(86400.0); });
    KRExpression::registerFunction("currentDate", [](const KRValue&) { return KRValue(1700000000.5); });
    KRExpression::registerFunction("isHelper", [](const KRValue& receiver) {
      return KRValue(static_cast<bool>(receiver.objectAs<FormulaHelper>()));
    });
    KRExpression::registerFunction(
        "doubled", [](const KRValue& receiver) { return KRValue(receiver.number().longLongValue() * 2); });
  }
};

}  // namespace

TEST_F(KRExpressionTest, NumbersAndArithmetic) {
  EXPECT_EQ(evaluate("1 + 2"), KRValue(3));
  EXPECT_EQ(evaluate("7 - 10"), KRValue(-3));
  EXPECT_EQ(evaluate("6 * 7"), KRValue(42));
  EXPECT_EQ(evaluate("1 + 2 * 3"), KRValue(7));
  EXPECT_EQ(evaluate("(1 + 2) * 3"), KRValue(9));
  EXPECT_EQ(evaluate("10 - 4 - 3"), KRValue(3));
  EXPECT_EQ(evaluate("2 * 3 + 4 * 5"), KRValue(26));
  EXPECT_EQ(evaluate("1.5 + 1"), KRValue(2.5));
}

TEST_F(KRExpressionTest, IntegerResultsStayIntegers) {
  EXPECT_EQ(evaluate("2 + 3").number().kind(), KRNumber::Kind::Int);
  EXPECT_EQ(evaluate("2 * 3.0").number().kind(), KRNumber::Kind::Double);
  EXPECT_EQ(evaluate("9223372036854775807 + 1").number().kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(evaluate("18446744073709551615 + 1").number().kind(), KRNumber::Kind::Double);
}

TEST_F(KRExpressionTest, DivisionGivesDoubles) {
  EXPECT_EQ(evaluate("7 / 2"), KRValue(3.5));
  EXPECT_EQ(evaluate("8 / 2").number().kind(), KRNumber::Kind::Double);
  EXPECT_EQ(evaluate("12 / 3 / 2"), KRValue(2.0));
  EXPECT_TRUE(std::isinf(evaluate("1 / 0").number().doubleValue()));
}

TEST_F(KRExpressionTest, PowerIsRightAssociativeAndBindsTighterThanUnaryMinus) {
  EXPECT_EQ(evaluate("2 ** 10"), KRValue(1024));
  EXPECT_EQ(evaluate("2 ** 3 ** 2"), KRValue(512));
  EXPECT_EQ(evaluate("(2 ** 3) ** 2"), KRValue(64));
  EXPECT_EQ(evaluate("-2 ** 2"), KRValue(-4));
  EXPECT_EQ(evaluate("(-2) ** 2"), KRValue(4));
  EXPECT_EQ(evaluate("2 ** -1"), KRValue(0.5));
  EXPECT_EQ(evaluate("3 * 2 ** 2"), KRValue(12));
  EXPECT_EQ(evaluate("4 ** 0.5"), KRValue(2.0));
}

TEST_F(KRExpressionTest, UnaryMinus) {
  EXPECT_EQ(evaluate("-5"), KRValue(-5));
  EXPECT_EQ(evaluate("--5"), KRValue(5));
  EXPECT_EQ(evaluate("-(2 + 3)"), KRValue(-5));
  EXPECT_EQ(evaluate("3 - -2"), KRValue(5));
  EXPECT_EQ(evaluate("-x", KRDictionary{{"x", 2.5}}), KRValue(-2.5));
  EXPECT_EQ(evaluate("- 1.5"), KRValue(-1.5));
}

TEST_F(KRExpressionTest, KeyPathsReadTheObject) {
  const KRDictionary object{{"size", KRDictionary{{"width", 40}, {"height", 30}}}, {"name", "a"}};
  EXPECT_EQ(evaluate("size.width * size.height", object), KRValue(1200));
  EXPECT_EQ(evaluate("SELF.size.width", object), KRValue(40));
  EXPECT_EQ(evaluate("name", object), KRValue("a"));
  EXPECT_EQ(evaluate("SELF", 7), KRValue(7));
  EXPECT_EQ(evaluate("missing", object), KRValue());
  EXPECT_EQ(evaluate("%K + 1", object, {"size.height"}), KRValue(31));
}

TEST_F(KRExpressionTest, NonNumbersInArithmeticGiveNil) {
  EXPECT_TRUE(evaluate("'a' + 1").isNil());
  EXPECT_TRUE(evaluate("missing * 2", KRDictionary::dictionary()).isNil());
  EXPECT_TRUE(evaluate("-name", KRDictionary{{"name", "x"}}).isNil());
  EXPECT_TRUE(evaluate("nil ** 2").isNil());
}

TEST_F(KRExpressionTest, Literals) {
  EXPECT_EQ(evaluate("'text'"), KRValue("text"));
  EXPECT_EQ(evaluate("\"text\""), KRValue("text"));
  EXPECT_EQ(evaluate("YES"), KRValue(true));
  EXPECT_EQ(evaluate("false"), KRValue(false));
  EXPECT_TRUE(evaluate("NULL").isNil());
  EXPECT_EQ(evaluate("{1, 'a'}"), KRValue(KRArray{1, "a"}));
  EXPECT_EQ(evaluate("{x, x + 1}", KRDictionary{{"x", 1}}), KRValue(KRArray{1, 2}));
  EXPECT_EQ(evaluate("CAST(0, 'NSDate')"), KRValue(KRDate::dateWithTimeIntervalSince1970(978307200.0)));
  EXPECT_EQ(evaluate("%@", {}, {KRArray{1}}), KRValue(KRArray{1}));
}

TEST_F(KRExpressionTest, FunctionsCallRegisteredOperationsOnTheReceiver) {
  const auto helper = std::make_shared<FormulaHelper>();
  EXPECT_EQ(evaluate("FUNCTION(SELF, 'dayInterval')", helper), KRValue(86400.0));
  EXPECT_EQ(evaluate("FUNCTION(SELF, 'isHelper')", helper), KRValue(true));
  EXPECT_EQ(evaluate("FUNCTION(SELF, 'isHelper')", 5), KRValue(false));
  EXPECT_EQ(evaluate("FUNCTION(SELF, \"currentDate\") - FUNCTION(SELF, 'dayInterval') * 2", helper),
            KRValue(1700000000.5 - 172800.0));
  EXPECT_EQ(evaluate("FUNCTION(count, 'doubled') + 1", KRDictionary{{"count", 20}}), KRValue(41));
  EXPECT_EQ(evaluate("FUNCTION(SELF, %@)", 4, {"doubled"}), KRValue(8));
  EXPECT_EQ(evaluate("FUNCTION(FUNCTION(SELF, 'doubled'), 'doubled')", 3), KRValue(12));
}

TEST_F(KRExpressionTest, UnknownFunctionsRaiseAtEvaluation) {
  const auto expression = KRExpression::expressionWithFormat("FUNCTION(SELF, 'neverRegistered')");
  try {
    expression->expressionValueWithObject(KRValue());
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
    EXPECT_NE(exception.reason().str().find("neverRegistered"), std::string::npos);
  }
}

TEST_F(KRExpressionTest, RegistrationReplacesAndRemoves) {
  KRExpression::registerFunction("expressionTestTemporary", [](const KRValue&) { return KRValue(1); });
  const auto expression = KRExpression::expressionWithFormat("FUNCTION(SELF, 'expressionTestTemporary')");
  EXPECT_EQ(expression->expressionValueWithObject({}), KRValue(1));
  KRExpression::registerFunction("expressionTestTemporary", [](const KRValue&) { return KRValue(2); });
  EXPECT_EQ(expression->expressionValueWithObject({}), KRValue(2));
  KRExpression::registerFunction("expressionTestTemporary", {});
  EXPECT_THROW(expression->expressionValueWithObject({}), KRException);
}

TEST_F(KRExpressionTest, VariablesComeFromTheContext) {
  const auto expression = KRExpression::expressionWithFormat("$base * 2");
  EXPECT_EQ(expression->expressionValueWithObject({}, KRDictionary{{"base", 21}}), KRValue(42));
  EXPECT_THROW(expression->expressionValueWithObject({}), KRException);
}

TEST_F(KRExpressionTest, UnknownKeysRaise) {
  EXPECT_THROW(evaluate("length", "text"), KRException);
  EXPECT_THROW(evaluate("anything", std::make_shared<FormulaHelper>()), KRException);
}

TEST_F(KRExpressionTest, Types) {
  EXPECT_EQ(KRExpression::expressionWithFormat("1")->expressionType(), KRExpression::Type::ConstantValue);
  EXPECT_EQ(KRExpression::expressionWithFormat("SELF")->expressionType(),
            KRExpression::Type::EvaluatedObject);
  EXPECT_EQ(KRExpression::expressionWithFormat("$v")->expressionType(), KRExpression::Type::Variable);
  EXPECT_EQ(KRExpression::expressionWithFormat("a.b")->expressionType(), KRExpression::Type::KeyPath);
  EXPECT_EQ(KRExpression::expressionWithFormat("FUNCTION(SELF, 'f')")->function(), "f");
  EXPECT_EQ(KRExpression::expressionWithFormat("a + 1")->expressionType(), KRExpression::Type::Arithmetic);
  EXPECT_EQ(KRExpression::expressionWithFormat("{a}")->expressionType(), KRExpression::Type::Aggregate);
  EXPECT_EQ(KRExpression::expressionWithFormat("%K", {"SELF"})->expressionType(),
            KRExpression::Type::EvaluatedObject);
}

TEST_F(KRExpressionTest, FormatsUseMinimalParentheses) {
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"1 + 2 * 3", "1 + 2 * 3"},
      {"(1 + 2) * 3", "(1 + 2) * 3"},
      {"1 - (2 - 3)", "1 - (2 - 3)"},
      {"(1 - 2) - 3", "1 - 2 - 3"},
      {"2 ** 3 ** 2", "2 ** 3 ** 2"},
      {"(2 ** 3) ** 2", "(2 ** 3) ** 2"},
      {"-2 ** 2", "-2 ** 2"},
      {"(-2) ** 2", "(-2) ** 2"},
      {"-(a + b)", "-(a + b)"},
      {"a * -b", "a * -b"},
      {"SELF.name", "name"},
      {"#in.b", "#in.b"},
      {"'it\\'s'", "\"it's\""},
      {"'tab\\there'", "\"tab\\there\""},
      {"1.5e300", "1.5e+300"},
      {"YES", "YES"},
      {"nil", "nil"},
      {"{1, 'a', x}", "{1, \"a\", x}"},
      {"FUNCTION(SELF, 'f') / 2", "FUNCTION(SELF, \"f\") / 2"},
      {"$v", "$v"},
  };
  for (const auto& [format, expected] : cases) {
    SCOPED_TRACE(format);
    EXPECT_EQ(KRExpression::expressionWithFormat(format)->expressionFormat(), expected);
  }
}

TEST_F(KRExpressionTest, KeysThatAreNotPlainNamesAreEscaped) {
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"first name", "#\"first name\""},
      {"a.1st.b", "a.#\"1st\".b"},
      {"$x", "#\"$x\""},
      {"in.Self", "#in.#Self"},
      {"say \"hi\"", "#\"say \\\"hi\\\"\""},
      {"größe.@count", "größe.@count"},
      {"", "#\"\""},
      {"a..b", "a.#\"\".b"},
      {"SELF.SELF.x", "SELF.#SELF.x"},
  };
  for (const auto& [keyPath, expected] : cases) {
    SCOPED_TRACE(keyPath);
    const auto expression = KRExpression::expressionForKeyPath(keyPath);
    EXPECT_EQ(expression->expressionFormat(), expected);
    EXPECT_TRUE(KRExpression::expressionWithFormat(expected)->isEqual(expression));
  }
}

TEST_F(KRExpressionTest, ConstantsWithoutLiteralsFormatAsParseableText) {
  EXPECT_EQ(
      KRExpression::expressionForConstantValue(std::numeric_limits<double>::infinity())->expressionFormat(),
      "1e999");
  EXPECT_EQ(KRExpression::expressionForConstantValue(KRDate::dateWithTimeIntervalSince1970(978307260.0))
                ->expressionFormat(),
            "CAST(60, \"NSDate\")");
  EXPECT_EQ(KRExpression::expressionForConstantValue(std::string("\x01"))->expressionFormat(), "\"\\u0001\"");
  EXPECT_EQ(KRExpression::expressionForConstantValue(KRValue::null())->expressionFormat(), "nil");
}

TEST_F(KRExpressionTest, FormatsParseBackToEqualExpressions) {
  const std::vector<std::string> formats = {
      "a + b * c - d / e", "-(a - b) ** -c", "(a ** b) ** (c + 1)",  "FUNCTION(x.y, 'f') * 2",
      "{a, {1, 2}, 'x'}",  "-1.25e-7 - -3",  "CAST(12.5, 'NSDate')", "$v ** 2"};
  for (const std::string& format : formats) {
    SCOPED_TRACE(format);
    const auto parsed = KRExpression::expressionWithFormat(format);
    const auto reparsed = KRExpression::expressionWithFormat(parsed->expressionFormat());
    EXPECT_TRUE(parsed->isEqual(reparsed)) << parsed->expressionFormat();
    EXPECT_EQ(parsed->hash(), reparsed->hash());
    EXPECT_EQ(parsed->description(), parsed->expressionFormat());
  }
}

TEST_F(KRExpressionTest, Equality) {
  const auto expression = KRExpression::expressionWithFormat("a + 1");
  EXPECT_TRUE(expression->isEqual(KRExpression::expressionWithFormat("SELF.a + 1")));
  EXPECT_FALSE(expression->isEqual(KRExpression::expressionWithFormat("a - 1")));
  EXPECT_FALSE(expression->isEqual(KRExpression::expressionWithFormat("a + 2")));
  EXPECT_FALSE(expression->isEqual(KRExpression::expressionWithFormat("b + 1")));
  EXPECT_FALSE(expression->isEqual(nullptr));
}

TEST_F(KRExpressionTest, FactoriesValidateTheirOperands) {
  const auto one = KRExpression::expressionForConstantValue(1);
  using Operator = KRExpression::ArithmeticOperator;
  EXPECT_THROW(KRExpression::expressionForArithmetic(Operator::Add, {one}), KRException);
  EXPECT_THROW(KRExpression::expressionForArithmetic(Operator::Negate, {one, one}), KRException);
  EXPECT_THROW(KRExpression::expressionForArithmetic(Operator::Add, {one, nullptr}), KRException);
  EXPECT_THROW(KRExpression::expressionForFunction(nullptr, "f"), KRException);
  auto tall = one;
  for (size_t i = 1; i < KRExpression::kMaximumHeight; ++i) {
    tall = KRExpression::expressionForArithmetic(Operator::Negate, {tall});
  }
  EXPECT_EQ(tall->height(), KRExpression::kMaximumHeight);
  EXPECT_THROW(KRExpression::expressionForArithmetic(Operator::Negate, {tall}), KRException);
}

TEST_F(KRExpressionTest, MalformedFormatsRaise) {
  for (const char* format :
       {"", "1 +", "* 2", "(1 + 2", "1 + 2)", "FUNCTION(SELF)", "FUNCTION(SELF, x)", "2 ** ", "'open", "1 2",
        "a..b", "{1, 2", "CAST(1, 'NSNumber')", "%@", "a == 1"}) {
    SCOPED_TRACE(format);
    EXPECT_THROW(KRExpression::expressionWithFormat(format), KRException);
  }
}

TEST_F(KRExpressionTest, EvaluatesAndRegistersFromFourThreadsAtOnce) {
  const auto expression = KRExpression::expressionWithFormat("FUNCTION(value, 'doubled') + value ** 2");
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      const KRDictionary object{{"value", t}};
      for (int round = 0; round < 300; ++round) {
        KRExpression::registerFunction("expressionThread" + std::to_string(t),
                                       [](const KRValue&) { return KRValue(); });
        if (!(expression->expressionValueWithObject(object) == KRValue(2 * t + t * t))) ++mismatches;
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(mismatches.load(), 0);
}
