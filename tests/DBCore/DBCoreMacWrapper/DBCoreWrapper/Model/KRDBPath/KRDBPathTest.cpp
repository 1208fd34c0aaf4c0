#include "Model/KRDBPath/KRDBPath.hpp"

#include <gtest/gtest.h>

#include <algorithm>

#include "KREntityClassChecks.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "KRRecordingEntityContext.hpp"
#include "Model/KRDBPath/KRDBPathObserver.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "Support/KRDictionaryJSON.hpp"
#include "dbreffolder.hpp"
#include "support/KRFakeMountTable.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBPath, dbcore::DBPath, dbcore::DBRefFolder>;
using Events = std::vector<std::string>;

TEST(KRDBPathTest, TypeNumbers) {
  EXPECT_EQ(KRDBPath::entityType(), 4);
  EXPECT_EQ(KRDBPath::dbEntityType(), 8);
}

TEST(KRDBPathTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBPathTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBPathTest, MarkedToDeleteComesFromTheRecord) { Checks::expectMarkedToDeleteTakenFromRecord(); }

TEST(KRDBPathTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

// Everything a path tells its listeners, in order: the entity notifications (with the did-change infos kept
// aside) and the path's own.
class PathEventsRecorder : public KRObject, public KRDBEntityObserver, public KRDBPathObserver {
 public:
  void entityWillChange(const std::shared_ptr<KRDBEntity>&, const KRDictionary&) override {
    events.emplace_back("willChange");
  }
  void entityDidChange(const std::shared_ptr<KRDBEntity>&, const KRDictionary& info) override {
    events.emplace_back("didChange");
    didChangeInfos.push_back(info);
  }
  void pathDidChange(const std::shared_ptr<KRDBPath>& path) override {
    events.push_back("pathDidChange " + path->path().str());
  }
  void volumeDidUpdate(const std::shared_ptr<KRDBPath>& path) override {
    events.push_back("volumeDidUpdate " + path->path().str());
  }

  Events events;
  std::vector<KRDictionary> didChangeInfos;
};

KRMountEntry photoDisk(std::string mountPoint) {
  return {.mountPoint = std::move(mountPoint),
          .device = "/dev/sdb1",
          .fileSystemType = "exfat",
          .volumeUUID = "5A3E-1C2D",
          .label = "Photos"};
}

class KRDBPathEntityTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }

  std::shared_ptr<KRDBPath> makePath(const std::wstring& relativePath = L"2024/trip") {
    record->path = relativePath;
    auto made = KRDBPath::initWithDBEntity(record);
    made->addListener(recorder);
    return made;
  }

  // A volume entity with the given id whose info describes the photo disk mounted at the mount point,
  // following `table` when it is given.
  static std::shared_ptr<KRDBVolume> volumeEntity(int64_t id, const std::string& mountPoint,
                                                  const std::shared_ptr<KRMountTable>& table = nullptr) {
    auto volumeRecord = std::make_shared<dbcore::DBVolume>();
    volumeRecord->set_id(id);
    volumeRecord->info = KRDictionaryJSON::jsonWString(
        KRVolumeInfo::volumeInfoWithMountEntry(photoDisk(mountPoint))->dictionarySerialization());
    auto volume = KRDBVolume::initWithDBEntity(volumeRecord);
    if (table) volume->awakeFromFetch(table);
    return volume;
  }

  std::shared_ptr<KRDBPath> pathOnMountedVolume() {
    const auto path = makePath();
    path->setVolumePrimitive(volumeEntity(5, "/media/photos", table));
    recorder->events.clear();
    return path;
  }

  // Runs the main run loop until the recorder holds the event.
  bool waitForEvent(const std::string& event) {
    return KRRunLoop::currentRunLoop()->runUntil(
        [&] {
          return std::find(recorder->events.begin(), recorder->events.end(), event) != recorder->events.end();
        },
        KRDate::dateWithTimeIntervalSinceNow(5));
  }

  std::shared_ptr<dbcore::DBPath> record = Checks::ownRecord(12);
  std::shared_ptr<PathEventsRecorder> recorder = std::make_shared<PathEventsRecorder>();
  std::shared_ptr<KRFakeMountTable> table = KRFakeMountTable::create({photoDisk("/media/photos")});
};

