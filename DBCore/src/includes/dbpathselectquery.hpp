#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over folder paths ("paths"): a Where clause over their columns.
class DBPathSelectQuery : public DBEntitySelectQuery {
 public:
  DBPathSelectQuery();
};

}  // namespace dbcore
