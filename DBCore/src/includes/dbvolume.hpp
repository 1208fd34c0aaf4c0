#pragma once

#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// A disk volume known to the catalog.
class DBVolume : public DBRecord<DBVolume, kDBVolumeType> {
 public:
  static constexpr const char* kTableName = "volumes";
  static const std::vector<DBColumn<DBVolume>>& columns();

  std::wstring uuid;
  // The volume's description as a JSON object.
  std::wstring info;
};

extern template class DBRecord<DBVolume, kDBVolumeType>;

}  // namespace dbcore
