#include <gtest/gtest.h>
#include <sqlite3.h>

#include <future>
#include <optional>
#include <thread>

#include "KRCommitCounter.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBCatalog/DBCoreUtils.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCatalog/KRDBUpdateOperation.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "dbimghistorystate.hpp"
#include "dbpath.hpp"
#include "dbreactor.hpp"
#include "dbresource.hpp"
#include "dbvolume.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

using dbcore::DBImage;
using dbcore::DBImgHistoryState;
using Reactor = KRDBCatalog::Reactor;
using EntityPtr = std::shared_ptr<KRDBEntity>;

const char* const kReplacementCharacter = "\xEF\xBF\xBD";

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(10));
}

// Holds the catalog's queue until the returned promise is fulfilled.
std::promise<void> holdQueue(KRDBCatalog& catalog) {
  std::promise<void> gate;
  catalog.performSynchronously(false, [opened = gate.get_future().share()] { opened.wait(); });
  return gate;
}

// Checks that the action raises the converted engine exception tagged with the operation's description.
template <class Action>
void expectRaisesTagged(Action&& action, const std::string& tag) {
  KRCapturingLogSink sink;
  try {
    action();
    ADD_FAILURE() << "no exception for " << tag;
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name().str().rfind("DBCore", 0), 0u) << exception.name().str();
    EXPECT_NE(exception.name().str().find(", tag:" + tag + ": "), std::string::npos)
        << exception.name().str();
    EXPECT_EQ(exception.userInfo().objectForKey(KRDBExceptionDescription), KRValue(tag));
  }
  EXPECT_EQ(sink.records().size(), 1u);
}

class KRDBCatalogStorageTest : public testing::Test {
 protected:
  void SetUp() override {
    catalog = KRDBCatalog::initWithContentsOfFile(path(), nullptr);
    ASSERT_TRUE(catalog);
    catalog->initializeAndUpdateIfNeaded();
  }

  std::string path() const { return directory.file("catalog.krcatalog"); }

  // A catalog over a second file whose schema was never made: every engine read and write fails.
  std::shared_ptr<KRDBCatalog> catalogWithoutSchema() const {
    return KRDBCatalog::initWithContentsOfFile(directory.file("empty.krcatalog"), nullptr);
  }

  // Runs engine work on the queue through the guard.
  void onEngine(const KRDBCatalog::ReactorBlock& block) const {
    catalog->performSynchronously(true, [&] { catalog->handleDBReactorBlock(block, "test", true); });
  }

  // Writes an unsaved record of any kind; its id is set.
  template <class Record>
  std::shared_ptr<Record> store(std::shared_ptr<Record> record) const {
    onEngine([&record](const Reactor& reactor) {
      *reactor << std::static_pointer_cast<dbcore::DBEntity>(record);
    });
    return record;
  }

  template <class Record>
  std::shared_ptr<Record> stored(long long id) const {
    std::shared_ptr<Record> record;
    onEngine([&](const Reactor& reactor) { record = reactor->Get<Record>(id); });
    return record;
  }

  std::shared_ptr<KRDBImage> addImage(const std::wstring& name = L"IMG_0001.CR3") const {
    auto record = std::make_shared<DBImage>();
    record->path = name;
    return KRDBImage::initWithDBEntity(store(record));
  }

  std::wstring storedImagePath(const std::shared_ptr<KRDBImage>& image) const {
    return stored<DBImage>(image->dbimage()->id())->path;
  }

  std::shared_ptr<DBImgHistoryState> addState(const std::wstring& guid) const {
    auto state = std::make_shared<DBImgHistoryState>();
    state->guid = guid;
    return store(state);
  }

  // Runs the main loop until every block the queue posted to it before now has run.
  void drain() const {
    bool drained = false;
    catalog->waitForAllDataBaseOperationsWithHandler([&drained] { drained = true; });
    ASSERT_TRUE(runMainLoopUntil([&drained] { return drained; }));
  }

  size_t pendingUpdates() const {
    std::lock_guard lock(catalog->updateOperationsLock());
    return catalog->updateOperations().count();
  }

