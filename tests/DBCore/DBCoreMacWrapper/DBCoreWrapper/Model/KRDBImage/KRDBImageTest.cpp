#include "Model/KRDBImage/KRDBImage.hpp"

#include <gtest/gtest.h>

#include "KRClasses/KRTCropDescription.hpp"
#include "KRClasses/KRVolume.hpp"
#include "KRClasses/KRVolumeInfo.hpp"
#include "KREntityClassChecks.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "KRRecordingEntityContext.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImageObserver.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbfilter.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

using dbcore::DBImage;
using Checks = KREntityClassChecks<KRDBImage, DBImage, dbcore::DBFilter>;
using Strings = std::vector<std::string>;

TEST(KRDBImageTest, TypeNumbers) {
  EXPECT_EQ(KRDBImage::entityType(), 1);
  EXPECT_EQ(KRDBImage::dbEntityType(), 1);
}

TEST(KRDBImageTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBImageTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

// ---- Helpers

std::shared_ptr<DBImage> imageRecord(const std::wstring& path = L"IMG_0001.CR3") {
  auto record = std::make_shared<DBImage>();
  record->set_id(11);
  record->path = path;
  record->guid = L"G-1";
  record->width = 400;
  record->height = 300;
  record->file_size = 2048;
  record->modification_date = 100;
  record->import_date = 200;
  record->import_index = 3;
  record->creation_date = 300;
  return record;
}

std::shared_ptr<KRDBImage> makeImage(const std::wstring& path = L"IMG_0001.CR3") {
  return KRDBImage::initWithDBEntity(imageRecord(path));
}

std::shared_ptr<KRDBImageState> makeState(int64_t id, uint64_t orientation = 1,
                                          std::shared_ptr<KRTCropDescription> crop = nullptr) {
  auto record = std::make_shared<dbcore::DBImgHistoryState>();
  record->set_id(id);
  record->image_orientation = orientation;
  if (crop) record->crop_description = KRString(crop->plistSerialization()).krs_wstring();
  return KRDBImageState::initWithDBEntity(record);
}

std::shared_ptr<KRDBImageAttributes> makeAttributes(bool lost = false, bool trashed = false) {
  auto record = std::make_shared<dbcore::DBUserImgAttrib>();
  record->set_id(21);
  record->image_id = 11;
  record->lost = lost;
  record->trashed = trashed;
  return KRDBImageAttributes::initWithDBEntity(record);
}

std::shared_ptr<KRDBPath> makePath(const std::wstring& relative = L"2026/trip") {
  auto record = std::make_shared<dbcore::DBPath>();
  record->set_id(31);
  record->path = relative;
  return KRDBPath::initWithDBEntity(record);
}

float ratioOf(KRDBImage& image) { return static_cast<float>(image.sizeAspectRatio().doubleValue()); }

std::shared_ptr<KRTCropDescription> crop(double width, double height, double imageWidth, double imageHeight) {
  return KRTCropDescription::initWithCropRect(KRRect{{0, 0}, {width, height}},
                                              KRSize{imageWidth, imageHeight});
}

// Records the image notifications as their names.
class ImageRecorder : public KRObject, public KRDBImageObserver {
 public:
  void imageFolderPathDidChange(const std::shared_ptr<KRDBImage>&) override {
    events.push_back("folderPath");
  }
  void imageFolderVolumeDidUpdate(const std::shared_ptr<KRDBImage>&) override {
    events.push_back("folderVolume");
  }
  void currentStateDidChange(const std::shared_ptr<KRDBImage>&) override { events.push_back("currentState"); }
  void statesDidChange(const std::shared_ptr<KRDBImage>&) override { events.push_back("states"); }
  void sizeAspectRatioDidChange(const std::shared_ptr<KRDBImage>&) override {
    events.push_back("aspectRatio");
  }
  Strings events;
};

class KRDBImageBehaviourTest : public testing::Test {
 protected:
  void SetUp() override {
    KRDBEntityClasses::registerAll();
    image->addListener(recorder);
    image->setContext(context);
  }

  std::shared_ptr<KRDBImage> image = makeImage();
  std::shared_ptr<ImageRecorder> recorder = std::make_shared<ImageRecorder>();
  std::shared_ptr<KRRecordingEntityContext> context = std::make_shared<KRRecordingEntityContext>();
};

// ---- Record properties

TEST(KRDBImageTest, TheChangeKeysHoldTheirOwnNames) {
  EXPECT_STREQ(kKRDBImageDidChangeGuid, "kKRDBImageDidChangeGuid");
  EXPECT_STREQ(kKRDBImageDidChangeName, "kKRDBImageDidChangeName");
  EXPECT_STREQ(kKRDBImageDidChangeWidth, "kKRDBImageDidChangeWidth");
  EXPECT_STREQ(kKRDBImageDidChangeHeight, "kKRDBImageDidChangeHeight");
  EXPECT_STREQ(kKRDBImageDidChangeFileSize, "kKRDBImageDidChangeFileSize");
  EXPECT_STREQ(kKRDBImageDidChangeModificationDate, "kKRDBImageDidChangeModificationDate");
  EXPECT_STREQ(kKRDBImageDidChangeImportDate, "kKRDBImageDidChangeImportDate");
  EXPECT_STREQ(kKRDBImageDidChangeImportIndex, "kKRDBImageDidChangeImportIndex");
}

TEST(KRDBImageTest, LoadingTakesEveryFieldAndPostsNothing) {
  const auto image = makeImage(L"folder/IMG_0001.CR3");
  EXPECT_EQ(image->name(), KRString("IMG_0001.CR3"));
  EXPECT_EQ(image->guid(), KRString("G-1"));
  EXPECT_EQ(image->width(), 400);
  EXPECT_EQ(image->height(), 300);
  EXPECT_EQ(image->fileSize(), 2048);
  EXPECT_EQ(image->importIndex(), 3);
  EXPECT_EQ(image->modificationDate().timeIntervalSince1970(), 100);
  EXPECT_EQ(image->importDate().timeIntervalSince1970(), 200);
  EXPECT_EQ(image->creationDate().timeIntervalSince1970(), 300);
  EXPECT_FALSE(image->isDbEntityChanged());
}

TEST(KRDBImageTest, EveryRecordPropertyFollowsTheSetterProtocol) {
  using Row = KRRecordProperty<KRDBImage>;
  const auto record = [](const KRDBImage& image) { return image.dbimage(); };
  const KRDate date = KRDate::dateWithTimeIntervalSince1970(1.9);
  expectSetterProtocol<KRDBImage>(
      [] { return makeImage(); },
      {
          Row{"guid", "kKRDBImageDidChangeGuid", [](KRDBImage& image) { image.setGuid("G-2"); },
              [&](const KRDBImage& image) { return record(image)->guid == L"G-2"; },
              [](KRDBImage& image) { image.setGuid(image.guid()); }},
          Row{"name", "kKRDBImageDidChangeName", [](KRDBImage& image) { image.setName("b.jpg"); },
              [&](const KRDBImage& image) { return record(image)->path == L"b.jpg"; },
              [](KRDBImage& image) { image.setName(KRString(image.name().str())); }},
          Row{"width", "kKRDBImageDidChangeWidth", [](KRDBImage& image) { image.setWidth(640); },
              [&](const KRDBImage& image) { return record(image)->width == 640; },
              [](KRDBImage& image) { image.setWidth(image.width()); }},
          Row{"height", "kKRDBImageDidChangeHeight", [](KRDBImage& image) { image.setHeight(480); },
              [&](const KRDBImage& image) { return record(image)->height == 480; },
              [](KRDBImage& image) { image.setHeight(image.height()); }},
          Row{"fileSize", "kKRDBImageDidChangeFileSize",
              [](KRDBImage& image) { image.setFileSize(1LL << 40); },
              [&](const KRDBImage& image) { return record(image)->file_size == 1LL << 40; },
              [](KRDBImage& image) { image.setFileSize(image.fileSize()); }},
          Row{"modificationDate", "kKRDBImageDidChangeModificationDate",
              [&](KRDBImage& image) { image.setModificationDate(date); },
              [&](const KRDBImage& image) { return record(image)->modification_date == 1; },
              [](KRDBImage& image) { image.setModificationDate(image.modificationDate()); }},
          Row{"importDate", "kKRDBImageDidChangeImportDate",
              [&](KRDBImage& image) { image.setImportDate(date); },
              [&](const KRDBImage& image) { return record(image)->import_date == 1; },
              [](KRDBImage& image) { image.setImportDate(image.importDate()); }},
          Row{"importIndex", "kKRDBImageDidChangeImportIndex",
              [](KRDBImage& image) { image.setImportIndex(9); },
              [&](const KRDBImage& image) { return record(image)->import_index == 9; },
              [](KRDBImage& image) { image.setImportIndex(image.importIndex()); }},
          Row{"creationDate", "kKRDBImageDidChangeCreationDate",
              [&](KRDBImage& image) { image.setCreationDate(date); },
              [&](const KRDBImage& image) { return record(image)->creation_date == 1; },
              [](KRDBImage& image) { image.setCreationDate(image.creationDate()); }},
      });
}

TEST(KRDBImageTest, ANameWithAFolderIsWrittenWholeAndLoadedAsItsLastComponent) {
  const auto image = makeImage();
  image->setName("a/b.jpg");
  EXPECT_EQ(image->dbimage()->path, L"a/b.jpg");
  const auto loaded = KRDBImage::initWithDBEntity(image->dbimage());
  EXPECT_EQ(loaded->name(), KRString("b.jpg"));
  EXPECT_EQ(loaded->fileName(), KRString("b"));
  EXPECT_EQ(loaded->fileType(), KRString("jpg"));
}

TEST(KRDBImageTest, AnEqualButDistinctGuidIsAChangeAndAnEqualNameIsNot) {
  const auto image = makeImage();
  const auto observer = KREntityObserverRecorder::observing(*image);
  image->setGuid(KRString(std::string("G-1")));
  ASSERT_EQ(observer->events.size(), 2u);
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBImageDidChangeGuid", true}}));
  observer->events.clear();
  image->setName(KRString(std::string("IMG_0001.CR3")));
  EXPECT_TRUE(observer->events.empty());
}

TEST(KRDBImageTest, DatesAreStoredAsWholeSecondsTowardZero) {
  const auto image = makeImage();
  image->setModificationDate(KRDate::dateWithTimeIntervalSince1970(1.9));
  EXPECT_EQ(image->dbimage()->modification_date, 1);
  image->setModificationDate(KRDate::dateWithTimeIntervalSince1970(-1.9));
  EXPECT_EQ(image->dbimage()->modification_date, -1);
  image->setImportDate(KRDate());
  EXPECT_EQ(image->dbimage()->import_date, 0);
}

TEST(KRDBImageTest, ANewNameDropsTheCachedFileNameAndType) {
  const auto image = makeImage();
  EXPECT_EQ(image->fileName(), KRString("IMG_0001"));
  EXPECT_EQ(image->fileType(), KRString("CR3"));
  image->setName("holiday.jpeg");
  EXPECT_EQ(image->fileName(), KRString("holiday"));
  EXPECT_EQ(image->fileType(), KRString("jpeg"));
}

// ---- Sizes and orientation

TEST_F(KRDBImageBehaviourTest, AQuarterTurnedOrientationInvertsTheRatio) {
  image->setCurrentStatePrimitive(makeState(1, 6));
  EXPECT_EQ(image->imageOrientation(), 6u);
  EXPECT_EQ(image->croppedSize(), (KRSize{400, 300}));
  EXPECT_EQ(ratioOf(*image), 0.75f);
  image->setCurrentStatePrimitive(makeState(2, 1));
  EXPECT_EQ(ratioOf(*image), 1.3333334f);
}

TEST_F(KRDBImageBehaviourTest, OrientationsOutsideOneToEightAreOne) {
  EXPECT_EQ(image->imageOrientation(), 1u);
  image->setCurrentStatePrimitive(makeState(1, 9));
  EXPECT_EQ(image->imageOrientation(), 1u);
  image->setCurrentStatePrimitive(makeState(2, 8));
  EXPECT_EQ(image->imageOrientation(), 8u);
}

TEST_F(KRDBImageBehaviourTest, TheCropOfTheCurrentStateGivesTheCroppedSize) {
  image->setCurrentStatePrimitive(makeState(1, 1, crop(100, 50, 200, 200)));
  EXPECT_EQ(image->croppedSize(), (KRSize{200, 75}));
  image->setWidth(401);
  EXPECT_EQ(image->croppedSize(), (KRSize{200, 75}));
}

TEST_F(KRDBImageBehaviourTest, ARatioChangeOfAMillionthPostsNothing) {
  image->setWidth(1000000);
  image->setHeight(1000000);
  image->setCurrentStatePrimitive(makeState(1));
  recorder->events.clear();
  image->setCurrentStatePrimitive(makeState(2, 1, crop(1000001, 1000000, 1000000, 1000000)));
  EXPECT_EQ(image->croppedSize(), (KRSize{1000001, 1000000}));
  EXPECT_EQ(recorder->events, Strings{"currentState"});
  EXPECT_EQ(ratioOf(*image), 1.0f);
  image->setCurrentStatePrimitive(makeState(3, 1, crop(1100000, 1000000, 1000000, 1000000)));
  EXPECT_EQ(recorder->events, (Strings{"currentState", "currentState", "aspectRatio"}));
  EXPECT_EQ(ratioOf(*image), 1.1f);
}

// ---- Availability and duplicates

TEST_F(KRDBImageBehaviourTest, AnImageOnAnAvailablePathIsUnavailableWhenLost) {
  const auto table = KRFakeMountTable::create({{.mountPoint = "/media/photos",
                                                .device = "/dev/sdb1",
                                                .fileSystemType = "exfat",
                                                .volumeUUID = "5A3E-1C2D"}});
  auto volumeRecord = std::make_shared<dbcore::DBVolume>();
  volumeRecord->set_id(41);
  const auto volume = KRDBVolume::initWithDBEntity(volumeRecord);
  volume->setVolume(
      KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoWithMountEntry(table->mounts()[0]), table));
  const auto path = makePath();
  path->setVolumePrimitive(volume);
  image->setFolderDBPathPrimitive(path);
  context->attributes = makeAttributes(false);
  ASSERT_TRUE(path->isAvailable());
  EXPECT_TRUE(image->isAvailable());
  EXPECT_EQ(image->path(), KRString("/media/photos/2026/trip/IMG_0001.CR3"));
  image->setLost(true);
  EXPECT_TRUE(context->attributes->isLost());
  EXPECT_FALSE(image->isAvailable());
  EXPECT_EQ(recorder->events, Strings{"folderPath"});
  image->setLost(true);
  EXPECT_EQ(recorder->events.size(), 1u);
}

