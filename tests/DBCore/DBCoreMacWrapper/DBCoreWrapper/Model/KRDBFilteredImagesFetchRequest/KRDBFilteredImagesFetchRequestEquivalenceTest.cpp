#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <functional>
#include <future>
#include <iterator>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRPredicate.hpp"
#include "KRVariedExifReader.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbentity.hpp"
#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbuserimgattrib.hpp"

namespace {

using Ids = KRFetchRequestCatalog::Ids;
using Request = KRDBFilteredImagesFetchRequest;
using ImagePtr = std::shared_ptr<KRDBImage>;

constexpr int kImageCount = 1000;
constexpr int kGeneratedCount = 2000;
constexpr int64_t kFirstDay = 1262304000;  // 2010-01-01
constexpr int64_t kTenYears = 10 * 365 * 86400;
const char* const kFolderPaths[] = {"/photos",          "/photos/2015", "/photos/2016", "/photos/2016/trip",
                                    "/photos/2019",     "/photos2",     "/archive",     "/archive/raw",
                                    "/archive/raw/old", "/scans"};
const char* const kExtensions[] = {".JPG", ".jpg", ".nef", ".CR3", ".png", ".tif", ".heic", ".dng"};
struct CameraModel {
  const char* maker;
  const char* name;
  const char* model;
};
const CameraModel kCameras[] = {
    {"Canon", "EOS R5", "Canon EOS R5"}, {"Canon", "EOS 5D", "Canon EOS 5D Mark IV"},
    {"Nikon", "Z 7", "NIKON Z 7"},       {"Nikon", "D850", "NIKON D850"},
    {"Sony", "A7 III", "ILCE-7M3"},      {"Fujifilm", "X-T4", "X-T4"},
    {"Olympus", "E-M1", "E-M1MarkII"},   {"Apple", "iPhone 12", "iPhone 12 Pro"},
};
// One lens name holds "false", so that literals drawn from it are rewritten in the predicate text.
const std::pair<const char*, const char*> kLenses[] = {{"Sigma", "24-70mm F2.8"},
                                                       {"Canon", "EF 50mm f/1.8"},
                                                       {"Nikon", "Z 85mm f/1.8 S"},
                                                       {"Sony", "FE 16-35mm F4"},
                                                       {"Tamron", "70-200mm F2.8 falsecolor"}};
const float kFNumbers[] = {1.4f, 1.8f, 2.0f, 2.8f, 4.0f, 5.6f, 8.0f, 11.0f, 16.0f};
const float kIsoSpeeds[] = {50, 100, 200, 400, 800, 1600, 3200, 6400, 12800};
const float kShutterSpeeds[] = {0.00025f, 0.001f, 0.004f, 0.008f, 0.0166667f, 0.033f, 0.125f, 0.5f, 1, 30};

// The catalog of the suite and its images as fetched and linked, one entity per record (as a context
// holds them): every image with its attributes, exif attributes and folder path, every path with its
// volume, every collection with its images. Built once on the test thread, then only read (the in-memory
// test may read it from another thread).
class KREquivalenceCatalog {
 public:
  KREquivalenceCatalog() {
    std::mt19937 random(20240611);
    build(random);
    load();
  }

  KRDBCatalog& catalog() { return store.catalog(); }
  void onQueue(const std::function<void()>& block) { catalog().performSynchronously(true, block); }

  KRFetchRequestCatalog store;
  std::vector<ImagePtr> images;
  std::vector<std::shared_ptr<KRDBCollection>> collections;
  std::vector<std::shared_ptr<KRDBReferencedFolder>> folders;

 private:
  static KRString imageName(int index, std::mt19937& random) {
    if (index % 101 == 7) return "import_index.jpg";
    if (index % 101 == 8) return "importIndex.jpg";
    const char* prefixes[] = {"IMG_", "DSC_", "_MG_", "P"};
    return prefixes[random() % 4] + std::to_string(index) + kExtensions[random() % std::size(kExtensions)];
  }
  static KRString originName(int index) {
    if (index % 50 == 1) return "untrue.jpg";
    if (index % 50 == 2) return "unYES.jpg";
    return "orig_" + std::to_string(index % 400) + kExtensions[index % std::size(kExtensions)];
  }
  static KRDate dayIn10Years(std::mt19937& random) {
    return KRDate::dateWithTimeIntervalSince1970(static_cast<double>(kFirstDay + random() % kTenYears));
  }
  template <class T, size_t N>
  static const T& pick(const T (&values)[N], std::mt19937& random) {
    return values[random() % N];
  }

