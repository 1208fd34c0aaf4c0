#include "KRFoundation/KRPredicateLexer.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <vector>

#include "KRFoundation/KRException.hpp"

namespace {

using Token = KRPredicateLexer::Token;
using Kind = Token::Kind;

std::vector<Kind> kinds(const std::vector<Token>& tokens) {
  std::vector<Kind> result;
  for (const Token& token : tokens) result.push_back(token.kind);
  return result;
}

std::vector<std::string> texts(const std::vector<Token>& tokens) {
  std::vector<std::string> result;
  for (const Token& token : tokens) result.push_back(token.text);
  return result;
}

// The single string literal of a format.
std::string stringLiteral(const std::string& format) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize(format);
  EXPECT_EQ(tokens.front().kind, Kind::String) << format;
  return tokens.front().text;
}

KRNumber numberLiteral(const std::string& format) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize(format);
  EXPECT_EQ(tokens.size(), 2u) << format;
  EXPECT_EQ(tokens.front().kind, Kind::Number) << format;
  return tokens.front().number;
}

}  // namespace

TEST(KRPredicateLexerTest, SplitsAComparison) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize("photo.rating >= 3");
  EXPECT_EQ(kinds(tokens), (std::vector<Kind>{Kind::Identifier, Kind::Symbol, Kind::Identifier, Kind::Symbol,
                                              Kind::Number, Kind::End}));
  EXPECT_EQ(texts(tokens), (std::vector<std::string>{"photo", ".", "rating", ">=", "3", ""}));
  EXPECT_EQ(tokens[3].position, 13u);
  EXPECT_EQ(tokens[5].position, 17u);
}

TEST(KRPredicateLexerTest, SymbolsTakeTheLongestMatch) {
  EXPECT_EQ(texts(KRPredicateLexer::tokenize("** * == = != <> <= =< >= => && || ! < >")),
            (std::vector<std::string>{"**", "*", "==", "=", "!=", "<>", "<=", "=<", ">=", "=>", "&&", "||",
                                      "!", "<", ">", ""}));
  EXPECT_EQ(texts(KRPredicateLexer::tokenize("a!=b")), (std::vector<std::string>{"a", "!=", "b", ""}));
  EXPECT_EQ(texts(KRPredicateLexer::tokenize("2***3")), (std::vector<std::string>{"2", "**", "*", "3", ""}));
}

TEST(KRPredicateLexerTest, KeywordsInAnyCaseComeOutUpperCase) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize("and Or nOt beginsWith self Yes nil name");
  EXPECT_EQ(texts(tokens),
            (std::vector<std::string>{"AND", "OR", "NOT", "BEGINSWITH", "SELF", "YES", "NIL", "name", ""}));
  EXPECT_EQ(tokens[6].kind, Kind::Keyword);
  EXPECT_EQ(tokens[7].kind, Kind::Identifier);
}

TEST(KRPredicateLexerTest, HashEscapesKeywordsAndDollarNamesVariables) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize("#and $limit @count #@sum");
  EXPECT_EQ(kinds(tokens), (std::vector<Kind>{Kind::Identifier, Kind::Variable, Kind::Identifier,
                                              Kind::Identifier, Kind::End}));
  EXPECT_EQ(texts(tokens), (std::vector<std::string>{"and", "limit", "@count", "@sum", ""}));
}

TEST(KRPredicateLexerTest, HashBeforeAQuotedStringMakesAKeyOfAnyText) {
  const std::vector<Token> tokens =
      KRPredicateLexer::tokenize("#'first name' #\"and\" #'' #'a\\'b\\u00e9' #'1x'.y");
  EXPECT_EQ(kinds(tokens),
            (std::vector<Kind>{Kind::Identifier, Kind::Identifier, Kind::Identifier, Kind::Identifier,
                               Kind::Identifier, Kind::Symbol, Kind::Identifier, Kind::End}));
  EXPECT_EQ(texts(tokens), (std::vector<std::string>{"first name", "and", "", "a'bé", "1x", ".", "y", ""}));
  EXPECT_EQ(tokens[1].position, 14u);
}

TEST(KRPredicateLexerTest, BadQuotedKeysFail) {
  EXPECT_THROW(KRPredicateLexer::tokenize("#'open == 1"), KRException);
  EXPECT_THROW(KRPredicateLexer::tokenize("#'bad \\q'"), KRException);
}

TEST(KRPredicateLexerTest, PlainNames) {
  for (const char* name : {"rating", "_x", "größe", "a1", "@count", "AND"}) {
    EXPECT_TRUE(KRPredicateLexer::isPlainName(name)) << name;
  }
  for (const char* name : {"", "1a", "first name", "a-b", "$x", "#x", "@", "@1", "a.b", "x'"}) {
    EXPECT_FALSE(KRPredicateLexer::isPlainName(name)) << name;
  }
}

TEST(KRPredicateLexerTest, NonAsciiLettersBelongToNames) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize("größe == 1");
  EXPECT_EQ(tokens.front().kind, Kind::Identifier);
  EXPECT_EQ(tokens.front().text, "größe");
}

TEST(KRPredicateLexerTest, ReservedWords) {
  EXPECT_TRUE(KRPredicateLexer::isReservedWord("between"));
  EXPECT_TRUE(KRPredicateLexer::isReservedWord("TruePredicate"));
  EXPECT_TRUE(KRPredicateLexer::isReservedWord("function"));
  EXPECT_FALSE(KRPredicateLexer::isReservedWord("rating"));
  EXPECT_FALSE(KRPredicateLexer::isReservedWord(""));
}

