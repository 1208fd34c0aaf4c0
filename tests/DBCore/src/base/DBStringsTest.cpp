#include "dbstrings.hpp"

#include <gtest/gtest.h>

#include <string>

namespace {

const std::string kUtf8 = "Fotos/\xC3\x89t\xC3\xA9 \xE6\x97\xA5\xE6\x9C\xAC \xF0\x9F\x98\x80";
const std::wstring kWide = L"Fotos/\u00c9t\u00e9 \u65e5\u672c \U0001F600";

TEST(DBStringsTest, S2wsDecodesUtf8IntoOneUnitPerCharacter) {
  EXPECT_EQ(dbcore::s2ws(kUtf8), kWide);
  EXPECT_EQ(dbcore::s2ws("\xF0\x9F\x98\x80").size(), 1u);
}

TEST(DBStringsTest, Ws2sEncodesUtf8) { EXPECT_EQ(dbcore::ws2s(kWide), kUtf8); }

TEST(DBStringsTest, ConversionsRoundTrip) {
  EXPECT_EQ(dbcore::ws2s(dbcore::s2ws(kUtf8)), kUtf8);
  EXPECT_EQ(dbcore::s2ws(dbcore::ws2s(kWide)), kWide);
  EXPECT_EQ(dbcore::s2ws(""), L"");
  EXPECT_EQ(dbcore::ws2s(L""), "");
}

TEST(DBStringsTest, EmbeddedNulIsKept) {
  const std::wstring wide(L"a\0b", 3);
  EXPECT_EQ(dbcore::s2ws(dbcore::ws2s(wide)), wide);
}

TEST(DBStringsTest, InvalidUtf8BecomesReplacementCharacter) {
  const std::wstring wide = dbcore::s2ws(
      "a\xFF"
      "b");
  EXPECT_EQ(wide.front(), L'a');
  EXPECT_EQ(wide.back(), L'b');
  EXPECT_NE(wide.find(L'\uFFFD'), std::wstring::npos);
}

}  // namespace
