#include "Support/KRDBRecordFieldConversion.hpp"

#include <gtest/gtest.h>

#include <limits>
#include <string>

namespace {

using Conversion = KRDBRecordFieldConversion;

TEST(KRDBRecordFieldConversionTest, FloatsIntoIntegerFieldsTruncateTowardZero) {
  EXPECT_EQ(Conversion::toRecord<int32_t>(7.9f), 7);
  EXPECT_EQ(Conversion::toRecord<int32_t>(-7.9f), -7);
  EXPECT_EQ(Conversion::toRecord<int32_t>(std::numeric_limits<float>::quiet_NaN()), 0);
  EXPECT_EQ(Conversion::toRecord<int32_t>(1e20f), std::numeric_limits<int32_t>::max());
  EXPECT_EQ(Conversion::toRecord<int32_t>(-1e20f), std::numeric_limits<int32_t>::min());
}

TEST(KRDBRecordFieldConversionTest, WideIntegersKeepTheirLow32Bits) {
  EXPECT_EQ(Conversion::toRecord<int32_t>(int64_t{4294967297}), 1);
  EXPECT_EQ(Conversion::toRecord<int32_t>(int64_t{-1}), -1);
  EXPECT_EQ(Conversion::toRecord<int32_t>(int64_t{2147483648}), std::numeric_limits<int32_t>::min());
}

TEST(KRDBRecordFieldConversionTest, StringsAndDatesCrossAsTheEngineKeepsThem) {
  EXPECT_EQ(Conversion::toRecord<std::wstring>(KRString("Café")), L"Café");
  EXPECT_EQ(Conversion::toRecord<int64_t>(KRDate::dateWithTimeIntervalSince1970(-1.9)), -1);
  EXPECT_EQ(Conversion::fromRecord<KRString>(std::wstring(L"Café")), KRString("Café"));
  EXPECT_EQ(Conversion::fromRecord<KRDate>(int64_t{5}).timeIntervalSince1970(), 5.0);
}

TEST(KRDBRecordFieldConversionTest, OtherValuesAreCastAsTheyAre) {
  EXPECT_EQ(Conversion::toRecord<float>(0.1), 0.1f);
  EXPECT_EQ(Conversion::toRecord<bool>(true), true);
  EXPECT_EQ(Conversion::fromRecord<float>(int32_t{7}), 7.0f);
  EXPECT_EQ(Conversion::fromRecord<int64_t>(int32_t{-3}), -3);
}

}  // namespace
