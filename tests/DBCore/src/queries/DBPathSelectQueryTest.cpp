#include "dbpathselectquery.hpp"

#include <gtest/gtest.h>

#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBPathSelectQueryTest : public DBSelectQueryTestBase {};

}  // namespace

TEST_F(DBPathSelectQueryTest, SelectsPathsNotMarkedToDeleteInIdOrder) {
  const auto a = makePath(L"/a", 2);
  const auto b = makePath(L"/b", 3);
  const auto c = makePath(L"/c", 2);
  b->set_marked_to_delete(true);
  *reactor << std::vector<std::shared_ptr<DBPath>>{b};
  auto query = std::make_shared<DBPathSelectQuery>();
  EXPECT_EQ(query->table(), "paths");
  query->Where(where<DBPath>("(marked_to_delete_bool == false)"));
  const auto paths = reactor->GetBySelectQuery<DBPath>(query);
  ASSERT_EQ(paths.size(), 2u);
  EXPECT_EQ(paths[0]->id(), a->id());
  EXPECT_EQ(paths[0]->path, L"/a");
  EXPECT_EQ(paths[1]->id(), c->id());
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBPath>>{a, b, c}),
            (std::vector<long long>{a->id(), c->id()}));
  query->Where(where<DBPath>("volume_id_int_64 == 2 && path_wide_ch > '/a'"));
  EXPECT_EQ(selectedIds<DBPath>(query), std::vector<long long>{c->id()});
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBPath>>{a, b, c}),
            std::vector<long long>{c->id()});
}