TEST_F(KRDBPathEntityTest, TheRecordGivesThePathAndAPathExistsWhenMade) {
  const auto path = makePath(L"Fotos/Été");
  EXPECT_EQ(path->path(), "Fotos/Été");
  EXPECT_TRUE(path->isExists());
  EXPECT_EQ(path->dbpath(), record);
  EXPECT_EQ(kKRDBPathDidChangePath, std::string("kKRDBPathDidChangePath"));
}

TEST_F(KRDBPathEntityTest, ARecordOfAnotherClassGivesNoPathRecord) {
  const auto path = KRDBPath::initWithDBEntity(std::make_shared<dbcore::DBRefFolder>());
  EXPECT_EQ(path->dbpath(), nullptr);
  EXPECT_TRUE(path->path().isNil());
}

TEST_F(KRDBPathEntityTest, ThePathFollowsTheSetterProtocol) {
  expectSetterProtocol<KRDBPath>(
      [this] { return makePath(); },
      {{"path", "kKRDBPathDidChangePath", [](KRDBPath& path) { path.setPath(KRString("2025/summer")); },
        [](const KRDBPath& path) { return path.dbpath()->path == L"2025/summer"; },
        [](KRDBPath& path) { path.setPath(path.path()); }}});
}

TEST_F(KRDBPathEntityTest, ANewPathIsAnnouncedAfterTheChange) {
  const auto path = makePath();
  path->setPath(KRString("2025/summer"));
  EXPECT_EQ(recorder->events, (Events{"willChange", "didChange", "pathDidChange 2025/summer"}));
  EXPECT_EQ(recorder->didChangeInfos,
            std::vector<KRDictionary>{KRDictionary({{"kKRDBPathDidChangePath", true}})});
}

TEST_F(KRDBPathEntityTest, TheSameStringObjectPostsOnceAndAnEqualDistinctStringPostsAgain) {
  const auto path = makePath();
  const KRString summer("2025/summer");
  path->setPath(summer);
  path->setPath(summer);
  EXPECT_EQ(recorder->events.size(), 3u);
  path->setPath(KRString("2025/summer"));
  EXPECT_EQ(recorder->events, (Events{"willChange", "didChange", "pathDidChange 2025/summer", "willChange",
                                      "didChange", "pathDidChange 2025/summer"}));
}

TEST_F(KRDBPathEntityTest, APathThatIsNotWrittenChangesOnlyInMemory) {
  const auto path = pathOnMountedVolume();
  EXPECT_EQ(path->absolutePath(), "/media/photos/2024/trip");
  path->setPath(KRString("2024/renamed"), true);
  EXPECT_EQ(path->path(), "2024/renamed");
  EXPECT_EQ(path->absolutePath(), "/media/photos/2024/renamed");
  EXPECT_EQ(record->path, L"2024/renamed");
  EXPECT_FALSE(path->isDbEntityChanged());
  EXPECT_EQ(recorder->events, (Events{"willChange", "didChange", "pathDidChange 2024/renamed"}));
  EXPECT_EQ(recorder->didChangeInfos, std::vector<KRDictionary>{KRDictionary({})});
}

TEST_F(KRDBPathEntityTest, ANilPathIsWrittenAsAnEmptyWideString) {
  const auto path = makePath();
  path->setPath(KRString());
  EXPECT_EQ(record->path, L"");
  EXPECT_TRUE(path->path().isNil());
}

TEST_F(KRDBPathEntityTest, WithoutAMountPointTheAbsolutePathIsTheRelativeOne) {
  const auto path = makePath();
  path->setVolumePrimitive(volumeEntity(5, "/media/photos"));
  EXPECT_TRUE(path->volume()->mountPoint().isNil());
  EXPECT_EQ(path->absolutePath(), "2024/trip");
  EXPECT_EQ(makePath(L"a/b")->absolutePath(), "a/b");
}

