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
// table (kTableName) and lists its own fields (columns()); the base columns come first. The operations
// are defined with the engine's sources, which instantiate DBRecord once for each record type; each
// record type's header declares that instantiation.
template <class Derived, uint8_t RecordType>
class DBRecord : public DBEntity {
 public:
  static constexpr uint8_t kRecordType = RecordType;

  const char* table_name() const override { return Derived::kTableName; }

  std::shared_ptr<DBEntity> clone() const override {
    return std::make_shared<Derived>(static_cast<const Derived&>(*this));
  }

  ColumnValues column_values() const override;
  void set_column_values(const ColumnValues& values) override;

  // The base columns followed by the record type's own.
  static const std::vector<DBColumn<Derived>>& all_columns();
  static ColumnTypes column_types();

 protected:
  DBRecord() : DBEntity(RecordType) {}

 private:
  const Derived& self() const { return static_cast<const Derived&>(*this); }
};

}  // namespace dbcore