  static KRVariedExifReader::Camera camera(std::mt19937& random) {
    KRVariedExifReader::Camera values;
    // Some images carry no camera values at all.
    if (random() % 20 == 0) return values;
    const CameraModel& model = pick(kCameras, random);
    const auto& lens = pick(kLenses, random);
    values.isoSpeed = pick(kIsoSpeeds, random);
    values.shutterSpeed = pick(kShutterSpeeds, random);
    values.fNumber = pick(kFNumbers, random);
    values.minFocalLength = static_cast<float>(12 + random() % 40);
    values.maxFocalLength = values.minFocalLength + static_cast<float>(random() % 180);
    values.focalLength = values.minFocalLength + static_cast<float>(random() % 50) / 2;
    values.focalLength35 = values.focalLength * 1.5f;
    values.minShutter = 0.000125f;
    values.maxShutter = static_cast<float>(random() % 2 == 0 ? 30 : 60);
    values.focusDistance = static_cast<float>(random() % 1000) / 100;
    values.bps = static_cast<float>(random() % 2 == 0 ? 12 : 14);
    values.whiteBalance = random() % 3;
    values.whiteBalanceIndex = static_cast<int32_t>(random() % 10);
    values.lightSource = static_cast<int32_t>(random() % 25);
    values.meteringMode = static_cast<int32_t>(random() % 7);
    values.cameraMaker = model.maker;
    values.cameraName = model.name;
    values.cameraModel = model.model;
    values.lensMaker = lens.first;
    values.lensPrettyName = lens.second;
    values.date = dayIn10Years(random);
    values.raw = random() % 3 == 0;
    values.fullFilled = random() % 4 != 0;
    return values;
  }

  void build(std::mt19937& random) {
    const auto volumes = store.create(KRDBEntityTypeVolume, {{}, {}});
    std::vector<KRDictionary> pathInfos;
    for (const auto& volume : volumes) {
      for (const char* path : kFolderPaths)
        pathInfos.push_back({{"DBPathInfoPath", path}, {"DBPathInfoVolume", volume}});
    }
    const auto paths = store.create(KRDBEntityTypePath, pathInfos);
    std::vector<KRDictionary> infos;
    for (int index = 0; index < kImageCount; ++index) {
      const KRString name = imageName(index, random);
      const KRTestExifReader::File file{"/p/" + name.str(),
                                        600,
                                        400,
                                        static_cast<int64_t>(10000 + random() % 50000000),
                                        dayIn10Years(random),
                                        dayIn10Years(random)};
      infos.push_back(
          {{"DBImageInfoExifReader", std::make_shared<KRVariedExifReader>(file, camera(random))},
           {"DBImageInfoImageName", name},
           {"DBImageInfoOriginImageName", originName(index)},
           {"DBImageImportIndex", static_cast<int>(index % 300)},
           {"DBImageImportTimeIntervalNumber", static_cast<double>(kFirstDay + random() % kTenYears)},
           {"DBImageInfoFolderDBPath", paths[random() % paths.size()]}});
    }
    const auto created = store.create(KRDBEntityTypeImage, infos);
    describeUsers(created, random);
    const auto made = store.create(KRDBEntityTypeCollection, {{}, {}, {}, {}, {}});
    const size_t memberShares[] = {2, 10, 50, 300, 900};
    for (size_t index = 0; index < made.size(); ++index) {
      KRDBEntitySet members;
      while (members.size() < memberShares[index]) members.insert(created[random() % created.size()]);
      onQueue([&] { catalog().addImagesSync(members, made[index]); });
    }
    for (size_t index : {0, 4, 14, 16, 7}) {
      folders.push_back(std::dynamic_pointer_cast<KRDBReferencedFolder>(
          store.create(KRDBEntityTypeReferencedFolder, {{{"DBReferencedFolderPath", paths[index]}}}).at(0)));
    }
    for (const auto& entity : made) collections.push_back(std::dynamic_pointer_cast<KRDBCollection>(entity));
  }

