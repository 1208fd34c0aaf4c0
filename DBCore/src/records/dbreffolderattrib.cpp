#include "dbreffolderattrib.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBRefFolderAttrib, kDBRefFolderAttribType>;

const std::vector<DBColumn<DBRefFolderAttrib>>& DBRefFolderAttrib::columns() {
  static const std::vector<DBColumn<DBRefFolderAttrib>> columns{
      DBField<DBRefFolderAttrib, &DBRefFolderAttrib::ref_folder_id>("ref_folder_id_int_64"),
      DBField<DBRefFolderAttrib, &DBRefFolderAttrib::favorite>("favorite_bool"),
      DBField<DBRefFolderAttrib, &DBRefFolderAttrib::selected_filter_types>("selected_filter_types_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
