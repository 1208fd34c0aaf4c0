#include "Model/KRDBCatalog/KRDBCatalog.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <optional>
#include <stdexcept>
#include <thread>

#include "DBCoreWrapper.hpp"
#include "KRFoundation/KRDispatchQueue.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "Model/KRDBCatalog/DBCoreUtils.hpp"
#include "Support/KRIncompatibleAppVersionError.hpp"
#include "dbexception.hpp"
#include "dbfilter.hpp"
#include "dbimage.hpp"
#include "dbreactor.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

using dbcore::DBImage;
using dbcore::DBReactor;
using Reactor = KRDBCatalog::Reactor;

const char* const kCatalogSource = "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBCatalog/KRDBCatalog";

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(10));
}

// Runs the main loop until every block that the queue posted to it before now has run.
void drainCatalog(const std::shared_ptr<KRDBCatalog>& catalog) {
  bool drained = false;
  catalog->waitForAllDataBaseOperationsWithHandler([&drained] { drained = true; });
  ASSERT_TRUE(runMainLoopUntil([&drained] { return drained; }));
}

// A gate that holds the catalog's queue until it is opened.
class QueueGate {
 public:
  void hold(KRDBCatalog& catalog) {
    catalog.performSynchronously(false, [this] {
      std::unique_lock lock(mutex_);
      condition_.wait(lock, [this] { return open_; });
    });
  }
  void open() {
    std::lock_guard lock(mutex_);
    open_ = true;
    condition_.notify_all();
  }

 private:
  std::mutex mutex_;
  std::condition_variable condition_;
  bool open_ = false;
};

class KRDBCatalogTest : public testing::Test {
 protected:
  std::string catalogPath(const std::string& name = "catalog.krcatalog") const {
    return directory.file(name);
  }

  std::shared_ptr<KRDBCatalog> open(const std::string& path, KRErrorPtr* error = nullptr) {
    return KRDBCatalog::initWithContentsOfFile(path, error);
  }

  std::shared_ptr<KRDBCatalog> openInitialized(const std::string& path) {
    auto catalog = open(path);
    if (catalog && catalog->needUpdate()) catalog->initializeAndUpdateIfNeaded();
    return catalog;
  }

  // Runs engine work on the catalog's queue through the guard.
  static void onEngine(KRDBCatalog& catalog, const KRDBCatalog::ReactorBlock& block) {
    catalog.performSynchronously(true, [&] { catalog.handleDBReactorBlock(block, "test", true); });
  }

  static void addImage(KRDBCatalog& catalog) {
    onEngine(catalog, [](const Reactor& reactor) {
      auto image = std::make_shared<DBImage>();
      image->path = L"IMG_0001.CR3";
      *reactor << image;
    });
  }

  static unsigned long long imageCount(KRDBCatalog& catalog) {
    unsigned long long count = 0;
    onEngine(catalog, [&count](const Reactor& reactor) { count = reactor->Count<DBImage>(); });
    return count;
  }

  KRTemporaryDirectory directory;
};

// ---- Opening

TEST_F(KRDBCatalogTest, ANewFileNeedsAnUpdateAndItsSchemaIsTooOldForAProductVersion) {
  const auto catalog = open(catalogPath());
  ASSERT_TRUE(catalog);
  EXPECT_TRUE(catalog->needUpdate());
  EXPECT_EQ(catalog->dbProductVersion(), -1);
  EXPECT_EQ(catalog->getDBProductVersion(), -1);
  catalog->initializeAndUpdateIfNeaded();
  EXPECT_FALSE(catalog->needUpdate());
  EXPECT_FALSE(catalog->containsUserData());
}

TEST_F(KRDBCatalogTest, AnInitializedFileIsCurrent) {
  openInitialized(catalogPath())->forceCloseDB();
  const auto catalog = open(catalogPath());
  ASSERT_TRUE(catalog);
  EXPECT_FALSE(catalog->needUpdate());
  EXPECT_EQ(catalog->dbProductVersion(), 0);
}

TEST_F(KRDBCatalogTest, AnIncompatibleFileGivesNilAndTheIncompatibilityError) {
  DBReactor other(6);
  ASSERT_EQ(other.Open(KRString(catalogPath()).krs_wstring(), L""), dbcore::kDBOpenNeedsUpdate);
  other.Initialize();
  other.Close();
  KRErrorPtr error;
  EXPECT_FALSE(open(catalogPath(), &error));
  ASSERT_TRUE(error);
  EXPECT_EQ(error->domain(), KRString("KRCatalogErrorDomain"));
  EXPECT_EQ(error->code(), 1);
  EXPECT_EQ(error->userInfo(), kr_incompatibleAppVersion()->userInfo());
  EXPECT_FALSE(open(catalogPath(), nullptr));
}