  // User and exif attribute flags and some images marked to delete, written through the entity setters.
  void describeUsers(const KRDBEntityArray& created, std::mt19937& random) {
    onQueue(
        [&] { catalog().additionalFetchingSyncForEntities(KRDBEntitySet(created.begin(), created.end())); });
    KRDBEntityArray changed;
    for (const auto& entity : created) {
      const auto image = std::dynamic_pointer_cast<KRDBImage>(entity);
      const auto attributes = image->attributesPrimitive();
      attributes->setTrashed(random() % 10 == 0);
      attributes->setLost(random() % 20 == 0);
      attributes->setRating(static_cast<int32_t>(random() % 6));
      attributes->setColor(static_cast<int32_t>(random() % 6));
      attributes->setOpened(random() % 3 == 0);
      attributes->setEditDate(dayIn10Years(random));
      attributes->setMarkedToDelete(random() % 30 == 0);
      image->exivAttributesPrimitive()->setMarkedToDelete(random() % 30 == 0);
      image->setMarkedToDelete(random() % 16 == 0);
      changed.insert(changed.end(), {image, attributes, image->exivAttributesPrimitive()});
    }
    onQueue([&] { catalog().updateEntitiesSync(changed); });
  }

  void load() {
    for (const auto& record : store.allRecords<dbcore::DBImage>())
      images.push_back(KRDBImage::initWithDBEntity(record));
    onQueue(
        [&] { catalog().additionalFetchingSyncForEntities(KRDBEntitySet(images.begin(), images.end())); });
    std::map<int64_t, std::shared_ptr<KRDBPath>> paths;
    const auto samePath = [&paths](const std::shared_ptr<KRDBPath>& path) {
      return paths.emplace(path->entityID()->dbid(), path).first->second;
    };
    for (const auto& image : images)
      image->setFolderDBPathPrimitive(samePath(image->folderDBPathPrimitive()));
    for (const auto& folder : folders) folder->setDbPath(samePath(folder->dbPath()));
    KRDBEntitySet pathSet;
    for (const auto& [id, path] : paths) pathSet.insert(path);
    onQueue([&] { catalog().additionalFetchingSyncForEntities(pathSet); });
    std::map<int64_t, std::shared_ptr<KRDBVolume>> volumes;
    for (const auto& [id, path] : paths) {
      path->setVolumePrimitive(
          volumes.emplace(path->volumePrimitive()->entityID()->dbid(), path->volumePrimitive())
              .first->second);
    }
    std::map<int64_t, ImagePtr> byId;
    for (const auto& image : images) byId[image->entityID()->dbid()] = image;
    for (const auto& collection : collections) {
      KRDBEntityArray members;
      onQueue([&] { members = catalog().fetchImagesOfFilterSync(collection); });
      KRDBEntitySet loaded;
      for (const auto& member : members) loaded.insert(byId.at(member->entityID()->dbid()));
      collection->setImagesPrimitive(std::make_shared<const KRDBEntitySet>(std::move(loaded)));
    }
  }
};

// One configuration of a request: a condition per kind (empty: none), where it is set, the collections
// (by index) and the referenced folder (by index, -1: none).
struct Setting {
  std::string image{};
  std::string user{};
  std::string exif{};
  std::vector<size_t> collections{};
  int folder = -1;
  bool custom = false;

  std::string description() const {
    std::string text = "image: \"" + image + "\" user: \"" + user + "\" exif: \"" + exif + "\" collections:";
    for (size_t index : collections) text += " " + std::to_string(index);
    return text + " folder: " + std::to_string(folder) + (custom ? " (custom)" : "");
  }
};

class KRDBFilteredImagesFetchRequestEquivalenceTest : public testing::Test {
 protected:
  static void SetUpTestSuite() { shared = new KREquivalenceCatalog(); }
  static void TearDownTestSuite() {
    delete shared;
    shared = nullptr;
  }

  static KRDictionary conditions(const Setting& setting) {
    KRDictionary dictionary = KRDictionary::dictionary();
    const std::pair<const KRString&, const std::string&> kinds[] = {
        {KRImagesConditionType, setting.image},
        {KRUserAttributesConditionType, setting.user},
        {KRExivAttributesConditionType, setting.exif}};
    for (const auto& [kind, condition] : kinds) {
      if (!condition.empty()) dictionary = dictionary.dictionaryBySettingObject(KRString(condition), kind);
    }
    return dictionary;
  }

