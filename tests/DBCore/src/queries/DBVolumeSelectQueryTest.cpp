#include "dbvolumeselectquery.hpp"

#include <gtest/gtest.h>

#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBVolumeSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBVolume> makeVolume(const std::wstring& uuid, bool marked) {
    auto volume = std::make_shared<DBVolume>();
    volume->uuid = uuid;
    volume->set_marked_to_delete(marked);
    *reactor << volume;
    return volume;
  }
};

}  // namespace

TEST_F(DBVolumeSelectQueryTest, SelectsVolumesByCondition) {
  const auto a = makeVolume(L"A-1", false);
  const auto b = makeVolume(L"B-2", true);
  const auto c = makeVolume(L"C-3", false);
  auto query = std::make_shared<DBVolumeSelectQuery>();
  EXPECT_EQ(query->table(), "volumes");
  query->Where(where<DBVolume>("(marked_to_delete_bool == false)"));
  const auto volumes = reactor->GetBySelectQuery<DBVolume>(query);
  ASSERT_EQ(volumes.size(), 2u);
  EXPECT_EQ(volumes[0]->uuid, L"A-1");
  EXPECT_EQ(volumes[1]->uuid, L"C-3");
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBVolume>>{a, b, c}),
            (std::vector<long long>{a->id(), c->id()}));
  query->Where(where<DBVolume>("uuid_wide_ch == 'B-2'"));
  EXPECT_EQ(selectedIds<DBVolume>(query), std::vector<long long>{b->id()});
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBVolume>>{a, b, c}),
            std::vector<long long>{b->id()});
}
