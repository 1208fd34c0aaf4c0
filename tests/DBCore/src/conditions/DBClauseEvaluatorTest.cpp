#include "dbclauseevaluator.hpp"

#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

#include "DBClauseTestSupport.hpp"
#include "dbclausecompiler.hpp"
#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbuserimgattrib.hpp"

using namespace dbcore;
using namespace clausetest;

namespace {

const std::string kUser = DBUserImgAttrib::kTableName;
const std::string kExif = DBExivImgAttrib::kTableName;

class DBClauseEvaluatorTest : public testing::Test {
 protected:
  DBClauseEvaluatorTest() {
    image->set_id(5);
    image->width = 3;
    image->path = L"12";
    image->guid = L"abc";
    image->file_size = (int64_t{1} << 53) + 1;
    user->image_id = 5;
    user->rating = 4;
    user->trashed = true;
    user->origin_name = L"4";
    exif->image_id = 5;
    exif->iso_speed = 100.0f;
    exif->camera_model = L"X-T5";
  }

  std::shared_ptr<const DBValidationRecord> record(bool withUser = true, bool withExif = true) const {
    return DBValidationRecord::make(*image, [=, this](const DBEntity&, const std::string& table) {
      if (table == kUser) return withUser ? std::static_pointer_cast<DBEntity>(user) : nullptr;
      return withExif ? std::static_pointer_cast<DBEntity>(exif) : nullptr;
    });
  }

  // The answer for the tree on the full record, with the sub-select values given.
  bool holds(Node tree, const DBSqlRow* aggregates = nullptr, uint32_t joined = 0) const {
    const DBClauseProgram program = DBClauseCompiler(DBImage::kTableName).compile({std::move(tree)});
    return DBClauseEvaluator(program, *record(), aggregates).satisfied(joined);
  }

  std::shared_ptr<DBImage> image = std::make_shared<DBImage>();
  std::shared_ptr<DBUserImgAttrib> user = std::make_shared<DBUserImgAttrib>();
  std::shared_ptr<DBExivImgAttrib> exif = std::make_shared<DBExivImgAttrib>();
};

}  // namespace

TEST_F(DBClauseEvaluatorTest, EachOperatorOnIntegers) {
  EXPECT_TRUE(holds(eq(source("width"), int32(3))));
  EXPECT_FALSE(holds(ne(source("width"), int32(3))));
  EXPECT_TRUE(holds(lt(source("width"), int32(4))));
  EXPECT_TRUE(holds(le(source("width"), int32(3))));
  EXPECT_FALSE(holds(gt(source("width"), int32(3))));
  EXPECT_TRUE(holds(ge(source("width"), int32(3))));
  EXPECT_TRUE(holds(gt(int32(4), source("width"))));
}

TEST_F(DBClauseEvaluatorTest, EachOperatorOnTexts) {
  EXPECT_TRUE(holds(eq(source("guid_wide_ch"), wide(L"abc"))));
  EXPECT_TRUE(holds(ne(source("guid_wide_ch"), wide(L"ABC"))));
  EXPECT_TRUE(holds(gt(source("guid_wide_ch"), wide(L"ABC"))));
  EXPECT_TRUE(holds(lt(source("guid_wide_ch"), wide(L"abcd"))));
  EXPECT_TRUE(holds(le(source("guid_wide_ch"), wide(L"abc"))));
  EXPECT_FALSE(holds(ge(source("guid_wide_ch"), wide(L"\u00e9"))));
}

TEST_F(DBClauseEvaluatorTest, RealsAndIntegersCompareExactly) {
  EXPECT_TRUE(holds(eq(other(kExif, "iso_speed"), int32(100))));
  EXPECT_TRUE(holds(gt(other(kExif, "iso_speed"), real(99.5f))));
  EXPECT_TRUE(holds(gt(source("file_size_int_64"), real(9007199254740992.0f))));
  EXPECT_TRUE(holds(eq(source("width"), real(3.0f))));
}

TEST_F(DBClauseEvaluatorTest, NumericAffinityReadsTextLiteralsAsNumbers) {
  EXPECT_TRUE(holds(eq(other(kUser, "trash_bool"), text("1"))));
  EXPECT_TRUE(holds(eq(other(kUser, "rating"), text(" 4 "))));
  EXPECT_TRUE(holds(eq(other(kUser, "rating"), text("4.0"))));
  EXPECT_FALSE(holds(eq(other(kUser, "rating"), text("4x"))));
  // A text that is no number stays text, which sorts after every number.
  EXPECT_TRUE(holds(lt(other(kUser, "rating"), text("4x"))));
}