  static std::shared_ptr<Request> request(const Setting& setting) {
    auto result = Request::init();
    if (setting.custom) {
      result->setCustomConditions(conditions(setting));
    } else {
      result->setFilterConditions(conditions(setting));
    }
    if (!setting.collections.empty()) {
      KRDBEntitySet filters;
      for (size_t index : setting.collections) filters.insert(shared->collections.at(index));
      result->setFilters(std::make_shared<const KRDBEntitySet>(std::move(filters)));
    }
    if (setting.folder >= 0) result->setFolder(shared->folders.at(static_cast<size_t>(setting.folder)));
    return result;
  }

  static Ids fetched(const Setting& setting) {
    KRDBEntitySet entities;
    const auto made = request(setting);
    shared->onQueue([&] { entities = shared->catalog().fetchEntitiesUsingFetchRequestSync(made); });
    Ids ids;
    for (const auto& entity : entities) ids.insert(entity->entityID()->dbid());
    return ids;
  }

  // The images not marked to delete that the in-memory test accepts (the engine never selects the others).
  static Ids satisfying(const Setting& setting) {
    const auto made = request(setting);
    Ids ids;
    for (const auto& image : shared->images) {
      if (!image->isMarkedToDelete() && made->isEntitySatisfyingFilterConditions(image)) {
        ids.insert(image->entityID()->dbid());
      }
    }
    return ids;
  }

  static Ids where(const std::function<bool(const ImagePtr&)>& test) {
    Ids ids;
    for (const auto& image : shared->images) {
      if (!image->isMarkedToDelete() && test(image)) ids.insert(image->entityID()->dbid());
    }
    return ids;
  }

  static KREquivalenceCatalog* shared;
};

KREquivalenceCatalog* KRDBFilteredImagesFetchRequestEquivalenceTest::shared = nullptr;

std::string differences(const Ids& engine, const Ids& memory) {
  std::string text =
      "engine " + std::to_string(engine.size()) + ", memory " + std::to_string(memory.size()) + ";";
  int shown = 0;
  for (int64_t id : engine) {
    if (!memory.contains(id) && shown++ < 5) text += " only engine " + std::to_string(id);
  }
  for (int64_t id : memory) {
    if (!engine.contains(id) && shown++ < 10) text += " only memory " + std::to_string(id);
  }
  return text;
}

// Conditions covering every operator, every column kind, both joins, the filters, the folder and computed
// sub-expressions.
const std::vector<Setting> kWrittenSettings = {
    {.image = "import_index == 42"},
    {.image = "_id_int_64 > 900", .user = "_id_int_64 < 1000", .exif = "_id_int_64 != 950"},
    {.image = "import_index != 42 && import_index < 10"},
    {.image = "import_index <= 3 || import_index >= 297"},
    {.image = "import_index > 100 && import_index < 110"},
    {.image = "10 > import_index"},
    {.image = "file_size_int_64 >= 40000000"},
    {.image = "file_size_int_64 < 1000000 || file_size_int_64 > 49000000"},
    {.image = "guid_wide_ch != '' && import_index < 5"},
    {.image = "path_wide_ch == 'importIndex.jpg' || path_wide_ch < 'D'"},
    {.image = "path_wide_ch >= 'P' && path_wide_ch < 'Q'"},
    {.image = "path_wide_ch != 'importIndex.jpg' && import_index == 7"},
    {.image = "modification_date_int_64 > 1420070400 && modification_date_int_64 <= 1451606400"},
    {.image = "import_date_int_64 < modification_date_int_64"},
    {.image = "(import_index < 50 || import_index > 250) && (file_size_int_64 < 25000000)"},
    {.image = "import_date_int_64 > $MAT_FUNCTION[1262304000 + 5 * FUNCTION(SELF, 'dayInterval') * 365]"},
    {.image = "import_index >= $MAT_FUNCTION[10 * 10] && import_index < $MAT_FUNCTION[300 / 2]"},
    {.user = "trash_bool == true"},
    {.user = "trash_bool != true && lost_bool == false"},
    {.user = "opened_bool == true || lost_bool == true"},
    {.user = "marked_to_delete_bool == true"},
    {.user = "origin_path_wide_ch == 'unYES.jpg'"},
    {.user = "edit_date_int_64 >= 1500000000 && edit_date_int_64 < 1510000000"},
    {.user = "false == trash_bool"},
    {.exif = "iso_speed >= 800"},
    {.exif = "iso_speed < 200 || iso_speed > 3200"},
    {.exif = "number <= 2 && focal_len > 20"},
    {.exif = "focal_len35mm == 54 || focal_len_min > 45"},
    {.exif = "focal_len_max > 100 && focal_len_min < focal_len"},
    {.exif = "shutter_speed < 0.0078125 && shutter_max == 60"},
    {.exif = "focus_distance > 9.5 || bits_per_sample == 12"},
    {.exif = "white_balance == 2 && white_balance_index >= 5"},
    {.exif = "light_source < 3 || metering_mode == 6"},
    {.exif = "camera_maker_wide_ch == 'Canon' && camera_name_wide_ch != 'EOS R5'"},
    {.exif = "camera_model_wide_ch == 'NIKON D850' || lens_maker_wide_ch == 'Tamron'"},
    {.exif = "lens_pretty_name_wide_ch >= 'F' && lens_pretty_name_wide_ch < 'Z'"},
    {.exif = "date_time_int_64 > 1577836800 && is_raw_bool == true"},
    {.exif = "is_full_filled_bool == false"},
    {.exif = "camera_maker_wide_ch == ''"},
    {.exif = "marked_to_delete_bool == true || shutter_min < 0.001"},
    {.image = "import_index < 150", .user = "trash_bool == false", .exif = "iso_speed > 400"},
    {.user = "lost_bool == false", .exif = "camera_maker_wide_ch == 'Sony'", .custom = true},
    {.image = "file_size_int_64 > 1000000", .collections = {3}},
    {.collections = {0, 1, 2}},
    {.user = "trash_bool == true", .collections = {4}},
    {.folder = 0},
    {.folder = 1},
    {.folder = 2, .custom = true},
    {.exif = "is_raw_bool == true", .collections = {3, 4}, .folder = 3},
    {.image = "import_index != 0", .folder = 4},
    {.image = "import_index == 12 || (import_index == 13 && file_size_int_64 > 0) || import_index == 14"},
};

TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, WrittenConditionsSelectAlike) {
  ASSERT_GE(kWrittenSettings.size(), 30u);
  size_t nonTrivial = 0;
  for (const Setting& setting : kWrittenSettings) {
    const Ids engine = fetched(setting);
    EXPECT_EQ(engine, satisfying(setting))
        << setting.description() << ": " << differences(engine, satisfying(setting));
    if (!engine.empty() && engine.size() < shared->images.size()) ++nonTrivial;
  }
  EXPECT_GE(nonTrivial, kWrittenSettings.size() - 2);
}

