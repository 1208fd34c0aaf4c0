#include <gtest/gtest.h>
#include <sqlite3.h>

#include <algorithm>
#include <functional>
#include <thread>

#include "KRClasses/KRTCropDescription.hpp"
#include "KRCommitCounter.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRRegularExpression.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRTestExifReader.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "Support/KRDictionaryJSON.hpp"
#include "dbreactor.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

using dbcore::DBExivImgAttrib;
using dbcore::DBImage;
using dbcore::DBPath;
using dbcore::DBRefFolder;
using dbcore::DBUserImgAttrib;
using Reactor = KRDBCatalog::Reactor;

const char* const kCreationSource =
    "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBCatalog/KRDBCatalogCreation";
const char* const kCatalogSource = "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBCatalog/KRDBCatalog";

bool isUUID(const KRString& text) {
  static const KRRegularExpression canonical(
      "[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}", false, false);
  return canonical.matches(text.str());
}

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(10));
}

// Runs SQL on the file through a writable connection of the test's own.
void execute(const std::string& path, const std::string& sql) {
  sqlite3* db = nullptr;
  ASSERT_EQ(sqlite3_open(path.c_str(), &db), SQLITE_OK);
  char* error = nullptr;
  const int result = sqlite3_exec(db, sql.c_str(), nullptr, nullptr, &error);
  EXPECT_EQ(result, SQLITE_OK) << (error ? error : "");
  sqlite3_free(error);
  sqlite3_close(db);
}

std::shared_ptr<KRTestExifReader> reader(const std::string& url, bool withCamera = false) {
  return KRTestExifReader::make(
      {url, 6000.9, 4000.2, 25000000, KRDate::dateWithTimeIntervalSince1970(1600000000.7),
       KRDate::dateWithTimeIntervalSince1970(1500000000.2)},
      withCamera);
}

class KRDBCatalogCreationTest : public testing::Test {
 protected:
  void SetUp() override {
    catalog = KRDBCatalog::initWithContentsOfFile(path(), nullptr);
    ASSERT_TRUE(catalog);
    catalog->initializeAndUpdateIfNeaded();
    counter = std::make_unique<KRCommitCounter>(path());
  }

  std::string path() const { return directory.file("catalog.krcatalog"); }

  // Runs engine reads on the catalog's queue through the guard.
  void onEngine(const KRDBCatalog::ReactorBlock& block) {
    catalog->performSynchronously(true, [&] { catalog->handleDBReactorBlock(block, "test", true); });
  }
  template <class Result>
  Result onQueue(std::function<Result(KRDBCatalog&)> work) {
    Result result{};
    catalog->performSynchronously(true, [&] { result = work(*catalog); });
    return result;
  }
  std::shared_ptr<KRDBEntity> create(int64_t type, const KRDictionary& info = {}) {
    return onQueue<std::shared_ptr<KRDBEntity>>(
        [&](KRDBCatalog& queue) { return queue.createEntityWithTypeSync(type, info); });
  }
  KRDBEntityArray createAll(int64_t type, const std::vector<KRDictionary>& infos) {
    return onQueue<KRDBEntityArray>(
        [&](KRDBCatalog& queue) { return queue.createEntitiesWithTypeSync(type, infos); });
  }
  template <class T>
  std::shared_ptr<T> createAs(int64_t type, const KRDictionary& info = {}) {
    return std::dynamic_pointer_cast<T>(create(type, info));
  }
  int64_t rows(const std::string& table) const { return counter->integer("SELECT count(*) FROM " + table); }
  std::string column(const std::string& sql) const { return counter->text(sql); }
  void expectConsistent() const {
    EXPECT_EQ(column("PRAGMA integrity_check"), "ok");
    EXPECT_EQ(column("PRAGMA foreign_key_check"), "");
  }
  // The first commit after opening also stamps the new log generation with a commit of its own: counting
  // starts after one.
  void startCountingCommits() { create(KRDBEntityTypeVolume); }
  std::shared_ptr<KRDBPath> savedPath(const std::string& text) {
    const auto paths = createAll(KRDBEntityTypePath, {KRDictionary{{"DBPathInfoPath", text}}});
    return std::dynamic_pointer_cast<KRDBPath>(paths.at(0));
  }
  std::shared_ptr<KRDBPath> unsavedPath(const std::string& text) {
    auto record = std::make_shared<DBPath>();
    record->path = KRString(text).krs_wstring();
    return KRDBPath::initWithDBEntity(record);
  }

  KRTemporaryDirectory directory;
  std::shared_ptr<KRDBCatalog> catalog;
  std::unique_ptr<KRCommitCounter> counter;
};

// ---- Images

TEST_F(KRDBCatalogCreationTest, AnImageWithoutInfoIsNamedByAUUIDAndHasBothAttributeRecords) {
  const auto image = createAs<KRDBImage>(KRDBEntityTypeImage);
  ASSERT_TRUE(image);
  EXPECT_TRUE(isUUID(image->name()));
  EXPECT_TRUE(isUUID(image->guid()));
  EXPECT_NE(image->name(), image->guid());
  EXPECT_GT(image->entityID()->dbid(), 0);
  const std::string id = std::to_string(image->entityID()->dbid());
  EXPECT_EQ(rows("image_user_attributes WHERE image_id_int_64 = " + id), 1);
  EXPECT_EQ(rows("image_exiv_attributes WHERE image_id_int_64 = " + id), 1);
  EXPECT_EQ(image->width(), 0);
  EXPECT_EQ(image->fileSize(), 0);
}

