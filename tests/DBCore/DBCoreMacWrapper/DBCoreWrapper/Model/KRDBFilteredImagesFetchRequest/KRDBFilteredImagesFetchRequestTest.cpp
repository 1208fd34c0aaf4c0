#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <map>
#include <thread>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbfilter.hpp"
#include "dbimgselectquery.hpp"
#include "dbreffolder.hpp"
#include "dbvolume.hpp"

namespace {

using dbcore::DBExivImgAttrib;
using dbcore::DBImage;
using dbcore::DBUserImgAttrib;
using Ids = KRFetchRequestCatalog::Ids;
using Request = KRDBFilteredImagesFetchRequest;

const KRString kImage = "imageCondition";
const KRString kUser = "userAttributesCondition";
const KRString kExiv = "exivAttributesCondition";

template <class Entity, class Record>
std::shared_ptr<Entity> entity(int64_t id, const std::function<void(Record&)>& fill = {}) {
  auto record = std::make_shared<Record>();
  record->set_id(id);
  if (fill) fill(*record);
  return Entity::initWithDBEntity(record);
}

std::shared_ptr<KRDBVolume> volume(int64_t id) { return entity<KRDBVolume, dbcore::DBVolume>(id); }

std::shared_ptr<KRDBPath> path(int64_t id, const std::wstring& text,
                               const std::shared_ptr<KRDBVolume>& volume) {
  auto result = entity<KRDBPath, dbcore::DBPath>(id, [&](dbcore::DBPath& record) { record.path = text; });
  result->setVolumePrimitive(volume);
  return result;
}

std::shared_ptr<KRDBReferencedFolder> folder(const std::shared_ptr<KRDBPath>& path) {
  auto result = entity<KRDBReferencedFolder, dbcore::DBRefFolder>(path ? path->entityID()->dbid() : 99);
  result->setDbPath(path);
  return result;
}

std::shared_ptr<KRDBCollection> collection(int64_t id, const KRDBEntitySet& images) {
  auto result = entity<KRDBCollection, dbcore::DBFilter>(id);
  result->setImagesPrimitive(std::make_shared<const KRDBEntitySet>(images));
  return result;
}

// An image with its two attribute entities.
std::shared_ptr<KRDBImage> image(int64_t id, const std::wstring& name) {
  auto result = entity<KRDBImage, DBImage>(id, [&](DBImage& record) { record.path = name; });
  result->setAttributesPrimitive(entity<KRDBImageAttributes, DBUserImgAttrib>(
      id, [id](DBUserImgAttrib& record) { record.image_id = id; }));
  result->setExivAttributesPrimitive(entity<KRDBImageExivAttributes, DBExivImgAttrib>(
      id, [id](DBExivImgAttrib& record) { record.image_id = id; }));
  return result;
}

std::string formatOf(const KRPredicatePtr& predicate) { return predicate->predicateFormat(); }

class KRDBFilteredImagesFetchRequestTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }

  bool satisfies(const std::shared_ptr<KRDBEntity>& entity) {
    return request->isEntitySatisfyingFilterConditions(entity);
  }

  std::shared_ptr<Request> request = Request::init();
};