  std::shared_ptr<KRDBUpdateOperation> pendingUpdate(const KRDBEntityIDPtr& entityID) const {
    std::lock_guard lock(catalog->updateOperationsLock());
    return std::dynamic_pointer_cast<KRDBUpdateOperation>(catalog->updateOperations().objectForKey(entityID));
  }

  KRTemporaryDirectory directory;
  std::shared_ptr<KRDBCatalog> catalog;
};

// ---- Fetch

// Fetches the stored record by identifier on the queue and checks the entity's class and record; an id
// without a record gives nil.
template <class Entity, class Record>
void expectFetched(KRDBCatalog& catalog, const std::shared_ptr<Record>& record) {
  EntityPtr fetched;
  EntityPtr missing;
  catalog.performSynchronously(true, [&] {
    fetched =
        catalog.fetchEntityWithIDSync(KRDBEntityID::initWithEntityType(Entity::entityType(), record->id()));
    missing = catalog.fetchEntityWithIDSync(
        KRDBEntityID::initWithEntityType(Entity::entityType(), record->id() + 1000));
  });
  const auto typed = std::dynamic_pointer_cast<Entity>(fetched);
  ASSERT_TRUE(typed) << Entity::entityType();
  EXPECT_EQ(typed->entityID()->dbid(), record->id());
  EXPECT_EQ(typed->entityID()->entityType(), Entity::entityType());
  EXPECT_NE(typed->dbentity(), record);
  EXPECT_FALSE(missing);
}

TEST_F(KRDBCatalogStorageTest, EveryKindOfTheTableIsFetchedByIdentifierInItsEntityClass) {
  const auto image = addImage()->dbimage();
  auto attributes = std::make_shared<dbcore::DBUserImgAttrib>();
  attributes->image_id = image->id();
  auto exiv = std::make_shared<dbcore::DBExivImgAttrib>();
  exiv->image_id = image->id();
  auto collection = std::make_shared<dbcore::DBFilter>();
  collection->name = L"Trip";
  auto folder = std::make_shared<dbcore::DBRefFolder>();
  folder->uuid = L"F";
  auto smart = std::make_shared<dbcore::DBSmartFilter>();
  smart->name = L"Five stars";
  expectFetched<KRDBImage>(*catalog, image);
  expectFetched<KRDBImageAttributes>(*catalog, store(attributes));
  expectFetched<KRDBImageExivAttributes>(*catalog, store(exiv));
  expectFetched<KRDBCollection>(*catalog, store(collection));
  expectFetched<KRDBReferencedFolder>(*catalog, store(folder));
  expectFetched<KRDBSmartFilter>(*catalog, store(smart));
}

TEST_F(KRDBCatalogStorageTest, PathsVolumesAndOtherKindsAreNotFetchedByIdentifier) {
  auto volume = std::make_shared<dbcore::DBVolume>();
  store(volume);
  auto path = std::make_shared<dbcore::DBPath>();
  path->path = L"/Photos";
  onEngine(
      [&path](const Reactor& reactor) { *reactor << std::vector<std::shared_ptr<dbcore::DBPath>>{path}; });
  ASSERT_TRUE(path->is_saved() && volume->is_saved());
  EXPECT_FALSE(catalog->fetchEntityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypePath, path->id())));
  EXPECT_FALSE(
      catalog->fetchEntityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypeVolume, volume->id())));
  const auto image = addImage();
  EXPECT_FALSE(catalog->fetchEntityWithID(
      KRDBEntityID::initWithEntityType(KRDBEntityTypeNone, image->dbimage()->id())));
  EXPECT_FALSE(catalog->fetchEntityWithID(nullptr));
  EXPECT_TRUE(catalog->fetchEntityWithID(image->entityID()));
}