// The rewriting into key paths is plain substring replacement, literals included: "true" becomes "YES"
// and a column name its key path, so the in-memory test compares with the rewritten text.
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, RewrittenLiteralsSelectWhatTheRewritingImplies) {
  const auto originNamed = [](const char* name) {
    return where([name](const ImagePtr& image) {
      return image->attributesPrimitive()->originName() == KRString(name);
    });
  };
  const auto named = [](const char* name) {
    return where([name](const ImagePtr& image) { return image->name() == KRString(name); });
  };
  ASSERT_FALSE(originNamed("untrue.jpg").empty());
  ASSERT_FALSE(originNamed("unYES.jpg").empty());
  const Setting untrue{.user = "origin_path_wide_ch == 'untrue.jpg'"};
  EXPECT_EQ(fetched(untrue), originNamed("untrue.jpg"));
  EXPECT_EQ(satisfying(untrue), originNamed("unYES.jpg"));
  ASSERT_FALSE(named("import_index.jpg").empty());
  ASSERT_FALSE(named("importIndex.jpg").empty());
  const Setting columnInLiteral{.image = "path_wide_ch == 'import_index.jpg'"};
  EXPECT_EQ(fetched(columnInLiteral), named("import_index.jpg"));
  EXPECT_EQ(satisfying(columnInLiteral), named("importIndex.jpg"));
}

