#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A folder on disk that holds catalog images, kept relative to the mount point of its volume.
class DBPath : public DBRecord<DBPath, kDBPathType> {
 public:
  static constexpr const char* kTableName = "paths";
  static const std::vector<DBColumn<DBPath>>& columns();

  // Id of the DBVolume record that holds the folder; 0 for none.
  int64_t volume_id = 0;
  // Relative to the volume's mount point.
  std::wstring path;
};

extern template class DBRecord<DBPath, kDBPathType>;

}  // namespace dbcore
