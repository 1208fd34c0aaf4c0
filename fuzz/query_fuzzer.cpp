// Runs arbitrary condition texts as image select queries on a small catalog and checks that SQLite
// selects exactly the images whose validation records Result answers true for.
//
// Input: the first byte chooses the joined attribute tables (bit 0: user attributes, bit 1: exif
// attributes); the rest is the condition on images, then one condition per joined table in that order,
// each on its own line. Lines beyond those are ignored.
//
// The catalog is built once and only read: besides the answers, every few inputs the fuzzer checks that
// it still holds what it was built with. Any exception fails, as the calls made here document none for
// a healthy catalog.
#include <stdlib.h>

#include <cfloat>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "dbclause.hpp"
#include "dbimgselectquery.hpp"
#include "dbreactor.hpp"
#include "dbrecords.hpp"
#include "dbselectplan.hpp"
#include "dbstrings.hpp"

namespace {

using namespace dbcore;

constexpr int kImages = 40;
constexpr uint64_t kInputsPerCatalogCheck = 256;

const std::vector<int32_t> kInts = {0, 1, -1, 7, 42, -300, 16777217, INT32_MAX, INT32_MIN};
const std::vector<int64_t> kInt64s = {0, 1, -1, 1700000000, -86400, 9007199254740993LL, INT64_MAX, INT64_MIN};
const std::vector<float> kFloats = {0.0f,        -0.0f,   0.5f,     2.8f,    -1.5f,    100.0f,    3200.0f,
                                    16777217.0f, FLT_MAX, -FLT_MAX, FLT_MIN, INFINITY, -INFINITY, NAN};
const std::vector<std::wstring> kTexts = {
    L"",    L"IMG_0001.CR3", L"img_0001.cr3", L"Canon", L"12",         L" 12",        L"-0",
    L"1e3", L"\u00e9",       L"\u65e5\u672c", L"a'b",   L"\"quoted\"", L"\U0001F600", L"Z"};

// Draws catalog values from the lists above, the same ones on every run.
class ValueSource {
 public:
  template <class T>
  const T& pick(const std::vector<T>& values) {
    return values[std::uniform_int_distribution<std::size_t>(0, values.size() - 1)(random_)];
  }
  bool chance(double probability) { return std::bernoulli_distribution(probability)(random_); }
  int32_t rating() { return std::uniform_int_distribution<int32_t>(0, 5)(random_); }

 private:
  std::mt19937_64 random_{20240611};
};

// A fresh directory under the temporary folder, removed with its contents on destruction.
class TemporaryDirectory {
 public:
  TemporaryDirectory() {
    std::string pattern = (std::filesystem::temp_directory_path() / "query_fuzzer-XXXXXX").string();
    if (mkdtemp(pattern.data()) == nullptr) std::abort();
    path_ = pattern;
  }
  ~TemporaryDirectory() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  TemporaryDirectory(const TemporaryDirectory&) = delete;
  TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;

  std::filesystem::path file(const std::string& name) const { return path_ / name; }

 private:
  std::filesystem::path path_;
};

// The catalog every input runs on, with its records kept in memory and the images' validation records.
class Catalog {
 public:
  Catalog() : reactor_(5) {
    const int opened = reactor_.Open(s2ws(directory_.file("query.krcatalog").string()), L"");
    if (opened != kDBOpenNeedsUpdate && opened != kDBOpenCurrent) std::abort();
    reactor_.Initialize();
    ValueSource values;
    for (int i = 0; i < kImages; ++i) addImage(values);
    makeValidationRecords();
  }
  ~Catalog() { reactor_.Close(); }
  Catalog(const Catalog&) = delete;
  Catalog& operator=(const Catalog&) = delete;

  DBReactor& reactor() { return reactor_; }
  const std::vector<std::shared_ptr<DBImage>>& images() const { return images_; }
  const std::shared_ptr<const DBValidationRecord>& validationRecord(std::size_t index) const {
    return validationRecords_[index];
  }

  // The image's record of the related table, or an empty pointer.
  std::shared_ptr<DBEntity> related(const DBEntity& image, const std::string& table) const {
    const auto& records = table == DBUserImgAttrib::kTableName ? user_ : exif_;
    const auto found = records.find(image.id());
    return found == records.end() ? nullptr : found->second;
  }

