#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// The view settings of a collection.
class DBFilterAttrib : public DBRecord<DBFilterAttrib, kDBFilterAttribType> {
 public:
  static constexpr const char* kTableName = "filter_attributes";
  static const std::vector<DBColumn<DBFilterAttrib>>& columns();

  // Id of the DBFilter record.
  int64_t filter_id = 0;
  bool favorite = false;
  // Joined with kUserConditionsDelimiter.
  std::wstring selected_filter_types;
};

extern template class DBRecord<DBFilterAttrib, kDBFilterAttribType>;

}  // namespace dbcore