TEST_F(KRDBImageBehaviourTest, WithoutAFolderPathAnImageIsUnavailable) {
  context->attributes = makeAttributes(false);
  EXPECT_FALSE(image->isAvailable());
  EXPECT_TRUE(image->path().isNil());
}

TEST_F(KRDBImageBehaviourTest, OnlyAnEditedStateOfAnUntrashedImageCanBeMarkedAsLost) {
  context->attributes = makeAttributes(false, false);
  EXPECT_FALSE(image->canBeMarkedAsLost());
  auto original = makeState(1);
  original->setOriginal(true);
  image->setCurrentStatePrimitive(original);
  EXPECT_FALSE(image->canBeMarkedAsLost());
  image->setCurrentStatePrimitive(makeState(2));
  EXPECT_TRUE(image->canBeMarkedAsLost());
  context->attributes->setTrashed(true);
  EXPECT_FALSE(image->canBeMarkedAsLost());
}

TEST(KRDBImageTest, PossibleDuplicatesCompareCreationDatesOrNames) {
  const auto image = makeImage();
  EXPECT_FALSE(image->isPossibleDuplicateOf(nullptr));
  const auto sameDate = makeImage(L"other-name.jpg");
  EXPECT_TRUE(image->isPossibleDuplicateOf(sameDate));
  sameDate->setFileSize(1);
  EXPECT_FALSE(image->isPossibleDuplicateOf(sameDate));
  const auto laterDate = makeImage();
  laterDate->setCreationDate(KRDate::dateWithTimeIntervalSince1970(301));
  EXPECT_FALSE(image->isPossibleDuplicateOf(laterDate));
  const auto undated = makeImage();
  undated->setCreationDate(KRDate());
  EXPECT_TRUE(image->isPossibleDuplicateOf(undated));
  const auto undatedOtherName = makeImage(L"other-name.jpg");
  undatedOtherName->setCreationDate(KRDate());
  EXPECT_FALSE(image->isPossibleDuplicateOf(undatedOtherName));
}

