#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

#include <gtest/gtest.h>

#include "KREntityClassChecks.hpp"
#include "KREntityObserverRecorder.hpp"
#include "KRRecordPropertyChecks.hpp"
#include "KRRecordingEntityContext.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolderObserver.hpp"
#include "dbpath.hpp"

namespace {

using Checks = KREntityClassChecks<KRDBReferencedFolder, dbcore::DBRefFolder, dbcore::DBPath>;

TEST(KRDBReferencedFolderTest, TypeNumbers) {
  EXPECT_EQ(KRDBReferencedFolder::entityType(), 3);
  EXPECT_EQ(KRDBReferencedFolder::dbEntityType(), 7);
}

TEST(KRDBReferencedFolderTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBReferencedFolderTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBReferencedFolderTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBReferencedFolderTest, NoRecordOrAForeignRecordIsRefused) { Checks::expectForeignRecordsRefused(); }

// Records what a referenced folder tells its observers.
class FolderObserverRecorder : public KRObject, public KRDBReferencedFolderObserver {
 public:
  void refFolderPathDidChange(const std::shared_ptr<KRDBReferencedFolder>& folder) override {
    events.push_back("refFolderPathDidChange");
    folders.push_back(folder);
  }
  void refFolderVolumeDidUpdate(const std::shared_ptr<KRDBReferencedFolder>& folder) override {
    events.push_back("refFolderVolumeDidUpdate");
    folders.push_back(folder);
  }
  std::vector<std::string> events;
  std::vector<std::shared_ptr<KRDBReferencedFolder>> folders;
};

std::shared_ptr<KRDBPath> pathEntity(const std::wstring& path) {
  auto record = std::make_shared<dbcore::DBPath>();
  record->set_id(40);
  record->path = path;
  return KRDBPath::initWithDBEntity(record);
}

std::shared_ptr<KRDBReferencedFolder> folderOver(const std::wstring& path,
                                                 const std::wstring& uuid = L"U-1") {
  auto record = std::make_shared<dbcore::DBRefFolder>();
  record->set_id(12);
  record->uuid = uuid;
  record->path_id = 40;
  record->order = 1.5f;
  const auto folder = KRDBReferencedFolder::initWithDBEntity(record);
  folder->setDbPath(pathEntity(path));
  return folder;
}

std::shared_ptr<KRDBReferencedFolder> tripFolder() { return folderOver(L"/Volumes/Photos/2024/Trip"); }

class KRDBReferencedFolderBehaviourTest : public testing::Test {
 protected:
  void SetUp() override { KRDBEntityClasses::registerAll(); }
  // A folder with two child folders that its context answers.
  void makeTree() {
    first = folderOver(L"/Volumes/Photos/2024/Trip/Day1");
    second = folderOver(L"/Volumes/Photos/2024/Trip/Day2");
    context->childs = {first, second};
    folder->setContext(context);
  }
  std::shared_ptr<KRDBReferencedFolder> folder = tripFolder();
  std::shared_ptr<KRRecordingEntityContext> context = std::make_shared<KRRecordingEntityContext>();
  std::shared_ptr<KRDBReferencedFolder> first, second;
};

TEST_F(KRDBReferencedFolderBehaviourTest, TheRecordGivesUuidPathIdAndOrder) {
  EXPECT_EQ(folder->uuid(), KRString("U-1"));
  EXPECT_EQ(folder->idPath(), 40);
  EXPECT_EQ(folder->order(), 1.5);
  EXPECT_EQ(folder->dbfilter(), folder->dbentity());
}

TEST_F(KRDBReferencedFolderBehaviourTest, NameAndPathComeFromThePath) {
  EXPECT_EQ(folder->name(), KRString("Trip"));
  EXPECT_EQ(folder->path(), KRString("/Volumes/Photos/2024/Trip"));
  EXPECT_EQ(folder->valueForKey("name"), KRValue("Trip"));
  EXPECT_EQ(folder->valueForKey("path"), KRValue("/Volumes/Photos/2024/Trip"));
  folder->setDbPath(pathEntity(L"/Volumes/Photos/Other"));
  EXPECT_EQ(folder->name(), KRString("Other"));
  folder->setDbPath(nullptr);
  EXPECT_TRUE(folder->name().isNil());
  EXPECT_TRUE(folder->path().isNil());
}

TEST_F(KRDBReferencedFolderBehaviourTest, ExistenceAndAvailabilityAreThoseOfThePath) {
  EXPECT_TRUE(folder->isExists());
  EXPECT_FALSE(folder->isAvailable());
  folder->dbPath()->setExists(false);
  EXPECT_FALSE(folder->isExists());
  EXPECT_EQ(folder->valueForKey("exists"), KRValue(false));
  folder->setDbPath(nullptr);
  EXPECT_FALSE(folder->isExists());
  EXPECT_FALSE(folder->isAvailable());
}

TEST_F(KRDBReferencedFolderBehaviourTest, SetExistsChangesTheWholeSubtree) {
  makeTree();
  folder->setExists(false);
  EXPECT_FALSE(folder->dbPath()->isExists());
  EXPECT_FALSE(first->isExists());
  EXPECT_FALSE(second->isExists());
  EXPECT_EQ(context->calls, std::vector<std::string>{"childsOfFilter"});
}

TEST_F(KRDBReferencedFolderBehaviourTest, SetExistsWithTheCurrentValueDoesNothing) {
  makeTree();
  second->dbPath()->setExists(false);
  const auto observer = std::make_shared<FolderObserverRecorder>();
  folder->addListener(observer);
  folder->setExists(true);
  EXPECT_TRUE(folder->isExists());
  EXPECT_FALSE(second->isExists());
  EXPECT_TRUE(context->calls.empty());
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBReferencedFolderBehaviourTest, TheOrderFollowsTheSetterProtocol) {
  expectSetterProtocol<KRDBReferencedFolder>(
      &tripFolder,
      {{"order", "kKRDBBaseFolderDidChangeOrder", [](KRDBReferencedFolder& f) { f.setOrder(0.1); },
        [](const KRDBReferencedFolder& f) { return f.dbfilter()->order == 0.1f; },
        [](KRDBReferencedFolder& f) { f.setOrder(0.1); }}});
}

TEST_F(KRDBReferencedFolderBehaviourTest, AnEmptyUuidIsMadeOnFirstReadAndKept) {
  const auto fresh = folderOver(L"/Volumes/Photos/New", L"");
  const auto observer = KREntityObserverRecorder::observing(*fresh);
  const KRString uuid = fresh->uuid();
  EXPECT_EQ(uuid.length(), 36u);
  EXPECT_EQ(fresh->dbfilter()->uuid, uuid.krs_wstring());
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBReferencedFolderDidChangeUuid", true}}));
  EXPECT_STREQ(kKRDBReferencedFolderDidChangeUuid, "kKRDBReferencedFolderDidChangeUuid");
  EXPECT_TRUE(fresh->isDbEntityChanged());
  observer->events.clear();
  EXPECT_EQ(fresh->uuid(), uuid);
  EXPECT_EQ(fresh->uuid(), uuid);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBReferencedFolderBehaviourTest, AStoredUuidIsReadWithoutChange) {
  const auto observer = KREntityObserverRecorder::observing(*folder);
  EXPECT_EQ(folder->uuid(), KRString("U-1"));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(folder->isDbEntityChanged());
}

TEST_F(KRDBReferencedFolderBehaviourTest, ThePathIsANecessaryLink) {
  EXPECT_EQ(KRDBReferencedFolder::necessaryLinkedEntitiesKeys(),
            (std::vector<std::string>{"attributesPrimitive", "dbPath"}));
  const auto bare = KRDBReferencedFolder::initWithDBEntity(std::make_shared<dbcore::DBRefFolder>());
  EXPECT_TRUE(bare->needFetchNecessaryEntities());
  const auto path = pathEntity(L"/a");
  bare->updateNecessaryEntityForKey("dbPath", path);
  EXPECT_EQ(bare->dbPath(), path);
  EXPECT_TRUE(path->hasListener(bare));
  EXPECT_EQ(bare->necessaryLinkedEntitiesDictionary(), KRDictionary({{"dbPath", KRValue(path)}}));
}

TEST_F(KRDBReferencedFolderBehaviourTest, SetDbPathMovesTheListenerRegistration) {
  const auto old = folder->dbPath();
  EXPECT_TRUE(old->hasListener(folder));
  const auto replacement = pathEntity(L"/b");
  folder->setDbPath(replacement);
  EXPECT_FALSE(old->hasListener(folder));
  EXPECT_TRUE(replacement->hasListener(folder));
  const auto observer = std::make_shared<FolderObserverRecorder>();
  folder->addListener(observer);
  old->setExists(false);
  EXPECT_TRUE(observer->events.empty());
  replacement->setExists(false);
  EXPECT_EQ(observer->events, std::vector<std::string>{"refFolderPathDidChange"});
  EXPECT_EQ(observer->folders[0], folder);
}

TEST_F(KRDBReferencedFolderBehaviourTest, PathNotificationsArePassedOn) {
  const auto observer = std::make_shared<FolderObserverRecorder>();
  folder->addListener(observer);
  folder->pathDidChange(folder->dbPath());
  folder->volumeDidUpdate(folder->dbPath());
  EXPECT_EQ(observer->events,
            (std::vector<std::string>{"refFolderPathDidChange", "refFolderVolumeDidUpdate"}));
  EXPECT_EQ(observer->folders[1], folder);
}

TEST_F(KRDBReferencedFolderBehaviourTest, TheDeletionKeyIsTypeAndPath) {
  EXPECT_EQ(folder->markedToDeleteHashKey(), KRString("3-/Volumes/Photos/2024/Trip"));
  EXPECT_EQ(folder->markedToDeleteHashKey(), KRDBEntity::markedToDeleteHashKeyForEntityType(
                                                 3, {{"DBPathInfoPath", "/Volumes/Photos/2024/Trip"}}));
  folder->setDbPath(nullptr);
  EXPECT_TRUE(folder->markedToDeleteHashKey().isNil());
}

TEST_F(KRDBReferencedFolderBehaviourTest, ImagesAreAddedThroughTheContextUnlessNone) {
  folder->setContext(context);
  folder->addImages({});
  EXPECT_TRUE(context->calls.empty());
  const std::shared_ptr<KRDBEntity> image = pathEntity(L"/c");
  folder->addImages({image});
  folder->removeImages({image});
  EXPECT_EQ(context->calls, std::vector<std::string>{"addImages:toReferencedFolder:"});
  EXPECT_EQ(context->changedEntities[0], KRDBEntitySet{image});
  EXPECT_EQ(context->changedFolders[0], folder);
}

TEST_F(KRDBReferencedFolderBehaviourTest, ResetToDefaultStateResetsTheSubtree) {
  makeTree();
  folder->setMarkedToDelete(true);
  first->setMarkedToDelete(true);
  second->setMarkedToDelete(true);
  folder->resetToDefaultState();
  EXPECT_FALSE(folder->isMarkedToDelete());
  EXPECT_FALSE(first->isMarkedToDelete());
  EXPECT_FALSE(second->isMarkedToDelete());
}

TEST_F(KRDBReferencedFolderBehaviourTest, FieldsAreReachedByKey) {
  EXPECT_EQ(folder->valueForKey("idPath"), KRValue(int64_t{40}));
  EXPECT_EQ(folder->valueForKey("uuid"), KRValue("U-1"));
  EXPECT_EQ(folder->valueForKey("dbPath").object(), folder->dbPath());
  EXPECT_EQ(folder->valueForKey("isAvailable"), KRValue(false));
  folder->setValueForKey(false, "exists");
  EXPECT_FALSE(folder->dbPath()->isExists());
  folder->setValueForKey(2.0, "order");
  EXPECT_EQ(folder->dbfilter()->order, 2.0f);
}

}  // namespace
