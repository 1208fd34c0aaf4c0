#pragma once

#include <cstdint>
#include <string>
#include <type_traits>
#include <utility>

#include "dbstatement.hpp"
#include "tvariant.hpp"

namespace dbcore {

// One column of a record type: its name, type, how to read and write it on a record and how to bind
// the record's value to a statement parameter without an intermediate value.
template <class Record>
struct DBColumn {
  const char* name;
  FieldType type;
  TVariant (*get)(const Record&);
  void (*set)(Record&, const TVariant&);
  void (*bind)(DBStatement&, int, const Record&);
};

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

}  // namespace dbcore
