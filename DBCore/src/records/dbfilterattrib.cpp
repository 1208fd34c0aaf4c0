#include "dbfilterattrib.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBFilterAttrib, kDBFilterAttribType>;

const std::vector<DBColumn<DBFilterAttrib>>& DBFilterAttrib::columns() {
  static const std::vector<DBColumn<DBFilterAttrib>> columns{
      DBField<DBFilterAttrib, &DBFilterAttrib::filter_id>("filter_id_int_64"),
      DBField<DBFilterAttrib, &DBFilterAttrib::favorite>("favorite_bool"),
      DBField<DBFilterAttrib, &DBFilterAttrib::selected_filter_types>("selected_filter_types_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
