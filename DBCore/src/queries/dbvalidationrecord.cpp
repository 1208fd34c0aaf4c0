#include "dbvalidationrecord.hpp"

#include <map>
#include <new>
#include <tuple>
#include <type_traits>

#include "dbrecords.hpp"

namespace dbcore {

namespace {

constexpr const char* kImageLinkColumn = "image_id_int_64";
// Enough room for the values of an image with both attribute records.
constexpr std::size_t kMaxRowValues = 64;

template <class... Records, class Body>
void forEachTableOf(std::tuple<Records...>*, const Body& body) {
  (body(Records::kTableName), ...);
}

template <class Body>
void forEachTable(const Body& body) {
  forEachTableOf(static_cast<DBRecordTypes*>(nullptr), body);
}

}  // namespace

const std::vector<DBValidationRecord::RelatedTable>& DBValidationRecord::relatedTables(
    const std::string& table) {
  static const std::vector<RelatedTable> none;
  static const std::map<std::string, std::vector<RelatedTable>> related{
      {DBImage::kTableName,
       {{DBUserImgAttrib::kTableName, kImageLinkColumn}, {DBExivImgAttrib::kTableName, kImageLinkColumn}}},
  };
  const auto found = related.find(table);
  return found == related.end() ? none : found->second;
}

// One allocation holds the record and, behind it, its values and their texts. The values are trivially
// destructible, so the deleter only releases the memory.
std::shared_ptr<const DBValidationRecord> DBValidationRecord::make(const DBEntity& record,
                                                                   const DBRelatedRecordResolver& resolver) {
  const Rows rows = rowsOf(record, resolver);
  std::vector<std::string> texts;
  const std::vector<DBSqlValue> values = DBSqlRow::storedValues(rows.values, texts);
  static_assert(std::is_trivially_destructible_v<DBSqlValue> && std::is_trivially_destructible_v<Slot>);
  void* memory = ::operator new(sizeof(DBValidationRecord) + DBSqlRow::blockSize(values));
  auto* made = new (memory) DBValidationRecord(record.table_name(), record.id(), rows.slots);
  DBSqlRow::writeBlock(values, reinterpret_cast<std::byte*>(made + 1));
  return std::shared_ptr<const DBValidationRecord>(made, [](const DBValidationRecord* done) {
    done->~DBValidationRecord();
    ::operator delete(const_cast<DBValidationRecord*>(done));
  });
}

DBValidationRecord::Rows DBValidationRecord::rowsOf(const DBEntity& record,
                                                    const DBRelatedRecordResolver& resolver) {
  Rows rows;
  rows.values.reserve(kMaxRowValues);
  const char* table = record.table_name();
  addRow(rows, 0, table, record.column_values());
  const auto& related = relatedTables(table);
  for (std::size_t index = 0; index < related.size() && index + 1 < kMaxSlots; ++index) {
    const std::shared_ptr<DBEntity> other = resolver ? resolver(record, related[index].table) : nullptr;
    const ColumnValues values = other ? other->column_values() : ColumnValues{};
    if (isRelated(record, related[index], other, values))
      addRow(rows, index + 1, related[index].table, values);
  }
  return rows;
}

// The names of the table's columns in order, read once per table.
const std::vector<std::string>& DBValidationRecord::columnNames(const char* table) {
  static const std::map<std::string, std::vector<std::string>> names = [] {
    std::map<std::string, std::vector<std::string>> byTable;
    forEachTable([&](const char* name) {
      for (const auto& [column, type] : DBEntity::T_COLUMN_TYPES(name)) byTable[name].push_back(column);
    });
    return byTable;
  }();
  static const std::vector<std::string> none;
  const auto found = names.find(table);
  return found == names.end() ? none : found->second;
}

// Every column of the table, in column-name order; a column the values lack is NULL.
void DBValidationRecord::addRow(Rows& rows, std::size_t slot, const char* table, const ColumnValues& values) {
  const auto offset = static_cast<uint32_t>(rows.values.size());
  for (const std::string& column : columnNames(table)) {
    const auto found = values.find(column);
    rows.values.push_back(found == values.end() ? TVariant() : found->second);
  }
  rows.slots[slot] = {offset, static_cast<uint32_t>(rows.values.size()) - offset, true};
}

// Whether the other record (with its values) is of the related table and linked to the record.
bool DBValidationRecord::isRelated(const DBEntity& record, const RelatedTable& related,
                                   const std::shared_ptr<DBEntity>& other, const ColumnValues& values) {
  if (!other || std::string(other->table_name()) != related.table) return false;
  const auto link = values.find(related.linkColumn);
  return link != values.end() && link->second.asInt64() == record.id();
}

}  // namespace dbcore