TEST_F(KRDBCatalogCreationTest, AnImageInfoFillsEveryField) {
  const auto folder = savedPath("/Volumes/Photos/2024");
  const KRDictionary info{{"DBImageInfoExifReader", reader("/Volumes/Photos/2024/IMG_0001.CR3", true)},
                          {"DBImageImportTimeIntervalNumber", 1700000000.9},
                          {"DBImageImportIndex", 7},
                          {"DBImageInfoImageName", "IMG_0001.CR3"},
                          {"DBImageInfoOriginImageName", "Original.CR3"},
                          {"DBImageInfoFolderDBPath", folder}};
  const auto image = createAs<KRDBImage>(KRDBEntityTypeImage, info);
  ASSERT_TRUE(image);
  EXPECT_TRUE(isUUID(image->guid()));
  EXPECT_EQ(image->name(), KRString("IMG_0001.CR3"));
  EXPECT_EQ(image->width(), 6000);
  EXPECT_EQ(image->height(), 4000);
  EXPECT_EQ(image->fileSize(), 25000000);
  EXPECT_EQ(image->modificationDate(), KRDate::dateWithTimeIntervalSince1970(1600000000));
  EXPECT_EQ(image->creationDate(), KRDate::dateWithTimeIntervalSince1970(1500000000));
  EXPECT_EQ(image->importDate(), KRDate::dateWithTimeIntervalSince1970(1700000000));
  EXPECT_EQ(image->importIndex(), 7);
  EXPECT_EQ(image->folderDBPathPrimitive(), folder);

  const std::string id = std::to_string(image->entityID()->dbid());
  EXPECT_EQ(column("SELECT folder_path_id FROM images WHERE _id_int_64 = " + id),
            std::to_string(folder->entityID()->dbid()));
  EXPECT_EQ(column("SELECT origin_path_wide_ch FROM image_user_attributes WHERE image_id_int_64 = " + id),
            "Original.CR3");
  std::shared_ptr<DBExivImgAttrib> exif;
  onEngine(
      [&](const Reactor& reactor) { exif = reactor->GetBy<DBExivImgAttrib, DBImage>(image->dbimage()); });
  ASSERT_TRUE(exif && exif->is_saved());
  EXPECT_FLOAT_EQ(exif->iso_speed, 400.0f);
  EXPECT_FLOAT_EQ(exif->shutter_speed, 0.004f);
  EXPECT_FLOAT_EQ(exif->f_number, 2.8f);
  EXPECT_FLOAT_EQ(exif->focal_length, 35.0f);
  EXPECT_FLOAT_EQ(exif->focal_length35, 52.5f);
  EXPECT_FLOAT_EQ(exif->ev, -0.7f);
  EXPECT_FLOAT_EQ(exif->min_focal_length, 24.0f);
  EXPECT_FLOAT_EQ(exif->max_focal_length, 70.0f);
  EXPECT_FLOAT_EQ(exif->min_shutter, 0.0001f);
  EXPECT_FLOAT_EQ(exif->max_shutter, 30.0f);
  EXPECT_FLOAT_EQ(exif->aperture, 2.97f);
  EXPECT_FLOAT_EQ(exif->focus_distance, 3.5f);
  EXPECT_EQ(exif->bps, 14);
  EXPECT_EQ(exif->white_balance, 3);
  EXPECT_EQ(exif->white_balance_index, 5);
  EXPECT_EQ(exif->light_source, 9);
  EXPECT_EQ(exif->metering_mode, 2);
  EXPECT_EQ(exif->camera_maker, L"Canon");
  EXPECT_EQ(exif->camera_name, L"EOS R5");
  EXPECT_EQ(exif->camera_model, L"Canon EOS R5");
  EXPECT_EQ(exif->lens_maker, L"Sigma");
  EXPECT_EQ(exif->lens_pretty_name, L"24-70mm F2.8");
  EXPECT_EQ(exif->date, 1700000000);
  EXPECT_TRUE(exif->raw);
  EXPECT_TRUE(exif->full_filled);
  EXPECT_EQ(exif->version, 3);
}

TEST_F(KRDBCatalogCreationTest, AnImageInfoWithoutKeysGivesTheDefaultsAndWarnsOfTheMissingReader) {
  KRCapturingLogSink sink;
  const auto image = createAs<KRDBImage>(KRDBEntityTypeImage, KRDictionary{{"unrelated", 1}});
  ASSERT_TRUE(image);
  EXPECT_TRUE(isUUID(image->guid()));
  EXPECT_EQ(image->name(), KRString(""));
  EXPECT_EQ(image->width(), 0);
  EXPECT_EQ(image->height(), 0);
  EXPECT_EQ(image->fileSize(), 0);
  EXPECT_EQ(image->modificationDate(), KRDate::dateWithTimeIntervalSince1970(0));
  EXPECT_EQ(image->importDate(), KRDate::dateWithTimeIntervalSince1970(0));
  EXPECT_EQ(image->importIndex(), 0);
  EXPECT_FALSE(image->folderDBPathPrimitive());
  const std::string id = std::to_string(image->entityID()->dbid());
  EXPECT_EQ(column("SELECT origin_path_wide_ch FROM image_user_attributes WHERE image_id_int_64 = " + id),
            "");
  EXPECT_EQ(column("SELECT camera_maker_wide_ch FROM image_exiv_attributes WHERE image_id_int_64 = " + id),
            "");
  EXPECT_EQ(column("SELECT folder_path_id FROM images WHERE _id_int_64 = " + id), "");
  const KRLogRecord expected{KRLogLevelWarning, kCreationSource, "exifReader", 0,
                             "An image info has no exif reader: the image gets no size, file size or dates"};
  ASSERT_EQ(sink.records().size(), 1u);
  KRLogRecord record = sink.records()[0];
  record.line = 0;
  EXPECT_EQ(record, expected);
}

