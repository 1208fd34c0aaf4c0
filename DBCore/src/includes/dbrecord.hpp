#pragma once

#include <memory>
#include <vector>

#include "dbcolumn.hpp"
#include "dbentity.hpp"

namespace dbcore {

// The column names every table has.
inline constexpr const char* kIdColumn = "_id_int_64";
inline constexpr const char* kMarkedToDeleteColumn = "marked_to_delete_bool";

// Implements the generic record operations of a record type from its column list: Derived names its
// table (kTableName) and lists its own fields (columns()); the base columns come first.
template <class Derived, uint8_t RecordType>
class DBRecord : public DBEntity {
 public:
  static constexpr uint8_t kRecordType = RecordType;

  const char* table_name() const override { return Derived::kTableName; }

  std::shared_ptr<DBEntity> clone() const override {
    return std::make_shared<Derived>(static_cast<const Derived&>(*this));
  }

  ColumnValues column_values() const override {
    ColumnValues values;
    for (const auto& column : all_columns()) values.emplace(column.name, column.get(self()));
    return values;
  }

  void set_column_values(const ColumnValues& values) override {
    for (const auto& column : all_columns()) {
      const auto found = values.find(column.name);
      if (found != values.end()) column.set(static_cast<Derived&>(*this), found->second);
    }
  }

  // The base columns followed by the record type's own.
  static const std::vector<DBColumn<Derived>>& all_columns() {
    static const std::vector<DBColumn<Derived>> columns = [] {
      std::vector<DBColumn<Derived>> all{
          {kIdColumn, FieldType::T_INT_64, [](const Derived& r) { return TVariant(r.id()); },
           [](Derived& r, const TVariant& v) { r.set_id(v.asInt64()); },
           [](DBStatement& s, int index, const Derived& r) { s.bind(index, r.id()); }},
          {kMarkedToDeleteColumn, FieldType::T_BOOL,
           [](const Derived& r) { return TVariant(r.marked_to_delete()); },
           [](Derived& r, const TVariant& v) { r.set_marked_to_delete(v.asBool()); },
           [](DBStatement& s, int index, const Derived& r) {
             s.bind(index, int64_t{r.marked_to_delete()});
           }}};
      const auto& own = Derived::columns();
      all.insert(all.end(), own.begin(), own.end());
      return all;
    }();
    return columns;
  }

  static ColumnTypes column_types() {
    ColumnTypes types;
    for (const auto& column : all_columns()) types.emplace(column.name, column.type);
    return types;
  }

 protected:
  DBRecord() : DBEntity(RecordType) {}

 private:
  const Derived& self() const { return static_cast<const Derived&>(*this); }
};

}  // namespace dbcore