// ---- Linked entities

TEST(KRDBImageTest, WithoutAContextLazyRelationsAreNil) {
  const auto image = makeImage();
  EXPECT_FALSE(image->attributes());
  EXPECT_FALSE(image->exivAttributes());
  EXPECT_FALSE(image->filters());
  EXPECT_FALSE(image->states());
}

TEST_F(KRDBImageBehaviourTest, AttributesAreFetchedOnceAndPointBackAtTheImage) {
  context->attributes = makeAttributes();
  auto exifRecord = std::make_shared<dbcore::DBExivImgAttrib>();
  exifRecord->image_id = 11;
  context->exivAttributes = KRDBImageExivAttributes::initWithDBEntity(exifRecord);
  EXPECT_EQ(image->attributes(), context->attributes);
  EXPECT_EQ(image->attributes(), context->attributes);
  EXPECT_EQ(image->exivAttributes(), context->exivAttributes);
  EXPECT_EQ(context->attributes->imagePrimitive(), image);
  EXPECT_EQ(context->exivAttributes->imagePrimitive(), image);
  EXPECT_EQ(context->calls, (Strings{"attributesForImage", "exivAttributesForImage"}));
}

TEST_F(KRDBImageBehaviourTest, StatesAreFetchedOnlyWithACurrentState) {
  context->states = {makeState(1), makeState(2)};
  EXPECT_FALSE(image->states());
  EXPECT_TRUE(context->calls.empty());
  image->setCurrentStatePrimitive(context->states[1]);
  ASSERT_TRUE(image->states());
  EXPECT_EQ(*image->states(), context->states);
  EXPECT_EQ(context->calls, Strings{"statesForImage"});
}

