#include "dbconditiontokenizer.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

using dbcore::DBConditionTokenizer;
using Tokens = std::vector<std::string>;

// The postfix tokens from the bottom of the stack to its top.
Tokens postfix(const std::string& condition) {
  auto stack = DBConditionTokenizer::postfix(condition);
  Tokens tokens;
  for (; !stack.empty(); stack.pop()) tokens.insert(tokens.begin(), stack.top());
  return tokens;
}

std::string repeated(const std::string& text, std::size_t count) {
  std::string result;
  for (std::size_t i = 0; i < count; ++i) result += text;
  return result;
}

// "1 || 1 || ..." with `operators` operators: a left-leaning chain that many levels deep.
std::string orChain(std::size_t operators) { return "1" + repeated(" || 1", operators); }

std::string nested(std::size_t levels) { return repeated("(", levels) + "a == b" + repeated(")", levels); }

TEST(DBConditionTokenizerTest, EmptyOrBlankConditionGivesAnEmptyStack) {
  EXPECT_TRUE(postfix("").empty());
  EXPECT_TRUE(postfix(" \t\r\n\f\v").empty());
}

TEST(DBConditionTokenizerTest, ComparisonComesOutInPostfixOrderWithTheRootOnTop) {
  EXPECT_EQ(postfix("marked_to_delete_bool == false"), (Tokens{"marked_to_delete_bool", "false", "=="}));
  const auto stack = DBConditionTokenizer::postfix("a == b");
  EXPECT_EQ(stack.top(), "==");
}

TEST(DBConditionTokenizerTest, SingleOperandIsItsOwnRoot) {
  EXPECT_EQ(postfix("lost_bool"), (Tokens{"lost_bool"}));
}

TEST(DBConditionTokenizerTest, EveryOperatorIsRecognisedWithOrWithoutSpaces) {
  for (const std::string op : {"&&", "||", "==", "!=", "<", "<=", ">", ">="}) {
    EXPECT_EQ(postfix("a " + op + " b"), (Tokens{"a", "b", op})) << op;
    EXPECT_EQ(postfix("a" + op + "b"), (Tokens{"a", "b", op})) << op;
  }
}

TEST(DBConditionTokenizerTest, ComparisonsBindTighterThanAnd) {
  EXPECT_EQ(postfix("a == 1 && b != 2"), (Tokens{"a", "1", "==", "b", "2", "!=", "&&"}));
}

TEST(DBConditionTokenizerTest, AndBindsTighterThanOr) {
  EXPECT_EQ(postfix("a || b && c"), (Tokens{"a", "b", "c", "&&", "||"}));
  EXPECT_EQ(postfix("a && b || c"), (Tokens{"a", "b", "&&", "c", "||"}));
  EXPECT_EQ(postfix("a == 1 && b == 2 || c == 3"),
            (Tokens{"a", "1", "==", "b", "2", "==", "&&", "c", "3", "==", "||"}));
}

TEST(DBConditionTokenizerTest, OperatorsAreLeftAssociative) {
  EXPECT_EQ(postfix("a && b && c"), (Tokens{"a", "b", "&&", "c", "&&"}));
  EXPECT_EQ(postfix("a || b || c"), (Tokens{"a", "b", "||", "c", "||"}));
  EXPECT_EQ(postfix("a < b >= c"), (Tokens{"a", "b", "<", "c", ">="}));
}

TEST(DBConditionTokenizerTest, ParenthesesGroupAndVanish) {
  EXPECT_EQ(postfix("(a || b) && c"), (Tokens{"a", "b", "||", "c", "&&"}));
  EXPECT_EQ(postfix("a && (b || c)"), (Tokens{"a", "b", "c", "||", "&&"}));
  EXPECT_EQ(postfix("((a))"), (Tokens{"a"}));
  EXPECT_EQ(postfix("(marked_to_delete_bool == false) && (lost_bool == true)"),
            (Tokens{"marked_to_delete_bool", "false", "==", "lost_bool", "true", "==", "&&"}));
}

TEST(DBConditionTokenizerTest, WhiteSpaceOfEveryKindSeparatesTokens) {
  EXPECT_EQ(postfix("\ta\n==\r\nb\f&&\vc  ==  d "), (Tokens{"a", "b", "==", "c", "d", "==", "&&"}));
}