TEST_F(KRDBFilteredImagesFetchRequestTest, TheConditionKindsAreTheEngineKeys) {
  EXPECT_EQ(KRImagesConditionType, kImage);
  EXPECT_EQ(KRUserAttributesConditionType, kUser);
  EXPECT_EQ(KRExivAttributesConditionType, kExiv);
  EXPECT_EQ(request->entityType(), 1);
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBImgSelectQuery>(request->selectQuery()));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, WithoutConditionsThePredicatesAreAlwaysTrue) {
  EXPECT_EQ(request->imageCondition(), KRString(""));
  EXPECT_EQ(formatOf(request->wherePredicate()), "TRUEPREDICATE");
  EXPECT_EQ(formatOf(request->userAttributesPredicate()), "TRUEPREDICATE");
  EXPECT_EQ(formatOf(request->exivAttributesPredicate()), "TRUEPREDICATE");
  EXPECT_TRUE(satisfies(image(1, L"a.jpg")));
  // The in-memory test checks the flag only with an image condition; the engine query always does.
  const auto marked = image(2, L"b.jpg");
  marked->dbentity()->set_marked_to_delete(true);
  marked->storeInfoFromDBentity(marked->dbentity());
  ASSERT_TRUE(marked->isMarkedToDelete());
  EXPECT_TRUE(satisfies(marked));
  request->setFilterConditions({{kImage, "import_index >= 0"}});
  EXPECT_FALSE(satisfies(marked));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, ThePathColumnBecomesTheNameKeyPath) {
  request->setFilterConditions({{kImage, "path_wide_ch == 'x'"}});
  EXPECT_EQ(request->imageCondition(), KRString("(path_wide_ch == 'x')"));
  EXPECT_EQ(Request::predicateFormatWithCondition("(path_wide_ch == 'x')", Request::imageColumnKeyPaths()),
            "(name == 'x')");
  EXPECT_EQ(formatOf(request->wherePredicate()),
            formatOf(KRPredicate::predicateWithFormat("markedToDelete == NO && (name == 'x')")));
  EXPECT_TRUE(satisfies(image(1, L"x")));
  EXPECT_FALSE(satisfies(image(2, L"y")));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, LongerColumnNamesAreReplacedFirst) {
  const auto& exiv = Request::exivAttributesColumnKeyPaths();
  ASSERT_EQ(exiv.size(), 25u);
  EXPECT_EQ(Request::imageColumnKeyPaths().size(), 7u);
  EXPECT_EQ(Request::userAttributesColumnKeyPaths().size(), 7u);
  EXPECT_EQ(exiv.front(),
            (std::pair<std::string, std::string>{"lens_pretty_name_wide_ch", "lensPrettyName"}));
  EXPECT_EQ(Request::predicateFormatWithCondition(
                "focal_len35mm == 50 && focal_len_min < 24 && focal_len_max > 70 && focal_len == 35 && "
                "white_balance_index == 5 && white_balance == 3 && shutter_min < 1 && shutter_speed > 0",
                exiv),
            "focalLength35 == 50 && minFocalLength < 24 && maxFocalLength > 70 && focalLength == 35 && "
            "whiteBalanceIndex == 5 && whiteBalance == 3 && minShutter < 1 && shutterSpeed > 0");
  EXPECT_EQ(Request::predicateFormatWithCondition(
                "date_time_int_64 > 5 && is_raw_bool == true && number >= 2.8 && _id_int_64 == 4", exiv),
            "date.timeIntervalSince1970 > 5 && raw == YES && fNumber >= 2.8 && entityID.dbid == 4");
  EXPECT_EQ(Request::predicateFormatWithCondition("modification_date_int_64 < 9 && import_date_int_64 > 1",
                                                  Request::imageColumnKeyPaths()),
            "modificationDate.timeIntervalSince1970 < 9 && importDate.timeIntervalSince1970 > 1");
}

TEST_F(KRDBFilteredImagesFetchRequestTest, TrueAndFalseAreReplacedInsideLiteralsToo) {
  EXPECT_EQ(Request::predicateFormatWithCondition(
                "origin_path_wide_ch == 'untrue_falsehood.jpg' && lost_bool == false",
                Request::userAttributesColumnKeyPaths()),
            "originName == 'unYES_NOhood.jpg' && lost == NO");
  request->setFilterConditions({{kUser, "origin_path_wide_ch == 'true.jpg'"}});
  EXPECT_EQ(formatOf(request->userAttributesPredicate()),
            formatOf(KRPredicate::predicateWithFormat("(originName == 'YES.jpg')")));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, FilterAndCustomConditionsAreJoined) {
  request->setFilterConditions({{kImage, "import_index > 1"}, {kExiv, "iso_speed > 100"}});
  request->setCustomConditions({{kImage, "import_index < 5"}, {kUser, "trash_bool == false"}});
  EXPECT_EQ(request->imageCondition(), KRString("(import_index > 1) && (import_index < 5)"));
  EXPECT_EQ(request->userAttributesCondition(), KRString("(trash_bool == false)"));
  EXPECT_EQ(request->exivAttributesCondition(), KRString("(iso_speed > 100)"));
  EXPECT_EQ(request->valueForKey("imageCondition"), KRValue("(import_index > 1) && (import_index < 5)"));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, TwoComputedSubExpressionsAreBothReplaced) {
  request->setCustomConditions(
      {{kImage, "import_index >= $MAT_FUNCTION[1 + 1] && import_index <= $MAT_FUNCTION[9 / 3]"}});
  EXPECT_EQ(request->imageCondition(), KRString("(import_index >= 2 && import_index <= 3)"));
  request->setCustomConditions({{kImage, "import_index >= $MAT_FUNCTION[1 + 1"}});
  EXPECT_TRUE(request->imageCondition().isNil());
  EXPECT_EQ(formatOf(request->wherePredicate()), "TRUEPREDICATE");
}