// The engine reads every numeric literal as a 32-bit float and converts it to the column's type; the
// in-memory predicate compares with the literal as written.
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, LiteralsAreConvertedAsTheEngineConvertsThem) {
  const auto exif = [](const ImagePtr& image) { return image->exivAttributesPrimitive(); };
  const Setting fNumber{.exif = "number == 2.8"};
  const Ids f28 = where([&](const ImagePtr& image) { return exif(image)->fNumber() == 2.8f; });
  ASSERT_FALSE(f28.empty());
  EXPECT_EQ(fetched(fNumber), f28);
  EXPECT_EQ(satisfying(fNumber), Ids{});
  const Setting truncated{.image = "import_index == 2.5"};
  const Ids index2 = where([](const ImagePtr& image) { return image->importIndex() == 2; });
  ASSERT_FALSE(index2.empty());
  EXPECT_EQ(fetched(truncated), index2);
  EXPECT_EQ(satisfying(truncated), Ids{});
  // An exif date that a float cannot hold: the engine compares with the float's value.
  const auto seconds = [&](const ImagePtr& image) {
    return static_cast<int64_t>(exif(image)->date().timeIntervalSince1970());
  };
  const auto unrepresentable =
      std::find_if(shared->images.begin(), shared->images.end(), [&](const ImagePtr& image) {
        return !image->isMarkedToDelete() &&
               seconds(image) != static_cast<int64_t>(static_cast<float>(seconds(image)));
      });
  ASSERT_NE(unrepresentable, shared->images.end());
  const int64_t date = seconds(*unrepresentable);
  const int64_t rounded = static_cast<int64_t>(static_cast<float>(date));
  const Setting exact{.exif = "date_time_int_64 == " + std::to_string(date)};
  EXPECT_EQ(fetched(exact), where([&](const ImagePtr& image) { return seconds(image) == rounded; }));
  EXPECT_EQ(satisfying(exact), where([&](const ImagePtr& image) { return seconds(image) == date; }));
  EXPECT_TRUE(satisfying(exact).contains((*unrepresentable)->entityID()->dbid()));
}

// "_id_int_64" becomes "entityID.dbid": the record id of the image, or of its user or exif attributes,
// read from the identifier in memory as the engine reads the id column.
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, IdentifierConditionsSelectAlike) {
  const auto idAtMost = [](int64_t last) {
    return where([last](const ImagePtr& image) { return image->entityID()->dbid() <= last; });
  };
  ASSERT_FALSE(idAtMost(20).empty());
  for (const Setting& setting : {Setting{.image = "_id_int_64 <= 20"}, Setting{.user = "_id_int_64 <= 20"},
                                 Setting{.exif = "_id_int_64 <= 20"}}) {
    EXPECT_FALSE(fetched(setting).empty()) << setting.description();
    EXPECT_EQ(satisfying(setting), fetched(setting)) << setting.description();
  }
  EXPECT_EQ(fetched({.image = "_id_int_64 <= 20"}), idAtMost(20));
}

// The column functions are the engine's sub-selects over the whole table; the predicate syntax has no
// such function, so the rewritten condition does not parse and the in-memory test answers no.
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, ColumnFunctionsSelectOnlyInTheEngine) {
  float largest = 0;
  for (const auto& image : shared->images)
    largest = std::max(largest, image->exivAttributesPrimitive()->isoSpeed());
  const Setting maximum{.exif = "iso_speed == max_from_column(iso_speed)"};
  const Ids atMaximum = where(
      [largest](const ImagePtr& image) { return image->exivAttributesPrimitive()->isoSpeed() == largest; });
  ASSERT_FALSE(atMaximum.empty());
  EXPECT_EQ(fetched(maximum), atMaximum);
  EXPECT_EQ(satisfying(maximum), Ids{});
  const Setting minimum{.image = "import_index <= min_from_column(import_index)"};
  const Ids first = where([](const ImagePtr& image) { return image->importIndex() == 0; });
  ASSERT_FALSE(first.empty());
  EXPECT_EQ(fetched(minimum), first);
  EXPECT_EQ(satisfying(minimum), Ids{});
}

// The engine rejects a comparison of two columns of different types and then selects nothing; the
// in-memory test answers no as well, although the predicate alone would answer per image (a number never
// equals a text, so "!=" would hold for every image).
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, ColumnsOfDifferentTypesSelectNothing) {
  const auto image = shared->images.front();
  ASSERT_TRUE(KRPredicate::predicateWithFormat("fileSize != name")->evaluateWithObject(KRValue(image)));
  for (const Setting& setting : {Setting{.image = "file_size_int_64 != path_wide_ch"},
                                 Setting{.exif = "camera_maker_wide_ch != iso_speed || iso_speed > 100"},
                                 Setting{.image = "file_size_int_64 == path_wide_ch"}}) {
    EXPECT_EQ(fetched(setting), Ids{}) << setting.description();
    EXPECT_EQ(satisfying(setting), Ids{}) << setting.description();
  }
}

