#include "dbvalidationrecord.hpp"

#include <gtest/gtest.h>

#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"
#include "dbuserimgattrib.hpp"

using namespace dbcore;

namespace {

std::shared_ptr<DBImage> image(int64_t id) {
  auto record = std::make_shared<DBImage>();
  record->set_id(id);
  record->path = L"IMG_1.CR3";
  record->width = 640;
  return record;
}

std::shared_ptr<DBUserImgAttrib> userAttributes(int64_t imageId, int32_t rating) {
  auto record = std::make_shared<DBUserImgAttrib>();
  record->image_id = imageId;
  record->rating = rating;
  return record;
}

size_t rankOf(const std::string& table, const std::string& column) {
  const ColumnTypes types = DBEntity::T_COLUMN_TYPES(table);
  return static_cast<size_t>(std::distance(types.begin(), types.find(column)));
}

}  // namespace

TEST(DBValidationRecordTest, RelatedTablesOfImagesOnly) {
  ASSERT_EQ(DBValidationRecord::relatedTables("images").size(), 2u);
  EXPECT_STREQ(DBValidationRecord::relatedTables("images")[0].table, "image_user_attributes");
  EXPECT_STREQ(DBValidationRecord::relatedTables("images")[1].table, "image_exiv_attributes");
  EXPECT_TRUE(DBValidationRecord::relatedTables("paths").empty());
  EXPECT_TRUE(DBValidationRecord::relatedTables("no such table").empty());
}

TEST(DBValidationRecordTest, OwnRowInColumnNameOrder) {
  const auto record = DBValidationRecord::make(*image(7), nullptr);
  EXPECT_EQ(record->table(), "images");
  EXPECT_EQ(record->id(), 7);
  ASSERT_TRUE(record->hasRow(0));
  EXPECT_EQ(record->rowSize(0), DBEntity::T_COLUMN_TYPES("images").size());
  EXPECT_EQ(record->value(0, rankOf("images", "width")).asInteger(), 640);
  EXPECT_EQ(record->value(0, rankOf("images", "path_wide_ch")).asText(), "IMG_1.CR3");
  EXPECT_EQ(record->value(0, rankOf("images", "_id_int_64")).asInteger(), 7);
  EXPECT_TRUE(record->value(0, record->rowSize(0)).isNull());
}

TEST(DBValidationRecordTest, RelatedRowsComeFromTheResolver) {
  const auto user = userAttributes(7, 4);
  const auto record =
      DBValidationRecord::make(*image(7), [&](const DBEntity& owner, const std::string& table) {
        EXPECT_EQ(owner.id(), 7);
        return table == "image_user_attributes" ? std::static_pointer_cast<DBEntity>(user) : nullptr;
      });
  ASSERT_TRUE(record->hasRow(1));
  EXPECT_EQ(record->value(1, rankOf("image_user_attributes", "rating")).asInteger(), 4);
  EXPECT_EQ(record->value(1, rankOf("image_user_attributes", "image_id_int_64")).asInteger(), 7);
  EXPECT_EQ(record->value(0, rankOf("images", "width")).asInteger(), 640);
  EXPECT_FALSE(record->hasRow(2));
  EXPECT_TRUE(record->value(2, 0).isNull());
  EXPECT_FALSE(record->hasRow(3));
  EXPECT_FALSE(record->hasRow(DBValidationRecord::kMaxSlots));
}

TEST(DBValidationRecordTest, WithoutResolverThereAreNoRelatedRows) {
  const auto record = DBValidationRecord::make(*image(7), nullptr);
  EXPECT_FALSE(record->hasRow(1));
  EXPECT_FALSE(record->hasRow(2));
}

TEST(DBValidationRecordTest, RelatedRecordOfAnotherImageOrTableCountsAsMissing) {
  const auto record = DBValidationRecord::make(*image(7), [](const DBEntity&, const std::string& table) {
    if (table == "image_user_attributes") return std::static_pointer_cast<DBEntity>(userAttributes(8, 1));
    return std::static_pointer_cast<DBEntity>(std::make_shared<DBPath>());
  });
  EXPECT_FALSE(record->hasRow(1));
  EXPECT_FALSE(record->hasRow(2));
}

TEST(DBValidationRecordTest, OtherTablesHaveOnlyTheirOwnRow) {
  auto path = std::make_shared<DBPath>();
  path->path = L"/a/b";
  bool asked = false;
  const auto record = DBValidationRecord::make(*path, [&](const DBEntity&, const std::string&) {
    asked = true;
    return nullptr;
  });
  EXPECT_FALSE(asked);
  EXPECT_EQ(record->table(), "paths");
  EXPECT_EQ(record->value(0, rankOf("paths", "path_wide_ch")).asText(), "/a/b");
  EXPECT_FALSE(record->hasRow(1));
}

TEST(DBValidationRecordTest, OwnsItsTextsAfterTheRecordsAreGone) {
  std::shared_ptr<const DBValidationRecord> record;
  {
    auto source = image(9);
    source->path = L"/Volumes/Photos/2026/a rather long file name \u00e9.CR3";
    const auto user = userAttributes(9, 2);
    user->origin_name = L"an origin name longer than eight bytes";
    record = DBValidationRecord::make(*source, [&](const DBEntity&, const std::string& table) {
      return table == "image_user_attributes" ? std::static_pointer_cast<DBEntity>(user) : nullptr;
    });
  }
  EXPECT_EQ(record->value(0, rankOf("images", "path_wide_ch")).asText(),
            "/Volumes/Photos/2026/a rather long file name \xc3\xa9.CR3");
  EXPECT_EQ(record->value(1, rankOf("image_user_attributes", "origin_path_wide_ch")).asText(),
            "an origin name longer than eight bytes");
  EXPECT_EQ(record->value(1, rankOf("image_user_attributes", "rating")).asInteger(), 2);
}
