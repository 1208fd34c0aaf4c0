#include "dbclausecompiler.hpp"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "DBClauseTestSupport.hpp"
#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbuserimgattrib.hpp"

using namespace dbcore;
using namespace clausetest;

namespace {

const std::string kUser = DBUserImgAttrib::kTableName;
const std::string kExif = DBExivImgAttrib::kTableName;

DBClauseProgram compiled(const std::string& table, std::vector<Node> trees) {
  return DBClauseCompiler(table).compile(trees);
}

DBClauseProgram compiledImages(Node tree) { return compiled(DBImage::kTableName, {std::move(tree)}); }

const DBSqlValue& onlyLiteral(const DBClauseProgram& program) {
  EXPECT_EQ(program.literals().size(), 1u);
  return program.literals()[0];
}

// Deepest first: a chain of `depth` nested && over one comparison.
Node chain(int depth) {
  Node node = eq(source("width"), int32(1));
  for (int i = 0; i < depth; ++i) node = both(node, eq(source("width"), int32(1)));
  return node;
}

}  // namespace

TEST(DBClauseCompilerTest, NoTreesNoCondition) {
  const DBClauseProgram program = compiled(DBImage::kTableName, {nullptr});
  EXPECT_FALSE(program.rejected());
  EXPECT_FALSE(program.hasCondition());
  EXPECT_EQ(program.sql(), "");
}

TEST(DBClauseCompilerTest, ComparisonWithBoundLiteral) {
  const DBClauseProgram program = compiledImages(eq(source("width"), int32(3)));
  EXPECT_EQ(program.sql(), "images.width = ?");
  EXPECT_EQ(onlyLiteral(program).asInteger(), 3);
}

TEST(DBClauseCompilerTest, OperatorsAndLogic) {
  const DBClauseProgram program = compiledImages(
      either(both(ne(source("width"), int32(1)), lt(source("height"), int32(2))),
             both(le(int32(3), source("import_index")),
                  both(gt(source("file_size_int_64"), int64(4)), ge(source("path_wide_ch"), wide(L"x"))))));
  EXPECT_EQ(program.sql(),
            "(images.width <> ? AND images.height < ? OR ? <= images.import_index AND "
            "images.file_size_int_64 > ? AND images.path_wide_ch >= ?)");
  EXPECT_EQ(program.literals().size(), 5u);
  EXPECT_EQ(program.literals()[4].asText(), "x");
}

TEST(DBClauseCompilerTest, SeveralTreesAreJoinedWithAnd) {
  const DBClauseProgram program = compiled(
      DBImage::kTableName, {eq(source("width"), int32(1)), nullptr, ge(other(kUser, "rating"), int32(3)),
                            eq(other(kExif, "is_raw_bool"), boolean(true))});
  EXPECT_EQ(
      program.sql(),
      "images.width = ? AND image_user_attributes.rating >= ? AND image_exiv_attributes.is_raw_bool = ?");
  EXPECT_EQ(program.relatedSlots(), 0b110u);
}

TEST(DBClauseCompilerTest, JoinedColumnsMarkTheirSlot) {
  EXPECT_EQ(compiledImages(eq(other(kUser, "rating"), int32(1))).relatedSlots(), 0b10u);
  EXPECT_EQ(compiledImages(eq(other(kExif, "iso_speed"), real(1))).relatedSlots(), 0b100u);
  EXPECT_EQ(compiledImages(eq(source("width"), int32(1))).relatedSlots(), 0u);
}

TEST(DBClauseCompilerTest, AggregatesBecomeSubSelects) {
  const DBClauseProgram program = compiledImages(both(
      eq(source("import_index"), maxOf("images", "import_index")), ge(minOf(kUser, "rating"), int32(0))));
  EXPECT_EQ(program.sql(),
            "images.import_index = (SELECT max(import_index) FROM images) AND "
            "(SELECT min(rating) FROM image_user_attributes) >= ?");
  EXPECT_EQ(program.aggregateSql(),
            "SELECT (SELECT max(import_index) FROM images), (SELECT min(rating) FROM image_user_attributes)");
  EXPECT_EQ(program.aggregateTypes(), (std::vector<FieldType>{FieldType::T_INT, FieldType::T_INT}));
  EXPECT_EQ(program.relatedSlots(), 0u);
}

