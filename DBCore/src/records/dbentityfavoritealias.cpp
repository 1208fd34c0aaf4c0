#include "dbentityfavoritealias.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBEntityFavoriteAlias, kDBEntityFavoriteAliasType>;

const std::vector<DBColumn<DBEntityFavoriteAlias>>& DBEntityFavoriteAlias::columns() {
  static const std::vector<DBColumn<DBEntityFavoriteAlias>> columns{
      DBField<DBEntityFavoriteAlias, &DBEntityFavoriteAlias::favorite>("favorite_bool"),
      DBField<DBEntityFavoriteAlias, &DBEntityFavoriteAlias::favorite_order>("favorite_order_float"),
      DBField<DBEntityFavoriteAlias, &DBEntityFavoriteAlias::orig_type>("orig_entity_type"),
      DBField<DBEntityFavoriteAlias, &DBEntityFavoriteAlias::orig_id>("orig_entity_id_int_64"),
  };
  return columns;
}

}  // namespace dbcore
