#include "dbuserimgattrib.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBUserImgAttrib, kDBUserImgAttribType>;

const std::vector<DBColumn<DBUserImgAttrib>>& DBUserImgAttrib::columns() {
  static const std::vector<DBColumn<DBUserImgAttrib>> columns{
      DBField<DBUserImgAttrib, &DBUserImgAttrib::image_id>("image_id_int_64"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::trashed>("trash_bool"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::marker>("marker"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::color>("color"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::rating>("rating"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::edit_date>("edit_date_int_64"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::opened>("opened_bool"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::trashed_date>("trashed_date_int_64"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::origin_name>("origin_path_wide_ch"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::lost>("lost_bool"),
      DBField<DBUserImgAttrib, &DBUserImgAttrib::tutorial>("tutorial"),
  };
  return columns;
}

}  // namespace dbcore
