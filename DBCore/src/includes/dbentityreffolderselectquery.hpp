#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over referenced folders ("reffolders"): a Where clause over their columns.
class DBEntityReffolderSelectQuery : public DBEntitySelectQuery {
 public:
  DBEntityReffolderSelectQuery();
};

}  // namespace dbcore
