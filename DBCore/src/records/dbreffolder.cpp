#include "dbreffolder.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBRefFolder, kDBRefFolderType>;

const std::vector<DBColumn<DBRefFolder>>& DBRefFolder::columns() {
  static const std::vector<DBColumn<DBRefFolder>> columns{
      DBField<DBRefFolder, &DBRefFolder::uuid>("uuid_wide_ch"),
      DBField<DBRefFolder, &DBRefFolder::path_id>("path_id_int_64"),
      DBField<DBRefFolder, &DBRefFolder::order>("order_float"),
  };
  return columns;
}

}  // namespace dbcore
