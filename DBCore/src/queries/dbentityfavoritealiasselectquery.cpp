#include "dbentityfavoritealiasselectquery.hpp"

#include "dbentityfavoritealias.hpp"

namespace dbcore {

DBEntityFavoriteAliasSelectQuery::DBEntityFavoriteAliasSelectQuery()
    : DBEntitySelectQuery(DBEntityFavoriteAlias::kTableName) {}

}  // namespace dbcore
