#include "Model/KRDBVolume/KRDBVolume.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KRFoundation/KRRegularExpression.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "Model/KRDBVolume/KRDBVolumeObserver.hpp"
#include "Support/KRDictionaryJSON.hpp"
#include "dbpath.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBVolume, dbcore::DBVolume, dbcore::DBPath>;
using Events = std::vector<std::string>;

TEST(KRDBVolumeTest, TypeNumbers) {
  EXPECT_EQ(KRDBVolume::entityType(), 13);
  EXPECT_EQ(KRDBVolume::dbEntityType(), 15);
}

TEST(KRDBVolumeTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBVolumeTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBVolumeTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBVolumeTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

// The volume notifications, as "<event> <mount point at arrival>".
class VolumeEventsRecorder : public KRObject, public KRDBVolumeObserver {
 public:
  void volumeDidChangeMountPoint(const std::shared_ptr<KRDBVolume>& volume) override {
    events.push_back("mountPoint " + volume->mountPoint().str());
  }
  void volumeDidChangeAvailability(const std::shared_ptr<KRDBVolume>& volume) override {
    events.push_back(std::string(volume->isAvailable() ? "appeared " : "disappeared ") +
                     volume->mountPoint().str());
  }

  Events events;
};

KRMountEntry cameraCard(std::string mountPoint) {
  return {.mountPoint = std::move(mountPoint),
          .device = "/dev/sdc1",
          .fileSystemType = "vfat",
          .volumeUUID = "0C1E-77AB",
          .label = "EOS_DIGITAL",
          .totalSize = 64'000'000'000};
}

KRDictionary cardInfo(const std::string& mountPoint) {
  return KRVolumeInfo::volumeInfoWithMountEntry(cameraCard(mountPoint))->dictionarySerialization();
}

class KRDBVolumeEntityTest : public testing::Test {
 protected:
  void SetUp() override {
    KRDBEntityClasses::registerAll();
    record->uuid = L"3F2504E0-4F89-11D3-9A0C-0305E82C3301";
    record->info = KRDictionaryJSON::jsonWString(cardInfo("/media/card"));
  }

  // The volume over the record, awoken over the fake mount table and listened to.
  std::shared_ptr<KRDBVolume> awokenVolume() {
    auto volume = KRDBVolume::initWithDBEntity(record);
    volume->awakeFromFetch(table);
    volume->addListener(recorder);
    return volume;
  }

  bool waitForEvents(size_t count) {
    return KRRunLoop::currentRunLoop()->runUntil([&] { return recorder->events.size() >= count; },
                                                 KRDate::dateWithTimeIntervalSinceNow(5));
  }

  std::shared_ptr<dbcore::DBVolume> record = Checks::ownRecord(3);
  std::shared_ptr<VolumeEventsRecorder> recorder = std::make_shared<VolumeEventsRecorder>();
  std::shared_ptr<KRFakeMountTable> table = KRFakeMountTable::create({cameraCard("/media/card")});
};

TEST_F(KRDBVolumeEntityTest, TheRecordGivesTheUuidAndTheInfo) {
  const auto volume = KRDBVolume::initWithDBEntity(record);
  EXPECT_EQ(volume->uuid(), "3F2504E0-4F89-11D3-9A0C-0305E82C3301");
  EXPECT_EQ(volume->info(), cardInfo("/media/card"));
  EXPECT_EQ(volume->dbvolume(), record);
  EXPECT_EQ(volume->volume(), nullptr);
  EXPECT_FALSE(volume->isDbEntityChanged());
  EXPECT_EQ(kKRDBVolumeDidChangeUuid, std::string("kKRDBVolumeDidChangeUuid"));
  EXPECT_EQ(kKRDBVolumeDidChangeInfo, std::string("kKRDBVolumeDidChangeInfo"));
}

TEST_F(KRDBVolumeEntityTest, InfoThatIsNotAJsonObjectGivesNoInfo) {
  record->info = L"[1, 2]";
  EXPECT_TRUE(KRDBVolume::initWithDBEntity(record)->info().isNil());
  EXPECT_EQ(KRDBVolume::initWithDBEntity(std::make_shared<dbcore::DBPath>())->dbvolume(), nullptr);
}

TEST_F(KRDBVolumeEntityTest, TheInfoFollowsTheSetterProtocol) {
  const KRDictionary moved = cardInfo("/media/moved");
  expectSetterProtocol<KRDBVolume>(
      [this] { return KRDBVolume::initWithDBEntity(record); },
      {{"info", "kKRDBVolumeDidChangeInfo", [&](KRDBVolume& volume) { volume.setInfo(moved); },
        [&](const KRDBVolume& volume) {
          return KRDictionaryJSON::dictionaryWithJsonWString(volume.dbvolume()->info) == moved;
        },
        [](KRDBVolume& volume) { volume.setInfo(volume.info()); }}});
}

TEST_F(KRDBVolumeEntityTest, AnEqualButDistinctInfoIsAChangeAndNoInfoIsWrittenEmpty) {
  const auto volume = KRDBVolume::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*volume);
  volume->setInfo(cardInfo("/media/card"));
  EXPECT_EQ(observer->kinds(), (Events{"willChange", "didChange"}));
  volume->setInfo(KRDictionary());
  EXPECT_EQ(record->info, L"");
  EXPECT_TRUE(volume->info().isNil());
}

TEST_F(KRDBVolumeEntityTest, AMissingUuidIsMadeOnFirstReadAndKept) {
  record->uuid = L"";
  const auto volume = KRDBVolume::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*volume);
  const KRString first = volume->uuid();
  const KRRegularExpression canonical("[0-9A-F]{8}-[0-9A-F]{4}-4[0-9A-F]{3}-[89AB][0-9A-F]{3}-[0-9A-F]{12}",
                                      false, false);
  EXPECT_TRUE(canonical.matches(first.str()));
  EXPECT_EQ(record->uuid, first.krs_wstring());
  EXPECT_TRUE(volume->isDbEntityChanged());
  ASSERT_EQ(observer->kinds(), Events{"didChange"});
  EXPECT_EQ(observer->events[0].info, KRDictionary({{"kKRDBVolumeDidChangeUuid", true}}));
  observer->events.clear();
  volume->setDbEntityChanged(false);
  EXPECT_EQ(volume->uuid(), first);
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(volume->isDbEntityChanged());
}