// Without an image condition the in-memory test does not look at the marked-to-delete flag; the engine
// never selects a marked image.
TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, OnlyAnImageConditionExcludesMarkedImagesInMemory) {
  std::vector<ImagePtr> marked;
  std::copy_if(shared->images.begin(), shared->images.end(), std::back_inserter(marked),
               [](const ImagePtr& image) { return image->isMarkedToDelete(); });
  ASSERT_FALSE(marked.empty());
  const auto free = request({});
  const auto withCondition = request({.image = "import_index >= 0"});
  for (const auto& image : marked) {
    EXPECT_TRUE(free->isEntitySatisfyingFilterConditions(image));
    EXPECT_FALSE(withCondition->isEntitySatisfyingFilterConditions(image));
  }
  const Ids all = fetched({});
  EXPECT_EQ(all.size(), shared->images.size() - marked.size());
  for (const auto& image : marked) EXPECT_FALSE(all.contains(image->entityID()->dbid()));
}

// Random request settings over the catalog's own values. Each is made twice: as written, and with its
// text literals as the in-memory test reads them (rewritten like the predicate text). The engine selects
// from the second what the in-memory test accepts from the first; where no literal is rewritten the two
// are the same setting. Numeric literals are written as the engine's 32-bit float parse reads them back
// exactly (see LiteralsAreConvertedAsTheEngineConvertsThem). Single thread.
class KRConditionGenerator {
 public:
  struct Generated {
    std::string written;
    std::string read;
  };

  KRConditionGenerator(const std::vector<ImagePtr>& images, uint32_t seed) : images_(images), random_(seed) {}

  std::pair<Setting, Setting> next() {
    Setting written;
    Setting read;
    std::string Setting::*const fields[] = {&Setting::image, &Setting::user, &Setting::exif};
    // Each kind in about half of the settings; a kind from the image on when none was chosen.
    const uint32_t kinds = 1 + random_() % 7;
    for (size_t kind = 0; kind < std::size(fields); ++kind) {
      if ((kinds & (1u << kind)) == 0) continue;
      const Generated condition = expression(kTables[kind], static_cast<int>(random_() % 3));
      written.*fields[kind] = condition.written;
      read.*fields[kind] = condition.read;
    }
    if (random_() % 6 == 0) {
      written.collections = {random_() % 5};
      if (random_() % 2 == 0) written.collections.push_back(random_() % 5);
    }
    if (random_() % 6 == 0) written.folder = static_cast<int>(random_() % 5);
    written.custom = random_() % 2 == 0;
    read.collections = written.collections;
    read.folder = written.folder;
    read.custom = written.custom;
    return {written, read};
  }

 private:
  struct Table {
    const char* name;
    const Request::ColumnKeyPaths& (*columns)();
    std::shared_ptr<KRDBEntity> (*owner)(const ImagePtr& image);
  };
  static constexpr Table kTables[] = {
      {dbcore::DBImage::kTableName, &Request::imageColumnKeyPaths,
       [](const ImagePtr& image) -> std::shared_ptr<KRDBEntity> { return image; }},
      {dbcore::DBUserImgAttrib::kTableName, &Request::userAttributesColumnKeyPaths,
       [](const ImagePtr& image) -> std::shared_ptr<KRDBEntity> { return image->attributesPrimitive(); }},
      {dbcore::DBExivImgAttrib::kTableName, &Request::exivAttributesColumnKeyPaths,
       [](const ImagePtr& image) -> std::shared_ptr<KRDBEntity> { return image->exivAttributesPrimitive(); }},
  };
  static constexpr const char* kOperators[] = {" == ", " != ", " < ", " <= ", " > ", " >= "};

  Generated expression(const Table& table, int depth) {
    if (depth == 0 || random_() % 4 == 0) return comparison(table);
    const char* junction = random_() % 3 == 0 ? " || " : " && ";
    const Generated left = expression(table, depth - 1);
    const Generated right = expression(table, depth - 1);
    const bool parenthesized = random_() % 2 == 0;
    const auto join = [&](const std::string& a, const std::string& b) {
      const std::string text = a + junction + b;
      return parenthesized ? "(" + text + ")" : text;
    };
    return {join(left.written, right.written), join(left.read, right.read)};
  }

  const std::pair<std::string, std::string>& column(const Table& table) {
    const auto& columns = table.columns();
    return columns[random_() % columns.size()];
  }