  // Whether the file still holds the records it was built with, as far as counting them tells.
  bool unchanged() {
    return reactor_.Count<DBImage>() == images_.size() &&
           reactor_.GetBySelectQuery<DBUserImgAttrib>(std::make_shared<DBEntitySelectQuery>()).size() ==
               user_.size() &&
           reactor_.GetBySelectQuery<DBExivImgAttrib>(std::make_shared<DBEntitySelectQuery>()).size() ==
               exif_.size();
  }

 private:
  void addImage(ValueSource& values) {
    auto image = std::make_shared<DBImage>();
    image->set_marked_to_delete(values.chance(0.25));
    image->guid = values.pick(kTexts);
    image->path = values.pick(kTexts);
    image->width = values.pick(kInts);
    image->height = values.pick(kInts);
    image->file_size = values.pick(kInt64s);
    image->modification_date = values.pick(kInt64s);
    image->import_date = values.pick(kInt64s);
    image->import_index = values.pick(kInts);
    image->creation_date = values.pick(kInt64s);
    reactor_ << image;
    images_.push_back(image);
    if (values.chance(0.8)) addUserAttributes(values, image->id());
    if (values.chance(0.8)) addExifAttributes(values, image->id());
  }

  void addUserAttributes(ValueSource& values, int64_t imageId) {
    auto attributes = std::make_shared<DBUserImgAttrib>();
    attributes->image_id = imageId;
    attributes->set_marked_to_delete(values.chance(0.2));
    attributes->trashed = values.chance(0.5);
    attributes->marker = values.pick(kInts);
    attributes->color = values.pick(kInts);
    attributes->rating = values.rating();
    attributes->edit_date = values.pick(kInt64s);
    attributes->opened = values.chance(0.5);
    attributes->trashed_date = values.pick(kInt64s);
    attributes->origin_name = values.pick(kTexts);
    attributes->lost = values.chance(0.5);
    reactor_ << std::vector<std::shared_ptr<DBUserImgAttrib>>{attributes};
    user_[imageId] = attributes;
  }

  void addExifAttributes(ValueSource& values, int64_t imageId) {
    auto attributes = std::make_shared<DBExivImgAttrib>();
    attributes->image_id = imageId;
    attributes->iso_speed = values.pick(kFloats);
    attributes->shutter_speed = values.pick(kFloats);
    attributes->f_number = values.pick(kFloats);
    attributes->focal_length = values.pick(kFloats);
    attributes->bps = values.pick(kInts);
    attributes->white_balance = values.pick(kInts);
    attributes->camera_maker = values.pick(kTexts);
    attributes->camera_model = values.pick(kTexts);
    attributes->lens_maker = values.pick(kTexts);
    attributes->date = values.pick(kInt64s);
    attributes->raw = values.chance(0.5);
    reactor_ << std::vector<std::shared_ptr<DBExivImgAttrib>>{attributes};
    exif_[imageId] = attributes;
  }

  void makeValidationRecords() {
    DBImgSelectQuery query;
    query.setRelatedRecordResolver(
        [this](const DBEntity& record, const std::string& table) { return related(record, table); });
    for (const auto& image : images_) validationRecords_.push_back(query.validationRecordForEntity(image));
  }

