#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>

#include "tvariant.hpp"

namespace dbcore {

// The engine's record kinds, stored in every record. The numbers are part of the catalog format.
enum DBEntityType : uint8_t {
  kDBImageType = 1,
  kDBFilterType = 2,
  kDBResourceType = 3,
  kDBUserImgAttribType = 4,
  kDBExivImgAttribType = 5,
  kDBImgHistoryStateType = 6,
  kDBRefFolderType = 7,
  kDBPathType = 8,
  kDBRefFolderAttribType = 9,
  kDBFilterAttribType = 10,
  kDBEntityFavoriteAliasType = 11,
  kDBSmartFilterType = 12,
  kDBSmartFilterAttribType = 13,
  kDBVolumeType = 15,
};

using ColumnValues = std::map<std::string, TVariant>;
using ColumnTypes = std::map<std::string, FieldType>;

// Common base of every record: its id (0 until the record is first written), its marked-to-delete
// flag and its record type.
class DBEntity {
 public:
  virtual ~DBEntity() = default;

  int64_t id() const { return id_; }
  void set_id(int64_t id) { id_ = id; }
  bool marked_to_delete() const { return marked_to_delete_; }
  void set_marked_to_delete(bool marked) { marked_to_delete_ = marked; }
  uint8_t type() const { return type_; }
  bool is_saved() const { return id_ != 0; }

  // The table that stores records of this kind.
  virtual const char* table_name() const = 0;
  // A deep copy of the record, id included.
  virtual std::shared_ptr<DBEntity> clone() const = 0;
  // Every column of the record with its value, the base columns included.
  virtual ColumnValues column_values() const = 0;
  // Sets the fields whose columns the map names; other fields keep their values.
  virtual void set_column_values(const ColumnValues& values) = 0;

  // The column types of a table by column name; empty for an unknown table. The map lives as long as
  // the program.
  static const ColumnTypes& T_COLUMN_TYPES(const std::string& table);

 protected:
  explicit DBEntity(uint8_t type) : type_(type) {}
  DBEntity(const DBEntity&) = default;
  DBEntity& operator=(const DBEntity&) = default;

 private:
  int64_t id_ = 0;
  bool marked_to_delete_ = false;
  uint8_t type_;
};

}  // namespace dbcore
