// Differential test of the in-memory evaluation against SQLite: random conditions over a catalog of
// random records must select, through GetBySelectQuery, exactly the records whose validation records
// Result answers true for.
#include <gtest/gtest.h>

#include <cfloat>
#include <chrono>
#include <cmath>
#include <limits>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "DBClauseTestSupport.hpp"
#include "dbclause.hpp"
#include "dbimgselectquery.hpp"
#include "dbreactor.hpp"
#include "dbselectplan.hpp"
#include "dbstrings.hpp"
#include "dbuserimgattribselectquery.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;
using namespace clausetest;

namespace {

constexpr int kImages = 80;
constexpr int kTextConditions = 8000;
constexpr int kTreeConditions = 3000;
// Conditions are made from shapes (structure, operators, columns) filled with fresh literals, so that
// statements repeat as they do in use.
constexpr int kConditionsPerShape = 10;

const std::vector<int32_t> kInts = {0, 1, -1, 2, 3, 5, 16777216, 16777217, INT32_MAX, INT32_MIN};
const std::vector<int64_t> kInt64s = {
    0, 1, -1, 3, 1700000000, 9007199254740993LL, INT64_MAX, INT64_MIN, (1LL << 53), -(1LL << 53)};
const std::vector<float> kFloats = {0.0f,   -0.0f,       0.1f,        1.5f,     3.0f,
                                    -2.5f,  FLT_MAX,     -FLT_MAX,    FLT_MIN,  1e-45f,
                                    100.0f, 16777216.0f, 16777217.0f, INFINITY, -INFINITY};
// Stored floats also take NaN, which the file keeps as NULL.
const std::vector<float> kRecordFloats = [] {
  std::vector<float> values = kFloats;
  values.push_back(NAN);
  return values;
}();
const std::vector<std::wstring> kWideTexts = {L"",    L"a",    L"IMG_1.CR3", L"12",           L" 12", L"1e3",
                                              L"-0",  L"0x10", L"\u00e9",    L"\u65e5\u672c", L"a'b", L"Z",
                                              L"abc", L"3",    L"2.5",       L"true"};
const std::vector<std::string> kTexts = {"",      "3",         " 3 ",  "3.0", "1e2",  "abc",
                                         "0x1",   "-0",        "true", "2x",  "\xff", "9223372036854775808",
                                         "1e400", "IMG_1.CR3", "Z"};

template <class T>
const T& pick(std::mt19937_64& random, const std::vector<T>& values) {
  return values[std::uniform_int_distribution<size_t>(0, values.size() - 1)(random)];
}

bool chance(std::mt19937_64& random, double probability) {
  return std::bernoulli_distribution(probability)(random);
}

// The catalog every condition runs on, with its records kept in memory for the validation records.
class Catalog {
 public:
  Catalog() : reactor(5) {
    reactor.Open(s2ws(directory.file("differential.krcatalog")), L"");
    reactor.Initialize();
    std::mt19937_64 random(7);
    for (int i = 0; i < kImages; ++i) addImage(random);
  }

  // The related records of an image for validation records; only read, so callable from any thread.
  std::shared_ptr<DBEntity> related(const DBEntity& record, const std::string& table) const {
    const auto& records = table == DBUserImgAttrib::kTableName ? user : exif;
    const auto found = records.find(record.id());
    return found == records.end() ? nullptr : found->second;
  }

  KRTemporaryDirectory directory;
  DBReactor reactor;
  std::vector<std::shared_ptr<DBImage>> images;
  std::map<int64_t, std::shared_ptr<DBEntity>> user;
  std::map<int64_t, std::shared_ptr<DBEntity>> exif;

 private:
  void addImage(std::mt19937_64& random) {
    auto image = std::make_shared<DBImage>();
    image->set_marked_to_delete(chance(random, 0.3));
    image->guid = pick(random, kWideTexts);
    image->path = pick(random, kWideTexts);
    image->width = pick(random, kInts);
    image->height = pick(random, kInts);
    image->file_size = pick(random, kInt64s);
    image->modification_date = pick(random, kInt64s);
    image->import_date = pick(random, kInt64s);
    image->import_index = pick(random, kInts);
    image->creation_date = pick(random, kInt64s);
    reactor << image;
    images.push_back(image);
    if (chance(random, 0.85)) addUserAttributes(random, *image);
    if (chance(random, 0.85)) addExifAttributes(random, *image);
  }

