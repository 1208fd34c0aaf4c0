#include "dbsmartfilterattrib.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBSmartFilterAttrib, kDBSmartFilterAttribType>;

const std::vector<DBColumn<DBSmartFilterAttrib>>& DBSmartFilterAttrib::columns() {
  static const std::vector<DBColumn<DBSmartFilterAttrib>> columns{
      DBField<DBSmartFilterAttrib, &DBSmartFilterAttrib::smart_filter_id>("smart_filter_id_int_64"),
      DBField<DBSmartFilterAttrib, &DBSmartFilterAttrib::selected_filter_types>(
          "selected_filter_types_wide_ch"),
  };
  return columns;
}

}  // namespace dbcore