TEST_F(KRDBPathEntityTest, TheAbsolutePathIsCachedUntilTheMountPointChanges) {
  const auto path = pathOnMountedVolume();
  path->setAbsolutePath(KRString("/elsewhere"));
  EXPECT_EQ(path->absolutePath(), "/elsewhere");
  EXPECT_EQ(path->valueForKey("absolutePath"), KRValue("/elsewhere"));
  EXPECT_TRUE(recorder->events.empty());
  path->volumeDidChangeMountPoint(path->volumePrimitive());
  EXPECT_EQ(path->absolutePath(), "/media/photos/2024/trip");
  EXPECT_EQ(recorder->events, Events{"pathDidChange 2024/trip"});
}

TEST_F(KRDBPathEntityTest, WithoutAContextThereIsNoVolume) {
  const auto path = makePath();
  EXPECT_EQ(path->volume(), nullptr);
  EXPECT_FALSE(path->isAvailable());
}

TEST_F(KRDBPathEntityTest, TheVolumeIsAskedFromTheContextOnceAndListenedTo) {
  const auto context = std::make_shared<KRRecordingEntityContext>();
  context->volume = volumeEntity(5, "/media/photos", table);
  const auto path = makePath();
  path->setContext(context);
  EXPECT_EQ(path->volume(), context->volume);
  EXPECT_EQ(path->volume(), context->volume);
  EXPECT_EQ(context->calls, Events{"volumeForPath"});
  EXPECT_TRUE(context->volume->hasListener(path));
  EXPECT_EQ(path->absolutePath(), "/media/photos/2024/trip");
  EXPECT_TRUE(recorder->events.empty());
}

TEST_F(KRDBPathEntityTest, AContextWithoutVolumeIsAskedAgain) {
  const auto context = std::make_shared<KRRecordingEntityContext>();
  const auto path = makePath();
  path->setContext(context);
  EXPECT_EQ(path->volume(), nullptr);
  EXPECT_EQ(path->volume(), nullptr);
  EXPECT_EQ(context->calls, (Events{"volumeForPath", "volumeForPath"}));
}

TEST_F(KRDBPathEntityTest, AnotherVolumeMovesTheListenerAndTheLocation) {
  const auto path = pathOnMountedVolume();
  const auto first = path->volumePrimitive();
  const auto second = volumeEntity(6, "/media/other");
  path->setVolumePrimitive(second);
  EXPECT_FALSE(first->hasListener(path));
  EXPECT_TRUE(second->hasListener(path));
  EXPECT_EQ(path->absolutePath(), "2024/trip");
  EXPECT_EQ(recorder->events, Events{"pathDidChange 2024/trip"});
  path->setVolumePrimitive(second);
  EXPECT_EQ(recorder->events.size(), 1u);
  EXPECT_FALSE(path->isDbEntityChanged());
  EXPECT_EQ(record->volume_id, 0);
}

TEST_F(KRDBPathEntityTest, BindingAVolumeWritesItsIdWithoutMarkingThePathChanged) {
  const auto path = makePath();
  const auto volume = volumeEntity(42, "/media/photos");
  path->setVolume(volume);
  EXPECT_EQ(record->volume_id, 42);
  EXPECT_EQ(path->volumePrimitive(), volume);
  EXPECT_FALSE(path->isDbEntityChanged());
  EXPECT_EQ(recorder->events, (Events{"pathDidChange 2024/trip", "didChange"}));
  EXPECT_EQ(recorder->didChangeInfos, std::vector<KRDictionary>{KRDictionary({})});
  path->setVolume(volume);
  EXPECT_EQ(recorder->events.size(), 2u);
  path->setVolume(nullptr);
  EXPECT_EQ(record->volume_id, 0);
  EXPECT_FALSE(volume->hasListener(path));
}

TEST_F(KRDBPathEntityTest, ExistenceChangesAreAnnouncedOnce) {
  const auto path = makePath();
  path->setExists(true);
  EXPECT_TRUE(recorder->events.empty());
  path->setExists(false);
  EXPECT_FALSE(path->isExists());
  EXPECT_FALSE(path->isDbEntityChanged());
  EXPECT_EQ(recorder->events, Events{"pathDidChange 2024/trip"});
}

