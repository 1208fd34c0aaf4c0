#include "dbentityfavoritealias.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;

struct DBEntityFavoriteAliasTraits {
  using Record = dbcore::DBEntityFavoriteAlias;
  static constexpr const char* kTable = "entity_favorite_aliases";
  static constexpr uint8_t kType = 11;

  static auto fields(const Record& record) {
    return std::tie(record.favorite, record.favorite_order, record.orig_type, record.orig_id);
  }

  static void fill(Record& record) {
    record.favorite = true;
    record.favorite_order = 2.25f;
    record.orig_type = 200;
    record.orig_id = 5000000004;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"favorite_bool", FieldType::T_BOOL},
        {"favorite_order_float", FieldType::T_FLOAT},
        {"orig_entity_type", FieldType::T_INT},
        {"orig_entity_id_int_64", FieldType::T_INT_64},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBEntityFavoriteAlias, DBRecordTest, DBEntityFavoriteAliasTraits);

TEST(DBEntityFavoriteAliasTest, OrigEntityTypeIsTheAliasedRecordType) {
  dbcore::DBEntityFavoriteAlias alias;
  EXPECT_EQ(alias.orig_entity_type(), 0);
  alias.orig_type = dbcore::kDBRefFolderType;
  EXPECT_EQ(alias.orig_entity_type(), dbcore::kDBRefFolderType);
}

TEST(DBEntityFavoriteAliasTest, OrigEntityTypeIsStoredAsAnUnsignedInteger) {
  dbcore::DBEntityFavoriteAlias alias;
  alias.orig_type = 255;
  const auto values = alias.column_values();
  EXPECT_EQ(values.at("orig_entity_type").asInt(), 255);

  dbcore::DBEntityFavoriteAlias loaded;
  loaded.set_column_values(values);
  EXPECT_EQ(loaded.orig_entity_type(), 255);
}
