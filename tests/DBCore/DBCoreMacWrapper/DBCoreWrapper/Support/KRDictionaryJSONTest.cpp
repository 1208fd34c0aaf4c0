#include "Support/KRDictionaryJSON.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <utility>
#include <vector>

namespace {

const char* const kNonASCIIText = "Caf\u00e9 \u2713 \U0001D11E";

KRDictionary nestedDictionary() {
  return KRDictionary{{"name", kNonASCIIText},
                      {"count", 3},
                      {"inner", KRDictionary{{"list", KRArray{1, "two", KRDictionary{{"x", kNonASCIIText}}}},
                                             {"flag", true}}}};
}

TEST(KRDictionaryJSONTest, WritesCompactText) {
  EXPECT_EQ(KRDictionaryJSON::jsonString(KRDictionary{{"a", 1}}), KRString("{\"a\":1}"));
  EXPECT_EQ(KRDictionaryJSON::jsonWString(KRDictionary{{"a", 1}}), std::wstring(L"{\"a\":1}"));
}

TEST(KRDictionaryJSONTest, ValuesJSONCannotRepresentGiveNilAndEmptyWideText) {
  const std::vector<std::pair<std::string, KRValue>> cases = {
      {"date", KRDate::dateWithTimeIntervalSince1970(0)},
      {"NaN", std::nan("")},
      {"set", KRSet{1, 2}},
  };
  for (const auto& [name, value] : cases) {
    const KRDictionary dictionary{{"ok", 1}, {"bad", value}};
    EXPECT_TRUE(KRDictionaryJSON::jsonString(dictionary).isNil()) << name;
    EXPECT_TRUE(KRDictionaryJSON::jsonWString(dictionary).empty()) << name;
  }
}

TEST(KRDictionaryJSONTest, NilDictionaryGivesNilAndEmptyWideText) {
  EXPECT_TRUE(KRDictionaryJSON::jsonString(KRDictionary()).isNil());
  EXPECT_TRUE(KRDictionaryJSON::jsonWString(KRDictionary()).empty());
}

TEST(KRDictionaryJSONTest, EmptyDictionaryIsAnEmptyObject) {
  EXPECT_EQ(KRDictionaryJSON::jsonString(KRDictionary::dictionary()), KRString("{}"));
  const KRDictionary parsed = KRDictionaryJSON::dictionaryWithJsonString("{}");
  EXPECT_FALSE(parsed.isNil());
  EXPECT_EQ(parsed.count(), 0u);
}

TEST(KRDictionaryJSONTest, EmptyOrNilTextGivesNil) {
  EXPECT_TRUE(KRDictionaryJSON::dictionaryWithJsonWString(std::wstring()).isNil());
  EXPECT_TRUE(KRDictionaryJSON::dictionaryWithJsonString(KRString()).isNil());
  EXPECT_TRUE(KRDictionaryJSON::dictionaryWithJsonString("").isNil());
}

TEST(KRDictionaryJSONTest, NestedNonASCIIDictionaryRoundTripsThroughWideText) {
  const KRDictionary original = nestedDictionary();
  const std::wstring wide = KRDictionaryJSON::jsonWString(original);
  ASSERT_FALSE(wide.empty());
  EXPECT_NE(wide.find(L"Caf\u00e9 \u2713 \U0001D11E"), std::wstring::npos);
  EXPECT_EQ(KRDictionaryJSON::dictionaryWithJsonWString(wide), original);
}

TEST(KRDictionaryJSONTest, NestedDictionaryRoundTripsThroughNarrowText) {
  const KRDictionary original = nestedDictionary();
  const KRString text = KRDictionaryJSON::jsonString(original);
  ASSERT_FALSE(text.isNil());
  EXPECT_EQ(KRDictionaryJSON::dictionaryWithJsonString(text), original);
}

TEST(KRDictionaryJSONTest, ValidJSONThatIsNotAnObjectGivesNil) {
  for (const wchar_t* text : {L"[1,2]", L"1", L"\"text\"", L"null", L"true"}) {
    EXPECT_TRUE(KRDictionaryJSON::dictionaryWithJsonWString(text).isNil())
        << KRString::krs_stringWithWString(text).str();
  }
  EXPECT_TRUE(KRDictionaryJSON::dictionaryWithJsonString("[1,2]").isNil());
}

TEST(KRDictionaryJSONTest, InvalidTextGivesNilWithoutThrowing) {
  for (const char* text : {"{", "{\"a\":}", "{\"a\" 1}", "not json", "{\"a\":1} trailing", "{'a':1}"}) {
    KRDictionary parsed = KRDictionary::dictionary();
    EXPECT_NO_THROW(parsed = KRDictionaryJSON::dictionaryWithJsonString(text)) << text;
    EXPECT_TRUE(parsed.isNil()) << text;
    EXPECT_NO_THROW(parsed = KRDictionaryJSON::dictionaryWithJsonWString(KRString(text).krs_wstring()))
        << text;
    EXPECT_TRUE(parsed.isNil()) << text;
  }
}

}  // namespace