TEST_F(KRDBFilteredImagesFetchRequestTest, AnImageOutsideTheFiltersIsRejected) {
  const auto inside = image(1, L"a.jpg");
  const auto outside = image(2, L"b.jpg");
  request->setFilters(std::make_shared<const KRDBEntitySet>(
      KRDBEntitySet{collection(7, {image(3, L"c.jpg")}), collection(8, {inside})}));
  EXPECT_TRUE(satisfies(inside));
  EXPECT_FALSE(satisfies(outside));
  request->setFilters(std::make_shared<const KRDBEntitySet>());
  EXPECT_TRUE(satisfies(outside));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, AnImageOnAnotherVolumeIsRejectedWhateverItsPath) {
  const auto photos = volume(1);
  const auto other = volume(2);
  request->setFolder(folder(path(10, L"/photos", photos)));
  const auto below = image(1, L"a.jpg");
  below->setFolderDBPathPrimitive(path(11, L"/photos/2024", photos));
  const auto elsewhere = image(2, L"b.jpg");
  elsewhere->setFolderDBPathPrimitive(path(12, L"/photos/2024", other));
  const auto sibling = image(3, L"c.jpg");
  sibling->setFolderDBPathPrimitive(path(13, L"/photos2", photos));
  const auto same = image(4, L"d.jpg");
  same->setFolderDBPathPrimitive(path(14, L"/photos/", photos));
  EXPECT_TRUE(satisfies(below));
  EXPECT_FALSE(satisfies(elsewhere));
  EXPECT_FALSE(satisfies(sibling));
  EXPECT_TRUE(satisfies(same));
  EXPECT_FALSE(satisfies(image(5, L"e.jpg")));
  // A folder with an empty path covers its whole volume.
  request->setFolder(folder(path(15, L"", photos)));
  EXPECT_TRUE(satisfies(sibling));
  EXPECT_FALSE(satisfies(elsewhere));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, AnImageNeedsBothAttributeEntities) {
  const auto withoutUser = image(1, L"a.jpg");
  withoutUser->setAttributesPrimitive(nullptr);
  EXPECT_FALSE(satisfies(withoutUser));
  const auto withoutExif = image(2, L"b.jpg");
  withoutExif->setExivAttributesPrimitive(nullptr);
  EXPECT_FALSE(satisfies(withoutExif));
  EXPECT_FALSE(satisfies(volume(3)));
  EXPECT_FALSE(satisfies(nullptr));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, TheAttributePredicatesTestTheAttributeEntities) {
  const auto trashed = image(1, L"a.jpg");
  trashed->attributesPrimitive()->setTrashed(true);
  const auto kept = image(2, L"b.jpg");
  request->setFilterConditions({{kUser, "trash_bool == true"}});
  EXPECT_TRUE(satisfies(trashed));
  EXPECT_FALSE(satisfies(kept));
  request->setCustomConditions({{kExiv, "iso_speed > 100"}});
  EXPECT_FALSE(satisfies(trashed));
  trashed->exivAttributesPrimitive()->setIsoSpeed(400);
  EXPECT_TRUE(satisfies(trashed));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, BadConditionsMatchNothingInMemory) {
  const auto candidate = image(1, L"x");
  for (const char* condition :
       {"path_wide_ch ==", "nope_int_64 == 3", "path_wide_ch == 'x'; DROP TABLE images",
        "path_wide_ch == 'x' || 1 == 1 --", "((("}) {
    request->setFilterConditions({{kImage, condition}});
    EXPECT_FALSE(satisfies(candidate)) << condition;
  }
}