TEST_F(KRDBCatalogCreationTest, ABatchOfImagesKeepsTheOrderOfItsInfos) {
  std::vector<KRDictionary> infos;
  for (int index = 0; index < 3; ++index)
    infos.push_back({{"DBImageInfoExifReader", reader("/p/" + std::to_string(index))},
                     {"DBImageInfoImageName", "IMG_" + std::to_string(index) + ".JPG"},
                     {"DBImageImportIndex", index}});
  const auto images = createAll(KRDBEntityTypeImage, infos);
  ASSERT_EQ(images.size(), 3u);
  for (int index = 0; index < 3; ++index) {
    const auto image = std::dynamic_pointer_cast<KRDBImage>(images[index]);
    ASSERT_TRUE(image);
    EXPECT_EQ(image->name(), KRString("IMG_" + std::to_string(index) + ".JPG"));
    EXPECT_EQ(image->importIndex(), index);
  }
  EXPECT_EQ(rows("images"), 3);
  EXPECT_EQ(rows("image_user_attributes"), 3);
  EXPECT_EQ(rows("image_exiv_attributes"), 3);
}

TEST_F(KRDBCatalogCreationTest, ACreatedImageHoldsItsSavedAttributeRecordsLinkedBothWays) {
  const auto image = std::dynamic_pointer_cast<KRDBImage>(
      create(KRDBEntityTypeImage,
             {{"DBImageInfoExifReader", reader("/p/linked")}, {"DBImageInfoOriginImageName", "o"}}));
  ASSERT_TRUE(image);
  const auto& attributes = image->attributesPrimitive();
  const auto& exif = image->exivAttributesPrimitive();
  ASSERT_TRUE(attributes);
  ASSERT_TRUE(exif);
  EXPECT_EQ(attributes->imagePrimitive(), image);
  EXPECT_EQ(exif->imagePrimitive(), image);
  EXPECT_GT(attributes->entityID()->dbid(), 0);
  EXPECT_GT(exif->entityID()->dbid(), 0);
  EXPECT_EQ(attributes->originName(), KRString("o"));
}

TEST_F(KRDBCatalogCreationTest, AThousandImagesCreatedInOneCallAreOneCommit) {
  const auto single = [this] { create(KRDBEntityTypeImage, {{"DBImageInfoExifReader", reader("/one")}}); };
  startCountingCommits();
  int64_t before = counter->commitsInLog();
  single();
  single();
  EXPECT_EQ(counter->commitsInLog() - before, 2);
  EXPECT_TRUE(counter->changedSinceLastLook());
  EXPECT_FALSE(counter->changedSinceLastLook());

  std::vector<KRDictionary> infos;
  for (int index = 0; index < 1000; ++index)
    infos.push_back({{"DBImageInfoExifReader", reader("/photos/" + std::to_string(index) + ".JPG", true)}});
  before = counter->commitsInLog();
  const auto images = createAll(KRDBEntityTypeImage, infos);
  EXPECT_EQ(images.size(), 1000u);
  EXPECT_EQ(counter->commitsInLog() - before, 1);
  EXPECT_TRUE(counter->changedSinceLastLook());
  EXPECT_EQ(rows("images"), 1002);
  EXPECT_EQ(rows("image_exiv_attributes"), 1002);
}

TEST_F(KRDBCatalogCreationTest,
       AFailureInTheMiddleOfABatchRaisesTheTaggedExceptionAndLeavesTheCatalogConsistent) {
  // The sixth image's exif attributes conflict with a row already there (the raw connection does not
  // check foreign keys; the image it names is written by the batch itself).
  execute(path(), "INSERT INTO image_exiv_attributes(_id_int_64, image_id_int_64) VALUES (100, 6)");
  std::vector<KRDictionary> infos(10, KRDictionary{{"DBImageInfoExifReader", reader("/photos/a.JPG")}});
  KRCapturingLogSink sink;
  std::optional<KRException> raised;
  try {
    createAll(KRDBEntityTypeImage, infos);
  } catch (const KRException& exception) {
    raised = exception;
  }
  ASSERT_TRUE(raised);
  EXPECT_TRUE(raised->name().hasPrefix("DBCore(code #"));
  EXPECT_NE(raised->name().str().find(", tag:BindDBAttributesDBImageArray: "), std::string::npos);
  EXPECT_EQ(raised->userInfo().objectForKey("KRDBExceptionDescription"),
            KRValue("BindDBAttributesDBImageArray"));
  const auto messages = sink.messages();
  EXPECT_TRUE(std::any_of(messages.begin(), messages.end(), [](const std::string& message) {
    return message.starts_with("KRDBCatalog handled exception: ");
  }));
  // The images and their user attributes written before the failure are kept; the failed write left nothing.
  EXPECT_EQ(rows("images"), 10);
  EXPECT_EQ(rows("image_user_attributes"), 10);
  EXPECT_EQ(column("SELECT group_concat(_id_int_64) FROM image_exiv_attributes"), "100");
  expectConsistent();
}