TEST_F(KRDBImageBehaviourTest, PrimitiveSettersPostNotChangedAndTheirOwnNotifications) {
  const auto observer = KREntityObserverRecorder::observing(*image);
  image->setStatesPrimitive(std::make_shared<const KRDBImageStates>());
  image->setFiltersPrimitive(std::make_shared<const KRDBEntitySet>());
  image->setCurrentStatePrimitive(makeState(1));
  EXPECT_EQ(recorder->events, (Strings{"states", "currentState", "aspectRatio"}));
  ASSERT_EQ(observer->events.size(), 3u);
  for (const auto& event : observer->events) EXPECT_EQ(event.info.count(), 0u);
  EXPECT_FALSE(image->isDbEntityChanged());
  const auto sameStates = image->statesPrimitive();
  image->setStatesPrimitive(sameStates);
  EXPECT_EQ(observer->events.size(), 3u);
}

TEST_F(KRDBImageBehaviourTest, TheFolderPathMovesTheImagesListenerRegistration) {
  const auto first = makePath(L"a");
  const auto second = makePath(L"b");
  image->setFolderDBPathPrimitive(first);
  EXPECT_TRUE(first->hasListener(image));
  EXPECT_TRUE(recorder->events.empty());
  image->setFolderDBPathPrimitive(second, true);
  EXPECT_FALSE(first->hasListener(image));
  EXPECT_TRUE(second->hasListener(image));
  EXPECT_EQ(recorder->events, Strings{"folderPath"});
}

