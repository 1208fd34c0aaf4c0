#include "Model/KRDBCatalog/KRDBCatalog.hpp"

#include <string>

#include "DBCoreWrapper.hpp"
#include "KRFoundation/KRDispatchQueue.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBCatalog/DBCoreUtils.hpp"
#include "Model/KRDBEntity/KRDBDataStorageFactoryBase.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Support/KRDBCoreInjectorService.hpp"
#include "Support/KRIncompatibleAppVersionError.hpp"
#include "dbexception.hpp"
#include "dbreactor.hpp"

namespace {

// The oldest schema that stores the product version.
constexpr int kProductVersionSchema = 119;

const char* const kSetProductVersionOperation = "setDbProductVersion:";
const char* const kUserDataOperation = "Check_if_contains_User_Data";
const char* const kCloseOperation = "Close";
const char* const kBackupOperation = "Backup";

template <class T>
unsigned long long childCount(const KRDBCatalog::Reactor& reactor) {
  const auto root = reactor->GetRoot<T>();
  return root ? reactor->Children(root).size() : 0;
}

}  // namespace

std::shared_ptr<KRDBCatalog> KRDBCatalog::initWithContentsOfFile(const KRString& path, KRErrorPtr* error) {
  KRDBEntityClasses::registerAll();
  KRDBCoreInjectorService::load();
  std::shared_ptr<KRDBCatalog> catalog(new KRDBCatalog());
  return catalog->openFile(path, error) ? catalog : nullptr;
}

KRDBCatalog::~KRDBCatalog() = default;

bool KRDBCatalog::openFile(const KRString& path, KRErrorPtr* error) {
  auto reactor = std::make_shared<dbcore::DBReactor>(applicationInfo());
  switch (reactor->Open(path.krs_wstring(), L"")) {
    case dbcore::kDBOpenCurrent:
      needUpdate_ = false;
      break;
    case dbcore::kDBOpenNeedsUpdate:
      needUpdate_ = true;
      break;
    case dbcore::kDBOpenIncompatible:
      if (error) *error = kr_incompatibleAppVersion();
      return false;
    default:
      return false;
  }
  setDbReactor(std::move(reactor));
  dbProductVersion_ = getDBProductVersion();
  makeDispatcher();
  return true;
}

void KRDBCatalog::makeDispatcher() {
  const std::string name =
      std::string(KRDBCoreWrapperBundleIdentifier) + ".block-dispatcher." + description();
  dispatcher_ = KRBlockDispatcher::initWithDispatchQueue(KRDispatchQueue::serialQueue(name));
}

std::weak_ptr<KRDBCatalog> KRDBCatalog::weakSelf() {
  return std::static_pointer_cast<KRDBCatalog>(shared_from_this());
}

// ---- Fields

KRDBCatalog::Reactor KRDBCatalog::dbReactor() const {
  std::lock_guard lock(reactorMutex_);
  return dbReactor_;
}

void KRDBCatalog::setDbReactor(Reactor reactor) {
  std::lock_guard lock(reactorMutex_);
  dbReactor_ = std::move(reactor);
}

KRDBEntityIDMapTable& KRDBCatalog::updateOperations() {
  std::call_once(updateOperationsOnce_, [this] {
    KRDBCoreInjectorService::load();
    const auto factory =
        KRDBCoreInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>();
    updateOperations_ = factory->makeMapTableWithObjectsMappedByEntityIDs();
  });
  return *updateOperations_;
}

// ---- Versions and schema

void KRDBCatalog::runOnQueue(const std::function<void()>& work) const {
  if (dispatcher_) {
    dispatcher_->performBlockAndWait(work);
  } else {
    work();
  }
}

int32_t KRDBCatalog::getDBProductVersion() const {
  const Reactor reactor = dbReactor();
  if (!reactor) return -1;
  int32_t version = -1;
  runOnQueue([&] {
    if (reactor->DBUserVersion() >= kProductVersionSchema) version = reactor->GetDBApplicationID();
  });
  return version;
}