TEST_F(KRDBCatalogStorageTest, TheAsynchronousFetchDeliversOnTheMainThread) {
  const auto image = addImage();
  std::optional<EntityPtr> delivered;
  bool onMain = false;
  catalog->fetchEntityWithID(
      image->entityID(),
      [&](EntityPtr entity) {
        delivered = entity;
        onMain = KRRunLoop::isMainThread();
      },
      false);
  EXPECT_FALSE(delivered);
  ASSERT_TRUE(runMainLoopUntil([&] { return delivered.has_value(); }));
  EXPECT_TRUE(onMain);
  ASSERT_TRUE(*delivered);
  EXPECT_TRUE((*delivered)->entityID()->isEqualTo(image->entityID()));
}

TEST_F(KRDBCatalogStorageTest, AFetchThatTheEngineFailsGivesNilAndLogs) {
  const auto broken = catalogWithoutSchema();
  EntityPtr delivered = addImage();
  KRCapturingLogSink sink;
  bool handled = false;
  broken->fetchEntityWithID(
      KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 1),
      [&](EntityPtr entity) {
        handled = true;
        delivered = entity;
      },
      true);
  EXPECT_TRUE(handled);
  EXPECT_FALSE(delivered);
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 2);
  EXPECT_NE(records[0].message.find(", tag:fetchEntityWithID: "), std::string::npos) << records[0].message;
  EXPECT_FALSE(broken->fetchEntityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 1)));
}

// ---- Update

TEST_F(KRDBCatalogStorageTest, AnUpdateWritesTheEntitysRecordInOneCommit) {
  const auto image = addImage();
  KRCommitCounter counter(path());
  const int64_t before = counter.commitsInLog();
  image->setName("IMG_0002.CR3");
  catalog->performSynchronously(true, [&] { catalog->updateEntitySync(image); });
  EXPECT_EQ(counter.commitsInLog() - before, 1);
  EXPECT_EQ(storedImagePath(image), L"IMG_0002.CR3");
}

TEST_F(KRDBCatalogStorageTest, AWriteTheEngineRefusesRaisesTheConvertedExceptionTaggedWithTheEntityType) {
  const auto broken = catalogWithoutSchema();
  const auto image = KRDBImage::initWithDBEntity(std::make_shared<DBImage>());
  const auto collection = KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>());
  expectRaisesTagged([&] { broken->performSynchronously(true, [&] { broken->updateEntitySync(image); }); },
                     "UpdateEntity_1");
  expectRaisesTagged(
      [&] { broken->performSynchronously(true, [&] { broken->updateEntitySync(collection); }); },
      "UpdateEntity_2");
  // A nil entity writes an empty record, which the engine refuses.
  expectRaisesTagged(
      [&] { catalog->performSynchronously(true, [&] { catalog->updateEntitySync(nullptr); }); },
      "UpdateEntity_0");
}

TEST_F(KRDBCatalogStorageTest, TwoUpdatesBeforeTheQueueRunsWriteOnceWithTheSecondSnapshot) {
  const auto image = addImage();
  KRCommitCounter counter(path());
  const int64_t before = counter.commitsInLog();
  std::promise<void> gate = holdQueue(*catalog);
  image->setName("first.CR3");
  catalog->updateEntity(image);
  const auto first = pendingUpdate(image->entityID());
  ASSERT_TRUE(first);
  EXPECT_EQ(first->name(), "updateEntity:");
  EXPECT_FALSE(first->isCancelled());
  image->setName("second.CR3");
  catalog->updateEntity(image);
  // The snapshot was taken at the call: later changes of the entity are not written.
  image->setName("third.CR3");
  EXPECT_TRUE(first->isCancelled());
  const auto second = pendingUpdate(image->entityID());
  ASSERT_TRUE(second);
  EXPECT_NE(second, first);
  EXPECT_EQ(pendingUpdates(), 1u);
  gate.set_value();
  drain();
  EXPECT_EQ(counter.commitsInLog() - before, 1);
  EXPECT_EQ(storedImagePath(image), L"second.CR3");
  EXPECT_FALSE(second->isCancelled());
  EXPECT_EQ(pendingUpdates(), 0u);
}

