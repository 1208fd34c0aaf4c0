#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

#include "KRFoundation/KRUUID.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolderObserver.hpp"
#include "Support/KRDBRecordConversions.hpp"

// Not one of the folders' record fields: the key under which the made uuid is posted.
const char* const kKRDBReferencedFolderDidChangeUuid = "kKRDBReferencedFolderDidChangeUuid";

namespace {

const char* const kDbPath = "dbPath";

}  // namespace

const std::vector<std::string>& KRDBReferencedFolder::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> keys = [] {
    std::vector<std::string> result = KRDBAbstractBaseFolder::necessaryLinkedEntitiesKeys();
    result.emplace_back(kDbPath);
    return result;
  }();
  return keys;
}

bool KRDBReferencedFolder::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBReferencedFolder::storeInfoFromDBReferencedFolder);
}

bool KRDBReferencedFolder::storeInfoFromDBReferencedFolder(
    const std::shared_ptr<dbcore::DBRefFolder>& folder) {
  uuid_ = KRDBRecordConversions::string(folder->uuid);
  idPath_ = folder->path_id;
  order_ = folder->order;
  return true;
}

std::shared_ptr<dbcore::DBRefFolder> KRDBReferencedFolder::dbfilter() const {
  return std::dynamic_pointer_cast<dbcore::DBRefFolder>(dbentity());
}

// ---- The folder on disk

void KRDBReferencedFolder::setDbPath(const std::shared_ptr<KRDBPath>& dbPath) {
  if (dbPath == dbPath_) return;
  if (dbPath_) dbPath_->removeListener(self());
  dbPath_ = dbPath;
  if (dbPath_) dbPath_->addListener(self());
}

KRString KRDBReferencedFolder::absolutePathOfDbPath() const {
  return dbPath_ ? dbPath_->absolutePath() : KRString();
}

KRString KRDBReferencedFolder::nameOfDbPath() const {
  const KRString absolutePath = absolutePathOfDbPath();
  return absolutePath ? absolutePath.lastPathComponent() : KRString();
}

const KRString& KRDBReferencedFolder::name() {
  name_ = nameOfDbPath();
  return name_;
}

KRString KRDBReferencedFolder::path() { return absolutePathOfDbPath(); }

bool KRDBReferencedFolder::isAvailable() { return dbPath_ && dbPath_->isAvailable(); }

bool KRDBReferencedFolder::isExists() { return dbPath_ && dbPath_->isExists(); }

template <class Action>
void KRDBReferencedFolder::forEachChildFolder(Action&& action) {
  const auto children = childs();
  if (!children) return;
  for (const auto& child : *children) {
    if (const auto folder = std::dynamic_pointer_cast<KRDBReferencedFolder>(child)) action(*folder);
  }
}

void KRDBReferencedFolder::setExists(bool exists) {
  if (!dbPath_ || dbPath_->isExists() == exists) return;
  dbPath_->setExists(exists);
  forEachChildFolder([exists](KRDBReferencedFolder& child) { child.setExists(exists); });
}

// ---- Record fields

void KRDBReferencedFolder::setOrder(double order) {
  setRecordValue(order_, order, kKRDBBaseFolderDidChangeOrder, [this](double value) {
    if (const auto record = dbfilter()) record->order = static_cast<float>(value);
  });
}

KRString KRDBReferencedFolder::uuid() {
  if (uuid_.empty()) {
    setRecordValue(uuid_, KRUUID::UUIDString(), kKRDBReferencedFolderDidChangeUuid,
                   [this](const KRString& value) {
                     if (const auto record = dbfilter())
                       record->uuid = KRDBRecordConversions::wideString(value);
                   });
  }
  return uuid_;
}

// ---- Membership, deletion, reset

void KRDBReferencedFolder::addImages(const KRDBEntitySet& images) {
  if (images.empty()) return;
  if (const auto owner = context()) owner->addImages(images, folderSelf());
}

KRString KRDBReferencedFolder::markedToDeleteHashKey() const {
  const KRString absolutePath = absolutePathOfDbPath();
  if (!absolutePath) return {};
  return KRString(std::to_string(entityType()) + "-" + absolutePath.str());
}

void KRDBReferencedFolder::resetToDefaultState() {
  KRDBAbstractBaseFolder::resetToDefaultState();
  forEachChildFolder([](KRDBReferencedFolder& child) { child.resetToDefaultState(); });
}

// ---- Path notifications

void KRDBReferencedFolder::pathDidChange(const std::shared_ptr<KRDBPath>& /*path*/) {
  notifyObserversWithSelector(&KRDBReferencedFolderObserver::refFolderPathDidChange, folderSelf());
}

void KRDBReferencedFolder::volumeDidUpdate(const std::shared_ptr<KRDBPath>& /*path*/) {
  notifyObserversWithSelector(&KRDBReferencedFolderObserver::refFolderVolumeDidUpdate, folderSelf());
}

// ---- Key-value coding

KRValue KRDBReferencedFolder::valueForKey(const std::string& key) const {
  if (key == kDbPath) return dbPath_;
  if (key == "idPath") return idPath_;
  if (key == "uuid") return uuid_;
  if (key == "path") return absolutePathOfDbPath();
  if (key == "name") return nameOfDbPath();
  if (key == "isAvailable" || key == "available") return dbPath_ && dbPath_->isAvailable();
  if (key == "isExists" || key == "exists") return dbPath_ && dbPath_->isExists();
  return KRDBAbstractBaseFolder::valueForKey(key);
}

void KRDBReferencedFolder::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == kDbPath) return setDbPath(value.objectAs<KRDBPath>());
  if (key == "exists") return setExists(value.number().boolValue());
  KRDBAbstractBaseFolder::setValueForKey(value, key);
}