void KRDBCatalog::setDbProductVersion(int32_t version) {
  if (version == dbProductVersion_) return;
  dbProductVersion_ = version;
  performSynchronously(true, [this, version] {
    handleDBReactorBlock([version](const Reactor& reactor) { reactor->SetDBApplicationID(version); },
                         kSetProductVersionOperation, true);
  });
}

void KRDBCatalog::initializeAndUpdateIfNeaded() {
  const Reactor reactor = dbReactor();
  if (!reactor) return;
  runOnQueue([&] { reactor->Initialize(); });
  performSynchronously(true, [this, &reactor] { containsUserData_ = containsUserData(reactor); });
  needUpdate_ = false;
}

bool KRDBCatalog::containsUserData(const Reactor& reactor) {
  bool contains = false;
  handleDBReactorBlock(
      [&contains, &reactor](const Reactor&) {
        contains = childCount<dbcore::DBRefFolder>(reactor) != 0 ||
                   childCount<dbcore::DBFilter>(reactor) != 0 || reactor->Count<dbcore::DBImage>() != 0;
      },
      kUserDataOperation, false);
  return contains;
}

// ---- Dispatch

void KRDBCatalog::performSynchronously(bool sync, std::function<void()> block) {
  if (sync) {
    dispatcher_->performBlockAndWait(block);
  } else {
    dispatcher_->performBlock(std::move(block));
  }
}

void KRDBCatalog::finishHandler(const Handler& handler, bool sync) {
  if (!handler) return;
  if (sync) return handler();
  asyncPerformMainThreadBlock(handler);
}

bool KRDBCatalog::handleDBReactorBlock(const ReactorBlock& block, const KRString& description,
                                       bool raiseException) {
  const Reactor reactor = dbReactor();
  if (!reactor) {
    KRLog(KRLogLevelError, "KRDBCatalog.dbReactor is nullptr");
    return false;
  }
  try {
    block(reactor);
    return true;
  } catch (const dbcore::DBException& exception) {
    const KRException converted = DBCoreUtils::exceptionFromDBException(exception, description);
    KRLog(KRLogLevelError, "KRDBCatalog handled exception: %@", converted);
    if (raiseException) throw converted;
    return false;
  }
}

// ---- Waiting, closing, backup

void KRDBCatalog::waitForAllDataBaseOperationsWithHandler(Handler handler) {
  performSynchronously(false, [weak = weakSelf(), handler = std::move(handler)] {
    if (const auto catalog = weak.lock()) catalog->asyncPerformMainThreadBlock(handler);
  });
}

void KRDBCatalog::closeAfterAllDataBaseOperationsWithHandler(Handler handler) {
  setNewOperationsDisallowed(true);
  performSynchronously(false, [weak = weakSelf(), handler = std::move(handler)] {
    const auto catalog = weak.lock();
    if (!catalog) return;
    catalog->closeEngine();
    catalog->asyncPerformMainThreadBlock(handler);
  });
}

void KRDBCatalog::forceCloseDB() {
  performSynchronously(true, [this] { closeEngine(); });
}

// Closes the file; the engine is released once it closed.
void KRDBCatalog::closeEngine() {
  if (handleDBReactorBlock([](const Reactor& reactor) { reactor->Close(); }, kCloseOperation, true)) {
    setDbReactor(nullptr);
  }
}

void KRDBCatalog::backupDBFileToPath(const KRString& path, std::function<void(bool)> handler) {
  performSynchronously(false, [weak = weakSelf(), path, handler = std::move(handler)] {
    const auto catalog = weak.lock();
    if (!catalog) return;
    bool backedUp = false;
    catalog->handleDBReactorBlock(
        [&](const Reactor& reactor) { backedUp = reactor->Backup(path.krs_wstring()); }, kBackupOperation,
        true);
    catalog->asyncPerformMainThreadBlock([handler, backedUp] {
      if (handler) handler(backedUp);
    });
  });
}
