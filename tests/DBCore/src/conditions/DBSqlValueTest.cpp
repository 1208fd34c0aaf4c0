#include "dbsqlvalue.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

using namespace dbcore;

namespace {

int order(const DBSqlValue& left, const DBSqlValue& right) {
  return DBSqlValue::compare(left, right).value();
}

DBSqlValue converted(const DBSqlValue& value, DBSqlValue::Affinity affinity, std::string& out) {
  char buffer[DBSqlValue::kIntegerTextSize];
  const DBSqlValue result = value.withAffinity(affinity, buffer);
  out = result.storageClass() == DBSqlValue::Class::Text ? std::string(result.asText()) : "";
  return result;
}

}  // namespace

TEST(DBSqlValueTest, ClassesAndNaN) {
  EXPECT_TRUE(DBSqlValue().isNull());
  EXPECT_EQ(DBSqlValue::integer(4).asInteger(), 4);
  EXPECT_EQ(DBSqlValue::real(2.5).asReal(), 2.5);
  EXPECT_EQ(DBSqlValue::text("ab").asText(), "ab");
  EXPECT_TRUE(DBSqlValue::real(std::nan("")).isNull());
}

TEST(DBSqlValueTest, ComparisonWithNullIsUnknown) {
  EXPECT_FALSE(DBSqlValue::compare(DBSqlValue(), DBSqlValue::integer(1)));
  EXPECT_FALSE(DBSqlValue::compare(DBSqlValue::text("a"), DBSqlValue()));
  EXPECT_FALSE(DBSqlValue::compare(DBSqlValue(), DBSqlValue()));
}

TEST(DBSqlValueTest, NumbersCompareExactlyAcrossIntegerAndReal) {
  const int64_t twoTo53 = int64_t{1} << 53;
  EXPECT_EQ(order(DBSqlValue::integer(twoTo53 + 1), DBSqlValue::real(static_cast<double>(twoTo53))), 1);
  EXPECT_EQ(order(DBSqlValue::real(static_cast<double>(twoTo53)), DBSqlValue::integer(twoTo53 + 1)), -1);
  EXPECT_EQ(order(DBSqlValue::integer(3), DBSqlValue::real(3.0)), 0);
  EXPECT_EQ(order(DBSqlValue::integer(3), DBSqlValue::real(3.5)), -1);
  EXPECT_EQ(order(DBSqlValue::integer(-3), DBSqlValue::real(-3.5)), 1);
  EXPECT_EQ(order(DBSqlValue::integer(INT64_MAX), DBSqlValue::real(9223372036854775808.0)), -1);
  EXPECT_EQ(order(DBSqlValue::integer(INT64_MIN), DBSqlValue::real(-9223372036854775808.0)), 0);
  EXPECT_EQ(order(DBSqlValue::integer(0), DBSqlValue::real(-INFINITY)), 1);
  EXPECT_EQ(order(DBSqlValue::real(-0.0), DBSqlValue::real(0.0)), 0);
}

TEST(DBSqlValueTest, NumbersSortBeforeTextAndTextComparesBytes) {
  EXPECT_EQ(order(DBSqlValue::integer(99), DBSqlValue::text("1")), -1);
  EXPECT_EQ(order(DBSqlValue::text(""), DBSqlValue::real(1e300)), 1);
  EXPECT_EQ(order(DBSqlValue::text("a"), DBSqlValue::text("ab")), -1);
  EXPECT_EQ(order(DBSqlValue::text("B"), DBSqlValue::text("a")), -1);
  EXPECT_EQ(order(DBSqlValue::text("\xc3\xa9"), DBSqlValue::text("z")), 1);
  EXPECT_EQ(order(DBSqlValue::text(std::string_view("a\0b", 3)), DBSqlValue::text("a")), 1);
}

TEST(DBSqlValueTest, TruthOfValues) {
  EXPECT_FALSE(DBSqlValue().truth());
  EXPECT_FALSE(*DBSqlValue::integer(0).truth());
  EXPECT_TRUE(*DBSqlValue::integer(-7).truth());
  EXPECT_FALSE(*DBSqlValue::real(0.0).truth());
  EXPECT_TRUE(*DBSqlValue::text("2x").truth());
  EXPECT_FALSE(*DBSqlValue::text("abc").truth());
  EXPECT_FALSE(*DBSqlValue::text("0.0e5").truth());
}

TEST(DBSqlValueTest, NumericAffinityTurnsNumberTextIntoNumbers) {
  std::string text;
  EXPECT_EQ(converted(DBSqlValue::text(" 12 "), DBSqlValue::Affinity::Numeric, text).asInteger(), 12);
  EXPECT_EQ(converted(DBSqlValue::text("2.5"), DBSqlValue::Affinity::Numeric, text).asReal(), 2.5);
  EXPECT_EQ(converted(DBSqlValue::text("12abc"), DBSqlValue::Affinity::Numeric, text).storageClass(),
            DBSqlValue::Class::Text);
  EXPECT_EQ(converted(DBSqlValue::text("12"), DBSqlValue::Affinity::None, text).storageClass(),
            DBSqlValue::Class::Text);
}

TEST(DBSqlValueTest, TextAffinityWritesIntegersAsText) {
  std::string text;
  EXPECT_EQ(converted(DBSqlValue::integer(-42), DBSqlValue::Affinity::Text, text).storageClass(),
            DBSqlValue::Class::Text);
  EXPECT_EQ(text, "-42");
  converted(DBSqlValue::integer(INT64_MIN), DBSqlValue::Affinity::Text, text);
  EXPECT_EQ(text, "-9223372036854775808");
  EXPECT_EQ(converted(DBSqlValue::integer(1), DBSqlValue::Affinity::Numeric, text).storageClass(),
            DBSqlValue::Class::Integer);
}

TEST(DBSqlValueTest, ShortTextsLiveInTheValue) {
  std::string bytes = "X-T2";
  const DBSqlValue shortText = DBSqlValue::text(bytes);
  bytes = "gone";
  EXPECT_EQ(shortText.asText(), "X-T2");
  EXPECT_FALSE(shortText.viewsText());
  const DBSqlValue copy = shortText;
  EXPECT_EQ(copy.asText(), "X-T2");
  EXPECT_EQ(DBSqlValue::text("12345678").asText(), "12345678");
  EXPECT_EQ(DBSqlValue::text("").asText(), "");
}

TEST(DBSqlValueTest, LongTextsViewTheirBytes) {
  const std::string bytes = "a text longer than eight bytes";
  const DBSqlValue longText = DBSqlValue::text(bytes);
  EXPECT_TRUE(longText.viewsText());
  EXPECT_EQ(longText.asText().data(), bytes.data());
  EXPECT_FALSE(DBSqlValue::integer(1).viewsText());
  EXPECT_EQ(sizeof(DBSqlValue), 16u);
}
