#include "dbvalidationrecord.hpp"

#include <map>
#include <tuple>

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

std::shared_ptr<const DBValidationRecord> DBValidationRecord::make(const DBEntity& record,
                                                                   const DBRelatedRecordResolver& resolver) {
  return std::make_shared<const DBValidationRecord>(Key{}, record, resolver);
}

DBValidationRecord::DBValidationRecord(Key, const DBEntity& record, const DBRelatedRecordResolver& resolver)
    : table_(record.table_name()), id_(record.id()) {
  std::vector<TVariant> all;
  all.reserve(kMaxRowValues);
  addRow(0, table_, record.column_values(), all);
  const auto& related = relatedTables(table_);
  for (std::size_t index = 0; index < related.size() && index + 1 < kMaxSlots; ++index) {
    const std::shared_ptr<DBEntity> other = resolver ? resolver(record, related[index].table) : nullptr;
    const ColumnValues values = other ? other->column_values() : ColumnValues{};
    if (isRelated(record, related[index], other, values))
      addRow(index + 1, related[index].table, values, all);
  }
  values_ = DBSqlRow(all);
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
void DBValidationRecord::addRow(std::size_t slot, const char* table, const ColumnValues& values,
                                std::vector<TVariant>& all) {
  slots_[slot] = {static_cast<uint32_t>(all.size()), 0, true};
  for (const std::string& column : columnNames(table)) {
    const auto found = values.find(column);
    all.push_back(found == values.end() ? TVariant() : found->second);
  }
  slots_[slot].size = static_cast<uint32_t>(all.size()) - slots_[slot].offset;
}

// Whether the other record (with its values) is of the related table and linked to the record.
bool DBValidationRecord::isRelated(const DBEntity& record, const RelatedTable& related,
                                   const std::shared_ptr<DBEntity>& other, const ColumnValues& values) {
  if (!other || std::string(other->table_name()) != related.table) return false;
  const auto link = values.find(related.linkColumn);
  return link != values.end() && link->second.asInt64() == record.id();
}

}  // namespace dbcore