TEST_F(KRDBVolumeEntityTest, AStoredUuidIsReadWithoutPosting) {
  const auto volume = KRDBVolume::initWithDBEntity(record);
  const auto observer = KREntityObserverRecorder::observing(*volume);
  EXPECT_EQ(volume->uuid(), "3F2504E0-4F89-11D3-9A0C-0305E82C3301");
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(volume->isDbEntityChanged());
}

TEST_F(KRDBVolumeEntityTest, AfterAFetchTheVolumeFollowsTheLiveVolume) {
  const auto volume = awokenVolume();
  ASSERT_NE(volume->volume(), nullptr);
  EXPECT_TRUE(volume->volume()->hasListener(volume));
  EXPECT_EQ(volume->mountPoint(), "/media/card");
  EXPECT_TRUE(volume->isAvailable());
  EXPECT_FALSE(volume->isDbEntityChanged());
}

TEST_F(KRDBVolumeEntityTest, WithoutALiveVolumeThereIsNoMountPoint) {
  record->info = KRDictionaryJSON::jsonWString(KRDictionary({{"name", "EOS_DIGITAL"}}));
  const auto volume = awokenVolume();
  EXPECT_EQ(volume->volume(), nullptr);
  EXPECT_TRUE(volume->mountPoint().isNil());
  EXPECT_FALSE(volume->isAvailable());
}

TEST_F(KRDBVolumeEntityTest, AVolumeMountedElsewhereStoresItsNewInfoAndTellsItsListeners) {
  const auto volume = awokenVolume();
  table->setMounts({cameraCard("/run/media/card")});
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_EQ(recorder->events, Events{"mountPoint /run/media/card"});
  EXPECT_EQ(volume->info(), cardInfo("/run/media/card"));
  EXPECT_EQ(KRDictionaryJSON::dictionaryWithJsonWString(record->info), cardInfo("/run/media/card"));
  EXPECT_TRUE(volume->isDbEntityChanged());
}

TEST_F(KRDBVolumeEntityTest, AnUnmountedAndRemountedVolumeTellsItsListeners) {
  const auto volume = awokenVolume();
  table->setMounts({});
  ASSERT_TRUE(waitForEvents(1));
  EXPECT_FALSE(volume->isAvailable());
  EXPECT_FALSE(volume->isDbEntityChanged());
  table->setMounts({cameraCard("/media/card")});
  ASSERT_TRUE(waitForEvents(2));
  EXPECT_EQ(recorder->events, (Events{"disappeared /media/card", "appeared /media/card"}));
}

TEST_F(KRDBVolumeEntityTest, SettingTheLiveVolumeIsPlain) {
  const auto volume = KRDBVolume::initWithDBEntity(record);
  const auto live =
      KRVolume::initWithVolumeInfo(KRVolumeInfo::volumeInfoWithMountEntry(cameraCard("/x")), table);
  volume->setVolume(live);
  EXPECT_EQ(volume->volume(), live);
  EXPECT_EQ(volume->mountPoint(), "/media/card");
  EXPECT_FALSE(live->hasListener(volume));
}

TEST_F(KRDBVolumeEntityTest, FieldsAreReachedByKey) {
  record->uuid = L"";
  const auto volume = awokenVolume();
  EXPECT_TRUE(volume->valueForKey("uuid").string().empty());
  EXPECT_FALSE(volume->isDbEntityChanged());
  EXPECT_EQ(volume->valueForKey("info"), KRValue(cardInfo("/media/card")));
  EXPECT_EQ(volume->valueForKey("mountPoint"), KRValue("/media/card"));
  EXPECT_EQ(volume->valueForKey("available"), KRValue(true));
  EXPECT_EQ(volume->valueForKey("volume").object(), volume->volume());
  volume->setValueForKey(cardInfo("/elsewhere"), "info");
  EXPECT_EQ(volume->info(), cardInfo("/elsewhere"));
  volume->setValueForKey(KRValue(), "volume");
  EXPECT_EQ(volume->volume(), nullptr);
}

}  // namespace
