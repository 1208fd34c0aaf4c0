#include "dbvolume.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBVolume, kDBVolumeType>;

const std::vector<DBColumn<DBVolume>>& DBVolume::columns() {
  static const std::vector<DBColumn<DBVolume>> columns{
      DBField<DBVolume, &DBVolume::uuid>("uuid_wide_ch"),
      DBField<DBVolume, &DBVolume::info>("info_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