TEST_F(KRDBImageBehaviourTest, OnlyItsOwnPathsNotificationsReachTheImage) {
  const auto own = makePath(L"own");
  image->setFolderDBPathPrimitive(own);
  const auto observer = KREntityObserverRecorder::observing(*image);
  image->pathDidChange(makePath(L"other"));
  image->volumeDidUpdate(makePath(L"other"));
  EXPECT_TRUE(recorder->events.empty());
  image->pathDidChange(own);
  image->volumeDidUpdate(own);
  EXPECT_EQ(recorder->events, (Strings{"folderPath", "folderVolume"}));
  ASSERT_EQ(observer->events.size(), 1u);
  EXPECT_EQ(observer->events[0].info.count(), 0u);
}

TEST_F(KRDBImageBehaviourTest, AVolumeThatGoesAwayReachesTheImagesObservers) {
  const KRMountEntry disk{.mountPoint = "/media/photos",
                          .device = "/dev/sdb1",
                          .fileSystemType = "exfat",
                          .volumeUUID = "5A3E-1C2D"};
  const auto table = KRFakeMountTable::create({disk});
  auto volumeRecord = std::make_shared<dbcore::DBVolume>();
  volumeRecord->set_id(41);
  volumeRecord->info = L"{}";
  const auto volume = KRDBVolume::initWithDBEntity(volumeRecord);
  const auto live = KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoWithMountEntry(disk), table);
  volume->setVolume(live);
  live->addListener(volume);
  const auto path = makePath();
  path->setVolumePrimitive(volume);
  image->setFolderDBPathPrimitive(path);
  context->attributes = makeAttributes();
  ASSERT_TRUE(image->isAvailable());
  table->setMounts({});
  ASSERT_TRUE(KRRunLoop::mainRunLoop()->runUntil([&] { return !recorder->events.empty(); },
                                                 KRDate::dateWithTimeIntervalSinceNow(5)));
  EXPECT_EQ(recorder->events, Strings{"folderVolume"});
  EXPECT_FALSE(image->isAvailable());
}

