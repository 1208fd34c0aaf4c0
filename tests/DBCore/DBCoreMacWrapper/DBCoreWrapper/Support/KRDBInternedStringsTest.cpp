#include "Support/KRDBInternedStrings.hpp"

#include <gtest/gtest.h>

#include <string>
#include <thread>

namespace {

TEST(KRDBInternedStringsTest, EqualShortTextsShareOneObject) {
  const KRString first = KRDBInternedStrings::string(L"FUJIFILM X-T5");
  const KRString second = KRDBInternedStrings::string(std::wstring(L"FUJIFILM ") + L"X-T5");
  EXPECT_EQ(first, KRString("FUJIFILM X-T5"));
  EXPECT_TRUE(identical(first, second));
  EXPECT_FALSE(identical(first, KRDBInternedStrings::string(L"FUJIFILM X-T4")));
}

TEST(KRDBInternedStringsTest, LongTextsAreConvertedEachTime) {
  const std::wstring text(KRDBInternedStrings::kLongestInterned + 1, L'a');
  const KRString first = KRDBInternedStrings::string(text);
  EXPECT_EQ(first.str(), std::string(text.size(), 'a'));
  EXPECT_FALSE(identical(first, KRDBInternedStrings::string(text)));
}

TEST(KRDBInternedStringsTest, AFullTableStartsAgainAndStillAnswersTheText) {
  for (size_t index = 0; index <= KRDBInternedStrings::kCapacity; ++index)
    KRDBInternedStrings::string(L"lens " + std::to_wstring(index));
  EXPECT_EQ(KRDBInternedStrings::string(L"lens 7"), KRString("lens 7"));
  EXPECT_EQ(KRDBInternedStrings::string(L"Ä lens ☀"), KRString("Ä lens ☀"));
}

TEST(KRDBInternedStringsTest, EachThreadHasItsOwnTable) {
  const KRString here = KRDBInternedStrings::string(L"Sony");
  KRString there;
  std::thread([&there] { there = KRDBInternedStrings::string(L"Sony"); }).join();
  EXPECT_EQ(here, there);
  EXPECT_FALSE(identical(here, there));
}

}  // namespace