// ---- Collections, smart filters, volumes, other types

TEST_F(KRDBCatalogCreationTest, ACollectionComesWithItsAttributesAndIgnoresTheInfo) {
  const auto filter = createAs<KRDBCollection>(KRDBEntityTypeCollection, {{"DBVolumeInfo", 1}});
  ASSERT_TRUE(filter);
  EXPECT_GT(filter->entityID()->dbid(), 0);
  const auto attributes = std::dynamic_pointer_cast<KRDBCollectionAttributes>(filter->attributesPrimitive());
  ASSERT_TRUE(attributes);
  EXPECT_EQ(column("SELECT filter_id_int_64 FROM filter_attributes"),
            std::to_string(filter->entityID()->dbid()));
  EXPECT_EQ(attributes->entityID()->dbid(), std::stoll(column("SELECT _id_int_64 FROM filter_attributes")));
}

TEST_F(KRDBCatalogCreationTest, ASmartFilterComesWithItsAttributes) {
  const auto filter = createAs<KRDBSmartFilter>(KRDBEntityTypeSmartFilter);
  ASSERT_TRUE(filter);
  ASSERT_TRUE(std::dynamic_pointer_cast<KRDBSmartFilterAttributes>(filter->attributesPrimitive()));
  EXPECT_EQ(column("SELECT smart_filter_id_int_64 FROM smart_filter_attributes"),
            std::to_string(filter->entityID()->dbid()));
}

TEST_F(KRDBCatalogCreationTest, FolderAttributesAreMadeOnceAndFetchedAfterwards) {
  const auto filter = createAs<KRDBCollection>(KRDBEntityTypeCollection);
  ASSERT_TRUE(filter);
  const auto again =
      onQueue<KRDBEntityArray>([&](KRDBCatalog& queue) { return queue.additionalFetchingForFilter(filter); });
  ASSERT_EQ(again.size(), 1u);
  EXPECT_EQ(again[0]->entityID()->dbid(), filter->attributesPrimitive()->entityID()->dbid());
  EXPECT_EQ(filter->attributesPrimitive(), again[0]);
  EXPECT_EQ(rows("filter_attributes"), 1);
  EXPECT_TRUE(onQueue<KRDBEntityArray>([](KRDBCatalog& queue) {
                return queue.additionalFetchingForSmartFilter(nullptr);
              }).empty());
}

TEST_F(KRDBCatalogCreationTest, AVolumeHasAUUIDAndItsInfoAsJSON) {
  const KRDictionary volumeInfo{{"name", "Photos"}, {"size", 42}};
  const auto volume = createAs<KRDBVolume>(KRDBEntityTypeVolume, {{"DBVolumeInfo", volumeInfo}});
  ASSERT_TRUE(volume);
  EXPECT_TRUE(isUUID(KRString::krs_stringWithWString(volume->dbvolume()->uuid)));
  EXPECT_EQ(KRDictionaryJSON::dictionaryWithJsonWString(volume->dbvolume()->info), volumeInfo);
  EXPECT_EQ(column("SELECT info_wide_ch FROM volumes"), KRDictionaryJSON::jsonString(volumeInfo).str());

  const auto bare = createAs<KRDBVolume>(KRDBEntityTypeVolume);
  ASSERT_TRUE(bare);
  EXPECT_EQ(bare->dbvolume()->info, L"");
}

TEST_F(KRDBCatalogCreationTest, OtherTypesGiveNilWithoutTouchingTheEngine) {
  EXPECT_FALSE(counter->changedSinceLastLook());
  for (const int64_t type : {0, 4, 5, 6, 7, 8, 9, 12, 14, -1}) {
    EXPECT_FALSE(create(type, {{"DBPathInfoPath", "/a"}})) << type;
    EXPECT_FALSE(create(type)) << type;
  }
  EXPECT_FALSE(counter->changedSinceLastLook());
}

TEST_F(KRDBCatalogCreationTest, CreatingManyOfAnotherTypeLeavesOutTheNilResults) {
  const auto filters = createAll(KRDBEntityTypeCollection, {{}, {}, {}});
  ASSERT_EQ(filters.size(), 3u);
  EXPECT_LT(filters[0]->entityID()->dbid(), filters[1]->entityID()->dbid());
  EXPECT_LT(filters[1]->entityID()->dbid(), filters[2]->entityID()->dbid());
  EXPECT_TRUE(createAll(KRDBEntityTypeFavoriteAlias, {{}, {}}).empty());
  const auto volumes = createAll(KRDBEntityTypeVolume, {{}, {}});
  EXPECT_EQ(volumes.size(), 2u);
}

// ---- History states

