#include "dbsqlrow.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <vector>

using namespace dbcore;

TEST(DBSqlRowTest, VariantsBecomeStoredValues) {
  const DBSqlRow row(std::vector<TVariant>{
      TVariant(true), TVariant(int32_t{-3}), TVariant(int64_t{1} << 40), TVariant(1.5f),
      TVariant(std::string("ab")), TVariant(std::wstring(L"\u00e9")), TVariant(), TVariant(std::nanf(""))});
  ASSERT_EQ(row.size(), 8u);
  EXPECT_EQ(row[0].asInteger(), 1);
  EXPECT_EQ(row[1].asInteger(), -3);
  EXPECT_EQ(row[2].asInteger(), int64_t{1} << 40);
  EXPECT_EQ(row[3].asReal(), 1.5);
  EXPECT_EQ(row[4].asText(), "ab");
  EXPECT_EQ(row[5].asText(), "\xc3\xa9");
  EXPECT_TRUE(row[6].isNull());
  EXPECT_TRUE(row[7].isNull());
}

TEST(DBSqlRowTest, InfinitiesStayRealsAndEveryNaNIsNull) {
  const DBSqlRow row(
      std::vector<TVariant>{TVariant(INFINITY), TVariant(-INFINITY), TVariant(-std::nanf(""))});
  EXPECT_EQ(row[0].storageClass(), DBSqlValue::Class::Real);
  EXPECT_EQ(row[0].asReal(), HUGE_VAL);
  EXPECT_EQ(row[1].asReal(), -HUGE_VAL);
  EXPECT_TRUE(row[2].isNull());
}

TEST(DBSqlRowTest, PastTheEndIsNull) {
  const DBSqlRow row(std::vector<TVariant>{TVariant(int32_t{1})});
  EXPECT_TRUE(row[1].isNull());
  EXPECT_TRUE(DBSqlRow()[0].isNull());
}

TEST(DBSqlRowTest, OwnsTheBytesOfItsTexts) {
  auto source = std::make_unique<std::string>("a longer text than small strings hold");
  DBSqlRow row(
      std::vector<DBSqlValue>{DBSqlValue::text(*source), DBSqlValue::integer(2), DBSqlValue::text("")});
  source.reset();
  const DBSqlRow moved(std::move(row));
  EXPECT_EQ(moved[0].asText(), "a longer text than small strings hold");
  EXPECT_EQ(moved[1].asInteger(), 2);
  EXPECT_EQ(moved[2].asText(), "");
}

TEST(DBSqlRowTest, HoldsSameValuesComparesClassesAndValues) {
  const auto row = [](std::vector<DBSqlValue> values) { return DBSqlRow(values); };
  const DBSqlRow base = row({DBSqlValue::integer(3), DBSqlValue(), DBSqlValue::text("a longer text value")});
  EXPECT_TRUE(base.holdsSameValues(
      row({DBSqlValue::integer(3), DBSqlValue(), DBSqlValue::text("a longer text value")})));
  EXPECT_FALSE(base.holdsSameValues(
      row({DBSqlValue::real(3.0), DBSqlValue(), DBSqlValue::text("a longer text value")})));
  EXPECT_FALSE(base.holdsSameValues(
      row({DBSqlValue::integer(3), DBSqlValue::integer(0), DBSqlValue::text("a longer text value")})));
  EXPECT_FALSE(base.holdsSameValues(
      row({DBSqlValue::integer(3), DBSqlValue(), DBSqlValue::text("a longer text valuE")})));
  EXPECT_FALSE(base.holdsSameValues(row({DBSqlValue::integer(3), DBSqlValue()})));
  EXPECT_TRUE(DBSqlRow().holdsSameValues(row({})));
}

TEST(DBSqlRowTest, WriteBlockCopiesTextsBehindTheValues) {
  const std::string longText = "a text longer than the inline room";
  const std::vector<DBSqlValue> values = {DBSqlValue::text(longText), DBSqlValue::text("short"),
                                          DBSqlValue::real(2.5)};
  const std::size_t size = DBSqlRow::blockSize(values);
  EXPECT_EQ(size, 3 * sizeof(DBSqlValue) + longText.size());
  std::vector<DBSqlValue> block(size / sizeof(DBSqlValue) + 1);
  auto* bytes = reinterpret_cast<std::byte*>(block.data());
  DBSqlRow::writeBlock(values, bytes);
  EXPECT_EQ(block[0].asText(), longText);
  EXPECT_EQ(reinterpret_cast<const std::byte*>(block[0].asText().data()), bytes + 3 * sizeof(DBSqlValue));
  EXPECT_EQ(block[1].asText(), "short");
  EXPECT_EQ(block[2].asReal(), 2.5);
}