TEST_F(DBClauseEvaluatorTest, TextColumnsCompareNumbersAsText) {
  EXPECT_TRUE(holds(eq(source("path_wide_ch"), int32(12))));
  EXPECT_TRUE(holds(lt(source("path_wide_ch"), int32(3))));
  EXPECT_FALSE(holds(eq(other(kUser, "origin_path_wide_ch"), maxOf(kUser, "rating"))));
  const DBSqlRow aggregates(std::vector<TVariant>{TVariant(int64_t{4})});
  EXPECT_TRUE(holds(eq(other(kUser, "origin_path_wide_ch"), maxOf(kUser, "rating")), &aggregates));
}

TEST_F(DBClauseEvaluatorTest, LiteralsWithoutAffinityCompareByClass) {
  EXPECT_FALSE(holds(eq(text("3"), int32(3))));
  EXPECT_TRUE(holds(lt(int32(99), text("1"))));
  EXPECT_TRUE(holds(eq(real(2.0f), int64(2))));
  EXPECT_FALSE(holds(eq(null(), null())));
}

TEST_F(DBClauseEvaluatorTest, ThreeValuedLogicWithNull) {
  const Node unknown = eq(maxOf(kUser, "rating"), int32(1));
  const Node yes = eq(source("width"), int32(3));
  const Node no = eq(source("width"), int32(4));
  EXPECT_FALSE(holds(unknown));
  EXPECT_FALSE(holds(both(unknown, yes)));
  EXPECT_FALSE(holds(both(no, unknown)));
  EXPECT_TRUE(holds(either(unknown, yes)));
  EXPECT_FALSE(holds(either(no, unknown)));
  // NULL && false is false, so comparing it with false holds; NULL && true is NULL.
  EXPECT_TRUE(holds(eq(both(unknown, no), boolean(false))));
  EXPECT_FALSE(holds(eq(both(unknown, yes), boolean(false))));
  EXPECT_FALSE(holds(ne(both(unknown, yes), boolean(false))));
}

TEST_F(DBClauseEvaluatorTest, OperandsAsConditions) {
  EXPECT_TRUE(holds(other(kUser, "trash_bool")));
  EXPECT_TRUE(holds(both(source("width"), text("2x"))));
  EXPECT_FALSE(holds(both(source("width"), text("abc"))));
  EXPECT_TRUE(holds(source("path_wide_ch")));
  EXPECT_FALSE(holds(source("guid_wide_ch")));
  EXPECT_FALSE(holds(null()));
}

TEST_F(DBClauseEvaluatorTest, ComparisonResultsAreIntegers) {
  EXPECT_TRUE(holds(eq(eq(source("width"), int32(3)), int32(1))));
  EXPECT_TRUE(holds(lt(eq(source("width"), int32(3)), text("a"))));
  EXPECT_TRUE(holds(eq(eq(source("width"), int32(3)), other(kUser, "trash_bool"))));
}

TEST_F(DBClauseEvaluatorTest, JoinedRowsMustExist) {
  const DBClauseProgram program =
      DBClauseCompiler(DBImage::kTableName).compile({eq(source("width"), int32(3))});
  EXPECT_TRUE(DBClauseEvaluator(program, *record(false, false), nullptr).satisfied(0));
  EXPECT_FALSE(DBClauseEvaluator(program, *record(false, true), nullptr).satisfied(0b10));
  EXPECT_TRUE(DBClauseEvaluator(program, *record(true, false), nullptr).satisfied(0b10));
  const DBClauseProgram joined = DBClauseCompiler(DBImage::kTableName)
                                     .compile({eq(other(kExif, "camera_model_wide_ch"), wide(L"X-T5"))});
  EXPECT_TRUE(DBClauseEvaluator(joined, *record(), nullptr).satisfied(0));
  EXPECT_FALSE(DBClauseEvaluator(joined, *record(true, false), nullptr).satisfied(0));
}

TEST_F(DBClauseEvaluatorTest, RejectedProgramAndNoCondition) {
  EXPECT_FALSE(holds(eq(source("no_such_column"), int32(1))));
  const DBClauseProgram none;
  EXPECT_TRUE(DBClauseEvaluator(none, *record(), nullptr).satisfied(0));
}

TEST_F(DBClauseEvaluatorTest, ConcurrentEvaluationsAgree) {
  const DBClauseProgram program =
      DBClauseCompiler(DBImage::kTableName)
          .compile({both(ge(other(kUser, "rating"), text("3")),
                         eq(other(kExif, "camera_model_wide_ch"), wide(L"X-T5")))});
  const auto shared = record();
  std::vector<std::thread> threads;
  std::vector<int> passes(4, 0);
  for (size_t t = 0; t < passes.size(); ++t) {
    threads.emplace_back([&, t] {
      for (int i = 0; i < 10000; ++i) passes[t] += DBClauseEvaluator(program, *shared, nullptr).satisfied(0);
    });
  }
  for (auto& thread : threads) thread.join();
  for (const int count : passes) EXPECT_EQ(count, 10000);
}