  TemporaryDirectory directory_;
  DBReactor reactor_;
  std::vector<std::shared_ptr<DBImage>> images_;
  std::map<int64_t, std::shared_ptr<DBEntity>> user_;
  std::map<int64_t, std::shared_ptr<DBEntity>> exif_;
  std::vector<std::shared_ptr<const DBValidationRecord>> validationRecords_;
};

Catalog& catalog() {
  static Catalog instance;
  return instance;
}

// The conditions of one input; a table's condition is empty when the input does not join it.
struct Conditions {
  bool joinsUser = false;
  bool joinsExif = false;
  std::string image;
  std::string user;
  std::string exif;
};

// The text up to the next line break, which it consumes.
std::string nextLine(std::string_view& text) {
  const std::size_t end = text.find('\n');
  const std::string line(text.substr(0, end));
  text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
  return line;
}

Conditions conditionsOf(const uint8_t* data, std::size_t size) {
  Conditions conditions;
  conditions.joinsUser = (data[0] & 1) != 0;
  conditions.joinsExif = (data[0] & 2) != 0;
  std::string_view text(reinterpret_cast<const char*>(data) + 1, size - 1);
  conditions.image = nextLine(text);
  if (conditions.joinsUser) conditions.user = nextLine(text);
  if (conditions.joinsExif) conditions.exif = nextLine(text);
  return conditions;
}

std::string describe(const Conditions& conditions) {
  std::string text = "images: " + conditions.image;
  if (conditions.joinsUser) text += "\nimage_user_attributes: " + conditions.user;
  if (conditions.joinsExif) text += "\nimage_exiv_attributes: " + conditions.exif;
  return text;
}

std::string describe(const TVariant& value) {
  switch (value.type()) {
    case FieldType::T_NONE:
      return "NULL";
    case FieldType::T_FLOAT:
      return std::to_string(value.asDouble());
    case FieldType::T_TEXT:
      return "'" + value.asText() + "'";
    case FieldType::T_WIDE_TEXT:
      return "'" + ws2s(value.asWideText()) + "'";
    default:
      return std::to_string(value.asInt64());
  }
}

void printRecord(const char* title, const std::shared_ptr<DBEntity>& record) {
  if (!record) {
    std::fprintf(stderr, "%s: none\n", title);
    return;
  }
  std::fprintf(stderr, "%s (marked to delete: %d):\n", title, record->marked_to_delete() ? 1 : 0);
  for (const auto& [column, value] : record->column_values()) {
    std::fprintf(stderr, "  %s = %s\n", column.c_str(), describe(value).c_str());
  }
}

[[noreturn]] void fail(const std::string& what, const Conditions& conditions) {
  std::fprintf(stderr, "%s\n%s\n", what.c_str(), describe(conditions).c_str());
  __builtin_trap();
}

[[noreturn]] void failOnImage(const DBImgSelectQuery& query, const Conditions& conditions, std::size_t index,
                              bool bySql) {
  const auto& image = catalog().images()[index];
  std::fprintf(stderr, "image %lld: selected by SQL: %d, Result: %d\nSQL: %s\n",
               static_cast<long long>(image->id()), bySql ? 1 : 0, bySql ? 0 : 1,
               query.planFor(DBImage::kTableName)->tail().c_str());
  printRecord("image", image);
  printRecord(DBUserImgAttrib::kTableName, catalog().related(*image, DBUserImgAttrib::kTableName));
  printRecord(DBExivImgAttrib::kTableName, catalog().related(*image, DBExivImgAttrib::kTableName));
  fail("SQL and Result disagree", conditions);
}

template <class A>
void join(DBImgSelectQuery& query, const std::string& condition) {
  query.Join<A>(std::make_shared<DBClause>(clauseWithCondition<A>(condition, true)));
}

std::shared_ptr<DBImgSelectQuery> queryFor(const Conditions& conditions) {
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(std::make_shared<DBClause>(clauseWithCondition<DBImage>(conditions.image, false)));
  if (conditions.joinsUser) join<DBUserImgAttrib>(*query, conditions.user);
  if (conditions.joinsExif) join<DBExivImgAttrib>(*query, conditions.exif);
  return query;
}

std::set<int64_t> selectedBySql(const std::shared_ptr<DBImgSelectQuery>& query) {
  std::set<int64_t> ids;
  for (const auto& image : catalog().reactor().GetBySelectQuery<DBImage>(query)) ids.insert(image->id());
  return ids;
}

// Runs the query first, so that Result reads the max/min values of this run.
void compare(const Conditions& conditions) {
  const auto query = queryFor(conditions);
  const std::set<int64_t> selected = selectedBySql(query);
  ColumnValues result;
  const auto& images = catalog().images();
  std::size_t found = 0;
  for (std::size_t i = 0; i < images.size(); ++i) {
    const bool bySql = selected.count(images[i]->id()) == 1;
    if (query->Result(result, catalog().validationRecord(i)) != bySql)
      failOnImage(*query, conditions, i, bySql);
    found += bySql ? 1 : 0;
  }
  if (found != selected.size()) fail("SQL selected images the catalog does not hold", conditions);
}

void checkCatalog(const Conditions& conditions) {
  static uint64_t inputs = 0;
  if (++inputs % kInputsPerCatalogCheck == 0 && !catalog().unchanged()) {
    fail("the catalog changed while it was only read", conditions);
  }
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  catalog();
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
  if (size == 0) return 0;
  const Conditions conditions = conditionsOf(data, size);
  try {
    compare(conditions);
    checkCatalog(conditions);
  } catch (const std::exception& exception) {
    fail(std::string("exception: ") + exception.what(), conditions);
  }
  return 0;
}