  void addUserAttributes(std::mt19937_64& random, const DBImage& image) {
    auto attributes = std::make_shared<DBUserImgAttrib>();
    attributes->image_id = image.id();
    attributes->set_marked_to_delete(chance(random, 0.2));
    attributes->trashed = chance(random, 0.5);
    attributes->marker = pick(random, kInts);
    attributes->color = pick(random, kInts);
    attributes->rating = std::uniform_int_distribution<int32_t>(0, 5)(random);
    attributes->edit_date = pick(random, kInt64s);
    attributes->opened = chance(random, 0.5);
    attributes->origin_name = pick(random, kWideTexts);
    attributes->lost = chance(random, 0.5);
    reactor << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
    user[image.id()] = attributes;
  }

  void addExifAttributes(std::mt19937_64& random, const DBImage& image) {
    auto attributes = std::make_shared<DBExivImgAttrib>();
    attributes->image_id = image.id();
    attributes->iso_speed = pick(random, kRecordFloats);
    attributes->shutter_speed = pick(random, kRecordFloats);
    attributes->f_number = pick(random, kRecordFloats);
    attributes->focal_length = pick(random, kRecordFloats);
    attributes->bps = pick(random, kInts);
    attributes->white_balance = pick(random, kInts);
    attributes->camera_maker = pick(random, kWideTexts);
    attributes->camera_model = pick(random, kWideTexts);
    attributes->date = pick(random, kInt64s);
    attributes->raw = chance(random, 0.5);
    reactor << std::vector<std::shared_ptr<DBExivImgAttrib>>{attributes};
    exif[image.id()] = attributes;
  }
};

// The columns a generator picks from, per table.
const std::vector<std::string> kImageColumns = {
    "_id_int_64", "marked_to_delete_bool", "guid_wide_ch",       "path_wide_ch",
    "width",      "file_size_int_64",      "import_date_int_64", "import_index"};
const std::vector<std::string> kUserColumns = {
    "marked_to_delete_bool", "trash_bool",          "rating",   "color",
    "edit_date_int_64",      "origin_path_wide_ch", "lost_bool"};
const std::vector<std::string> kExifColumns = {
    "iso_speed",        "shutter_speed",        "number",
    "white_balance",    "camera_model_wide_ch", "camera_maker_wide_ch",
    "date_time_int_64", "is_raw_bool"};

const std::vector<std::string> kPathColumns = {"volume_id_int_64", "path_wide_ch"};

const std::vector<std::string>& columnsOf(const std::string& table) {
  if (table == DBUserImgAttrib::kTableName) return kUserColumns;
  if (table == DBExivImgAttrib::kTableName) return kExifColumns;
  return kImageColumns;
}

// Draws the structure of a condition from one random source and its literals from another, so that
// one shape seed gives the same structure (and SQL) with different literals.
class Generator {
 public:
  Generator(uint64_t shapeSeed, uint64_t valueSeed) : shape_(shapeSeed), value_(valueSeed) {}

  std::mt19937_64& shape() { return shape_; }
  std::mt19937_64& value() { return value_; }

  const std::string& table() {
    static const std::vector<std::string> tables = {DBImage::kTableName, DBUserImgAttrib::kTableName,
                                                    DBExivImgAttrib::kTableName};
    return pick(shape_, tables);
  }

 private:
  std::mt19937_64 shape_;
  std::mt19937_64 value_;
};

// Random condition trees as type checking could leave them, or could not: any column against any
// literal type, on either side, nested in && and ||.
class TreeMaker {
 public:
  explicit TreeMaker(Generator& generator) : generator_(generator) {}

  Node condition(int depth) {
    const int kind = std::uniform_int_distribution<int>(0, 9)(generator_.shape());
    if (depth >= 3 || kind < 6) return comparison(depth);
    if (kind < 9) {
      return op(chance(generator_.shape(), 0.5) ? kOperatorAnd : kOperatorOr, condition(depth + 1),
                condition(depth + 1));
    }
    return operandNode(depth);
  }

 private:
  Node comparison(int depth) {
    const int32_t code =
        std::uniform_int_distribution<int32_t>(kOperatorEqual, kOperatorGreaterOrEqual)(generator_.shape());
    Node left = operandNode(depth);
    Node right = operandNode(depth);
    return chance(generator_.shape(), 0.5) ? op(code, left, right) : op(code, right, left);
  }

  Node operandNode(int depth) {
    const int kind = std::uniform_int_distribution<int>(0, 19)(generator_.shape());
    if (kind < 8) return column();
    if (kind < 17) return literal();
    if (kind < 19 || depth >= 3) return aggregate();
    return condition(depth + 1);
  }

