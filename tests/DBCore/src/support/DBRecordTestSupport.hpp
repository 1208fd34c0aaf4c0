#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

#include "dbentity.hpp"
#include "dbrecordcolumns.hpp"

// The checks that every record type passes, as a typed test suite. A record test instantiates it with a
// traits type that gives:
//   Record            the record class;
//   kTable, kType     its table name and record type number;
//   fields(record)    std::tie of every own field of the record, in field order;
//   fill(record)      sets every own field to a value that is not its default (distinct texts per field);
//   ownColumns()      the record's own column names with their types, in field order.

namespace dbrecordtest {

using ColumnList = std::vector<std::pair<std::string, dbcore::FieldType>>;

// Wide text with a Latin accent, CJK and a character outside the BMP, tagged so that each field differs.
inline std::wstring wideText(const std::wstring& tag) {
  return tag + L" \u00c9t\u00e9 \u65e5\u672c \U0001F600";
}

// The values a default record holds: value-initialised fields of the same types.
template <class... Fields>
std::tuple<std::remove_cvref_t<Fields>...> defaultsOf(const std::tuple<Fields...>&) {
  return {};
}

// How many of the fields hold their type's default value.
template <class... Fields>
int defaultFieldCount(const std::tuple<Fields...>& fields) {
  return std::apply(
      [](const auto&... field) {
        return (0 + ... + (field == std::remove_cvref_t<decltype(field)>{} ? 1 : 0));
      },
      fields);
}

}  // namespace dbrecordtest

template <class Traits>
class DBRecordTest : public testing::Test {
 protected:
  using Record = typename Traits::Record;

  // A saved, marked record whose every field holds a non-default value.
  static Record filledRecord() {
    Record record;
    record.set_id(77);
    record.set_marked_to_delete(true);
    Traits::fill(record);
    return record;
  }

  static void expectSameRecord(const Record& actual, const Record& expected) {
    EXPECT_EQ(actual.id(), expected.id());
    EXPECT_EQ(actual.marked_to_delete(), expected.marked_to_delete());
    EXPECT_EQ(int{actual.type()}, int{expected.type()});
    EXPECT_EQ(Traits::fields(actual), Traits::fields(expected));
  }

  // The base columns and the record's own.
  static dbcore::ColumnTypes expectedColumns() {
    const dbrecordtest::ColumnList own = Traits::ownColumns();
    dbcore::ColumnTypes columns(own.begin(), own.end());
    columns.emplace("_id_int_64", dbcore::FieldType::T_INT_64);
    columns.emplace("marked_to_delete_bool", dbcore::FieldType::T_BOOL);
    return columns;
  }

  template <class Field>
  static void expectColumnValue(const dbcore::ColumnValues& values, const std::string& column,
                                const Field& field) {
    const auto found = values.find(column);
    ASSERT_NE(found, values.end()) << column;
    EXPECT_TRUE(found->second == dbcore::DBFieldTraits<Field>::to(field)) << column;
  }
};

TYPED_TEST_SUITE_P(DBRecordTest);

TYPED_TEST_P(DBRecordTest, DefaultRecordIsEmptyAndUnsaved) {
  const typename TestFixture::Record record;
  EXPECT_EQ(record.id(), 0);
  EXPECT_FALSE(record.is_saved());
  EXPECT_FALSE(record.marked_to_delete());
  EXPECT_EQ(int{record.type()}, int{TypeParam::kType});
  EXPECT_EQ(TypeParam::fields(record), dbrecordtest::defaultsOf(TypeParam::fields(record)));
}

TYPED_TEST_P(DBRecordTest, NamesItsTableAndRecordType) {
  const typename TestFixture::Record record;
  EXPECT_STREQ(record.table_name(), TypeParam::kTable);
  EXPECT_EQ(int{TestFixture::Record::kRecordType}, int{TypeParam::kType});
}

// Guards the test data: the round trips below only prove something when every field is set and listed.
TYPED_TEST_P(DBRecordTest, FilledRecordSetsEveryColumnField) {
  const auto record = TestFixture::filledRecord();
  EXPECT_EQ(dbrecordtest::defaultFieldCount(TypeParam::fields(record)), 0);
  EXPECT_EQ(std::tuple_size_v<decltype(TypeParam::fields(record))>, TestFixture::Record::columns().size());
}

TYPED_TEST_P(DBRecordTest, CloneIsDeepAndKeepsTheDynamicType) {
  using Record = typename TestFixture::Record;
  const std::shared_ptr<dbcore::DBEntity> original = std::make_shared<Record>(TestFixture::filledRecord());
  const std::shared_ptr<dbcore::DBEntity> copy = original->clone();
  ASSERT_NE(copy, original);
  auto* typedCopy = dynamic_cast<Record*>(copy.get());
  ASSERT_NE(typedCopy, nullptr);
  TestFixture::expectSameRecord(*typedCopy, static_cast<const Record&>(*original));

  *typedCopy = Record();
  typedCopy->set_id(5);
  TestFixture::expectSameRecord(static_cast<const Record&>(*original), TestFixture::filledRecord());
}

TYPED_TEST_P(DBRecordTest, ColumnValuesRoundTripThroughAFreshRecord) {
  const auto original = TestFixture::filledRecord();
  typename TestFixture::Record fresh;
  fresh.set_column_values(original.column_values());
  TestFixture::expectSameRecord(fresh, original);
}

TYPED_TEST_P(DBRecordTest, ColumnValuesHaveTheColumnTypes) {
  dbcore::ColumnTypes valueTypes;
  for (const auto& [name, value] : TestFixture::filledRecord().column_values())
    valueTypes.emplace(name, value.type());
  EXPECT_EQ(valueTypes, TestFixture::expectedColumns());
}

TYPED_TEST_P(DBRecordTest, EachColumnCarriesItsField) {
  const auto record = TestFixture::filledRecord();
  const auto values = record.column_values();
  const auto columns = TypeParam::ownColumns();
  ASSERT_EQ(columns.size(), std::tuple_size_v<decltype(TypeParam::fields(record))>);
  size_t index = 0;
  std::apply(
      [&](const auto&... field) {
        (TestFixture::expectColumnValue(values, columns[index++].first, field), ...);
      },
      TypeParam::fields(record));
}

TYPED_TEST_P(DBRecordTest, SetColumnValuesChangesOnlyTheNamedColumns) {
  auto record = TestFixture::filledRecord();
  record.set_column_values(
      {{"_id_int_64", dbcore::TVariant(int64_t{9})}, {"no_such_column", dbcore::TVariant(true)}});
  auto expected = TestFixture::filledRecord();
  expected.set_id(9);
  TestFixture::expectSameRecord(record, expected);
}

TYPED_TEST_P(DBRecordTest, ColumnTypesOfItsTableAreExactlyItsColumns) {
  EXPECT_EQ(dbcore::DBEntity::T_COLUMN_TYPES(TypeParam::kTable), TestFixture::expectedColumns());
  EXPECT_EQ(TestFixture::Record::column_types(), TestFixture::expectedColumns());
}

REGISTER_TYPED_TEST_SUITE_P(DBRecordTest, DefaultRecordIsEmptyAndUnsaved, NamesItsTableAndRecordType,
                            FilledRecordSetsEveryColumnField, CloneIsDeepAndKeepsTheDynamicType,
                            ColumnValuesRoundTripThroughAFreshRecord, ColumnValuesHaveTheColumnTypes,
                            EachColumnCarriesItsField, SetColumnValuesChangesOnlyTheNamedColumns,
                            ColumnTypesOfItsTableAreExactlyItsColumns);
