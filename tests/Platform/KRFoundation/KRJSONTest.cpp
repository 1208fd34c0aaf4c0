#include "KRFoundation/KRJSON.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>
#include <utility>
#include <vector>

namespace {

std::string jsonText(const KRValue& value) { return KRJSON::stringWithJSONObject(value).str(); }

KRValue parsed(const std::string& text) { return KRJSON::JSONObjectWithString(KRString(text)); }

void expectError(const std::shared_ptr<KRError>& error, long long code, const std::string& context) {
  ASSERT_NE(error, nullptr) << context;
  EXPECT_EQ(error->domain(), KRString("NSCocoaErrorDomain")) << context;
  EXPECT_EQ(error->code(), code) << context;
  EXPECT_FALSE(error->userInfo().objectForKey(KRError::NSLocalizedDescriptionKey).string().empty())
      << context;
}

std::string nested(int depth) { return std::string(depth, '[') + std::string(depth, ']'); }

TEST(KRJSONTest, WritesCompactText) {
  const KRDictionary object{{"a", 1}, {"b", KRArray{true, KRNull{}, "x"}}};
  EXPECT_EQ(jsonText(object), R"({"a":1,"b":[true,null,"x"]})");
}

TEST(KRJSONTest, WritesKeysInDictionaryOrder) {
  const KRDictionary object{{"zebra", 1}, {"apple", 2}, {"mango", KRDictionary{{"y", 1}, {"b", 2}}}};
  EXPECT_EQ(jsonText(object), R"({"zebra":1,"apple":2,"mango":{"y":1,"b":2}})");
}

TEST(KRJSONTest, WritesBooleansAsLiterals) {
  EXPECT_EQ(jsonText(KRArray{true, false, 1, 0}), "[true,false,1,0]");
}

TEST(KRJSONTest, WritesNumbersOfEveryKind) {
  const KRArray numbers{std::numeric_limits<long long>::min(), std::numeric_limits<unsigned long long>::max(),
                        1.5, 0.1, -2};
  EXPECT_EQ(jsonText(numbers), "[-9223372036854775808,18446744073709551615,1.5,0.1,-2]");
}

TEST(KRJSONTest, WritesTopLevelScalars) {
  EXPECT_EQ(jsonText("x"), "\"x\"");
  EXPECT_EQ(jsonText(KRNull{}), "null");
  EXPECT_EQ(jsonText(42), "42");
  EXPECT_EQ(jsonText(KRArray::array()), "[]");
  EXPECT_EQ(jsonText(KRDictionary::dictionary()), "{}");
}

TEST(KRJSONTest, WritesEscapesAndRawUnicode) {
  const KRArray strings{"quote\" back\\ nl\n tab\t \x01 \u00e9 \U0001F600 /"};
  EXPECT_EQ(jsonText(strings), "[\"quote\\\" back\\\\ nl\\n tab\\t \\u0001 \u00e9 \U0001F600 /\"]");
}

TEST(KRJSONTest, NestedValuesRoundTrip) {
  const KRValue original = KRDictionary{
      {"name", "Trip \u00e9t\u00e9 \U0001F600"},
      {"count", 3},
      {"ratio", 0.25},
      {"flags", KRArray{true, false}},
      {"nested", KRDictionary{{"list", KRArray{KRDictionary{{"x", KRNull{}}}, KRArray::array(), "s"}}}},
      {"empty", KRDictionary::dictionary()},
  };
  std::shared_ptr<KRError> error;
  const KRString text = KRJSON::stringWithJSONObject(original, &error);
  ASSERT_FALSE(text.isNil());
  EXPECT_EQ(error, nullptr);
  const KRValue back = KRJSON::JSONObjectWithString(text, &error);
  EXPECT_EQ(error, nullptr);
  EXPECT_TRUE(back == original);
  EXPECT_EQ(KRJSON::stringWithJSONObject(back), text);
  EXPECT_EQ(back.dictionary().objectForKey("flags").array().objectAtIndex(0).number().kind(),
            KRNumber::Kind::Bool);
}

TEST(KRJSONTest, ReadsNumbersWithTheirKinds) {
  const KRArray numbers =
      parsed("[1,-5,9223372036854775807,9223372036854775808,18446744073709551615,1.0,2.5e3,true]").array();
  ASSERT_EQ(numbers.count(), 8u);
  const std::vector<KRNumber::Kind> kinds = {
      KRNumber::Kind::Int,  KRNumber::Kind::Int,    KRNumber::Kind::Int,    KRNumber::Kind::UInt,
      KRNumber::Kind::UInt, KRNumber::Kind::Double, KRNumber::Kind::Double, KRNumber::Kind::Bool};
  for (size_t i = 0; i < kinds.size(); ++i)
    EXPECT_EQ(numbers.objectAtIndex(i).number().kind(), kinds[i]) << i;
  EXPECT_EQ(numbers.objectAtIndex(1).number().longLongValue(), -5);
  EXPECT_EQ(numbers.objectAtIndex(3).number().unsignedLongLongValue(), 9223372036854775808ull);
  EXPECT_EQ(numbers.objectAtIndex(6).number().doubleValue(), 2500.0);
  EXPECT_TRUE(numbers.objectAtIndex(7).number().boolValue());
}

TEST(KRJSONTest, ReadsIntegersBeyondSixtyFourBitsAsDoubles) {
  const KRNumber number = parsed("18446744073709551616").number();
  ASSERT_FALSE(number.isNil());
  EXPECT_EQ(number.kind(), KRNumber::Kind::Double);
  EXPECT_DOUBLE_EQ(number.doubleValue(), 18446744073709551616.0);
}

TEST(KRJSONTest, ReadsObjectsInDocumentOrder) {
  const KRDictionary object = parsed(R"({"b":1,"a":2,"c":{"z":null,"y":"s"}})").dictionary();
  ASSERT_EQ(object.count(), 3u);
  EXPECT_EQ(object.entries()[0].first, KRValue("b"));
  EXPECT_EQ(object.entries()[1].first, KRValue("a"));
  const KRDictionary inner = object.objectForKey("c").dictionary();
  ASSERT_EQ(inner.count(), 2u);
  EXPECT_EQ(inner.entries()[0].first, KRValue("z"));
  EXPECT_TRUE(inner.entries()[0].second.isNull());
  EXPECT_EQ(inner.objectForKey("y"), KRValue("s"));
}

TEST(KRJSONTest, LaterDuplicateKeyWins) {
  const KRDictionary object = parsed(R"({"a":1,"b":2,"a":3})").dictionary();
  ASSERT_EQ(object.count(), 2u);
  EXPECT_EQ(object.objectForKey("a"), KRValue(3));
  EXPECT_EQ(object.entries()[0].first, KRValue("a"));
}

TEST(KRJSONTest, ReadsTopLevelScalarsAndWhitespace) {
  EXPECT_EQ(parsed("\"x\""), KRValue("x"));
  EXPECT_EQ(parsed(" 42 "), KRValue(42));
  EXPECT_TRUE(parsed("null").isNull());
  EXPECT_EQ(parsed(" {\n\t\"a\" : [ 1 , 2 ] } "), KRValue(KRDictionary{{"a", KRArray{1, 2}}}));
}

TEST(KRJSONTest, ReadsUnicodeEscapes) {
  EXPECT_EQ(parsed(R"("\u00e9\ud83d\ude00\u0041\n\/")"), KRValue("\u00e9\U0001F600A\n/"));
  EXPECT_EQ(parsed("\"\u00e9\U0001F600\""), KRValue("\u00e9\U0001F600"));
}

TEST(KRJSONTest, UnrepresentableValuesGiveNilAndAnError) {
  const KRValue date = KRDate::dateWithTimeIntervalSince1970(0);
  const std::vector<std::pair<const char*, KRValue>> cases = {
      {"NaN", std::nan("")},
      {"infinity", std::numeric_limits<double>::infinity()},
      {"negative infinity", -std::numeric_limits<double>::infinity()},
      {"NaN inside an array", KRArray{1, std::nan("")}},
      {"date", date},
      {"date deep inside", KRDictionary{{"a", KRArray{KRDictionary{{"b", date}}}}}},
      {"set", KRSet{1, 2}},
      {"object", KRValue(KRError::errorWithDomain("test", 1))},
      {"nil", KRValue()},
      {"nil inside an array", KRArray{1, KRValue()}},
      {"nil inside a dictionary", KRDictionary{{"a", KRValue()}}},
      {"number key", KRDictionary{{1, "x"}}},
      {"null key", KRDictionary{{KRNull{}, "x"}}},
      {"invalid UTF-8 string", KRArray{"a\xFF"}},
      {"invalid UTF-8 key", KRDictionary{{"\xC0\xAF", 1}}},
  };
  for (const auto& [name, value] : cases) {
    std::shared_ptr<KRError> error;
    EXPECT_TRUE(KRJSON::stringWithJSONObject(value, &error).isNil()) << name;
    expectError(error, KRJSON::NSPropertyListWriteInvalidError, name);
  }
}

TEST(KRJSONTest, MalformedTextGivesNilAndAnError) {
  const std::vector<std::string> cases = {
      "",        "   ", "{",         "[1,2", R"({"a":1)",  R"({"a":1}x)",        "[1] [2]",       "[1,]",
      "{'a':1}", "nul", "\"abc",     "\xFF", "\"\xC3(\"",  "[\"\xED\xA0\x80\"]", R"(["\ud800"])", R"(["\x"])",
      "01",      "1.",  "{\"a\" 1}", "NaN",  "[Infinity]", "\"tab\there\"",
  };
  for (const auto& text : cases) {
    std::shared_ptr<KRError> error;
    EXPECT_TRUE(KRJSON::JSONObjectWithString(KRString(text), &error).isNil()) << text;
    ASSERT_NE(error, nullptr) << text;
    expectError(error, KRJSON::NSPropertyListReadCorruptError, text);
    EXPECT_NE(error->localizedDescription().str().find("parse_error"), std::string::npos) << text;
  }
}

TEST(KRJSONTest, TextWithANulCharacterIsRefused) {
  for (const std::string& text :
       {std::string("[1]\0", 4), std::string("[1]\0[2]", 7), std::string("\0", 1)}) {
    std::shared_ptr<KRError> error;
    EXPECT_TRUE(KRJSON::JSONObjectWithString(KRString(text), &error).isNil()) << text.size();
    expectError(error, KRJSON::NSPropertyListReadCorruptError, "NUL");
  }
}

TEST(KRJSONTest, NilTextGivesNilAndAnError) {
  std::shared_ptr<KRError> error;
  EXPECT_TRUE(KRJSON::JSONObjectWithString(KRString(), &error).isNil());
  expectError(error, KRJSON::NSPropertyListReadCorruptError, "nil");
}

TEST(KRJSONTest, ErrorOutParameterIsOptional) {
  EXPECT_TRUE(KRJSON::JSONObjectWithString("{").isNil());
  EXPECT_TRUE(KRJSON::stringWithJSONObject(std::nan("")).isNil());
}

TEST(KRJSONTest, NestingUpToTheLimitIsRead) {
  std::shared_ptr<KRError> error;
  KRValue value = KRJSON::JSONObjectWithString(KRString(nested(KRJSON::maximumDepth)), &error);
  EXPECT_EQ(error, nullptr);
  int depth = 0;
  while (value.type() == KRValue::Type::Array) {
    ++depth;
    value = value.array().count() ? value.array().objectAtIndex(0) : KRValue();
  }
  EXPECT_EQ(depth, KRJSON::maximumDepth);
}

TEST(KRJSONTest, DeeperNestingIsRefusedWithoutCrashing) {
  for (int depth : {KRJSON::maximumDepth + 1, 100000}) {
    std::shared_ptr<KRError> error;
    EXPECT_TRUE(KRJSON::JSONObjectWithString(KRString(nested(depth)), &error).isNil()) << depth;
    expectError(error, KRJSON::NSPropertyListReadCorruptError, std::to_string(depth));
  }
  std::string objects;
  for (int i = 0; i < 100000; ++i) objects += "{\"a\":";
  std::shared_ptr<KRError> error;
  EXPECT_TRUE(
      KRJSON::JSONObjectWithString(KRString(objects + "1" + std::string(100000, '}')), &error).isNil());
  expectError(error, KRJSON::NSPropertyListReadCorruptError, "nested objects");
}

}  // namespace