TEST(DBClauseCompilerTest, NoByteOfALiteralReachesTheSql) {
  const std::vector<std::string> attempts = {
      "' OR 1=1 --", "x'; DROP TABLE images; --", "/* comment */",
      "\"quoted\"",  "); DELETE FROM images; (",  "camera_model_wide_ch"};
  for (const std::string& attempt : attempts) {
    const DBClauseProgram program =
        compiledImages(either(eq(source("path_wide_ch"), text(attempt)), eq(text(attempt), wide(L"OR 1=1"))));
    ASSERT_FALSE(program.rejected()) << attempt;
    EXPECT_EQ(program.sql(), "(images.path_wide_ch = ? OR ? = ?)") << attempt;
  }
}

TEST(DBClauseCompilerTest, ForgedReferencesAreRefused) {
  EXPECT_TRUE(compiledImages(eq(other("images; DROP TABLE images", "width"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(source("width) OR (1"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(maxOf("images", "width) FROM images; --"), int32(1))).rejected());
}

TEST(DBClauseCompilerTest, UnknownNamesAreRefused) {
  EXPECT_TRUE(compiledImages(eq(source("no_such_column"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(source("rating"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(other("paths", "path_wide_ch"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(other(kUser, "no_such_column"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(maxOf("no_such_table", "width"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(maxOf("images", "no_such_column"), int32(1))).rejected());
  EXPECT_TRUE(compiled("paths", {eq(other(kUser, "rating"), int32(1))}).rejected());
  EXPECT_TRUE(compiled("no_such_table", {eq(source("width"), int32(1))}).rejected());
}

TEST(DBClauseCompilerTest, MalformedTreesAreRefused) {
  EXPECT_TRUE(compiledImages(op(99, source("width"), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(op(kOperatorEqual, source("width"), nullptr)).rejected());
  EXPECT_TRUE(compiledImages(op(kOperatorAnd, nullptr, eq(source("width"), int32(1)))).rejected());
  EXPECT_TRUE(compiledImages(eq(std::make_shared<token_node>(), int32(1))).rejected());
  EXPECT_TRUE(compiledImages(eq(textNode("not an engine text"), int32(1))).rejected());
}

TEST(DBClauseCompilerTest, ParenthesesOnlyWherePrecedenceNeedsThem) {
  const Node a = eq(source("width"), int32(1));
  const Node b = eq(source("height"), int32(2));
  EXPECT_EQ(compiledImages(both(either(a, b), both(a, either(a, b)))).sql(),
            "(images.width = ? OR images.height = ?) AND images.width = ? AND (images.width = ? OR "
            "images.height = ?)");
  EXPECT_EQ(compiledImages(either(both(a, b), either(a, b))).sql(),
            "(images.width = ? AND images.height = ? OR images.width = ? OR images.height = ?)");
  EXPECT_EQ(compiledImages(eq(eq(source("width"), int32(1)), lt(int32(2), source("height")))).sql(),
            "(images.width = ?) = (? < images.height)");
  EXPECT_EQ(compiled(DBImage::kTableName, {either(a, b), a}).sql(),
            "(images.width = ? OR images.height = ?) AND images.width = ?");
}

TEST(DBClauseCompilerTest, NestingIsBounded) {
  Node comparisons = eq(source("width"), int32(1));
  for (int i = 0; i < DBClauseCompiler::kMaxNesting; ++i) comparisons = eq(comparisons, int32(1));
  EXPECT_FALSE(compiledImages(comparisons).rejected());
  EXPECT_TRUE(compiledImages(eq(comparisons, int32(1))).rejected());
}

TEST(DBClauseCompilerTest, DepthAndSizeAreBounded) {
  EXPECT_FALSE(compiledImages(chain(DBClauseCompiler::kMaxDepth - 1)).rejected());
  EXPECT_TRUE(compiledImages(chain(DBClauseCompiler::kMaxDepth + 1)).rejected());
  // Shared subtrees would make the walk exponential; the node budget stops it.
  Node shared = eq(source("width"), int32(1));
  for (int i = 0; i < 40; ++i) shared = both(shared, shared);
  EXPECT_TRUE(compiledImages(shared).rejected());
}

TEST(DBClauseCompilerTest, TextLiteralAgainstNumericColumnIsBoundAsItsNumber) {
  EXPECT_EQ(onlyLiteral(compiledImages(eq(source("marked_to_delete_bool"), text("1")))).asInteger(), 1);
  EXPECT_EQ(onlyLiteral(compiledImages(eq(text(" 2.5 "), other(kExif, "iso_speed")))).asReal(), 2.5);
  EXPECT_EQ(onlyLiteral(compiledImages(eq(source("width"), text("3x")))).asText(), "3x");
}

TEST(DBClauseCompilerTest, IntegerLiteralAgainstTextColumnIsBoundAsText) {
  const DBClauseProgram program = compiledImages(eq(source("path_wide_ch"), int64(-12)));
  EXPECT_FALSE(program.rejected());
  EXPECT_EQ(onlyLiteral(program).asText(), "-12");
}

TEST(DBClauseCompilerTest, RealTurnedIntoTextIsRefused) {
  EXPECT_TRUE(compiledImages(eq(source("path_wide_ch"), real(1.5f))).rejected());
  EXPECT_TRUE(compiledImages(eq(maxOf(kExif, "iso_speed"), source("path_wide_ch"))).rejected());
  EXPECT_FALSE(compiledImages(eq(maxOf(kExif, "iso_speed"), source("width"))).rejected());
  EXPECT_FALSE(compiledImages(eq(maxOf(kUser, "rating"), source("path_wide_ch"))).rejected());
  EXPECT_FALSE(compiledImages(eq(real(1.5f), text("1.5"))).rejected());
}

TEST(DBClauseCompilerTest, LiteralsWithoutAffinityStayAsTheyAre) {
  const DBClauseProgram program = compiledImages(eq(text("3"), int32(3)));
  EXPECT_EQ(program.literals()[0].asText(), "3");
  EXPECT_EQ(program.literals()[1].asInteger(), 3);
  const DBClauseProgram columns = compiledImages(eq(source("guid_wide_ch"), text("12")));
  EXPECT_EQ(onlyLiteral(columns).asText(), "12");
}

TEST(DBClauseCompilerTest, LiteralsUsedAsConditionsAreBoundAsTruthValues) {
  const DBClauseProgram program =
      compiledImages(either(both(text("2x"), text("abc")), either(null(), real(0.5f))));
  ASSERT_EQ(program.literals().size(), 4u);
  EXPECT_EQ(program.literals()[0].asInteger(), 1);
  EXPECT_EQ(program.literals()[1].asInteger(), 0);
  EXPECT_TRUE(program.literals()[2].isNull());
  EXPECT_EQ(program.literals()[3].asInteger(), 1);
  EXPECT_EQ(onlyLiteral(compiledImages(text("0"))).asInteger(), 0);
}

TEST(DBClauseCompilerTest, ClauseWithConditionTreesCompile) {
  const DBClause clause = clauseWithCondition<DBImage>("marked_to_delete_bool == false && width > 3", false);
  const DBClauseProgram program = compiledImages(clause.root());
  EXPECT_EQ(program.sql(), "images.marked_to_delete_bool = ? AND images.width > ?");
  const DBClause joined = clauseWithCondition<DBUserImgAttrib>("rating >= max_from_column(rating)", true);
  EXPECT_EQ(compiledImages(joined.root()).sql(),
            "image_user_attributes.rating >= (SELECT max(rating) FROM image_user_attributes)");
}
