#include "dbenginereference.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "dbclause.hpp"

namespace {

using dbcore::DBEngineReference;
using Kind = DBEngineReference::Kind;

// The text of a string literal with its embedded NUL bytes (without the terminating one).
template <std::size_t N>
std::string bytes(const char (&text)[N]) {
  return std::string(text, N - 1);
}

TEST(DBEngineReferenceTest, TextsHaveTheDocumentedLayout) {
  EXPECT_EQ((DBEngineReference{Kind::Source, "", "lost_bool"}.text()), bytes("\0src\0lost_bool"));
  EXPECT_EQ((DBEngineReference{Kind::Other, "paths", "path_wide_ch"}.text()),
            bytes("\0oth\0paths\0path_wide_ch"));
  EXPECT_EQ((DBEngineReference{Kind::Max, "images", "width"}.text()), bytes("\0max\0images\0width"));
  EXPECT_EQ((DBEngineReference{Kind::Min, "images", "width"}.text()), bytes("\0min\0images\0width"));
}

TEST(DBEngineReferenceTest, TheConditionFunctionsMakeReferenceTexts) {
  EXPECT_EQ(dbcore::SOURCE_VAL("width"), (DBEngineReference{Kind::Source, "", "width"}.text()));
  EXPECT_EQ(dbcore::OTHER_VAL("images", "width"), (DBEngineReference{Kind::Other, "images", "width"}.text()));
  EXPECT_EQ(dbcore::SELECT_MAX("width", "images"), (DBEngineReference{Kind::Max, "images", "width"}.text()));
  EXPECT_EQ(dbcore::SELECT_MIN("width", "images"), (DBEngineReference{Kind::Min, "images", "width"}.text()));
}

TEST(DBEngineReferenceTest, ParseReadsBackEveryKind) {
  const std::vector<DBEngineReference> references{
      {Kind::Source, "", "_id_int_64"},
      {Kind::Other, "image_user_attributes", "trash_bool"},
      {Kind::Max, "image_exiv_attributes", "iso_speed"},
      {Kind::Min, "entity_favorite_aliases", "favorite_order_float"},
  };
  for (const auto& reference : references) {
    const auto parsed = DBEngineReference::parse(reference.text());
    ASSERT_TRUE(parsed.has_value()) << reference.column;
    EXPECT_EQ(*parsed, reference);
  }
}

TEST(DBEngineReferenceTest, ParseReadsTheConditionFunctionTexts) {
  EXPECT_EQ(DBEngineReference::parse(dbcore::SOURCE_VAL("c")), (DBEngineReference{Kind::Source, "", "c"}));
  EXPECT_EQ(DBEngineReference::parse(dbcore::OTHER_VAL("t", "c")),
            (DBEngineReference{Kind::Other, "t", "c"}));
  EXPECT_EQ(DBEngineReference::parse(dbcore::SELECT_MAX("c", "t")), (DBEngineReference{Kind::Max, "t", "c"}));
  EXPECT_EQ(DBEngineReference::parse(dbcore::SELECT_MIN("c", "t")), (DBEngineReference{Kind::Min, "t", "c"}));
}

TEST(DBEngineReferenceTest, ASourceReferenceHasNoTable) {
  const auto parsed = DBEngineReference::parse(DBEngineReference{Kind::Source, "images", "width"}.text());
  ASSERT_TRUE(parsed.has_value());
  EXPECT_TRUE(parsed->table.empty());
  EXPECT_EQ(parsed->column, "width");
}

TEST(DBEngineReferenceTest, ParseRejectsTextsOfAnotherLayout) {
  const std::vector<std::string> texts{
      "",
      "width",
      "src",
      "srcwidth",
      "0src0width",
      bytes("\0"),
      bytes("\0src"),
      bytes("\0src\0"),
      bytes("\0src width"),
      bytes("\0src\0a\0b"),
      bytes("\0SRC\0width"),
      bytes("\0xyz\0width"),
      bytes("\0srcx\0width"),
      bytes(" \0src\0width"),
      bytes("\0oth\0images"),
      bytes("\0oth\0\0width"),
      bytes("\0oth\0images\0"),
      bytes("\0oth\0images\0a\0b"),
      bytes("\0max\0width"),
      bytes("\0min\0\0"),
  };
  for (const auto& text : texts) {
    EXPECT_FALSE(DBEngineReference::parse(text).has_value()) << testing::PrintToString(text);
  }
}

TEST(DBEngineReferenceTest, ParseRejectsEveryTokenOfACondition) {
  auto stack = dbcore::makeConditionStackWithCondition(
      "(width >= -2.5 && path_wide_ch == '\\0src\\0width') || import_index == max_from_column(import_index) "
      "|| guid_wide_ch != \"src\"");
  ASSERT_FALSE(stack.empty());
  for (; !stack.empty(); stack.pop())
    EXPECT_FALSE(DBEngineReference::parse(stack.top()).has_value()) << stack.top();
}

}  // namespace
