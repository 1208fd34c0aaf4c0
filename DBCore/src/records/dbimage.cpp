#include "dbimage.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBImage, kDBImageType>;

const std::vector<DBColumn<DBImage>>& DBImage::columns() {
  static const std::vector<DBColumn<DBImage>> columns{
      DBField<DBImage, &DBImage::guid>("guid_wide_ch"),
      DBField<DBImage, &DBImage::path>("path_wide_ch"),
      DBField<DBImage, &DBImage::width>("width"),
      DBField<DBImage, &DBImage::height>("height"),
      DBField<DBImage, &DBImage::file_size>("file_size_int_64"),
      DBField<DBImage, &DBImage::modification_date>("modification_date_int_64"),
      DBField<DBImage, &DBImage::import_date>("import_date_int_64"),
      DBField<DBImage, &DBImage::import_index>("import_index"),
      DBField<DBImage, &DBImage::creation_date>("creation_date_int_64"),
  };
  return columns;
}

}  // namespace dbcore
