#include "dbentityfavoritealiasselectquery.hpp"

#include <gtest/gtest.h>

#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBEntityFavoriteAliasSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBEntityFavoriteAlias> alias(uint8_t type, int64_t id, bool favorite, float order) {
    auto record = std::make_shared<DBEntityFavoriteAlias>();
    record->orig_type = type;
    record->orig_id = id;
    record->favorite = favorite;
    record->favorite_order = order;
    *reactor << record;
    return record;
  }
};

}  // namespace

TEST_F(DBEntityFavoriteAliasSelectQueryTest, SelectsAliasesByCondition) {
  const auto a = alias(kDBFilterType, 2, true, 1.5f);
  const auto b = alias(kDBRefFolderType, 3, false, 0.5f);
  const auto c = alias(kDBRefFolderType, 4, true, 2.5f);
  const std::vector<std::shared_ptr<DBEntityFavoriteAlias>> all{a, b, c};
  auto query = std::make_shared<DBEntityFavoriteAliasSelectQuery>();
  EXPECT_EQ(query->table(), "entity_favorite_aliases");
  query->Where(where<DBEntityFavoriteAlias>("(marked_to_delete_bool == false) && (favorite_bool == true)"));
  const auto aliases = reactor->GetBySelectQuery<DBEntityFavoriteAlias>(query);
  ASSERT_EQ(aliases.size(), 2u);
  EXPECT_EQ(aliases[0]->orig_id, 2);
  EXPECT_EQ(aliases[1]->orig_id, 4);
  EXPECT_EQ(satisfyingIds(query, all), (std::vector<long long>{a->id(), c->id()}));
  query->Where(where<DBEntityFavoriteAlias>("orig_entity_type == 7 && favorite_order_float < 1"));
  EXPECT_EQ(selectedIds<DBEntityFavoriteAlias>(query), std::vector<long long>{b->id()});
  EXPECT_EQ(satisfyingIds(query, all), std::vector<long long>{b->id()});
}