TEST_F(KRDBCatalogTest, AFileThatCannotBeOpenedGivesNilAndLeavesTheErrorUntouched) {
  std::ofstream(catalogPath())
      << "Not a catalog: only text, long enough to fill the header of a database file. "
         "More text, more text, more text, more text, more text, more text.";
  const KRErrorPtr sentinel = KRError::errorWithDomain("sentinel", 42);
  KRErrorPtr error = sentinel;
  EXPECT_FALSE(open(catalogPath(), &error));
  EXPECT_EQ(error, sentinel);
  error = nullptr;
  EXPECT_FALSE(open(directory.file("missing-folder/catalog.krcatalog"), &error));
  EXPECT_FALSE(error);
}

TEST_F(KRDBCatalogTest, ANilPathIsTheEmptyPathWhichCannotBeOpened) {
  KRErrorPtr error;
  EXPECT_FALSE(KRDBCatalog::initWithContentsOfFile(KRString(), &error));
  EXPECT_FALSE(KRDBCatalog::initWithContentsOfFile("", &error));
  EXPECT_FALSE(error);
}

TEST_F(KRDBCatalogTest, TheApplicationIdentityIsFive) {
  EXPECT_EQ(KRDBCatalog::applicationInfo(), 5);
  EXPECT_EQ(KRDBCatalog::applicationID(), 5);
}

TEST_F(KRDBCatalogTest, TheDispatcherQueueIsNamedAfterTheBundleAndTheCatalog) {
  const auto catalog = open(catalogPath());
  ASSERT_TRUE(catalog && catalog->dispatcher());
  EXPECT_EQ(catalog->dispatcher()->dispatchQueue()->label(),
            std::string(KRDBCoreWrapperBundleIdentifier) + ".block-dispatcher." + catalog->description());
}

// ---- Product version

TEST_F(KRDBCatalogTest, TheProductVersionIsStoredInTheFile) {
  {
    const auto catalog = openInitialized(catalogPath());
    catalog->setDbProductVersion(7);
    EXPECT_EQ(catalog->dbProductVersion(), 7);
    EXPECT_EQ(catalog->getDBProductVersion(), 7);
  }
  EXPECT_EQ(open(catalogPath())->dbProductVersion(), 7);
}

TEST_F(KRDBCatalogTest, SettingTheCurrentProductVersionMakesNoEngineCall) {
  const auto catalog = openInitialized(catalogPath());
  catalog->setDbProductVersion(7);
  // Another connection changes the stored version behind the catalog's back.
  DBReactor other(KRDBCatalog::applicationInfo());
  ASSERT_EQ(other.Open(KRString(catalogPath()).krs_wstring(), L""), dbcore::kDBOpenCurrent);
  other.SetDBApplicationID(9);
  catalog->setDbProductVersion(7);
  EXPECT_EQ(other.GetDBApplicationID(), 9);
  catalog->setDbProductVersion(8);
  EXPECT_EQ(other.GetDBApplicationID(), 8);
  other.Close();
}

// ---- User data

TEST_F(KRDBCatalogTest, AnEmptyCatalogHasNoUserDataAndOneImageSuffices) {
  const auto catalog = openInitialized(catalogPath());
  EXPECT_FALSE(catalog->containsUserData());
  EXPECT_FALSE(catalog->containsUserData(catalog->dbReactor()));
  addImage(*catalog);
  EXPECT_TRUE(catalog->containsUserData(catalog->dbReactor()));
  catalog->forceCloseDB();
  const auto reopened = open(catalogPath());
  reopened->initializeAndUpdateIfNeaded();
  EXPECT_TRUE(reopened->containsUserData());
}

TEST_F(KRDBCatalogTest, ATopLevelCollectionIsUserData) {
  const auto catalog = openInitialized(catalogPath());
  onEngine(*catalog, [](const Reactor& reactor) {
    auto collection = std::make_shared<dbcore::DBFilter>();
    collection->name = L"Trip";
    *reactor << collection;
  });
  EXPECT_TRUE(catalog->containsUserData(catalog->dbReactor()));
}

