#include "Support/KRDBRecordConversions.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

using Conversions = KRDBRecordConversions;

TEST(KRDBRecordConversionsTest, DatesAreTruncatedTowardZero) {
  EXPECT_EQ(Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(1.9)), 1);
  EXPECT_EQ(Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(-1.9)), -1);
  EXPECT_EQ(Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(1700000000.0)), 1700000000);
}

TEST(KRDBRecordConversionsTest, NoDateAndUnstorableDatesAreZero) {
  EXPECT_EQ(Conversions::seconds(KRDate()), 0);
  EXPECT_EQ(
      Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(std::numeric_limits<double>::quiet_NaN())),
      0);
  EXPECT_EQ(Conversions::seconds(KRDate::dateWithTimeIntervalSince1970(1e300)), 0);
}

TEST(KRDBRecordConversionsTest, StoredSecondsMakeADate) {
  EXPECT_EQ(Conversions::date(-1).timeIntervalSince1970(), -1.0);
  EXPECT_EQ(Conversions::date(0).timeIntervalSince1970(), 0.0);
}

TEST(KRDBRecordConversionsTest, StringsCrossAsWideStringsLosslessly) {
  const KRString text("Île-de-France ✓ 𝄞");
  EXPECT_EQ(Conversions::wideString(text).size(), 17u);
  EXPECT_EQ(Conversions::string(Conversions::wideString(text)), text);
  EXPECT_EQ(Conversions::wideString(KRString()), L"");
  EXPECT_EQ(Conversions::string(L""), KRString(""));
}

TEST(KRDBRecordConversionsTest, EmptyTextsLoadAsOneSharedStringAndOthersEachAsTheirOwn) {
  const KRString empty = Conversions::string(L"");
  EXPECT_FALSE(empty.isNil());
  EXPECT_TRUE(identical(empty, Conversions::string(L"")));
  EXPECT_FALSE(identical(empty, KRString("")));
  EXPECT_FALSE(identical(Conversions::string(L"a"), Conversions::string(L"a")));
}

}  // namespace