// ---- Collections

TEST_F(KRDBImageBehaviourTest, AddingAndRemovingFoldersAsksTheContextPerFolder) {
  auto collectionRecord = std::make_shared<dbcore::DBFilter>();
  const auto first = KRDBCollection::initWithDBEntity(collectionRecord);
  const auto second = KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>());
  image->addFilters({first, second});
  image->deleteFilters({first});
  EXPECT_EQ(context->calls,
            (Strings{"addImages:toFilter:", "addImages:toFilter:", "deleteImages:fromFilter:"}));
}

TEST_F(KRDBImageBehaviourTest, PrimitiveFolderChangesAnswerWhatReallyChanged) {
  const auto first = KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>());
  const auto second = KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>());
  context->filters = {first};
  EXPECT_EQ(image->addFiltersPrimitive({first, second}), KRDBEntitySet{second});
  EXPECT_EQ(*image->filters(), (KRDBEntitySet{first, second}));
  EXPECT_TRUE(image->addFiltersPrimitive({first}).empty());
  EXPECT_EQ(image->deleteFiltersPrimitive({first}), KRDBEntitySet{first});
  EXPECT_EQ(*image->filters(), KRDBEntitySet{second});
  EXPECT_TRUE(image->deleteFiltersPrimitive({first}).empty());
}

// ---- History

TEST_F(KRDBImageBehaviourTest, PushingOnTheSecondOfFourStatesDropsTheRedoBranch) {
  context->states = {makeState(1), makeState(2), makeState(3), makeState(4)};
  image->setCurrentStatePrimitive(context->states[1]);
  const auto pushed = makeState(5);
  const KRDBImageStates result = image->statesByPushingState(pushed);
  EXPECT_EQ(result, (KRDBImageStates{context->states[0], context->states[1], pushed}));
}

TEST_F(KRDBImageBehaviourTest, APushedCropIsConvertedToTheImageSize) {
  const auto pushed = makeState(5, 1, crop(50, 50, 100, 100));
  const KRDBImageStates result = image->statesByPushingState(pushed);
  ASSERT_EQ(result.size(), 1u);
  EXPECT_EQ(pushed->cropDesc()->imageSize(), (KRSize{400, 300}));
  EXPECT_EQ(pushed->cropDesc()->cropRect().size, (KRSize{200, 150}));
}

TEST_F(KRDBImageBehaviourTest, HistoryChangesUpdateTheEditDateAndGoThroughTheContext) {
  context->attributes = makeAttributes();
  const auto state = makeState(1);
  image->pushState(state);
  EXPECT_FALSE(context->attributes->editDate().isNil());
  image->setCurrentState(state);
  image->setStates({});
  EXPECT_EQ(context->calls, (Strings{"attributesForImage", "setStates:currentState:forImage:",
                                     "setCurrentState:forImage:", "setStates:currentState:forImage:"}));
}

// ---- Necessary links, keys, reset

TEST(KRDBImageTest, TheNecessaryLinksAndTheirReverseKeys) {
  EXPECT_EQ(KRDBImage::necessaryLinkedEntitiesKeys(),
            (Strings{"attributesPrimitive", "exivAttributesPrimitive", "folderDBPathPrimitive"}));
  EXPECT_EQ(KRDBImage::reverseKeyForNecessaryKey("attributesPrimitive"), "imagePrimitive");
  EXPECT_EQ(KRDBImage::reverseKeyForNecessaryKey("exivAttributesPrimitive"), "imagePrimitive");
  EXPECT_EQ(KRDBImage::reverseKeyForNecessaryKey("folderDBPathPrimitive"), "");
  const auto image = makeImage();
  EXPECT_TRUE(image->needFetchNecessaryEntities());
  const auto attributes = makeAttributes();
  image->updateNecessaryEntityForKey("attributesPrimitive", attributes);
  EXPECT_EQ(image->attributesPrimitive(), attributes);
  EXPECT_EQ(attributes->imagePrimitive(), image);
  const auto path = makePath();
  image->updateNecessaryEntityForKey("folderDBPathPrimitive", path);
  EXPECT_EQ(image->folderDBPath(), path);
}