TEST_F(KRDBCatalogStorageTest, UpdatesOfDifferentEntitiesAreEachWritten) {
  const auto a = addImage(L"a.CR3");
  const auto b = addImage(L"b.CR3");
  std::promise<void> gate = holdQueue(*catalog);
  a->setName("a2.CR3");
  b->setName("b2.CR3");
  catalog->updateEntity(a);
  catalog->updateEntity(b);
  catalog->updateEntity(nullptr);
  EXPECT_EQ(pendingUpdates(), 2u);
  gate.set_value();
  drain();
  EXPECT_EQ(storedImagePath(a), L"a2.CR3");
  EXPECT_EQ(storedImagePath(b), L"b2.CR3");
  EXPECT_EQ(pendingUpdates(), 0u);
}

TEST_F(KRDBCatalogStorageTest, UpdatesFromAnotherThreadRaceTheQueueAndTheLastSnapshotWins) {
  const auto image = addImage();
  std::vector<EntityPtr> snapshots;
  for (int index = 0; index < 20; ++index) {
    const auto copy = std::static_pointer_cast<KRDBImage>(image->copyEntity());
    copy->setName(KRString("IMG_" + std::to_string(index)));
    snapshots.push_back(copy);
  }
  std::thread caller([&] {
    for (const auto& snapshot : snapshots) catalog->updateEntity(snapshot);
  });
  caller.join();
  drain();
  EXPECT_EQ(storedImagePath(image), L"IMG_19");
  EXPECT_EQ(pendingUpdates(), 0u);
}

TEST_F(KRDBCatalogStorageTest, UpdatesOfAHundredEntitiesCostOneCommit) {
  KRDBEntityArray images;
  for (int index = 0; index < 100; ++index) {
    const auto image = addImage();
    image->setName(KRString("renamed_" + std::to_string(index)));
    images.push_back(image);
  }
  KRCommitCounter counter(path());
  const int64_t before = counter.commitsInLog();
  catalog->performSynchronously(true, [&] { catalog->updateEntitiesSync(images); });
  EXPECT_EQ(counter.commitsInLog() - before, 1);
  EXPECT_TRUE(counter.changedSinceLastLook());
  EXPECT_EQ(storedImagePath(std::static_pointer_cast<KRDBImage>(images[0])), L"renamed_0");
  EXPECT_EQ(storedImagePath(std::static_pointer_cast<KRDBImage>(images[99])), L"renamed_99");
}

TEST_F(KRDBCatalogStorageTest, AFailingWriteAmongSeveralKeepsTheEarlierWritesAndRaises) {
  const auto a = addImage(L"a.CR3");
  const auto b = addImage(L"b.CR3");
  a->setName("a2.CR3");
  b->setName("b2.CR3");
  KRCommitCounter counter(path());
  const int64_t before = counter.commitsInLog();
  expectRaisesTagged(
      [&] { catalog->performSynchronously(true, [&] {
              catalog->updateEntitiesSync({a, nullptr, b});
            }); },
      "UpdateEntity_0");
  EXPECT_EQ(counter.commitsInLog() - before, 1);
  EXPECT_EQ(storedImagePath(a), L"a2.CR3");
  EXPECT_EQ(storedImagePath(b), L"b.CR3");
}

TEST_F(KRDBCatalogStorageTest, UpdatesOfAClosedCatalogAreEachLoggedWithoutRaising) {
  const auto a = addImage(L"a.CR3");
  const auto b = addImage(L"b.CR3");
  catalog->forceCloseDB();
  KRCapturingLogSink sink;
  catalog->performSynchronously(true, [&] { catalog->updateEntitiesSync({a, b}); });
  EXPECT_EQ(sink.messages(), (std::vector<std::string>{"KRDBCatalog.dbReactor is nullptr",
                                                       "KRDBCatalog.dbReactor is nullptr"}));
}

