#include "KRFoundation/KRUTF.hpp"

#include <gtest/gtest.h>

TEST(KRUTFTest, RoundTripsEveryPlane) {
  const std::wstring wide = L"a\u00e9\u65e5\U0001F600\U0010FFFF";
  const std::string utf8 = KRUTF::utf8FromWide(wide);
  EXPECT_EQ(utf8, "a\xC3\xA9\xE6\x97\xA5\xF0\x9F\x98\x80\xF4\x8F\xBF\xBF");
  EXPECT_EQ(KRUTF::wideFromUTF8(utf8), wide);
}

TEST(KRUTFTest, InvalidInputBecomesReplacementCharacters) {
  EXPECT_EQ(KRUTF::wideFromUTF8("a\xFF"
                                "b"),
            L"a\uFFFDb");
  EXPECT_EQ(KRUTF::wideFromUTF8("\xE6\x97"), L"\uFFFD");
  const std::wstring invalid{static_cast<wchar_t>(0xD800), static_cast<wchar_t>(0x110000), L'z'};
  EXPECT_EQ(KRUTF::utf8FromWide(invalid), "\xEF\xBF\xBD\xEF\xBF\xBDz");
}

TEST(KRUTFTest, AppendKeepsWhatTheBufferHeld) {
  std::string buffer = "prefix:";
  KRUTF::appendUTF8(buffer, L"\u00e9");
  EXPECT_EQ(buffer, "prefix:\xC3\xA9");
}
