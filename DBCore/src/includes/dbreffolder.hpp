#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A referenced folder: a folder on disk whose images are in the catalog, one node of its tree.
class DBRefFolder : public DBRecord<DBRefFolder, kDBRefFolderType> {
 public:
  static constexpr const char* kTableName = "reffolders";
  static const std::vector<DBColumn<DBRefFolder>>& columns();

  std::wstring uuid;
  // Id of the DBPath record of the folder.
  int64_t path_id = 0;
  // Position among its siblings.
  float order = 0.0f;
};

extern template class DBRecord<DBRefFolder, kDBRefFolderType>;

}  // namespace dbcore