TEST_F(KRDBCatalogStorageTest, UpdateEntitiesWritesSnapshotsOfTheChangedOnesAndMarksThemUnchanged) {
  const auto changed = addImage(L"a.CR3");
  const auto unchanged = addImage(L"b.CR3");
  changed->setName("a2.CR3");
  // A record change made behind the entity's setters leaves it unchanged: it must not be written.
  unchanged->dbimage()->path = L"b2.CR3";
  std::promise<void> gate = holdQueue(*catalog);
  catalog->updateEntities({changed, unchanged, nullptr});
  EXPECT_FALSE(changed->isDbEntityChanged());
  changed->setName("a3.CR3");
  gate.set_value();
  drain();
  EXPECT_EQ(storedImagePath(changed), L"a2.CR3");
  EXPECT_EQ(storedImagePath(unchanged), L"b.CR3");
}

TEST_F(KRDBCatalogStorageTest, UpdateEntitiesWithNoChangedEntityQueuesNothing) {
  const auto image = addImage();
  image->dbimage()->path = L"behind.CR3";
  KRCommitCounter counter(path());
  catalog->updateEntities({image});
  catalog->updateEntities({});
  drain();
  EXPECT_FALSE(counter.changedSinceLastLook());
  EXPECT_EQ(storedImagePath(image), L"IMG_0001.CR3");
}

// ---- Deletion

TEST_F(KRDBCatalogStorageTest, EveryKindOfTheTableIsDeleted) {
  const auto image = addImage();
  const auto other = addImage(L"other.CR3");
  auto attributesRecord = std::make_shared<dbcore::DBUserImgAttrib>();
  attributesRecord->image_id = other->dbimage()->id();
  const auto attributes = KRDBImageAttributes::initWithDBEntity(store(attributesRecord));
  const auto collection = KRDBCollection::initWithDBEntity(store(std::make_shared<dbcore::DBFilter>()));
  const auto folder = KRDBReferencedFolder::initWithDBEntity(store(std::make_shared<dbcore::DBRefFolder>()));
  auto aliasRecord = std::make_shared<dbcore::DBEntityFavoriteAlias>();
  aliasRecord->orig_type = dbcore::kDBImageType;
  aliasRecord->orig_id = other->dbimage()->id();
  const auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(store(aliasRecord));
  catalog->performSynchronously(true, [&] {
    for (const EntityPtr& entity : std::vector<EntityPtr>{image, attributes, collection, folder, alias})
      catalog->deleteEntitySync(entity);
  });
  EXPECT_FALSE(stored<DBImage>(image->dbimage()->id()));
  EXPECT_FALSE(stored<dbcore::DBUserImgAttrib>(attributesRecord->id()));
  EXPECT_FALSE(stored<dbcore::DBFilter>(collection->dbentity()->id()));
  EXPECT_FALSE(stored<dbcore::DBRefFolder>(folder->dbentity()->id()));
  std::shared_ptr<dbcore::DBEntityFavoriteAlias> remainingAlias;
  onEngine([&](const Reactor& reactor) {
    remainingAlias =
        reactor->GetBy<dbcore::DBEntityFavoriteAlias>(std::shared_ptr<dbcore::DBEntity>(other->dbimage()));
  });
  EXPECT_FALSE(remainingAlias);
  EXPECT_TRUE(stored<DBImage>(other->dbimage()->id()));
}

TEST_F(KRDBCatalogStorageTest, DeletingAKindOutsideTheTableDoesNothing) {
  const auto image = addImage();
  auto exivRecord = std::make_shared<dbcore::DBExivImgAttrib>();
  exivRecord->image_id = image->dbimage()->id();
  const auto exiv = KRDBImageExivAttributes::initWithDBEntity(store(exivRecord));
  const auto smart = KRDBSmartFilter::initWithDBEntity(store(std::make_shared<dbcore::DBSmartFilter>()));
  KRCommitCounter counter(path());
  catalog->performSynchronously(true, [&] {
    catalog->deleteEntitySync(exiv);
    catalog->deleteEntitySync(smart);
    catalog->deleteEntitySync(nullptr);
  });
  EXPECT_FALSE(counter.changedSinceLastLook());
  EXPECT_TRUE(stored<dbcore::DBExivImgAttrib>(exivRecord->id()));
  EXPECT_TRUE(stored<dbcore::DBSmartFilter>(smart->dbentity()->id()));
}

