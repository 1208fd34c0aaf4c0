#pragma once

#include <cstdint>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// Marks another record as a favorite and gives it a place in the favorites' order.
class DBEntityFavoriteAlias : public DBRecord<DBEntityFavoriteAlias, kDBEntityFavoriteAliasType> {
 public:
  static constexpr const char* kTableName = "entity_favorite_aliases";
  static const std::vector<DBColumn<DBEntityFavoriteAlias>>& columns();

  // The record type of the aliased record.
  uint8_t orig_entity_type() const { return orig_type; }

  bool favorite = false;
  float favorite_order = 0.0f;
  // Record type (DBEntityType) of the aliased record.
  uint8_t orig_type = 0;
  // Id of the aliased record.
  int64_t orig_id = 0;
};

extern template class DBRecord<DBEntityFavoriteAlias, kDBEntityFavoriteAliasType>;

}  // namespace dbcore
