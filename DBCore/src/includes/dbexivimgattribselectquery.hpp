#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over exif attribute records ("image_exiv_attributes"): a Where clause over their columns.
class DBExivImgAttribSelectQuery : public DBEntitySelectQuery {
 public:
  DBExivImgAttribSelectQuery();
};

}  // namespace dbcore