// The links are read and set without key-value coding, with the same outcome: a link of another class
// or none goes through key-value coding, which empties the slot (and refuses the back link a path lacks).
TEST(KRDBImageTest, TheNecessaryLinksAreReadAndSetDirectly) {
  const auto image = makeImage();
  const auto attributes = makeAttributes();
  const auto path = makePath();
  EXPECT_FALSE(image->necessaryLinkedEntity("attributesPrimitive"));
  image->updateNecessaryEntityForKey("attributesPrimitive", attributes);
  image->updateNecessaryEntityForKey("folderDBPathPrimitive", path);
  EXPECT_EQ(image->necessaryLinkedEntity("attributesPrimitive"), attributes);
  EXPECT_EQ(image->necessaryLinkedEntity("folderDBPathPrimitive"), path);
  EXPECT_FALSE(image->necessaryLinkedEntity("exivAttributesPrimitive"));
  EXPECT_TRUE(image->needFetchNecessaryEntities());
  EXPECT_THROW(image->updateNecessaryEntityForKey("attributesPrimitive", path), KRException);
  EXPECT_FALSE(image->attributesPrimitive());
  image->updateNecessaryEntityForKey("folderDBPathPrimitive", nullptr);
  EXPECT_FALSE(image->folderDBPath());
}

TEST_F(KRDBImageBehaviourTest, TheDeletionKeyIsTheTypeAndThePath) {
  image->setFolderDBPathPrimitive(makePath(L"/photos"));
  EXPECT_EQ(image->markedToDeleteHashKey(), KRString("1-/photos/IMG_0001.CR3"));
}

TEST_F(KRDBImageBehaviourTest, ResetDropsRelationsButKeepsTheFavoriteAlias) {
  context->attributes = makeAttributes();
  image->attributes();
  const auto path = makePath();
  image->setFolderDBPathPrimitive(path);
  auto aliasRecord = std::make_shared<dbcore::DBEntityFavoriteAlias>();
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(aliasRecord);
  image->setFavoriteAliasPrimitive(alias);
  image->reset();
  EXPECT_FALSE(image->attributesPrimitive());
  EXPECT_FALSE(image->folderDBPath());
  EXPECT_FALSE(path->hasListener(image));
  EXPECT_EQ(image->favoriteAliasPrimitive(), alias);
  EXPECT_TRUE(recorder->events.empty());
}

TEST_F(KRDBImageBehaviourTest, ResetToDefaultStateLeavesFoldersHistoryAndMarks) {
  const auto folder = KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>());
  context->filters = {folder};
  context->attributes = makeAttributes(false, true);
  image->setMarkedToDelete(true);
  image->resetToDefaultState();
  EXPECT_FALSE(image->isMarkedToDelete());
  EXPECT_FALSE(context->attributes->isTrashed());
  EXPECT_EQ(context->calls, (Strings{"filtersOfImage", "deleteImages:fromFilter:", "attributesForImage",
                                     "setStates:currentState:forImage:"}));
}

TEST_F(KRDBImageBehaviourTest, AnUnknownKeyIsLoggedAndIgnored) {
  KRCapturingLogSink sink;
  image->setValueForKey(5, "noSuchKey");
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0], (KRLogRecord{4, "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBImage/KRDBImage",
                                     "setValueForUndefinedKey", 280,
                                     "Warning!!!\nUndefined Key: noSuchKey\nFor obj Class: KRDBImage"}));
}

TEST_F(KRDBImageBehaviourTest, PropertiesAreReachedByKey) {
  EXPECT_EQ(image->valueForKey("name"), KRValue("IMG_0001.CR3"));
  EXPECT_EQ(image->valueForKey("fileSize"), KRValue(2048));
  EXPECT_EQ(image->valueForKey("fileType"), KRValue("CR3"));
  EXPECT_EQ(image->valueForKeyPath("importDate.timeIntervalSince1970"), KRValue(200.0));
  image->setValueForKey(7, "importIndex");
  EXPECT_EQ(image->importIndex(), 7);
}

}  // namespace