TEST_F(KRDBFilteredImagesFetchRequestTest, TheTestAnswersTheSameFromSeveralThreadsAtOnce) {
  std::vector<std::shared_ptr<KRDBImage>> images;
  for (int64_t id = 1; id <= 300; ++id) {
    images.push_back(image(id, id % 2 == 0 ? L"even.jpg" : L"odd.jpg"));
    images.back()->attributesPrimitive()->setTrashed(id % 3 == 0);
  }
  request->setFilterConditions({{kImage, "path_wide_ch == 'even.jpg'"}, {kUser, "trash_bool == false"}});
  std::atomic<int> wrong = 0;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < 4; ++thread) {
    threads.emplace_back([&] {
      for (size_t index = 0; index < images.size(); ++index) {
        const int64_t id = static_cast<int64_t>(index) + 1;
        if (satisfies(images[index]) != (id % 2 == 0 && id % 3 != 0)) ++wrong;
      }
    });
  }
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(wrong.load(), 0);
}

TEST_F(KRDBFilteredImagesFetchRequestTest, OnlyAnotherSettingObjectResetsTheRequest) {
  const KRDictionary conditions{{kImage, "import_index > 1"}};
  request->setFilterConditions(conditions);
  const auto query = request->selectQuery();
  const auto predicate = request->wherePredicate();
  request->setFilterConditions(conditions);
  EXPECT_EQ(request->selectQuery(), query);
  EXPECT_EQ(request->wherePredicate(), predicate);
  request->setFilterConditions(KRDictionary{{kImage, "import_index > 1"}});
  EXPECT_NE(request->selectQuery(), query);
  EXPECT_NE(request->wherePredicate(), predicate);
  const auto folderEntity = folder(path(1, L"/a", volume(1)));
  request->setFolder(folderEntity);
  const auto withFolder = request->selectQuery();
  request->setFolder(folderEntity);
  EXPECT_EQ(request->selectQuery(), withFolder);
  // Nil again is the same setting; an empty dictionary is another object.
  request->setCustomConditions({});
  EXPECT_EQ(request->selectQuery(), withFolder);
  request->setCustomConditions(KRDictionary::dictionary());
  EXPECT_NE(request->selectQuery(), withFolder);
  const auto custom = request->exivAttributesPredicate();
  request->setExivAttributesPredicate(KRPredicate::predicateWithValue(false));
  EXPECT_NE(request->exivAttributesPredicate(), custom);
  EXPECT_EQ(formatOf(request->exivAttributesPredicate()), "FALSEPREDICATE");
}

TEST_F(KRDBFilteredImagesFetchRequestTest, SettingsAreKeyValueProperties) {
  const auto folderEntity = folder(path(1, L"/a", volume(1)));
  request->setValueForKey(KRValue(folderEntity), "folder");
  EXPECT_EQ(request->folder(), folderEntity);
  request->setValueForKey(KRDictionary{{kImage, "import_index > 1"}}, "customConditions");
  EXPECT_EQ(request->imageCondition(), KRString("(import_index > 1)"));
  const auto filter = collection(3, {});
  request->setValueForKey(KRSet({KRValue(filter)}), "filters");
  ASSERT_TRUE(request->filters());
  EXPECT_TRUE(request->filters()->contains(filter));
  EXPECT_EQ(request->valueForKey("filters"), KRValue(KRSet({KRValue(filter)})));
}

TEST_F(KRDBFilteredImagesFetchRequestTest, AnUnknownKeyIsLoggedAndIgnored) {
  const KRCapturingLogSink sink;
  request->setValueForKey(KRValue(3), "noSuchKey");
  const auto records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 4);
  EXPECT_EQ(records[0].sourcePath,
            "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBFilteredImagesFetchRequest/"
            "KRDBFilteredImagesFetchRequest");
  EXPECT_EQ(records[0].function, "setValueForUndefinedKey");
  EXPECT_EQ(records[0].message,
            "Warning!!!\nUndefined Key: noSuchKey\nFor obj Class: KRDBFilteredImagesFetchRequest");
}

}  // namespace

