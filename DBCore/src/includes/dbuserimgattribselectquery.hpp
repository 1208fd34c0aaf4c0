#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over user attribute records ("image_user_attributes"): a Where clause over their columns.
class DBUserImgAttribSelectQuery : public DBEntitySelectQuery {
 public:
  DBUserImgAttribSelectQuery();
};

}  // namespace dbcore
