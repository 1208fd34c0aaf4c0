#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// The view settings of a referenced folder.
class DBRefFolderAttrib : public DBRecord<DBRefFolderAttrib, kDBRefFolderAttribType> {
 public:
  static constexpr const char* kTableName = "referenced_folder_attributes";
  static const std::vector<DBColumn<DBRefFolderAttrib>>& columns();

  // Id of the DBRefFolder record.
  int64_t ref_folder_id = 0;
  bool favorite = false;
  // Joined with kUserConditionsDelimiter.
  std::wstring selected_filter_types;
};

extern template class DBRecord<DBRefFolderAttrib, kDBRefFolderAttribType>;

}  // namespace dbcore