TEST_F(KRDBCatalogCreationTest, AStateInfoFillsEveryFieldAndBindsItsResources) {
  const auto base =
      createAs<KRDBImageState>(KRDBEntityTypeImageState, {{"resourcesArray", KRArray{"base.bin"}}});
  ASSERT_TRUE(base);
  const auto crop = KRTCropDescription::initWithCropRect({{10, 20}, {300, 200}}, {6000, 4000});
  const KRDictionary info{{"guid", "G-1"},
                          {"actionName", "Crop"},
                          {"additionalInfo", "{\"x\":1}"},
                          {"cropInfo", crop},
                          {"imageOrientationInfo", 6},
                          {"hash", "H-1"},
                          {"original", true},
                          {"resourcesArray", KRArray{"a.bin", "b.bin"}},
                          {"baseStateID", base->entityID()->dbid()}};
  const auto state = createAs<KRDBImageState>(KRDBEntityTypeImageState, info);
  ASSERT_TRUE(state);
  const auto record = state->dbstate();
  EXPECT_EQ(record->guid, L"G-1");
  EXPECT_EQ(record->action_name, L"Crop");
  EXPECT_EQ(record->additional_info, L"{\"x\":1}");
  EXPECT_EQ(record->crop_description, KRString(crop->plistSerialization()).krs_wstring());
  EXPECT_EQ(record->image_orientation, 6u);
  EXPECT_EQ(record->state_hash, L"H-1");
  EXPECT_TRUE(record->original);
  const std::string id = std::to_string(state->entityID()->dbid());
  EXPECT_EQ(column("SELECT group_concat(name_wide_ch, ',') FROM (SELECT name_wide_ch FROM history_resources "
                   "JOIN state_resources ON resource_id = _id_int_64 WHERE state_id = " +
                   id + " ORDER BY name_wide_ch)"),
            "a.bin,b.bin,base.bin");
}

TEST_F(KRDBCatalogCreationTest, AStateWithoutHashGetsAFreshUUIDAndKeepsAnEmptyGuid) {
  const auto first = createAs<KRDBImageState>(KRDBEntityTypeImageState);
  const auto second = createAs<KRDBImageState>(KRDBEntityTypeImageState, {{"actionName", "Rotate"}});
  ASSERT_TRUE(first && second);
  EXPECT_TRUE(isUUID(KRString::krs_stringWithWString(first->dbstate()->state_hash)));
  EXPECT_NE(first->dbstate()->state_hash, second->dbstate()->state_hash);
  EXPECT_EQ(first->dbstate()->guid, L"");
  EXPECT_EQ(first->dbstate()->action_name, L"");
  EXPECT_EQ(first->dbstate()->crop_description, L"");
  EXPECT_EQ(first->dbstate()->image_orientation, 0u);
  EXPECT_FALSE(first->dbstate()->original);
  EXPECT_EQ(rows("image_history_states"), 2);
}

TEST_F(KRDBCatalogCreationTest, AnEmptyResourcesArrayMakesNoBinding) {
  startCountingCommits();
  const int64_t before = counter->commitsInLog();
  ASSERT_TRUE(create(KRDBEntityTypeImageState, {{"resourcesArray", KRArray(std::vector<KRValue>{})}}));
  EXPECT_EQ(counter->commitsInLog() - before, 1);
  EXPECT_EQ(rows("state_resources"), 0);
  EXPECT_EQ(rows("history_resources"), 0);
}

// ---- Paths and referenced folders

TEST_F(KRDBCatalogCreationTest, PathsAreCreatedInOrderWithTheirVolumes) {
  const auto volume = createAs<KRDBVolume>(KRDBEntityTypeVolume);
  const auto paths =
      createAll(KRDBEntityTypePath, {{{"DBPathInfoPath", "Photos/2024"}, {"DBPathInfoVolume", volume}},
                                     {{"DBPathInfoPath", "/tmp/b"}},
                                     {}});
  ASSERT_EQ(paths.size(), 3u);
  const auto first = std::dynamic_pointer_cast<KRDBPath>(paths[0]);
  const auto second = std::dynamic_pointer_cast<KRDBPath>(paths[1]);
  const auto third = std::dynamic_pointer_cast<KRDBPath>(paths[2]);
  ASSERT_TRUE(first && second && third);
  EXPECT_EQ(first->path(), KRString("Photos/2024"));
  EXPECT_EQ(first->volumePrimitive(), volume);
  EXPECT_EQ(first->dbpath()->volume_id, volume->entityID()->dbid());
  EXPECT_EQ(second->path(), KRString("/tmp/b"));
  EXPECT_FALSE(second->volumePrimitive());
  EXPECT_EQ(second->dbpath()->volume_id, 0);
  EXPECT_EQ(third->path(), KRString(""));
  EXPECT_LT(first->entityID()->dbid(), second->entityID()->dbid());
  EXPECT_EQ(rows("paths"), 3);
}

TEST_F(KRDBCatalogCreationTest, AReferencedFolderWithoutPathIsNil) {
  EXPECT_FALSE(create(KRDBEntityTypeReferencedFolder));
  EXPECT_FALSE(create(KRDBEntityTypeReferencedFolder, {{"DBReferencedFolderParent", 1}}));
  EXPECT_EQ(rows("reffolders WHERE _id_int_64 != 1"), 0);
}