TEST_F(KRDBCatalogTest, TheUserDataCheckAnswersFalseWhenTheEngineFails) {
  const auto catalog = open(catalogPath());
  KRCapturingLogSink sink;
  // The schema does not exist yet: the engine's reads fail.
  EXPECT_FALSE(catalog->containsUserData(catalog->dbReactor()));
  ASSERT_EQ(sink.records().size(), 1u);
  EXPECT_EQ(sink.records()[0].message.rfind("KRDBCatalog handled exception: DBCore", 0), 0u);
  EXPECT_NE(sink.records()[0].message.find("tag:Check_if_contains_User_Data"), std::string::npos);
}

// ---- Dispatch

TEST_F(KRDBCatalogTest, ASynchronousBlockRunsOnTheQueueBeforeTheCallerResumes) {
  const auto catalog = open(catalogPath());
  bool onQueue = false;
  catalog->performSynchronously(true, [&] { onQueue = catalog->dispatcher()->dispatchQueue()->isCurrent(); });
  EXPECT_TRUE(onQueue);
}

TEST_F(KRDBCatalogTest, AsynchronousBlocksRunLaterInSubmissionOrder) {
  const auto catalog = open(catalogPath());
  QueueGate gate;
  gate.hold(*catalog);
  std::vector<int> order;
  for (int index = 0; index < 3; ++index)
    catalog->performSynchronously(false, [&order, index] { order.push_back(index); });
  EXPECT_TRUE(order.empty());
  gate.open();
  catalog->performSynchronously(true, [] {});
  EXPECT_EQ(order, (std::vector<int>{0, 1, 2}));
}

TEST_F(KRDBCatalogTest, FinishHandlerCallsInPlaceForSyncAndOnTheMainThreadOtherwise) {
  const auto catalog = open(catalogPath());
  std::thread::id syncThread;
  catalog->performSynchronously(
      true, [&] { catalog->finishHandler([&] { syncThread = std::this_thread::get_id(); }, true); });
  EXPECT_NE(syncThread, std::thread::id());
  EXPECT_NE(syncThread, std::this_thread::get_id());

  int result = 0;
  catalog->finishHandler(std::function<void(int)>([&](int value) { result = value; }), 42, false);
  EXPECT_EQ(result, 0);
  ASSERT_TRUE(runMainLoopUntil([&] { return result == 42; }));
  catalog->finishHandler(KRDBCatalog::Handler(), false);
  catalog->finishHandler(std::function<void(int)>(), 1, true);
}

TEST_F(KRDBCatalogTest, AnAsynchronousOperationDeliversOnTheMainThreadAfterTheQueueRan) {
  const auto catalog = openInitialized(catalogPath());
  addImage(*catalog);
  bool workedOnQueue = false;
  std::optional<unsigned long long> delivered;
  bool deliveredOnMain = false;
  catalog->performOperation<unsigned long long>(
      [&](KRDBCatalog& self) {
        workedOnQueue = self.dispatcher()->dispatchQueue()->isCurrent();
        return self.dbReactor()->Count<DBImage>();
      },
      [&](unsigned long long count) {
        delivered = count;
        deliveredOnMain = KRRunLoop::isMainThread();
      },
      false);
  EXPECT_FALSE(delivered);
  ASSERT_TRUE(runMainLoopUntil([&] { return delivered.has_value(); }));
  EXPECT_TRUE(workedOnQueue);
  EXPECT_TRUE(deliveredOnMain);
  EXPECT_EQ(*delivered, 1u);
}

TEST_F(KRDBCatalogTest, ASynchronousOperationCallsItsHandlerOnTheQueueBeforeTheCallerResumes) {
  const auto catalog = open(catalogPath());
  bool handledOnQueue = false;
  int delivered = 0;
  catalog->performOperation<int>([](KRDBCatalog&) { return 3; },
                                 [&](int value) {
                                   delivered = value;
                                   handledOnQueue = catalog->dispatcher()->dispatchQueue()->isCurrent();
                                 },
                                 true);
  EXPECT_EQ(delivered, 3);
  EXPECT_TRUE(handledOnQueue);
  EXPECT_EQ(catalog->performOperationAndWait<int>([](KRDBCatalog&) { return 4; }), 4);
}