namespace {

// Eight images on a real catalog: image i is IMG_i.JPG of 1000 + i bytes; the even ones carry the test
// reader's camera (ISO 400, raw, Canon). Their folders cycle through /photos and /photos/2024 on the
// first volume, /photos/2024 on the second and /photos2 on the first. Image 0 is marked to delete,
// images 1 and 2 are trashed, images 2, 3 and 5 are in a collection, and a referenced folder points at
// /photos on the first volume.
class KRDBFilteredImagesFetchRequestCatalogTest : public testing::Test {
 protected:
  void SetUp() override {
    const auto volumes = catalog.create(KRDBEntityTypeVolume, {{}, {}});
    const auto paths = catalog.create(KRDBEntityTypePath,
                                      {{{"DBPathInfoPath", "/photos"}, {"DBPathInfoVolume", volumes[0]}},
                                       {{"DBPathInfoPath", "/photos/2024"}, {"DBPathInfoVolume", volumes[0]}},
                                       {{"DBPathInfoPath", "/photos/2024"}, {"DBPathInfoVolume", volumes[1]}},
                                       {{"DBPathInfoPath", "/photos2"}, {"DBPathInfoVolume", volumes[0]}}});
    KRDBEntityArray created;
    for (int index = 0; index < 8; ++index) {
      const auto one = catalog.createImages(1, index % 2 == 0, paths, index);
      created.push_back(one.at(0));
    }
    catalog.markFirstToDelete<DBImage>();
    trash({created[1], created[2]});
    const auto collection = catalog.create(KRDBEntityTypeCollection, {{}}).at(0);
    const KRDBEntitySet members{created[2], created[3], created[5]};
    catalog.onEngine([&](const KRFetchRequestCatalog::Reactor& reactor) {
      for (const auto& member : members) {
        reactor->FilterAddImage(collection->entityID()->dbid(),
                                std::dynamic_pointer_cast<DBImage>(member->dbentity()));
      }
    });
    referencedFolder = std::dynamic_pointer_cast<KRDBReferencedFolder>(
        catalog.create(KRDBEntityTypeReferencedFolder, {{{"DBReferencedFolderPath", paths[0]}}}).at(0));
    ASSERT_TRUE(referencedFolder);
    ASSERT_EQ(referencedFolder->dbPath(), paths[0]);
    loadImages(created);
    std::dynamic_pointer_cast<KRDBCollection>(collection)
        ->setImagesPrimitive(
            std::make_shared<const KRDBEntitySet>(KRDBEntitySet{byIndex[2], byIndex[3], byIndex[5]}));
    collections = std::make_shared<const KRDBEntitySet>(KRDBEntitySet{collection});
  }

  void trash(const KRDBEntityArray& images) {
    std::vector<std::shared_ptr<DBUserImgAttrib>> records;
    for (const auto& record : catalog.allRecords<DBUserImgAttrib>()) {
      for (const auto& image : images) {
        if (record->image_id == image->entityID()->dbid()) records.push_back(record);
      }
    }
    for (const auto& record : records) record->trashed = true;
    catalog.onEngine([&](const KRFetchRequestCatalog::Reactor& reactor) { *reactor << records; });
  }

  // Entities over the records as the engine now holds them, with their folders and attributes.
  void loadImages(const KRDBEntityArray& created) {
    std::map<int64_t, std::shared_ptr<KRDBImageAttributes>> users;
    for (const auto& record : catalog.allRecords<DBUserImgAttrib>()) {
      users[record->image_id] = KRDBImageAttributes::initWithDBEntity(record);
    }
    std::map<int64_t, std::shared_ptr<KRDBImageExivAttributes>> exifs;
    for (const auto& record : catalog.allRecords<DBExivImgAttrib>()) {
      exifs[record->image_id] = KRDBImageExivAttributes::initWithDBEntity(record);
    }
    for (const auto& record : catalog.allRecords<DBImage>()) {
      const auto image = KRDBImage::initWithDBEntity(record);
      image->setAttributesPrimitive(users[record->id()]);
      image->setExivAttributesPrimitive(exifs[record->id()]);
      for (size_t index = 0; index < created.size(); ++index) {
        if (created[index]->entityID()->dbid() != record->id()) continue;
        image->setFolderDBPathPrimitive(std::dynamic_pointer_cast<KRDBImage>(created[index])->folderDBPath());
        byIndex[index] = image;
        idOf[index] = record->id();
      }
    }
  }