TEST_F(KRDBCatalogCreationTest, AReferencedFolderWithoutParentGoesUnderTheRoot) {
  const auto path = unsavedPath("/Volumes/Photos");
  const auto folder =
      createAs<KRDBReferencedFolder>(KRDBEntityTypeReferencedFolder, {{"DBReferencedFolderPath", path}});
  ASSERT_TRUE(folder);
  const std::string id = std::to_string(folder->entityID()->dbid());
  EXPECT_EQ(column("SELECT parent_id FROM reffolders WHERE _id_int_64 = " + id), "1");
  EXPECT_TRUE(isUUID(KRString::krs_stringWithWString(folder->dbfilter()->uuid)));
  EXPECT_EQ(folder->dbPath(), path);
  EXPECT_FALSE(folder->parentPrimitive());
  EXPECT_TRUE(std::dynamic_pointer_cast<KRDBRefFolderAttributes>(folder->attributesPrimitive()));
  EXPECT_EQ(column("SELECT path_wide_ch FROM paths WHERE _id_int_64 = "
                   "(SELECT path_id_int_64 FROM reffolders WHERE _id_int_64 = " +
                   id + ")"),
            "/Volumes/Photos");

  const auto child = createAs<KRDBReferencedFolder>(
      KRDBEntityTypeReferencedFolder, {{"DBReferencedFolderPath", unsavedPath("/Volumes/Photos/2024")},
                                       {"DBReferencedFolderParent", folder}});
  ASSERT_TRUE(child);
  EXPECT_EQ(column("SELECT parent_id FROM reffolders WHERE _id_int_64 = " +
                   std::to_string(child->entityID()->dbid())),
            id);
  EXPECT_EQ(child->parentPrimitive(), folder);
}

TEST_F(KRDBCatalogCreationTest, AFailedReferencedFolderWriteIsLoggedAndStillGivesTheEntity) {
  auto missing = std::make_shared<DBRefFolder>();
  missing->set_id(999);
  const auto missingParent = KRDBReferencedFolder::initWithDBEntity(missing);
  const auto path = unsavedPath("/x");
  KRCapturingLogSink sink;
  const auto folder = createAs<KRDBReferencedFolder>(
      KRDBEntityTypeReferencedFolder,
      {{"DBReferencedFolderPath", path}, {"DBReferencedFolderParent", missingParent}});
  ASSERT_TRUE(folder);
  EXPECT_EQ(folder->entityID()->dbid(), 0);
  EXPECT_EQ(path->dbpath()->id(), 0);
  EXPECT_EQ(folder->dbPath(), path);
  EXPECT_EQ(folder->parentPrimitive(), missingParent);
  EXPECT_FALSE(folder->attributesPrimitive());
  EXPECT_EQ(rows("paths"), 0);
  EXPECT_EQ(rows("reffolders"), 1);
  EXPECT_EQ(rows("referenced_folder_attributes"), 0);
  ASSERT_FALSE(sink.records().empty());
  const KRLogRecord record = sink.records()[0];
  EXPECT_EQ(record.level, KRLogLevelError);
  EXPECT_EQ(record.sourcePath, kCatalogSource);
  EXPECT_EQ(record.function, "handleDBReactorBlock");
  EXPECT_NE(record.message.find("tag:CreateDBRefFolder: "), std::string::npos);
  expectConsistent();
}

TEST_F(KRDBCatalogCreationTest, ReferencedFolderTreesAreWrittenInOneCommitInCollationOrder) {
  const auto volume = createAs<KRDBVolume>(KRDBEntityTypeVolume);
  const auto other = createAs<KRDBVolume>(KRDBEntityTypeVolume);
  const KRDictionary plain{{"unused", true}};
  const KRDictionary childs{
      {"/r/b", plain},
      {"/r/a", KRDictionary{{"DBPathInfoVolume", other}}},
      {"/r/c", KRDictionary{{"DBReferencedFolderChildsPaths", KRDictionary{{"/r/c/d", plain}}}}}};
  const std::vector<KRDictionary> infos{{{"DBReferencedFolderPath", unsavedPath("/r")},
                                         {"DBPathInfoVolume", volume},
                                         {"DBReferencedFolderChildsPaths", childs}},
                                        {{"DBReferencedFolderPath", unsavedPath("/single")}},
                                        {{"DBReferencedFolderChildsPaths", childs}}};
  const int64_t before = counter->commitsInLog();
  const auto folders = createAll(KRDBEntityTypeReferencedFolder, infos);
  EXPECT_EQ(counter->commitsInLog() - before, 1);
  ASSERT_EQ(folders.size(), 6u);
  std::vector<std::shared_ptr<KRDBReferencedFolder>> made;
  for (const auto& entity : folders) made.push_back(std::dynamic_pointer_cast<KRDBReferencedFolder>(entity));
  const std::vector<std::string> expectedPaths{"/r", "/r/a", "/r/b", "/r/c", "/r/c/d", "/single"};
  for (size_t index = 0; index < made.size(); ++index) {
    ASSERT_TRUE(made[index]);
    EXPECT_EQ(made[index]->dbPath()->path(), KRString(expectedPaths[index]));
    EXPECT_GT(made[index]->entityID()->dbid(), 0);
  }
  const auto& root = made[0];
  EXPECT_FALSE(root->parentPrimitive());
  EXPECT_EQ(column("SELECT parent_id FROM reffolders WHERE _id_int_64 = " +
                   std::to_string(root->entityID()->dbid())),
            "1");
  for (size_t index : {1u, 2u, 3u}) EXPECT_EQ(made[index]->parentPrimitive(), root);
  EXPECT_EQ(made[4]->parentPrimitive(), made[3]);
  EXPECT_EQ(column("SELECT parent_id FROM reffolders WHERE _id_int_64 = " +
                   std::to_string(made[4]->entityID()->dbid())),
            std::to_string(made[3]->entityID()->dbid()));
  EXPECT_EQ(*root->childsPrimitive(), (KRDBEntitySet{made[1], made[2], made[3]}));
  EXPECT_EQ(*made[3]->childsPrimitive(), (KRDBEntitySet{made[4]}));
  EXPECT_TRUE(made[4]->childsPrimitive()->empty());
  EXPECT_EQ(made[0]->dbPath()->volumePrimitive(), volume);
  EXPECT_EQ(made[1]->dbPath()->volumePrimitive(), other);
  EXPECT_EQ(made[2]->dbPath()->volumePrimitive(), volume);
  EXPECT_EQ(made[4]->dbPath()->volumePrimitive(), volume);
  EXPECT_EQ(made[2]->dbPath()->dbpath()->volume_id, volume->entityID()->dbid());
  EXPECT_EQ(made[1]->dbPath()->dbpath()->volume_id, other->entityID()->dbid());
  expectConsistent();
}