TEST_F(KRDBCatalogTest, AnOperationWhoseCatalogIsGoneCallsNothing) {
  auto catalog = open(catalogPath());
  const auto dispatcher = catalog->dispatcher();
  QueueGate gate;
  gate.hold(*catalog);
  bool worked = false;
  bool handled = false;
  catalog->performOperation<int>([&](KRDBCatalog&) { return worked = true, 1; }, [&](int) { handled = true; },
                                 false);
  catalog.reset();
  gate.open();
  dispatcher->performBlockAndWait([] {});
  bool drained = false;
  KRRunLoop::mainRunLoop()->performBlock([&] { drained = true; });
  ASSERT_TRUE(runMainLoopUntil([&] { return drained; }));
  EXPECT_FALSE(worked);
  EXPECT_FALSE(handled);
}

// ---- Exception guard

TEST_F(KRDBCatalogTest, TheGuardAnswersTrueWhenTheBlockReturns) {
  const auto catalog = open(catalogPath());
  Reactor seen;
  EXPECT_TRUE(catalog->handleDBReactorBlock([&](const Reactor& reactor) { seen = reactor; }, "test", true));
  EXPECT_EQ(seen, catalog->dbReactor());
}

TEST_F(KRDBCatalogTest, TheGuardLogsAnEngineExceptionAndAnswersFalseWithoutRaising) {
  const auto catalog = open(catalogPath());
  KRCapturingLogSink sink;
  const bool result = catalog->handleDBReactorBlock(
      [](const Reactor&) { throw dbcore::DBException("disk full", 13); }, "CreateDBImage", false);
  EXPECT_FALSE(result);
  const KRException converted =
      DBCoreUtils::exceptionFromDBException(dbcore::DBException("disk full", 13), "CreateDBImage");
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 2);
  EXPECT_EQ(records[0].sourcePath, kCatalogSource);
  EXPECT_EQ(records[0].function, "handleDBReactorBlock");
  EXPECT_EQ(records[0].message, "KRDBCatalog handled exception: " + converted.description());
}

TEST_F(KRDBCatalogTest, TheGuardRaisesTheConvertedException) {
  const auto catalog = open(catalogPath());
  KRCapturingLogSink sink;
  try {
    catalog->handleDBReactorBlock([](const Reactor&) { throw dbcore::DBException("no such record", 5); },
                                  "RemoveDBImage", true);
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString("DBCore(code #5), tag:RemoveDBImage: no such record"));
    EXPECT_EQ(exception.userInfo().objectForKey(KRDBExceptionDescription), KRValue("RemoveDBImage"));
  }
  EXPECT_EQ(sink.records().size(), 1u);
}

TEST_F(KRDBCatalogTest, TheGuardLetsOtherExceptionsPassUntouched) {
  const auto catalog = open(catalogPath());
  KRCapturingLogSink sink;
  EXPECT_THROW(
      catalog->handleDBReactorBlock([](const Reactor&) { throw std::out_of_range("index"); }, "test", false),
      std::out_of_range);
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBCatalogTest, TheGuardWithoutAnEngineLogsAndAnswersFalse) {
  const auto catalog = openInitialized(catalogPath());
  catalog->forceCloseDB();
  EXPECT_FALSE(catalog->dbReactor());
  KRCapturingLogSink sink;
  bool called = false;
  EXPECT_FALSE(catalog->handleDBReactorBlock([&](const Reactor&) { called = true; }, "test", true));
  EXPECT_FALSE(called);
  const std::vector<KRLogRecord> records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 2);
  EXPECT_EQ(records[0].sourcePath, kCatalogSource);
  EXPECT_EQ(records[0].function, "handleDBReactorBlock");
  EXPECT_EQ(records[0].message, "KRDBCatalog.dbReactor is nullptr");
}

// ---- Waiting, closing, backup

TEST_F(KRDBCatalogTest, WaitingCallsTheHandlerAfterEveryEarlierOperation) {
  const auto catalog = open(catalogPath());
  QueueGate gate;
  gate.hold(*catalog);
  std::atomic<int> finished = 0;
  for (int index = 0; index < 5; ++index) catalog->performSynchronously(false, [&finished] { ++finished; });
  int seenByHandler = -1;
  catalog->waitForAllDataBaseOperationsWithHandler([&] { seenByHandler = finished; });
  gate.open();
  ASSERT_TRUE(runMainLoopUntil([&] { return seenByHandler >= 0; }));
  EXPECT_EQ(seenByHandler, 5);
}

