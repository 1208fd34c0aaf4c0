#pragma once

// The column tables of the record types: how each field type is stored and bound, DBField, and the
// generic operations of DBRecord. Included by the record types' sources, which instantiate DBRecord for
// their type.

#include <cstdint>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "dbrecord.hpp"
#include "dbstatement.hpp"

namespace dbcore {

// How a C++ field type is stored: its field type and the conversions to and from a value.
template <class T>
struct DBFieldTraits;

template <>
struct DBFieldTraits<bool> {
  static constexpr FieldType type = FieldType::T_BOOL;
  static TVariant to(bool value) { return TVariant(value); }
  static bool from(const TVariant& value) { return value.asBool(); }
  static void bind(DBStatement& statement, int index, bool value) { statement.bind(index, int64_t{value}); }
};

template <>
struct DBFieldTraits<int32_t> {
  static constexpr FieldType type = FieldType::T_INT;
  static TVariant to(int32_t value) { return TVariant(value); }
  static int32_t from(const TVariant& value) { return value.asInt(); }
  static void bind(DBStatement& statement, int index, int32_t value) {
    statement.bind(index, int64_t{value});
  }
};

template <>
struct DBFieldTraits<int64_t> {
  static constexpr FieldType type = FieldType::T_INT_64;
  static TVariant to(int64_t value) { return TVariant(value); }
  static int64_t from(const TVariant& value) { return value.asInt64(); }
  static void bind(DBStatement& statement, int index, int64_t value) { statement.bind(index, value); }
};

// Small unsigned fields (record type codes) are kept in a 32-bit integer column.
template <>
struct DBFieldTraits<uint8_t> {
  static constexpr FieldType type = FieldType::T_INT;
  static TVariant to(uint8_t value) { return TVariant(static_cast<int32_t>(value)); }
  static uint8_t from(const TVariant& value) { return static_cast<uint8_t>(value.asInt()); }
  static void bind(DBStatement& statement, int index, uint8_t value) {
    statement.bind(index, int64_t{value});
  }
};

// Unsigned 64-bit fields are kept bit for bit in a 64-bit integer column.
template <>
struct DBFieldTraits<uint64_t> {
  static constexpr FieldType type = FieldType::T_INT_64;
  static TVariant to(uint64_t value) { return TVariant(static_cast<int64_t>(value)); }
  static uint64_t from(const TVariant& value) { return static_cast<uint64_t>(value.asInt64()); }
  static void bind(DBStatement& statement, int index, uint64_t value) {
    statement.bind(index, static_cast<int64_t>(value));
  }
};

template <>
struct DBFieldTraits<float> {
  static constexpr FieldType type = FieldType::T_FLOAT;
  static TVariant to(float value) { return TVariant(value); }
  static float from(const TVariant& value) { return value.asFloat(); }
  static void bind(DBStatement& statement, int index, float value) { statement.bindDouble(index, value); }
};

template <>
struct DBFieldTraits<std::wstring> {
  static constexpr FieldType type = FieldType::T_WIDE_TEXT;
  static TVariant to(const std::wstring& value) { return TVariant(value); }
  static std::wstring from(const TVariant& value) { return value.asWideText(); }
  static void bind(DBStatement& statement, int index, const std::wstring& value) {
    statement.bindWide(index, value);
  }
};

// The column of a public data member: DBField<DBImage, &DBImage::guid>("guid_wide_ch").
template <class Record, auto Member>
DBColumn<Record> DBField(const char* name) {
  using T = std::remove_cvref_t<decltype(std::declval<Record&>().*Member)>;
  return {name, DBFieldTraits<T>::type,
          [](const Record& record) { return DBFieldTraits<T>::to(record.*Member); },
          [](Record& record, const TVariant& value) { record.*Member = DBFieldTraits<T>::from(value); },
          [](DBStatement& statement, int index, const Record& record) {
            DBFieldTraits<T>::bind(statement, index, record.*Member);
          }};
}

template <class Derived, uint8_t RecordType>
ColumnValues DBRecord<Derived, RecordType>::column_values() const {
  ColumnValues values;
  for (const auto& column : all_columns()) values.emplace(column.name, column.get(self()));
  return values;
}

template <class Derived, uint8_t RecordType>
void DBRecord<Derived, RecordType>::set_column_values(const ColumnValues& values) {
  for (const auto& column : all_columns()) {
    const auto found = values.find(column.name);
    if (found != values.end()) column.set(static_cast<Derived&>(*this), found->second);
  }
}

template <class Derived, uint8_t RecordType>
const std::vector<DBColumn<Derived>>& DBRecord<Derived, RecordType>::all_columns() {
  static const std::vector<DBColumn<Derived>> columns = [] {
    std::vector<DBColumn<Derived>> all{
        {kIdColumn, FieldType::T_INT_64, [](const Derived& r) { return TVariant(r.id()); },
         [](Derived& r, const TVariant& v) { r.set_id(v.asInt64()); },
         [](DBStatement& s, int index, const Derived& r) { s.bind(index, r.id()); }},
        {kMarkedToDeleteColumn, FieldType::T_BOOL,
         [](const Derived& r) { return TVariant(r.marked_to_delete()); },
         [](Derived& r, const TVariant& v) { r.set_marked_to_delete(v.asBool()); },
         [](DBStatement& s, int index, const Derived& r) { s.bind(index, int64_t{r.marked_to_delete()}); }}};
    const auto& own = Derived::columns();
    all.insert(all.end(), own.begin(), own.end());
    return all;
  }();
  return columns;
}

template <class Derived, uint8_t RecordType>
ColumnTypes DBRecord<Derived, RecordType>::column_types() {
  ColumnTypes types;
  for (const auto& column : all_columns()) types.emplace(column.name, column.type);
  return types;
}

}  // namespace dbcore