// ---- Bad input

struct BadInput {
  const char* name;
  int64_t type;
  KRDictionary info;
  const char* function;
  std::string message;
};

TEST_F(KRDBCatalogCreationTest, BadInfoValuesGiveTheDefaultAndAWarning) {
  const auto exifReader = reader("/photos/a.JPG");
  const std::vector<BadInput> cases{
      {"number for a string",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", exifReader}, {"DBImageInfoImageName", 42}},
       "ignored",
       "Ignoring the value under DBImageInfoImageName of a creation info: 42 is not a string"},
      {"not UTF-8",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", exifReader}, {"DBImageInfoImageName", std::string("IMG_\xff\xfe.JPG")}},
       "string",
       "Ignoring the value under DBImageInfoImageName of a creation info: it is not UTF-8 text"},
      {"relative url",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", reader("photos/a.JPG")}},
       "exifReader",
       "Ignoring the exif reader of an image info: its url photos/a.JPG is not an absolute path"},
      {"not a reader",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", "/photos/a.JPG"}},
       "ignored",
       "Ignoring the value under DBImageInfoExifReader of a creation info: /photos/a.JPG is not an exif "
       "reader"},
      {"string for a number",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", exifReader}, {"DBImageImportIndex", "7"}},
       "ignored",
       "Ignoring the value under DBImageImportIndex of a creation info: 7 is not a number"},
      {"unsaved folder",
       KRDBEntityTypeImage,
       {{"DBImageInfoExifReader", exifReader}, {"DBImageInfoFolderDBPath", unsavedPath("/nowhere")}},
       "operator()",
       "Ignoring the folder of an image info: its path /nowhere is not in the catalog"},
      {"number for a volume info",
       KRDBEntityTypeVolume,
       {{"DBVolumeInfo", 3}},
       "ignored",
       "Ignoring the value under DBVolumeInfo of a creation info: 3 is not a dictionary"},
      {"number for a hash",
       KRDBEntityTypeImageState,
       {{"hash", 5}},
       "ignored",
       "Ignoring the value under hash of a creation info: 5 is not a string"},
      {"string for a path",
       KRDBEntityTypeReferencedFolder,
       {{"DBReferencedFolderPath", "/x"}},
       "ignored",
       "Ignoring the value under DBReferencedFolderPath of a creation info: /x is not a path"},
  };
  for (const BadInput& bad : cases) {
    SCOPED_TRACE(bad.name);
    KRCapturingLogSink sink;
    const auto entity = create(bad.type, bad.info);
    const auto records = sink.records();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_EQ(records[0].level, KRLogLevelWarning);
    EXPECT_EQ(records[0].sourcePath, kCreationSource);
    EXPECT_EQ(records[0].function, bad.function);
    EXPECT_EQ(records[0].message, bad.message);
    if (bad.type == KRDBEntityTypeReferencedFolder) {
      EXPECT_FALSE(entity);
      continue;
    }
    ASSERT_TRUE(entity);
    if (const auto image = std::dynamic_pointer_cast<KRDBImage>(entity)) {
      EXPECT_EQ(image->name(), KRString(""));
      EXPECT_EQ(image->importIndex(), 0);
      EXPECT_FALSE(image->folderDBPathPrimitive());
    }
  }
  EXPECT_EQ(column("SELECT group_concat(width) FROM images WHERE _id_int_64 IN (3, 4)"), "0,0");
  EXPECT_EQ(rows("images"), 6);
  EXPECT_EQ(rows("image_user_attributes"), 6);
  EXPECT_EQ(rows("image_exiv_attributes"), 6);
  EXPECT_EQ(column("SELECT info_wide_ch FROM volumes"), "");
  EXPECT_TRUE(isUUID(column("SELECT state_hash_wide_ch FROM image_history_states")));
  expectConsistent();
}

TEST_F(KRDBCatalogCreationTest, ResourceNamesThatAreNotStringsAreSkipped) {
  KRCapturingLogSink sink;
  ASSERT_TRUE(create(KRDBEntityTypeImageState, {{"resourcesArray", KRArray{"a.bin", 3, "b.bin"}}}));
  EXPECT_EQ(rows("history_resources"), 2);
  ASSERT_EQ(sink.messages().size(), 1u);
  EXPECT_EQ(sink.messages()[0], "Ignoring the value under name of a creation info: 3 is not a string");
}

