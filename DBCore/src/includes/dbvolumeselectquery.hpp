#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over volumes ("volumes"): a Where clause over their columns.
class DBVolumeSelectQuery : public DBEntitySelectQuery {
 public:
  DBVolumeSelectQuery();
};

}  // namespace dbcore
