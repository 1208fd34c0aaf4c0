#include "dbuserimgattribselectquery.hpp"

#include <gtest/gtest.h>

#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBUserImgAttribSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBUserImgAttrib> attributes(int32_t rating, bool trashed) {
    auto record = std::make_shared<DBUserImgAttrib>();
    record->image_id = makeImage(L"image " + std::to_wstring(rating))->id();
    record->rating = rating;
    record->trashed = trashed;
    *reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{record};
    return record;
  }
};

}  // namespace

TEST_F(DBUserImgAttribSelectQueryTest, SelectsAttributeRecordsByTheirColumns) {
  const auto a = attributes(1, false);
  const auto b = attributes(4, true);
  const auto c = attributes(5, false);
  const std::vector<std::shared_ptr<DBUserImgAttrib>> all{a, b, c};
  auto query = std::make_shared<DBUserImgAttribSelectQuery>();
  EXPECT_EQ(query->table(), "image_user_attributes");
  query->Where(where<DBUserImgAttrib>("(marked_to_delete_bool == false) && rating >= 4"));
  const auto records = reactor->GetBySelectQuery<DBUserImgAttrib>(query);
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(records[0]->rating, 4);
  EXPECT_EQ(records[1]->rating, 5);
  EXPECT_EQ(satisfyingIds(query, all), (std::vector<long long>{b->id(), c->id()}));
  // The literal 1 stays text for a boolean column; numeric affinity still compares it as a number.
  query->Where(where<DBUserImgAttrib>("trash_bool == 1"));
  EXPECT_EQ(selectedIds<DBUserImgAttrib>(query), std::vector<long long>{b->id()});
  EXPECT_EQ(satisfyingIds(query, all), std::vector<long long>{b->id()});
}
