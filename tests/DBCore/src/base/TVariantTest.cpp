#include "tvariant.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

using dbcore::FieldType;
using dbcore::TVariant;

TEST(TVariantTest, DefaultValueHasNoType) {
  const TVariant value;
  EXPECT_EQ(value.type(), FieldType::T_NONE);
  EXPECT_EQ(value.asInt64(), 0);
  EXPECT_EQ(value.asDouble(), 0.0);
  EXPECT_TRUE(value.asWideText().empty());
}

TEST(TVariantTest, EachConstructorSetsItsType) {
  EXPECT_EQ(TVariant(true).type(), FieldType::T_BOOL);
  EXPECT_EQ(TVariant(int32_t{7}).type(), FieldType::T_INT);
  EXPECT_EQ(TVariant(int64_t{7}).type(), FieldType::T_INT_64);
  EXPECT_EQ(TVariant(1.5f).type(), FieldType::T_FLOAT);
  EXPECT_EQ(TVariant(std::string("text")).type(), FieldType::T_TEXT);
  EXPECT_EQ(TVariant(std::wstring(L"text")).type(), FieldType::T_WIDE_TEXT);
}

TEST(TVariantTest, IntegersConvertToEveryNumericKind) {
  const TVariant big(int64_t{1} << 40);
  EXPECT_EQ(big.asInt64(), int64_t{1} << 40);
  EXPECT_EQ(big.asDouble(), 1099511627776.0);
  EXPECT_TRUE(big.asBool());
  const TVariant negative(int32_t{-7});
  EXPECT_EQ(negative.asInt64(), -7);
  EXPECT_EQ(negative.asFloat(), -7.0f);
  EXPECT_EQ(TVariant(true).asInt(), 1);
  EXPECT_FALSE(TVariant(int64_t{0}).asBool());
}

TEST(TVariantTest, FloatsTruncateTowardZeroAsIntegers) {
  const TVariant value(3.75f);
  EXPECT_EQ(value.asFloat(), 3.75f);
  EXPECT_EQ(value.asDouble(), 3.75);
  EXPECT_EQ(value.asInt64(), 3);
  EXPECT_EQ(TVariant(-2.5f).asInt(), -2);
}

TEST(TVariantTest, TextReadsAsZeroNumber) {
  EXPECT_EQ(TVariant(std::string("12")).asInt64(), 0);
  EXPECT_EQ(TVariant(std::wstring(L"12")).asDouble(), 0.0);
  EXPECT_FALSE(TVariant(std::string("1")).asBool());
}

TEST(TVariantTest, WideTextReadsBackAndIsEmptyForOtherTypes) {
  const std::wstring text = L"\u00c9t\u00e9 \u65e5\u672c \U0001F600";
  EXPECT_EQ(TVariant(text).asWideText(), text);
  EXPECT_TRUE(TVariant(std::string("narrow")).asWideText().empty());
  EXPECT_TRUE(TVariant(int32_t{3}).asWideText().empty());
  EXPECT_EQ(TVariant(std::string("narrow")).asText(), "narrow");
}

TEST(TVariantTest, EqualityComparesTypeAndValue) {
  EXPECT_EQ(TVariant(int32_t{1}), TVariant(int32_t{1}));
  EXPECT_EQ(TVariant(), TVariant());
  EXPECT_NE(TVariant(int32_t{1}), TVariant(int32_t{2}));
  EXPECT_NE(TVariant(int32_t{1}), TVariant(int64_t{1}));
  EXPECT_NE(TVariant(true), TVariant(int32_t{1}));
  EXPECT_NE(TVariant(std::string("a")), TVariant(std::wstring(L"a")));
  EXPECT_NE(TVariant(int64_t{0}), TVariant());
}

TEST(TVariantDeathTest, NarrowTextReadOfAnotherTypeStopsTheProgram) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_DEATH(TVariant(int32_t{5}).asText(), "type == FieldType::T_TEXT");
  EXPECT_DEATH(TVariant(std::wstring(L"wide")).asText(), "type == FieldType::T_TEXT");
}