TEST(DBConditionTokenizerTest, QuotesAreRemoved) {
  EXPECT_EQ(postfix("path_wide_ch == 'IMG 0001.jpg'"), (Tokens{"path_wide_ch", "IMG 0001.jpg", "=="}));
  EXPECT_EQ(postfix("path_wide_ch == \"IMG 0001.jpg\""), (Tokens{"path_wide_ch", "IMG 0001.jpg", "=="}));
}

TEST(DBConditionTokenizerTest, BackslashTakesTheNextCharacterLiterally) {
  EXPECT_EQ(postfix(R"('it\'s')"), (Tokens{"it's"}));
  EXPECT_EQ(postfix(R"("say \"hi\"")"), (Tokens{R"(say "hi")"}));
  EXPECT_EQ(postfix(R"('back\\slash')"), (Tokens{R"(back\slash)"}));
  EXPECT_EQ(postfix(R"('\n\t')"), (Tokens{"nt"}));
}

TEST(DBConditionTokenizerTest, TheOtherQuoteNeedsNoEscape) {
  EXPECT_EQ(postfix(R"('say "hi"')"), (Tokens{R"(say "hi")"}));
  EXPECT_EQ(postfix(R"("it's")"), (Tokens{"it's"}));
}

TEST(DBConditionTokenizerTest, EmptyQuotesAreAnEmptyTextOperand) {
  EXPECT_EQ(postfix("path_wide_ch == ''"), (Tokens{"path_wide_ch", "", "=="}));
  EXPECT_EQ(postfix("\"\" != path_wide_ch"), (Tokens{"", "path_wide_ch", "!="}));
}

TEST(DBConditionTokenizerTest, QuotedTextKeepsOperatorsParenthesesAndSpaces) {
  EXPECT_EQ(postfix("a == '(b && c) || d'"), (Tokens{"a", "(b && c) || d", "=="}));
}

TEST(DBConditionTokenizerTest, NegativeAndDecimalNumbersAreOneToken) {
  EXPECT_EQ(postfix("width > -3"), (Tokens{"width", "-3", ">"}));
  EXPECT_EQ(postfix("order_float <= 2.5"), (Tokens{"order_float", "2.5", "<="}));
  EXPECT_EQ(postfix("order_float==-0.25"), (Tokens{"order_float", "-0.25", "=="}));
  EXPECT_EQ(postfix("-7 < width"), (Tokens{"-7", "width", "<"}));
  EXPECT_EQ(postfix("_id_int_64 == 16777217"), (Tokens{"_id_int_64", "16777217", "=="}));
}

TEST(DBConditionTokenizerTest, ColumnFunctionPushesTheColumnThenTheWord) {
  EXPECT_EQ(postfix("max_from_column(import_index)"), (Tokens{"import_index", "max_from_column"}));
  EXPECT_EQ(postfix("min_from_column ( width )"), (Tokens{"width", "min_from_column"}));
}

TEST(DBConditionTokenizerTest, ColumnFunctionIsAnOperandOfComparisons) {
  EXPECT_EQ(postfix("import_index == max_from_column(import_index)"),
            (Tokens{"import_index", "import_index", "max_from_column", "=="}));
  EXPECT_EQ(postfix("min_from_column(width) < width && lost_bool == true"),
            (Tokens{"width", "min_from_column", "width", "<", "lost_bool", "true", "==", "&&"}));
}

TEST(DBConditionTokenizerTest, WordsMayHoldDigitsAndUnderscores) {
  EXPECT_EQ(postfix("focal_len35mm >= _x9"), (Tokens{"focal_len35mm", "_x9", ">="}));
}

TEST(DBConditionTokenizerTest, ConditionOfTheMaximumLengthIsRead) {
  const std::string prefix = "path_wide_ch == '";
  const std::string condition =
      prefix + std::string(DBConditionTokenizer::kMaxConditionLength - prefix.size() - 1, 'x') + "'";
  ASSERT_EQ(condition.size(), DBConditionTokenizer::kMaxConditionLength);
  EXPECT_EQ(postfix(condition).size(), 3u);
  EXPECT_TRUE(postfix(condition + " ").empty());
}

TEST(DBConditionTokenizerTest, ParenthesesNestAtMostTheLimit) {
  EXPECT_EQ(postfix(nested(DBConditionTokenizer::kMaxParenthesesDepth)), (Tokens{"a", "b", "=="}));
  EXPECT_TRUE(postfix(nested(DBConditionTokenizer::kMaxParenthesesDepth + 1)).empty());
}

TEST(DBConditionTokenizerTest, OperatorsNestAtMostTheLimit) {
  EXPECT_EQ(postfix(orChain(DBConditionTokenizer::kMaxOperatorDepth)).size(),
            2 * DBConditionTokenizer::kMaxOperatorDepth + 1);
  EXPECT_TRUE(postfix(orChain(DBConditionTokenizer::kMaxOperatorDepth + 1)).empty());
}

struct Malformed {
  const char* name;
  std::string condition;
};

void PrintTo(const Malformed& malformed, std::ostream* out) { *out << malformed.name; }

class DBConditionTokenizerMalformedTest : public testing::TestWithParam<Malformed> {};

TEST_P(DBConditionTokenizerMalformedTest, GivesAnEmptyStack) {
  EXPECT_TRUE(postfix(GetParam().condition).empty());
}

INSTANTIATE_TEST_SUITE_P(
    DBConditionTokenizerConditions, DBConditionTokenizerMalformedTest,
    testing::Values(
        Malformed{"OpenParenthesis", "("}, Malformed{"CloseParenthesis", ")"},
        Malformed{"UnclosedParenthesis", "(a == b"}, Malformed{"UnopenedParenthesis", "a == b)"},
        Malformed{"ReversedParentheses", ")a == b("}, Malformed{"EmptyParentheses", "()"},
        Malformed{"OperatorBeforeClose", "(a ==)"}, Malformed{"MissingRightOperand", "a =="},
        Malformed{"MissingLeftOperand", "== a"}, Malformed{"DanglingAnd", "lost_bool == true &&"},
        Malformed{"LeadingOr", "|| lost_bool == true"}, Malformed{"DoubledOperator", "a == == b"},
        Malformed{"TwoWords", "a b"}, Malformed{"ThirdOperand", "a == b c"},
        Malformed{"NumberThenWord", "focal_len == 35mm"}, Malformed{"OperandThenParenthesis", "a (b)"},
        Malformed{"UnterminatedSingleQuote", "a == 'b"}, Malformed{"UnterminatedDoubleQuote", "a == \"b"},
        Malformed{"EscapedClosingQuote", R"(a == 'b\')"}, Malformed{"TrailingBackslash", "a == 'b\\"},
        Malformed{"SingleEquals", "a = b"}, Malformed{"SingleAmpersand", "a & b"},
        Malformed{"SingleBar", "a | b"}, Malformed{"Not", "!a"}, Malformed{"TripleEquals", "a === b"},
        Malformed{"AngleBrackets", "a <> b"}, Malformed{"Semicolon", "a == b;"},
        Malformed{"Comment", "a == b -- c"}, Malformed{"Hash", "a == b # c"},
        Malformed{"NonAscii", "\xc3\xa9t\xc3\xa9 == a"}, Malformed{"LoneMinus", "a == -"},
        Malformed{"DoubleMinus", "a == --1"}, Malformed{"TrailingDot", "a == 1."},
        Malformed{"LeadingDot", "a == .5"}, Malformed{"NulOutside", std::string("a == b\0", 7)},
        Malformed{"NulInQuotes", std::string("a == 'b\0c'", 10)}, Malformed{"NulOnly", std::string(1, '\0')},
        Malformed{"BareMaxFunction", "max_from_column"},
        Malformed{"BareMinFunctionCompared", "width == min_from_column"},
        Malformed{"FunctionWithoutColumn", "max_from_column()"},
        Malformed{"FunctionUnclosed", "max_from_column(width"},
        Malformed{"FunctionQuotedColumn", "max_from_column('width')"},
        Malformed{"FunctionTwoColumns", "max_from_column(width height)"},
        Malformed{"FunctionAfterOperand", "width max_from_column(width)"},
        Malformed{"QuotedOperator", "a == '&&'"}, Malformed{"QuotedFunctionWord", "'max_from_column'"},
        Malformed{"QuotedMinFunctionWord", "a == \"min_from_column\""}, Malformed{"TwoEmptyQuotes", "'' ''"},
        Malformed{"EmptyQuotesAfterOperator", "== ''"},
        Malformed{"OverLongCondition",
                  "a == '" + std::string(DBConditionTokenizer::kMaxConditionLength, 'x') + "'"},
        Malformed{"TenThousandParentheses", nested(10000)},
        Malformed{"TooManyParentheses", nested(DBConditionTokenizer::kMaxParenthesesDepth + 1)},
        Malformed{"TooLongChain", orChain(DBConditionTokenizer::kMaxOperatorDepth + 1)}),
    [](const testing::TestParamInfo<Malformed>& info) { return std::string(info.param.name); });

}  // namespace
