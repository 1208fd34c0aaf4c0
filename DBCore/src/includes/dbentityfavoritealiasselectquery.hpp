#pragma once

#include "dbselectquery.hpp"

namespace dbcore {

// A select query over favorite aliases ("entity_favorite_aliases"): a Where clause over their columns.
class DBEntityFavoriteAliasSelectQuery : public DBEntitySelectQuery {
 public:
  DBEntityFavoriteAliasSelectQuery();
};

}  // namespace dbcore
