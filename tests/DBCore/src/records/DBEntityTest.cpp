#include "dbentity.hpp"

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <tuple>

#include "dbrecords.hpp"

namespace {

template <class... Records>
std::set<std::string> tableNames(std::tuple<Records...>*) {
  return {Records::kTableName...};
}

TEST(DBEntityTest, ColumnTypesOfAnUnknownTableAreEmpty) {
  EXPECT_TRUE(dbcore::DBEntity::T_COLUMN_TYPES("unknown").empty());
  EXPECT_TRUE(dbcore::DBEntity::T_COLUMN_TYPES("").empty());
  EXPECT_TRUE(dbcore::DBEntity::T_COLUMN_TYPES("IMAGES").empty());
}

TEST(DBEntityTest, EveryRecordTypeHasItsOwnTable) {
  const auto tables = tableNames(static_cast<dbcore::DBRecordTypes*>(nullptr));
  EXPECT_EQ(tables.size(), std::tuple_size_v<dbcore::DBRecordTypes>);
  for (const auto& table : tables) EXPECT_FALSE(dbcore::DBEntity::T_COLUMN_TYPES(table).empty()) << table;
}

TEST(DBEntityTest, EveryTableHasTheBaseColumns) {
  for (const auto& table : tableNames(static_cast<dbcore::DBRecordTypes*>(nullptr))) {
    const auto columns = dbcore::DBEntity::T_COLUMN_TYPES(table);
    EXPECT_EQ(columns.at("_id_int_64"), dbcore::FieldType::T_INT_64) << table;
    EXPECT_EQ(columns.at("marked_to_delete_bool"), dbcore::FieldType::T_BOOL) << table;
  }
}

}  // namespace

TEST(DBEntityTest, ColumnTypesAreOneMapPerTableForTheLifeOfTheProgram) {
  EXPECT_EQ(&dbcore::DBEntity::T_COLUMN_TYPES("images"), &dbcore::DBEntity::T_COLUMN_TYPES("images"));
  EXPECT_EQ(&dbcore::DBEntity::T_COLUMN_TYPES("unknown"), &dbcore::DBEntity::T_COLUMN_TYPES("other"));
}