  Node column() {
    const std::string& table = generator_.table();
    const std::string& name = pick(generator_.shape(), columnsOf(table));
    return table == DBImage::kTableName ? source(name) : other(table, name);
  }

  // Now and then over the empty table of paths, whose max and min are NULL.
  Node aggregate() {
    const bool empty = chance(generator_.shape(), 0.15);
    const std::string table = empty ? DBPath::kTableName : generator_.table();
    const std::string& name =
        empty ? pick(generator_.shape(), kPathColumns) : pick(generator_.shape(), columnsOf(table));
    return chance(generator_.shape(), 0.5) ? maxOf(table, name) : minOf(table, name);
  }

  Node literal() {
    std::mt19937_64& random = generator_.value();
    switch (std::uniform_int_distribution<int>(0, 7)(random)) {
      case 0:
        return boolean(chance(random, 0.5));
      case 1:
        return int32(pick(random, kInts));
      case 2:
        return int64(pick(random, kInt64s));
      case 3:
        return real(chance(random, 0.1) ? NAN : pick(random, kFloats));
      case 4:
        return text(pick(random, kTexts));
      case 5:
        return wide(pick(random, kWideTexts));
      case 6:
        return null();
      default:
        return int32(std::uniform_int_distribution<int32_t>(-2, 6)(random));
    }
  }

  Generator& generator_;
};

// Random condition texts for clauseWithCondition over one table: its columns, literal words, numbers
// and quoted texts, column functions, parentheses, and now and then malformed text.
class TextMaker {
 public:
  TextMaker(Generator& generator, std::string table) : generator_(generator), table_(std::move(table)) {}

  std::string condition(int depth) {
    const int kind = std::uniform_int_distribution<int>(0, 9)(generator_.shape());
    if (depth >= 3 || kind < 6) return comparison();
    if (kind < 9)
      return "(" + condition(depth + 1) + (kind < 8 ? " && " : " || ") + condition(depth + 1) + ")";
    return operand();
  }

 private:
  std::string comparison() {
    static const std::vector<std::string> operators = {"==", "!=", "<", "<=", ">", ">="};
    const std::string& code = pick(generator_.shape(), operators);
    const std::string left = operand();
    const std::string right = operand();
    return chance(generator_.shape(), 0.5) ? left + " " + code + " " + right
                                           : right + " " + code + " " + left;
  }

  std::string operand() {
    const int kind = std::uniform_int_distribution<int>(0, 19)(generator_.shape());
    const std::string& column = pick(generator_.shape(), columnsOf(table_));
    if (kind < 9) return column;
    if (kind < 11)
      return (chance(generator_.shape(), 0.5) ? "max_from_column(" : "min_from_column(") + column + ")";
    return literal();
  }

  std::string literal() {
    static const std::vector<std::string> numbers = {
        "0", "1", "-1", "3", "2.5", "16777217", "0.1", "-0", "9223372036854775807", "100000000000000000000",
        "5"};
    static const std::vector<std::string> words = {"true",   "false", "abc",      "Z",  "camera",
                                                   "rating", "nan",   "infinity", "inf"};
    static const std::vector<std::string> quoted = {
        "'x'", "'IMG_1.CR3'", "''", "'12'", "' 12'", "'1e3'", "'a\\'b'", "\"abc\"", "'3'", "'2.5'", "'true'"};
    std::mt19937_64& random = generator_.value();
    switch (std::uniform_int_distribution<int>(0, 2)(random)) {
      case 0:
        return pick(random, numbers);
      case 1:
        return pick(random, words);
      default:
        return pick(random, quoted);
    }
  }