TEST_F(KRDBCatalogStorageTest, ImagesAreDeletedTogetherInOneCommit) {
  const auto a = addImage(L"a.CR3");
  const auto b = addImage(L"b.CR3");
  const auto kept = addImage(L"c.CR3");
  KRCommitCounter counter(path());
  const int64_t before = counter.commitsInLog();
  catalog->performSynchronously(true, [&] { catalog->deleteImagesSync({a, b}); });
  EXPECT_EQ(counter.commitsInLog() - before, 1);
  EXPECT_FALSE(stored<DBImage>(a->dbimage()->id()));
  EXPECT_FALSE(stored<DBImage>(b->dbimage()->id()));
  EXPECT_TRUE(stored<DBImage>(kept->dbimage()->id()));
}

TEST_F(KRDBCatalogStorageTest, QueuedDeletionsRunLater) {
  const auto image = addImage(L"a.CR3");
  const auto images = KRDBEntityArray{addImage(L"b.CR3"), addImage(L"c.CR3")};
  std::promise<void> gate = holdQueue(*catalog);
  catalog->deleteEntity(image);
  catalog->deleteImages(images);
  gate.set_value();
  drain();
  EXPECT_FALSE(stored<DBImage>(image->dbimage()->id()));
  for (const auto& deleted : images) EXPECT_FALSE(stored<DBImage>(deleted->dbentity()->id()));
}

TEST_F(KRDBCatalogStorageTest, DeletionsTheEngineRefusesRaiseTaggedExceptions) {
  const auto broken = catalogWithoutSchema();
  const auto image = KRDBImage::initWithDBEntity(std::make_shared<DBImage>());
  const std::vector<std::pair<EntityPtr, std::string>> rows = {
      {image, "RemoveDBImage"},
      {KRDBCollection::initWithDBEntity(std::make_shared<dbcore::DBFilter>()), "RemoveDBFilter"},
      {KRDBReferencedFolder::initWithDBEntity(std::make_shared<dbcore::DBRefFolder>()), "RemoveDBRefFolder"},
      {KRDBImageAttributes::initWithDBEntity(std::make_shared<dbcore::DBUserImgAttrib>()),
       "RemoveDBAttributes"},
      {KRDBEntityFavoriteAlias::initWithDBEntity(std::make_shared<dbcore::DBEntityFavoriteAlias>()),
       "RemoveDBFavAlias"},
  };
  for (const auto& [entity, tag] : rows)
    expectRaisesTagged([&] { broken->performSynchronously(true, [&] { broken->deleteEntitySync(entity); }); },
                       tag);
  expectRaisesTagged([&] { broken->performSynchronously(true, [&] { broken->deleteImagesSync({image}); }); },
                     "RemoveImage");
}

// ---- Dangling records

std::vector<KRString> danglingStates(KRDBCatalog& catalog) {
  return catalog.performOperationAndWait<std::vector<KRString>>(
      [](KRDBCatalog& self) { return self.fetchUUIDsOfDanglingStatesSync(); });
}

std::vector<KRString> danglingResources(KRDBCatalog& catalog) {
  return catalog.performOperationAndWait<std::vector<KRString>>(
      [](KRDBCatalog& self) { return self.fetchNamesOfDanglingHistoryResourcesSync(); });
}

