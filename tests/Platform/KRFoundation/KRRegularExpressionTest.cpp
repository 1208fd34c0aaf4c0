#include "KRFoundation/KRRegularExpression.hpp"

#include <gtest/gtest.h>

#include <chrono>

#include "KRFoundation/KRException.hpp"

TEST(KRRegularExpressionTest, MatchesWholeTexts) {
  const KRRegularExpression expression("[a-z]+\\.jpg", false, false);
  EXPECT_EQ(expression.pattern(), "[a-z]+\\.jpg");
  EXPECT_TRUE(expression.matches("beach.jpg"));
  EXPECT_FALSE(expression.matches("beach.jpg.png"));
  EXPECT_FALSE(expression.matches("my beach.jpg"));
  EXPECT_FALSE(expression.matches("Beach.jpg"));
}

TEST(KRRegularExpressionTest, CaseAndDiacriticOptions) {
  EXPECT_TRUE(KRRegularExpression("[a-z]+", true, false).matches("BEACH"));
  EXPECT_FALSE(KRRegularExpression("ete", false, false).matches("été"));
  EXPECT_TRUE(KRRegularExpression("ete", false, true).matches("été"));
  EXPECT_TRUE(KRRegularExpression("été", false, true).matches("ete"));
  EXPECT_TRUE(KRRegularExpression("ete", true, true).matches("ÉTÉ"));
}

TEST(KRRegularExpressionTest, LineBreaksAreOrdinaryCharacters) {
  for (const bool folded : {false, true}) {
    SCOPED_TRACE(folded);
    EXPECT_FALSE(KRRegularExpression("a.b", folded, folded).matches("a\nb"));
    EXPECT_FALSE(KRRegularExpression("^a$.*", folded, folded).matches("a\nb"));
    EXPECT_FALSE(KRRegularExpression("a..b", folded, folded).matches("a\r\nb"));
    EXPECT_FALSE(KRRegularExpression("a.b", folded, folded).matches("a\u2028b"));
    EXPECT_TRUE(KRRegularExpression("a\\nb", folded, folded).matches("a\nb"));
    EXPECT_TRUE(KRRegularExpression("a[\\s\\S]b", folded, folded).matches("a\nb"));
    EXPECT_TRUE(KRRegularExpression("^a\\nb$", folded, folded).matches("a\nb"));
  }
}

TEST(KRRegularExpressionTest, UnicodeAwareClasses) {
  EXPECT_TRUE(KRRegularExpression("\\w+", false, false).matches("größe"));
  EXPECT_TRUE(KRRegularExpression(".", false, false).matches("\xF0\x9F\x98\x80"));
}

TEST(KRRegularExpressionTest, InvalidPatternsRaise) {
  for (const char* pattern : {"(", "[a-", "*a", "a{2,1}", "\\"}) {
    SCOPED_TRACE(pattern);
    try {
      KRRegularExpression(pattern, false, false);
      ADD_FAILURE() << "no exception";
    } catch (const KRException& exception) {
      EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
      EXPECT_NE(exception.reason().str().find("Invalid regular expression"), std::string::npos);
    }
  }
}

TEST(KRRegularExpressionTest, RunawayBacktrackingEndsAsNoMatch) {
  const KRRegularExpression expression("(a+)+b", false, false);
  const auto start = std::chrono::steady_clock::now();
  EXPECT_FALSE(expression.matches(std::string(100, 'a')));
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(30));
  EXPECT_TRUE(expression.matches("aaab"));
}
