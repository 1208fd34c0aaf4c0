#include "dbexivimgattribselectquery.hpp"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "DBNonFiniteFloatTestSupport.hpp"
#include "DBSelectQueryTestSupport.hpp"

using namespace dbcore;

namespace {

class DBExivImgAttribSelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBExivImgAttrib> attributes(float iso, const std::wstring& model) {
    auto record = std::make_shared<DBExivImgAttrib>();
    record->image_id = makeImage(model + L" " + std::to_wstring(iso))->id();
    record->iso_speed = iso;
    record->camera_model = model;
    *reactor << std::vector<std::shared_ptr<DBExivImgAttrib>>{record};
    return record;
  }
};

// One column of each field type, three records with rising values in it, and the literal of the middle
// (for booleans: two records and the literal true).
struct TypedColumn {
  std::string column;
  std::vector<std::function<void(DBExivImgAttrib&)>> values;
  std::string literal;
  size_t literalRank;
};

std::vector<TypedColumn> typedColumns() {
  return {
      {"is_raw_bool", {[](auto& r) { r.raw = false; }, [](auto& r) { r.raw = true; }}, "true", 1},
      {"bits_per_sample",
       {[](auto& r) { r.bps = -8; }, [](auto& r) { r.bps = 16; }, [](auto& r) { r.bps = 32; }},
       "16",
       1},
      {"date_time_int_64",
       {[](auto& r) { r.date = -1; }, [](auto& r) { r.date = 1700000000; },
        [](auto& r) { r.date = INT64_MAX; }},
       "1700000000",
       1},
      {"iso_speed",
       {[](auto& r) { r.iso_speed = -0.5f; }, [](auto& r) { r.iso_speed = 2.5f; },
        [](auto& r) { r.iso_speed = 1e30f; }},
       "2.5",
       1},
      {"camera_model_wide_ch",
       {[](auto& r) { r.camera_model = L"A7"; }, [](auto& r) { r.camera_model = L"X-T5"; },
        [](auto& r) { r.camera_model = L"x-t5"; }},
       "'X-T5'",
       1},
  };
}

struct Operator {
  const char* text;
  std::function<bool(size_t, size_t)> holds;
};

const std::vector<Operator> kOperators = {
    {"==", [](size_t a, size_t b) { return a == b; }}, {"!=", [](size_t a, size_t b) { return a != b; }},
    {"<", [](size_t a, size_t b) { return a < b; }},   {"<=", [](size_t a, size_t b) { return a <= b; }},
    {">", [](size_t a, size_t b) { return a > b; }},   {">=", [](size_t a, size_t b) { return a >= b; }},
};

}  // namespace

TEST_F(DBExivImgAttribSelectQueryTest, EachOperatorOnEachFieldType) {
  for (const TypedColumn& typed : typedColumns()) {
    std::vector<std::shared_ptr<DBExivImgAttrib>> records;
    for (const auto& setValue : typed.values) {
      records.push_back(attributes(0.0f, L"record " + std::to_wstring(records.size())));
      setValue(*records.back());
    }
    *reactor << records;
    for (const Operator& op : kOperators) {
      std::vector<long long> expected;
      for (size_t rank = 0; rank < records.size(); ++rank) {
        if (op.holds(rank, typed.literalRank)) expected.push_back(records[rank]->id());
      }
      auto query = std::make_shared<DBExivImgAttribSelectQuery>();
      const std::string condition = typed.column + " " + op.text + " " + typed.literal;
      query->Where(where<DBExivImgAttrib>(condition));
      std::vector<long long> selected;
      for (const auto& record : reactor->GetBySelectQuery<DBExivImgAttrib>(query)) {
        if (record->id() >= records.front()->id()) selected.push_back(record->id());
      }
      EXPECT_EQ(selected, expected) << condition;
      EXPECT_EQ(satisfyingIds(query, records), expected) << condition;
    }
  }
}

TEST_F(DBExivImgAttribSelectQueryTest, SelectsExifRecordsByTheirColumns) {
  const auto a = attributes(100.0f, L"X-T5");
  const auto b = attributes(0.1f, L"A7");
  const auto c = attributes(3200.0f, L"X-T5");
  const std::vector<std::shared_ptr<DBExivImgAttrib>> all{a, b, c};
  auto query = std::make_shared<DBExivImgAttribSelectQuery>();
  EXPECT_EQ(query->table(), "image_exiv_attributes");
  query->Where(where<DBExivImgAttrib>("camera_model_wide_ch == 'X-T5' && iso_speed > 150"));
  const auto records = reactor->GetBySelectQuery<DBExivImgAttrib>(query);
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0]->iso_speed, 3200.0f);
  EXPECT_EQ(satisfyingIds(query, all), std::vector<long long>{c->id()});
  // 0.1 as a float literal equals the stored float, both widened the same way.
  query->Where(where<DBExivImgAttrib>("iso_speed == 0.1"));
  EXPECT_EQ(selectedIds<DBExivImgAttrib>(query), std::vector<long long>{b->id()});
  EXPECT_EQ(satisfyingIds(query, all), std::vector<long long>{b->id()});
}

// Cameras write 0/0 and x/0 rationals: one batch imports NaN and infinities in every float field. NaN is
// a missing value to conditions, as SQL's NULL is: no comparison with it holds, not even with itself.
TEST_F(DBExivImgAttribSelectQueryTest, NaNAndInfinitiesImportReadBackAndSelectAlikeInSqlAndInMemory) {
  std::vector<float> values = nonfinite::kValues;
  values.push_back(2.0f);
  std::vector<std::shared_ptr<DBExivImgAttrib>> records;
  for (float value : values) {
    auto record = std::make_shared<DBExivImgAttrib>();
    record->image_id = makeImage(L"image " + std::to_wstring(records.size()))->id();
    nonfinite::setEveryFloat(*record, value);
    records.push_back(record);
  }
  *reactor << records;
  for (size_t index = 0; index < records.size(); ++index) {
    const auto read = reactor->Get<DBExivImgAttrib>(records[index]->id());
    ASSERT_TRUE(read);
    EXPECT_TRUE(nonfinite::everyFloatIs(*read, values[index]));
  }
  // Indexes into `values`: NaN, +inf, -inf, 2.
  const std::vector<std::pair<std::string, std::vector<size_t>>> conditions = {
      {"ev > 1", {1, 3}},
      {"ev <= 1", {2}},
      {"ev == ev", {1, 2, 3}},
      {"ev != 2", {1, 2}},
      {"ev == inf", {1}},
      {"ev == nan || ev != nan", {}},
      {"ev == max_from_column(ev)", {1}},
      {"ev == min_from_column(ev)", {2}},
      {"aperture != focal_len || ev == 2", {3}},
      {"ev > 1 || 1", {0, 1, 2, 3}},
  };
  for (const auto& [condition, indexes] : conditions) {
    std::vector<long long> expected;
    for (size_t index : indexes) expected.push_back(records[index]->id());
    auto query = std::make_shared<DBExivImgAttribSelectQuery>();
    query->Where(where<DBExivImgAttrib>(condition));
    EXPECT_EQ(selectedIds<DBExivImgAttrib>(query), expected) << condition;
    EXPECT_EQ(satisfyingIds(query, records), expected) << condition;
  }
}