  Generated comparison(const Table& table) {
    const auto& [name, keyPath] = column(table);
    const dbcore::FieldType type = dbcore::DBEntity::T_COLUMN_TYPES(table.name).at(name);
    const bool boolean = type == dbcore::FieldType::T_BOOL;
    const std::string op = kOperators[boolean && random_() % 4 != 0 ? random_() % 2 : random_() % 6];
    if (random_() % 10 == 0) {
      const auto& other = column(table);
      if (dbcore::DBEntity::T_COLUMN_TYPES(table.name).at(other.first) == type) {
        const std::string text = name + op + other.first;
        return {text, text};
      }
    }
    const ImagePtr& image = images_[random_() % images_.size()];
    const KRValue value = KRValue(table.owner(image)).valueForKeyPath(keyPath);
    const Generated literal = literalFor(type, value, table);
    if (random_() % 5 == 0) return {literal.written + op + name, literal.read + op + name};
    return {name + op + literal.written, name + op + literal.read};
  }

  Generated literalFor(dbcore::FieldType type, const KRValue& value, const Table& table) {
    switch (type) {
      case dbcore::FieldType::T_BOOL: {
        const std::string text =
            (random_() % 4 == 0 ? random_() % 2 == 0 : value.number().boolValue()) ? "true" : "false";
        return {text, text};
      }
      case dbcore::FieldType::T_INT:
      case dbcore::FieldType::T_UINT: {
        const long long deltas[] = {0, 0, 0, 1, -1, 2};
        const std::string text =
            std::to_string(value.number().longLongValue() + deltas[random_() % std::size(deltas)]);
        return {text, text};
      }
      case dbcore::FieldType::T_INT_64: {
        const long long deltas[] = {0, 0, 0, 1, -1, 1000, -86400 * 30, 86400 * 365};
        const long long near =
            std::llround(value.number().doubleValue()) + deltas[random_() % std::size(deltas)];
        const std::string text = std::to_string(static_cast<long long>(static_cast<float>(near)));
        return {text, text};
      }
      case dbcore::FieldType::T_FLOAT: {
        const float factors[] = {1, 1, 1, 0.5f, 2, 1.0001f};
        const std::string text = exactFloat(static_cast<float>(value.number().doubleValue()) *
                                            factors[random_() % std::size(factors)]);
        return {text, text};
      }
      default: {
        const std::string text = value.string() ? value.string().str() : "";
        const size_t cut = random_() % 3 == 0 ? random_() % (text.size() + 1) : text.size();
        const std::string written = text.substr(0, cut) + (random_() % 5 == 0 ? "z" : "");
        const std::string read = Request::predicateFormatWithCondition(written, table.columns());
        return {"'" + written + "'", "'" + read + "'"};
      }
    }
  }

  // The decimal text that reads back as exactly this float, both as a float and as a double.
  static std::string exactFloat(float number) {
    char text[64];
    std::snprintf(text, sizeof text, "%.17g", static_cast<double>(number));
    if (std::string(text).find('e') != std::string::npos) return "0";
    return text;
  }

  const std::vector<ImagePtr>& images_;
  std::mt19937 random_;
};

TEST_F(KRDBFilteredImagesFetchRequestEquivalenceTest, GeneratedConditionsSelectAlike) {
  KRConditionGenerator generator(shared->images, 77031);
  std::vector<std::string> mismatches;
  size_t nonTrivial = 0;
  size_t rewritten = 0;
  const size_t notMarked = fetched({}).size();
  for (int index = 0; index < kGeneratedCount; ++index) {
    const auto [written, read] = generator.next();
    // The in-memory test runs on another thread while the catalog's queue runs the query.
    std::future<Ids> inMemory = std::async(std::launch::async, [&written] { return satisfying(written); });
    const Ids engine = fetched(read);
    const Ids memory = inMemory.get();
    if (engine != memory) mismatches.push_back(written.description() + ": " + differences(engine, memory));
    if (written.description() != read.description()) ++rewritten;
    if (!engine.empty() && engine.size() < notMarked) ++nonTrivial;
  }
  std::string shown;
  for (size_t index = 0; index < std::min<size_t>(mismatches.size(), 20); ++index)
    shown += mismatches[index] + "\n";
  EXPECT_TRUE(mismatches.empty()) << mismatches.size() << " mismatches:\n" << shown;
  EXPECT_GE(nonTrivial, static_cast<size_t>(kGeneratedCount) / 3);
  EXPECT_GT(rewritten, 0u);
}

}  // namespace