  Ids selected() { return catalog.selectedIds<DBImage>(request->selectQuery()); }
  // The images not marked to delete whose in-memory test answers yes (without an image condition the
  // in-memory test does not look at the flag, see WithoutConditionsEveryImageNotMarkedToDeleteIsSelected).
  Ids satisfying() {
    Ids result;
    for (const auto& [index, image] : byIndex) {
      if (!image->isMarkedToDelete() && request->isEntitySatisfyingFilterConditions(image))
        result.insert(image->entityID()->dbid());
    }
    return result;
  }
  Ids ids(std::initializer_list<int> indexes) {
    Ids result;
    for (int index : indexes) result.insert(idOf.at(index));
    return result;
  }
  // The engine and the in-memory test select the same images, and those are the expected ones.
  void expectSelection(const Ids& expected) {
    EXPECT_EQ(selected(), expected);
    EXPECT_EQ(satisfying(), expected);
  }

  KRFetchRequestCatalog catalog;
  std::shared_ptr<Request> request = Request::init();
  std::shared_ptr<KRDBReferencedFolder> referencedFolder;
  Request::FiltersPtr collections;
  std::map<size_t, std::shared_ptr<KRDBImage>> byIndex;
  std::map<size_t, int64_t> idOf;
};

TEST_F(KRDBFilteredImagesFetchRequestCatalogTest, WithoutConditionsEveryImageNotMarkedToDeleteIsSelected) {
  EXPECT_EQ(selected(), ids({1, 2, 3, 4, 5, 6, 7}));
  EXPECT_EQ(satisfying(), ids({1, 2, 3, 4, 5, 6, 7}));
  // In memory the flag is tested only with an image condition.
  EXPECT_TRUE(request->isEntitySatisfyingFilterConditions(byIndex.at(0)));
  request->setFilterConditions({{kImage, "import_index >= 0"}});
  EXPECT_FALSE(request->isEntitySatisfyingFilterConditions(byIndex.at(0)));
}

TEST_F(KRDBFilteredImagesFetchRequestCatalogTest, ImageConditionsSelectAlike) {
  request->setFilterConditions({{kImage, "file_size_int_64 >= 1003"}});
  expectSelection(ids({3, 4, 5, 6, 7}));
  request->setFilterConditions({{kImage, "path_wide_ch == 'IMG_0.JPG' || path_wide_ch == 'IMG_4.JPG'"}});
  expectSelection(ids({4}));
  request->setFilterConditions({{kImage, "import_index >= 0 && file_size_int_64 < 1002"}});
  expectSelection(ids({1}));
}

TEST_F(KRDBFilteredImagesFetchRequestCatalogTest, AttributeConditionsSelectAlike) {
  request->setFilterConditions({{kUser, "trash_bool == true"}});
  expectSelection(ids({1, 2}));
  request->setFilterConditions({{kExiv, "iso_speed > 100 && is_raw_bool == true"}});
  expectSelection(ids({2, 4, 6}));
  request->setCustomConditions({{kUser, "trash_bool == false"}, {kImage, "file_size_int_64 > 1002"}});
  expectSelection(ids({4, 6}));
  request->setFilterConditions({{kExiv, "camera_maker_wide_ch == 'Canon' && focal_len35mm > 50"}});
  request->setCustomConditions({});
  expectSelection(ids({2, 4, 6}));
}

TEST_F(KRDBFilteredImagesFetchRequestCatalogTest, FiltersAndFolderSelectAlike) {
  request->setFilters(collections);
  expectSelection(ids({2, 3, 5}));
  request->setFilters(nullptr);
  request->setFolder(referencedFolder);
  // /photos and /photos/2024 on the first volume; not the second volume's /photos/2024, not /photos2.
  expectSelection(ids({1, 4, 5}));
  request->setFilters(collections);
  request->setFilterConditions({{kUser, "trash_bool == false"}});
  expectSelection(ids({5}));
}

TEST_F(KRDBFilteredImagesFetchRequestCatalogTest, BadConditionsSelectNothing) {
  for (const char* condition : {"path_wide_ch ==", "path_wide_ch == 'IMG_1.JPG'; DROP TABLE images",
                                "nope_int_64 == 3", "file_size_int_64 == path_wide_ch", ")) || ((1 == 1"}) {
    request->setFilterConditions({{kImage, condition}});
    expectSelection({});
  }
  request->setFilterConditions({{kUser, "trash_bool == true &&"}});
  expectSelection({});
  request->setFilterConditions({{kExiv, "camera_maker_wide_ch == 5 || ("}});
  expectSelection({});
  EXPECT_EQ(catalog.allRecords<DBImage>().size(), 8u);
}

}  // namespace