TEST_F(KRDBCatalogTest, ClosingDisallowsNewOperationsAndNeverCallsTheirHandlers) {
  const auto catalog = openInitialized(catalogPath());
  bool earlierHandled = false;
  catalog->performOperation<int>([](KRDBCatalog&) { return 1; }, [&](int) { earlierHandled = true; }, false);
  bool closed = false;
  catalog->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  EXPECT_TRUE(catalog->isNewOperationsDisallowed());

  bool laterWorked = false;
  bool laterHandled = false;
  catalog->performOperation<int>([&](KRDBCatalog&) { return laterWorked = true, 1; },
                                 [&](int) { laterHandled = true; }, false);
  catalog->performOperation<int>([&](KRDBCatalog&) { return laterWorked = true, 1; },
                                 [&](int) { laterHandled = true; }, true);
  EXPECT_EQ(catalog->performOperationAndWait<int>([](KRDBCatalog&) { return 7; }), 0);
  ASSERT_TRUE(runMainLoopUntil([&] { return closed; }));
  // Everything the queue could still post has been delivered once this handler ran.
  drainCatalog(catalog);
  EXPECT_TRUE(earlierHandled);
  EXPECT_FALSE(laterWorked);
  EXPECT_FALSE(laterHandled);
  EXPECT_FALSE(catalog->dbReactor());
  EXPECT_TRUE(open(catalogPath()));
}

TEST_F(KRDBCatalogTest, ForceCloseClosesAtOnceAndKeepsOperationsAllowed) {
  const auto catalog = openInitialized(catalogPath());
  catalog->forceCloseDB();
  EXPECT_FALSE(catalog->dbReactor());
  EXPECT_FALSE(catalog->isNewOperationsDisallowed());
  int delivered = 0;
  catalog->performOperation<int>([](KRDBCatalog&) { return 2; }, [&](int value) { delivered = value; }, true);
  EXPECT_EQ(delivered, 2);
}

TEST_F(KRDBCatalogTest, ABackupOpensAsACurrentCatalogWithTheSameRecords) {
  const auto catalog = openInitialized(catalogPath());
  addImage(*catalog);
  addImage(*catalog);
  std::optional<bool> backedUp;
  bool onMain = false;
  catalog->backupDBFileToPath(catalogPath("copy.krcatalog"), [&](bool result) {
    backedUp = result;
    onMain = KRRunLoop::isMainThread();
  });
  ASSERT_TRUE(runMainLoopUntil([&] { return backedUp.has_value(); }));
  EXPECT_TRUE(*backedUp);
  EXPECT_TRUE(onMain);
  const auto copy = open(catalogPath("copy.krcatalog"));
  ASSERT_TRUE(copy);
  EXPECT_FALSE(copy->needUpdate());
  EXPECT_EQ(imageCount(*copy), 2u);
}

TEST_F(KRDBCatalogTest, ABackupThatCannotBeWrittenAnswersFalse) {
  const auto catalog = openInitialized(catalogPath());
  std::optional<bool> backedUp;
  catalog->backupDBFileToPath(KRString(), [&](bool result) { backedUp = result; });
  ASSERT_TRUE(runMainLoopUntil([&] { return backedUp.has_value(); }));
  EXPECT_FALSE(*backedUp);
}

TEST_F(KRDBCatalogTest, ABackupWithoutAnEngineAnswersFalse) {
  const auto catalog = openInitialized(catalogPath());
  catalog->forceCloseDB();
  KRCapturingLogSink sink;
  std::optional<bool> backedUp;
  catalog->backupDBFileToPath(catalogPath("copy.krcatalog"), [&](bool result) { backedUp = result; });
  ASSERT_TRUE(runMainLoopUntil([&] { return backedUp.has_value(); }));
  EXPECT_FALSE(*backedUp);
  EXPECT_EQ(sink.messages(), std::vector<std::string>{"KRDBCatalog.dbReactor is nullptr"});
}

TEST_F(KRDBCatalogTest, UpdateOperationsIsMadeOnFirstUseAndKeyedByIdentifierValue) {
  const auto catalog = open(catalogPath());
  KRDBEntityIDMapTable& operations = catalog->updateOperations();
  EXPECT_EQ(&operations, &catalog->updateOperations());
  EXPECT_EQ(operations.count(), 0u);
  operations.setObject(catalog, KRDBEntityID::initWithEntityType(1, 5));
  EXPECT_EQ(operations.objectForKey(KRDBEntityID::initWithEntityType(1, 5)), catalog);
  EXPECT_FALSE(operations.objectForKey(KRDBEntityID::initWithEntityType(2, 5)));
  operations.removeAllObjects();
}

}  // namespace
