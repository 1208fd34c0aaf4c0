#include "dbentityreffolderselectquery.hpp"

#include <gtest/gtest.h>

#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBEntityReffolderSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBRefFolder> folder(const std::wstring& uuid, bool marked) {
    auto record = std::make_shared<DBRefFolder>();
    record->uuid = uuid;
    record->set_marked_to_delete(marked);
    *reactor << std::static_pointer_cast<DBEntity>(record);
    return record;
  }
};

}  // namespace

TEST_F(DBEntityReffolderSelectQueryTest, SelectsReferencedFoldersIncludingTheRoot) {
  const auto a = folder(L"a", false);
  const auto b = folder(L"b", true);
  auto query = std::make_shared<DBEntityReffolderSelectQuery>();
  EXPECT_EQ(query->table(), "reffolders");
  query->Where(where<DBRefFolder>("(marked_to_delete_bool == false)"));
  const auto folders = reactor->GetBySelectQuery<DBRefFolder>(query);
  ASSERT_EQ(folders.size(), 2u);
  EXPECT_EQ(folders[0]->id(), 1);
  EXPECT_EQ(folders[1]->uuid, L"a");
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBRefFolder>>{a, b}),
            std::vector<long long>{a->id()});
  query->Where(where<DBRefFolder>("uuid_wide_ch == 'b'"));
  EXPECT_EQ(selectedIds<DBRefFolder>(query), std::vector<long long>{b->id()});
}