TEST_F(KRDBCatalogStorageTest, DanglingStatesAndResourcesAreListedAndCleared) {
  const auto image = addImage();
  const auto kept = addState(L"kept");
  addState(L"dangling-1");
  const auto bound = addState(L"dangling-2");
  onEngine([&](const Reactor& reactor) {
    reactor->SetStatesByVector<DBImage, DBImgHistoryState>({{image->dbimage(), {{kept}, 0}}});
    reactor->BindStateWithResources(kept, {L"kept.dat"});
    reactor->BindStateWithResources(bound, {L"left.dat"});
  });
  EXPECT_EQ(danglingStates(*catalog), (std::vector<KRString>{"dangling-1", "dangling-2"}));
  EXPECT_TRUE(danglingResources(*catalog).empty());
  catalog->performSynchronously(true, [&] { catalog->deleteDanglingHistoryStatesSync(); });
  EXPECT_TRUE(danglingStates(*catalog).empty());
  EXPECT_EQ(danglingResources(*catalog), std::vector<KRString>{"left.dat"});
  catalog->performSynchronously(true, [&] { catalog->deleteDanglingHistoryResourcesSync(); });
  EXPECT_TRUE(danglingResources(*catalog).empty());
  std::vector<std::shared_ptr<DBImgHistoryState>> states;
  onEngine([&](const Reactor& reactor) {
    states = reactor->GetStates<DBImage, DBImgHistoryState>(image->dbimage());
  });
  ASSERT_EQ(states.size(), 1u);
  EXPECT_EQ(states[0]->guid, L"kept");
}

TEST_F(KRDBCatalogStorageTest, DanglingPathsAreCleared) {
  auto dangling = std::make_shared<dbcore::DBPath>();
  dangling->path = L"/Empty";
  auto used = std::make_shared<dbcore::DBPath>();
  used->path = L"/Photos";
  const auto image = addImage();
  onEngine([&](const Reactor& reactor) {
    *reactor << std::vector<std::shared_ptr<dbcore::DBPath>>{dangling, used};
    *reactor << std::vector<std::pair<std::shared_ptr<dbcore::DBPath>, std::shared_ptr<DBImage>>>{
        {used, image->dbimage()}};
  });
  catalog->performSynchronously(true, [&] { catalog->deleteDanglingPathesSync(); });
  EXPECT_FALSE(stored<dbcore::DBPath>(dangling->id()));
  EXPECT_TRUE(stored<dbcore::DBPath>(used->id()));
}

// No guid can fail to convert: the engine reads invalid UTF-8 as U+FFFD and writes a lone surrogate as
// U+FFFD, so a state whose stored guid is not valid text is listed with replacement characters.
TEST_F(KRDBCatalogStorageTest, ADanglingStateWithInvalidTextInItsGuidIsListedWithReplacementCharacters) {
  addState(std::wstring(1, static_cast<wchar_t>(0xD800)));
  const auto raw = addState(L"raw");
  sqlite3* db = nullptr;
  ASSERT_EQ(sqlite3_open(path().c_str(), &db), SQLITE_OK);
  const std::string sql =
      "UPDATE image_history_states SET guid_wide_ch = CAST(X'FF41' AS TEXT) WHERE _id_int_64 = " +
      std::to_string(raw->id());
  EXPECT_EQ(sqlite3_exec(db, sql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK);
  sqlite3_close(db);
  EXPECT_EQ(danglingStates(*catalog),
            (std::vector<KRString>{kReplacementCharacter, std::string(kReplacementCharacter) + "A"}));
}

TEST_F(KRDBCatalogStorageTest, ClearingsTheEngineRefusesRaiseTaggedExceptions) {
  const auto broken = catalogWithoutSchema();
  const std::vector<std::pair<void (KRDBCatalog::*)(), std::string>> rows = {
      {&KRDBCatalog::deleteDanglingPathesSync, "ClearDanglingPaths"},
      {&KRDBCatalog::deleteDanglingHistoryStatesSync, "ClearDanglingHistoryStates"},
      {&KRDBCatalog::deleteDanglingHistoryResourcesSync, "ClearDanglingHistoryResourcesSync"},
  };
  for (const auto& [clear, tag] : rows)
    expectRaisesTagged([&] { broken->performSynchronously(true, [&] { ((*broken).*clear)(); }); }, tag);
}

TEST_F(KRDBCatalogStorageTest, AClosedCatalogListsNoDanglingRecordsAndFetchesNothing) {
  addState(L"dangling");
  catalog->forceCloseDB();
  EXPECT_TRUE(catalog->fetchUUIDsOfDanglingStatesSync().empty());
  EXPECT_TRUE(catalog->fetchNamesOfDanglingHistoryResourcesSync().empty());
  EXPECT_FALSE(catalog->fetchEntityWithIDSync(KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 1)));
}