// ---- Exif reader

TEST_F(KRDBCatalogCreationTest, AnExifReaderAnswersItsUrlByKeyAndKnowsNothingOfTheCameraByDefault) {
  const auto bare = reader("/photos/a.JPG");
  EXPECT_EQ(bare->valueForKey("url"), KRValue("/photos/a.JPG"));
  EXPECT_EQ(
      KRDBEntity::markedToDeleteHashKeyForEntityType(KRDBEntityTypeImage, {{"DBImageInfoExifReader", bare}}),
      KRString("1-/photos/a.JPG"));
  const KRDBExifReader& plain = *bare;
  EXPECT_EQ(plain.isoSpeed(), 0.0f);
  EXPECT_EQ(plain.whiteBalance(), 0);
  EXPECT_FALSE(plain.cameraMaker());
  EXPECT_FALSE(plain.date());
  EXPECT_FALSE(plain.isRaw());
}

TEST_F(KRDBCatalogCreationTest, UpdatingExifAttributesByAReaderPostsNothingAndMarksNothingChanged) {
  auto record = std::make_shared<DBExivImgAttrib>();
  record->camera_maker = L"Old";
  const auto attributes = KRDBImageExivAttributes::initWithDBEntity(record);
  attributes->updateByExifReader(nullptr);
  EXPECT_EQ(attributes->cameraMaker(), KRString("Old"));
  attributes->updateByExifReader(reader("/a", true));
  EXPECT_EQ(attributes->cameraMaker(), KRString("Canon"));
  EXPECT_EQ(record->camera_maker, L"Canon");
  EXPECT_FLOAT_EQ(attributes->bps(), 14.0f);
  EXPECT_EQ(attributes->whiteBalance(), 3);
  EXPECT_EQ(attributes->date(), KRDate::dateWithTimeIntervalSince1970(1700000000));
  EXPECT_FALSE(attributes->isDbEntityChanged());
  attributes->updateByExifReader(reader("/a"));
  EXPECT_EQ(attributes->cameraMaker(), KRString(""));
  EXPECT_EQ(record->iso_speed, 0.0f);
}

// ---- Asynchronous forms

TEST_F(KRDBCatalogCreationTest, TheAsynchronousFormsDeliverOnTheMainThread) {
  std::shared_ptr<KRDBEntity> entity;
  bool entityOnMain = false;
  catalog->createEntityWithType(
      KRDBEntityTypeCollection,
      [&](std::shared_ptr<KRDBEntity> created) {
        entityOnMain = KRRunLoop::isMainThread();
        entity = std::move(created);
      },
      false);
  std::optional<KRDBEntityArray> entities;
  catalog->createEntitiesWithType(
      KRDBEntityTypeVolume, {{}, {}}, [&](KRDBEntityArray created) { entities = std::move(created); }, false);
  EXPECT_FALSE(entity);
  ASSERT_TRUE(runMainLoopUntil([&] { return entity && entities; }));
  EXPECT_TRUE(entityOnMain);
  EXPECT_TRUE(std::dynamic_pointer_cast<KRDBCollection>(entity));
  EXPECT_EQ(entities->size(), 2u);
}

TEST_F(KRDBCatalogCreationTest, TheSynchronousFormsCallTheirHandlerOnTheQueueBeforeReturning) {
  std::shared_ptr<KRDBEntity> entity;
  std::thread::id handlerThread;
  catalog->createEntityWithType(
      KRDBEntityTypeImage,
      [&](std::shared_ptr<KRDBEntity> created) {
        handlerThread = std::this_thread::get_id();
        entity = std::move(created);
      },
      true);
  ASSERT_TRUE(std::dynamic_pointer_cast<KRDBImage>(entity));
  EXPECT_NE(handlerThread, std::this_thread::get_id());
  KRDBEntityArray images;
  catalog->createEntitiesWithType(
      KRDBEntityTypeImage, {{{"DBImageInfoExifReader", reader("/a")}}},
      [&](KRDBEntityArray created) { images = std::move(created); }, true);
  EXPECT_EQ(images.size(), 1u);
}

TEST_F(KRDBCatalogCreationTest, AfterClosingTheAsynchronousFormsNeverCallTheirHandlers) {
  bool closed = false;
  catalog->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  int handled = 0;
  catalog->createEntityWithType(
      KRDBEntityTypeCollection, [&](std::shared_ptr<KRDBEntity>) { ++handled; }, false);
  catalog->createEntityWithType(
      KRDBEntityTypeCollection, KRDictionary(), [&](std::shared_ptr<KRDBEntity>) { ++handled; }, true);
  catalog->createEntitiesWithType(
      KRDBEntityTypeImage, {{}}, [&](KRDBEntityArray) { ++handled; }, false);
  ASSERT_TRUE(runMainLoopUntil([&] { return closed; }));
  // Everything the queue could still post has been delivered once this handler ran.
  bool drained = false;
  catalog->waitForAllDataBaseOperationsWithHandler([&] { drained = true; });
  ASSERT_TRUE(runMainLoopUntil([&] { return drained; }));
  EXPECT_EQ(handled, 0);
  EXPECT_EQ(rows("filters WHERE _id_int_64 != 1"), 0);
  EXPECT_EQ(rows("images"), 0);
}

}  // namespace