  Generator& generator_;
  std::string table_;
};

class DBClauseEvaluatorDifferentialTest : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    catalog_ = new Catalog();
    records_ = new std::vector<std::shared_ptr<const DBValidationRecord>>();
    DBImgSelectQuery query;
    query.setRelatedRecordResolver(resolver());
    for (const auto& image : catalog_->images) records_->push_back(query.validationRecordForEntity(image));
  }

  static void TearDownTestSuite() {
    delete records_;
    delete catalog_;
  }

  static DBRelatedRecordResolver resolver() {
    return [](const DBEntity& record, const std::string& table) { return catalog_->related(record, table); };
  }

  // Runs the query and compares its records with the in-memory answers for every image.
  static void expectSameImages(const std::shared_ptr<DBImgSelectQuery>& query,
                               const std::string& description) {
    std::set<int64_t> selected;
    for (const auto& image : catalog_->reactor.GetBySelectQuery<DBImage>(query)) selected.insert(image->id());
    ColumnValues result;
    for (size_t i = 0; i < catalog_->images.size(); ++i) {
      const int64_t id = catalog_->images[i]->id();
      const bool inMemory = query->Result(result, (*records_)[i]);
      ASSERT_EQ(inMemory, selected.count(id) == 1)
          << description << "\nimage " << id << "\nSQL:" << query->planFor(DBImage::kTableName)->tail();
    }
    ++conditions_;
    if (!selected.empty() && selected.size() < catalog_->images.size()) ++discriminating_;
  }

  static Catalog* catalog_;
  static std::vector<std::shared_ptr<const DBValidationRecord>>* records_;
  static int conditions_;
  static int discriminating_;
};

Catalog* DBClauseEvaluatorDifferentialTest::catalog_ = nullptr;
std::vector<std::shared_ptr<const DBValidationRecord>>* DBClauseEvaluatorDifferentialTest::records_ = nullptr;
int DBClauseEvaluatorDifferentialTest::conditions_ = 0;
int DBClauseEvaluatorDifferentialTest::discriminating_ = 0;

}  // namespace

TEST_F(DBClauseEvaluatorDifferentialTest, ConditionTextsThroughClauseWithCondition) {
  conditions_ = discriminating_ = 0;
  for (int shape = 0; shape < kTextConditions / kConditionsPerShape; ++shape) {
    for (int round = 0; round < kConditionsPerShape; ++round) {
      Generator generator(static_cast<uint64_t>(shape), static_cast<uint64_t>(shape * 1000 + round));
      const std::string imageText = TextMaker(generator, DBImage::kTableName).condition(0);
      const std::string userText = TextMaker(generator, DBUserImgAttrib::kTableName).condition(1);
      const std::string exifText = TextMaker(generator, DBExivImgAttrib::kTableName).condition(1);
      const bool joinUser = chance(generator.shape(), 0.5);
      const bool joinExif = chance(generator.shape(), 0.4);
      auto query = std::make_shared<DBImgSelectQuery>();
      query->Where(std::make_shared<DBClause>(clauseWithCondition<DBImage>(imageText, false)));
      if (joinUser)
        query->Join<DBUserImgAttrib>(
            std::make_shared<DBClause>(clauseWithCondition<DBUserImgAttrib>(userText, true)));
      if (joinExif)
        query->Join<DBExivImgAttrib>(
            std::make_shared<DBClause>(clauseWithCondition<DBExivImgAttrib>(exifText, true)));
      expectSameImages(query, "images: " + imageText + (joinUser ? "\nuser: " + userText : "") +
                                  (joinExif ? "\nexif: " + exifText : ""));
      if (HasFatalFailure()) return;
    }
  }
  EXPECT_EQ(conditions_, kTextConditions);
  // Most conditions must split the catalog, or the comparison would prove little.
  EXPECT_GT(discriminating_, kTextConditions / 3);
}

TEST_F(DBClauseEvaluatorDifferentialTest, HandBuiltTrees) {
  conditions_ = discriminating_ = 0;
  int rejected = 0;
  for (int shape = 0; shape < kTreeConditions / kConditionsPerShape; ++shape) {
    for (int round = 0; round < kConditionsPerShape; ++round) {
      Generator generator(static_cast<uint64_t>(shape) + 1000000,
                          static_cast<uint64_t>(shape * 1000 + round));
      TreeMaker maker(generator);
      auto query = std::make_shared<DBImgSelectQuery>();
      query->Where(clause(maker.condition(0)));
      if (chance(generator.shape(), 0.3)) query->Join<DBUserImgAttrib>(clause(maker.condition(1)));
      if (chance(generator.shape(), 0.3)) query->Join<DBExivImgAttrib>(clause(maker.condition(1)));
      rejected += query->planFor(DBImage::kTableName)->selectsNothing() ? 1 : 0;
      expectSameImages(query, "tree shape " + std::to_string(shape) + " round " + std::to_string(round));
      if (HasFatalFailure()) return;
    }
  }
  EXPECT_EQ(conditions_, kTreeConditions);
  EXPECT_GT(discriminating_, kTreeConditions / 4);
  // Only comparisons of reals with text columns through literals or sub-selects are refused.
  EXPECT_LT(rejected, kTreeConditions / 5);
}