// ---- Asynchronous forms

// Calls every asynchronous form with a handler once; each handler counts itself and whether it ran off
// the main thread.
struct HandledCalls {
  static constexpr int kCount = 6;
  int handled = 0;
  int offMain = 0;
  std::vector<KRString> uuids;

  void note() {
    ++handled;
    if (!KRRunLoop::isMainThread()) ++offMain;
  }
  void callAll(KRDBCatalog& catalog, const KRDBEntityIDPtr& entityID, bool sync) {
    catalog.fetchEntityWithID(
        entityID, [this](EntityPtr) { note(); }, sync);
    catalog.fetchUUIDsOfDanglingStatesWithHandler(
        [this](std::vector<KRString> list) {
          uuids = std::move(list);
          note();
        },
        sync);
    catalog.fetchNamesOfDanglingHistoryResourcesWithHandler([this](std::vector<KRString>) { note(); }, sync);
    catalog.deleteDanglingDBPathesWithHandler([this] { note(); }, sync);
    catalog.deleteDanglingHistoryStatesWithHandler([this] { note(); }, sync);
    catalog.deleteDanglingHistoryResourcesWithHandler([this] { note(); }, sync);
  }
};

TEST_F(KRDBCatalogStorageTest, AsynchronousFormsDeliverOnTheMainThreadAfterTheQueueRan) {
  const auto image = addImage();
  addState(L"dangling");
  HandledCalls calls;
  calls.callAll(*catalog, image->entityID(), false);
  EXPECT_EQ(calls.handled, 0);
  ASSERT_TRUE(runMainLoopUntil([&] { return calls.handled == HandledCalls::kCount; }));
  EXPECT_EQ(calls.offMain, 0);
  EXPECT_EQ(calls.uuids, std::vector<KRString>{"dangling"});
  EXPECT_TRUE(danglingStates(*catalog).empty());
}

TEST_F(KRDBCatalogStorageTest, SynchronousFormsCallTheirHandlersOnTheQueueBeforeReturning) {
  const auto image = addImage();
  HandledCalls calls;
  calls.callAll(*catalog, image->entityID(), true);
  EXPECT_EQ(calls.handled, HandledCalls::kCount);
  EXPECT_EQ(calls.offMain, HandledCalls::kCount);
}

TEST_F(KRDBCatalogStorageTest, AfterClosingNoOperationRunsAndNoHandlerIsCalled) {
  const auto image = addImage();
  addState(L"dangling");
  image->setName("renamed.CR3");
  bool closed = false;
  catalog->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  HandledCalls calls;
  calls.callAll(*catalog, image->entityID(), false);
  calls.callAll(*catalog, image->entityID(), true);
  catalog->updateEntity(image);
  catalog->updateEntities({image});
  catalog->deleteEntity(image);
  catalog->deleteImages({image});
  EXPECT_FALSE(catalog->fetchEntityWithID(image->entityID()));
  EXPECT_TRUE(image->isDbEntityChanged());
  EXPECT_EQ(pendingUpdates(), 0u);
  ASSERT_TRUE(runMainLoopUntil([&] { return closed; }));
  // Everything the queue could still post has been delivered once this handler ran.
  drain();
  EXPECT_EQ(calls.handled, 0);
  const auto reopened = KRDBCatalog::initWithContentsOfFile(path(), nullptr);
  ASSERT_TRUE(reopened);
  const auto fetched = std::dynamic_pointer_cast<KRDBImage>(reopened->fetchEntityWithID(image->entityID()));
  ASSERT_TRUE(fetched);
  EXPECT_EQ(fetched->dbimage()->path, L"IMG_0001.CR3");
  EXPECT_EQ(danglingStates(*reopened), std::vector<KRString>{"dangling"});
}

}  // namespace