TEST_F(KRDBPathEntityTest, AMissingFolderIsUnavailableEvenOnAnAvailableVolume) {
  const auto path = pathOnMountedVolume();
  ASSERT_TRUE(path->volumePrimitive()->isAvailable());
  EXPECT_TRUE(path->isAvailable());
  path->setExists(false);
  EXPECT_FALSE(path->isAvailable());
  EXPECT_EQ(path->valueForKey("available"), KRValue(false));
}

TEST_F(KRDBPathEntityTest, TheVolumeIsTheNecessaryLink) {
  EXPECT_EQ(KRDBPath::necessaryLinkedEntitiesKeys(), Events{"volumePrimitive"});
  const auto path = makePath();
  EXPECT_TRUE(path->needFetchNecessaryEntities());
  const auto volume = volumeEntity(5, "/media/photos");
  path->updateNecessaryEntityForKey("volumePrimitive", volume);
  EXPECT_EQ(path->volumePrimitive(), volume);
  EXPECT_FALSE(path->needFetchNecessaryEntities());
  EXPECT_EQ(path->necessaryLinkedEntitiesDictionary(), KRDictionary({{"volumePrimitive", volume}}));
}

TEST_F(KRDBPathEntityTest, AVolumeThatComesOrGoesIsPassedOn) {
  const auto path = makePath();
  path->volumeDidChangeAvailability(nullptr);
  EXPECT_EQ(recorder->events, Events{"volumeDidUpdate 2024/trip"});
}

TEST_F(KRDBPathEntityTest, AVolumeMountedElsewhereReachesThePathListeners) {
  const auto path = pathOnMountedVolume();
  EXPECT_EQ(path->absolutePath(), "/media/photos/2024/trip");
  table->setMounts({photoDisk("/run/media/photos")});
  ASSERT_TRUE(waitForEvent("pathDidChange 2024/trip"));
  EXPECT_EQ(path->absolutePath(), "/run/media/photos/2024/trip");
  EXPECT_TRUE(path->volumePrimitive()->isDbEntityChanged());
  EXPECT_FALSE(path->isDbEntityChanged());
}

TEST_F(KRDBPathEntityTest, AnUnmountedAndRemountedVolumeReachesThePathListeners) {
  const auto path = pathOnMountedVolume();
  table->setMounts({});
  ASSERT_TRUE(waitForEvent("volumeDidUpdate 2024/trip"));
  EXPECT_FALSE(path->isAvailable());
  EXPECT_EQ(recorder->events, Events{"volumeDidUpdate 2024/trip"});
  recorder->events.clear();
  table->setMounts({photoDisk("/mnt/photos")});
  ASSERT_TRUE(waitForEvent("volumeDidUpdate 2024/trip"));
  EXPECT_EQ(recorder->events, (Events{"pathDidChange 2024/trip", "volumeDidUpdate 2024/trip"}));
  EXPECT_TRUE(path->isAvailable());
  EXPECT_EQ(path->absolutePath(), "/mnt/photos/2024/trip");
}

TEST_F(KRDBPathEntityTest, FieldsAreReachedByKey) {
  const auto path = makePath();
  EXPECT_EQ(path->valueForKey("path"), KRValue("2024/trip"));
  EXPECT_EQ(path->valueForKey("exists"), KRValue(true));
  EXPECT_EQ(path->valueForKey("absolutePath"), KRValue("2024/trip"));
  EXPECT_TRUE(path->valueForKey("volume").isNil());
  path->setValueForKey("2023", "path");
  path->setValueForKey(false, "exists");
  EXPECT_EQ(path->path(), "2023");
  EXPECT_FALSE(path->isExists());
  const auto volume = volumeEntity(9, "/media/photos");
  path->setValueForKey(volume, "volume");
  EXPECT_EQ(record->volume_id, 9);
  EXPECT_EQ(path->valueForKey("volumePrimitive").object(), volume);
  path->setValueForKey(KRValue(), "volumePrimitive");
  EXPECT_TRUE(path->valueForKey("volume").isNil());
  path->setValueForKey("/abs", "absolutePath");
  EXPECT_EQ(path->absolutePath(), "/abs");
}

}  // namespace