TEST(KRPredicateLexerTest, Integers) {
  EXPECT_EQ(numberLiteral("42").kind(), KRNumber::Kind::Int);
  EXPECT_EQ(numberLiteral("42").longLongValue(), 42);
  EXPECT_EQ(numberLiteral("9223372036854775807").longLongValue(), 9223372036854775807LL);
  EXPECT_EQ(numberLiteral("9223372036854775808").kind(), KRNumber::Kind::UInt);
  EXPECT_EQ(numberLiteral("18446744073709551615").unsignedLongLongValue(), 18446744073709551615ULL);
  EXPECT_EQ(numberLiteral("18446744073709551616").kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(numberLiteral("18446744073709551616").doubleValue(), 18446744073709551616.0);
}

TEST(KRPredicateLexerTest, Decimals) {
  EXPECT_EQ(numberLiteral("2.5").kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(numberLiteral("2.5").doubleValue(), 2.5);
  EXPECT_DOUBLE_EQ(numberLiteral("1e3").doubleValue(), 1000.0);
  EXPECT_DOUBLE_EQ(numberLiteral("1.5E-2").doubleValue(), 0.015);
  EXPECT_DOUBLE_EQ(numberLiteral("2e+2").doubleValue(), 200.0);
  EXPECT_TRUE(std::isinf(numberLiteral("1e999").doubleValue()));
  EXPECT_EQ(numberLiteral("1e-999").doubleValue(), 0.0);
  EXPECT_EQ(numberLiteral("0." + std::string(400, '0') + "1").doubleValue(), 0.0);
  EXPECT_TRUE(std::isinf(numberLiteral(std::string(400, '9')).doubleValue()));
}

TEST(KRPredicateLexerTest, MinusIsNeverPartOfANumber) {
  EXPECT_EQ(texts(KRPredicateLexer::tokenize("-5")), (std::vector<std::string>{"-", "5", ""}));
  EXPECT_EQ(texts(KRPredicateLexer::tokenize("1.x")), (std::vector<std::string>{"1", ".", "x", ""}));
}

TEST(KRPredicateLexerTest, StringEscapes) {
  EXPECT_EQ(stringLiteral("'it\\'s'"), "it's");
  EXPECT_EQ(stringLiteral("\"say \\\"hi\\\"\""), "say \"hi\"");
  EXPECT_EQ(stringLiteral("'a\\nb\\tc\\rd\\\\e'"), "a\nb\tc\rd\\e");
  EXPECT_EQ(stringLiteral("'\\u00e9\\u00C9'"), "éÉ");
  EXPECT_EQ(stringLiteral("'\\ud83d\\ude00'"), "\xF0\x9F\x98\x80");
  EXPECT_EQ(stringLiteral("\"it's\""), "it's");
  EXPECT_EQ(stringLiteral("''"), "");
  EXPECT_EQ(stringLiteral("'line\nbreak'"), "line\nbreak");
}

TEST(KRPredicateLexerTest, FormatConversions) {
  const std::vector<Token> tokens = KRPredicateLexer::tokenize("%@ %K %d %i %u %ld %lld %llu %f %lf %g %e");
  EXPECT_EQ(texts(tokens),
            (std::vector<std::string>{"@", "K", "d", "i", "u", "ld", "lld", "llu", "f", "lf", "g", "e", ""}));
  EXPECT_EQ(tokens.front().kind, Kind::Argument);
}

TEST(KRPredicateLexerTest, BadInputRaisesAtItsPosition) {
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"a == 'open", "position 5: unterminated string"},
      {"a == 'x\\q'", "position 7: unknown escape"},
      {"a == '\\u12'", "position 8: expected four hexadecimal digits"},
      {"a == '\\udc00'", "position 6: unpaired surrogate"},
      {"a ? 1", "position 2: unexpected character"},
      {"a == %z", "position 5: unknown format conversion"},
      {"a == #", "position 5: expected a name"},
      {"a == $9", "position 5: expected a name"},
      {"abc\xC0\xAF", "position 3: invalid UTF-8"},
      {"'\xED\xA0\x80'", "position 1: invalid UTF-8"},
  };
  for (const auto& [format, expected] : cases) {
    SCOPED_TRACE(format);
    try {
      KRPredicateLexer::tokenize(format);
      ADD_FAILURE() << "no exception";
    } catch (const KRException& exception) {
      EXPECT_EQ(exception.name(), KRString(KRException::NSInvalidArgumentException));
      EXPECT_NE(exception.reason().str().find(expected), std::string::npos) << exception.reason().str();
    }
  }
}

TEST(KRPredicateLexerTest, EmptyAndBlankFormatsAreJustTheEnd) {
  EXPECT_EQ(kinds(KRPredicateLexer::tokenize("")), (std::vector<Kind>{Kind::End}));
  const std::vector<Token> blank = KRPredicateLexer::tokenize(" \t\n ");
  EXPECT_EQ(kinds(blank), (std::vector<Kind>{Kind::End}));
  EXPECT_EQ(blank.front().position, 4u);
}

TEST(KRPredicateLexerTest, ParseErrorReasonQuotesTheFormat) {
  try {
    KRPredicateLexer::raiseParseError("a \xFF b", 2, "invalid UTF-8");
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.reason().str(),
              "Unable to parse the format string \"a \xEF\xBF\xBD b\" at position 2: invalid UTF-8");
  }
}
