#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// The view settings of a smart collection.
class DBSmartFilterAttrib : public DBRecord<DBSmartFilterAttrib, kDBSmartFilterAttribType> {
 public:
  static constexpr const char* kTableName = "smart_filter_attributes";
  static const std::vector<DBColumn<DBSmartFilterAttrib>>& columns();

  // Id of the DBSmartFilter record.
  int64_t smart_filter_id = 0;
  // Joined with kUserConditionsDelimiter.
  std::wstring selected_filter_types;
};

extern template class DBRecord<DBSmartFilterAttrib, kDBSmartFilterAttribType>;

}  // namespace dbcore
