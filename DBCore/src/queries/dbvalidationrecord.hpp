#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "dbentity.hpp"
#include "dbselectquery.hpp"
#include "dbsqlrow.hpp"

namespace dbcore {

// A record's column values as SQLite stores them, taken once so that select queries can tell in memory,
// from any thread and without the database, whether the record satisfies them (DBEntitySelectQuery::
// Result). It holds the record's own row and the rows of its related tables (images: user and exif
// attributes, when the resolver gives them), all in one block of values. It is immutable and does not
// depend on any query: one record serves every query over the record's table.
//
// The values follow the record in the same allocation, so that reading a value needs no pointer from
// the record: a membership test over many records waits for one cache miss per line it reads, not for
// a chain of them.
class DBValidationRecord {
 public:
  // A table whose row belongs to a record of another table: the column that holds the record's id.
  struct RelatedTable {
    const char* table;
    const char* linkColumn;
  };

  // The record's own row and at most this many minus one related rows.
  static constexpr std::size_t kMaxSlots = 4;

  // The related tables of a table, in slot order (slot 1 is the first); empty for most tables.
  static const std::vector<RelatedTable>& relatedTables(const std::string& table);

  // The record's values, and those of its related records as far as the resolver (may be empty) gives
  // them. A related record of another table, or linked to another record, counts as missing.
  static std::shared_ptr<const DBValidationRecord> make(const DBEntity& record,
                                                        const DBRelatedRecordResolver& resolver);

  DBValidationRecord(const DBValidationRecord&) = delete;
  DBValidationRecord& operator=(const DBValidationRecord&) = delete;

  std::string_view table() const { return table_; }
  int64_t id() const { return id_; }

  // Whether the record has a row in the slot: 0 for its own, n for its n-th related table.
  bool hasRow(std::size_t slot) const { return slot < kMaxSlots && slots_[slot].present; }
  std::size_t rowSize(std::size_t slot) const { return hasRow(slot) ? slots_[slot].size : 0; }
  // The value of a column in the slot's row, columns numbered in the order of the table's column names
  // (DBEntity::T_COLUMN_TYPES order); NULL for a missing row or column.
  const DBSqlValue& value(std::size_t slot, std::size_t column) const {
    return column < rowSize(slot) ? values()[slots_[slot].offset + column] : kNull;
  }

 private:
  struct Slot {
    uint32_t offset = 0;
    uint32_t size = 0;
    bool present = false;
  };

  // Every row's column values, one row after the other, with the slots that locate them.
  struct Rows {
    std::array<Slot, kMaxSlots> slots{};
    std::vector<TVariant> values;
  };

  static constexpr DBSqlValue kNull{};

  DBValidationRecord(const char* table, int64_t id, const std::array<Slot, kMaxSlots>& slots)
      : table_(table), id_(id), slots_(slots) {}

  static Rows rowsOf(const DBEntity& record, const DBRelatedRecordResolver& resolver);
  static void addRow(Rows& rows, std::size_t slot, const char* table, const ColumnValues& values);
  static const std::vector<std::string>& columnNames(const char* table);
  static bool isRelated(const DBEntity& record, const RelatedTable& related,
                        const std::shared_ptr<DBEntity>& other, const ColumnValues& values);

  // The values behind the record (see make()).
  const DBSqlValue* values() const { return std::launder(reinterpret_cast<const DBSqlValue*>(this + 1)); }

  // The engine's own table name (DBEntity::table_name()).
  const char* table_;
  int64_t id_;
  std::array<Slot, kMaxSlots> slots_;
};

static_assert(alignof(DBValidationRecord) >= alignof(DBSqlValue) &&
              sizeof(DBValidationRecord) % alignof(DBSqlValue) == 0);

}  // namespace dbcore
