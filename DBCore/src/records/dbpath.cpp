#include "dbpath.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBPath, kDBPathType>;

const std::vector<DBColumn<DBPath>>& DBPath::columns() {
  static const std::vector<DBColumn<DBPath>> columns{
      DBField<DBPath, &DBPath::volume_id>("volume_id_int_64"),
      DBField<DBPath, &DBPath::path>("path_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
