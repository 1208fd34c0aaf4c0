#pragma once

#include <cstddef>
#include <memory>
#include <new>
#include <span>
#include <string>
#include <vector>

#include "dbsqlvalue.hpp"
#include "tvariant.hpp"

namespace dbcore {

// An immutable list of SQL values that owns the bytes of its texts, so that its values stay valid as long
// as the row lives. The values and the bytes share one block of memory. It can be moved, not copied.
class DBSqlRow {
 public:
  DBSqlRow() = default;
  // Copies the values; the bytes their texts view are copied into the row.
  explicit DBSqlRow(const std::vector<DBSqlValue>& values);
  // The values as SQLite stores them: booleans and integers as INTEGER, floats as REAL (NaN as NULL),
  // narrow and wide texts as UTF-8 TEXT, T_NONE as NULL.
  explicit DBSqlRow(const std::vector<TVariant>& values);
  DBSqlRow(DBSqlRow&&) noexcept = default;
  DBSqlRow& operator=(DBSqlRow&&) noexcept = default;
  DBSqlRow(const DBSqlRow&) = delete;
  DBSqlRow& operator=(const DBSqlRow&) = delete;

  // The value SQLite stores for a variant (see above); a text is put into `text`, which the value views.
  static DBSqlValue storedValue(const TVariant& variant, std::string& text);
  // The stored values of the variants; `texts` keeps the texts they view.
  static std::vector<DBSqlValue> storedValues(const std::vector<TVariant>& variants,
                                              std::vector<std::string>& texts);

  // The bytes a block of the values takes: the values, then the bytes of the texts they view.
  static std::size_t blockSize(std::span<const DBSqlValue> values);
  // Writes the values into `block` (blockSize bytes, aligned for DBSqlValue) with their texts copied
  // behind them, so that the block's values view only the block.
  static void writeBlock(std::span<const DBSqlValue> values, std::byte* block);

  std::size_t size() const { return size_; }
  // The value at the index; NULL past the end.
  const DBSqlValue& operator[](std::size_t index) const { return index < size_ ? data()[index] : kNull; }
  std::span<const DBSqlValue> values() const { return {data(), size_}; }

  // Whether both rows hold the same values: same storage classes, equal numbers, equal bytes.
  bool holdsSameValues(const DBSqlRow& other) const;

 private:
  static constexpr DBSqlValue kNull{};

  const DBSqlValue* data() const { return std::launder(reinterpret_cast<const DBSqlValue*>(block_.get())); }

  // The values, then the bytes of their texts.
  std::unique_ptr<std::byte[]> block_;
  std::size_t size_ = 0;
};

}  // namespace dbcore
