#include "Model/KRDBPath/KRDBPath.hpp"

#include "Model/KRDBPath/KRDBPathObserver.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "Support/KRDBRecordConversions.hpp"

const char* const kKRDBPathDidChangePath = "kKRDBPathDidChangePath";

namespace {

const char* const kVolumePrimitive = "volumePrimitive";

}  // namespace

const std::vector<std::string>& KRDBPath::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> keys = [] {
    std::vector<std::string> all = KRDBEntity::necessaryLinkedEntitiesKeys();
    all.emplace_back(kVolumePrimitive);
    return all;
  }();
  return keys;
}

bool KRDBPath::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBPath::storeInfoFromDBPath);
}

bool KRDBPath::storeInfoFromDBPath(const std::shared_ptr<dbcore::DBPath>& path) {
  path_ = KRDBRecordConversions::string(path->path);
  absolutePath_ = {};
  return true;
}

std::shared_ptr<dbcore::DBPath> KRDBPath::dbpath() const {
  return std::dynamic_pointer_cast<dbcore::DBPath>(dbentity());
}

// ---- Path

void KRDBPath::setPath(const KRString& path) { setPath(path, false); }

void KRDBPath::setPath(const KRString& path, bool andDoesNotWriteToDatabase) {
  if (identical(path, path_)) return;
  willChange({});
  path_ = path;
  absolutePath_ = {};
  if (const auto record = dbpath()) record->path = KRDBRecordConversions::wideString(path_);
  if (andDoesNotWriteToDatabase) {
    didChangeWithoutRecord();
  } else {
    didChange({{kKRDBPathDidChangePath, true}});
  }
  notifyPathDidChange();
}

KRString KRDBPath::absolutePath() {
  if (!absolutePath_) absolutePath_ = computedAbsolutePath(volume());
  return absolutePath_;
}

void KRDBPath::setAbsolutePath(const KRString& absolutePath) { absolutePath_ = absolutePath; }

KRString KRDBPath::computedAbsolutePath(const std::shared_ptr<KRDBVolume>& volume) const {
  const KRString mountPoint = volume ? volume->mountPoint() : KRString();
  return mountPoint.empty() ? path_ : mountPoint.stringByAppendingPathComponent(path_);
}

// ---- Volume

std::shared_ptr<KRDBVolume> KRDBPath::volume() {
  if (volume_) return volume_;
  const auto owner = context();
  if (!owner) return nullptr;
  volume_ = owner->volumeForPath(pathSelf());
  if (volume_) volume_->addListener(self());
  return volume_;
}

void KRDBPath::setVolumePrimitive(const std::shared_ptr<KRDBVolume>& volume) {
  if (volume == volume_) return;
  if (volume_) volume_->removeListener(self());
  volume_ = volume;
  if (volume_) volume_->addListener(self());
  volumeDidChangeMountPoint(volume_);
}

void KRDBPath::setVolume(const std::shared_ptr<KRDBVolume>& volume) {
  if (volume == volume_) return;
  setVolumePrimitive(volume);
  if (const auto record = dbpath()) record->volume_id = volume ? volume->entityID()->dbid() : 0;
  didChangeWithoutRecord();
}

// ---- Existence and availability

void KRDBPath::setExists(bool exists) {
  if (exists == exists_) return;
  exists_ = exists;
  notifyPathDidChange();
}

bool KRDBPath::isAvailable() {
  if (!exists_) return false;
  const auto current = volume();
  return current && current->isAvailable();
}

// ---- Volume listener

void KRDBPath::volumeDidChangeMountPoint(const std::shared_ptr<KRDBVolume>& /*volume*/) {
  absolutePath_ = {};
  notifyPathDidChange();
}

void KRDBPath::volumeDidChangeAvailability(const std::shared_ptr<KRDBVolume>& /*volume*/) {
  notifyObserversWithSelector(&KRDBPathObserver::volumeDidUpdate, pathSelf());
}

void KRDBPath::notifyPathDidChange() {
  notifyObserversWithSelector(&KRDBPathObserver::pathDidChange, pathSelf());
}

// ---- Key-value coding

KRValue KRDBPath::valueForKey(const std::string& key) const {
  if (key == "path") return path_;
  if (key == "exists") return exists_;
  if (key == "absolutePath") return absolutePath_ ? absolutePath_ : computedAbsolutePath(volume_);
  if (key == "volume" || key == kVolumePrimitive) return volume_;
  if (key == "available") return exists_ && volume_ && volume_->isAvailable();
  return KRDBEntity::valueForKey(key);
}

void KRDBPath::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "path") return setPath(value.string());
  if (key == "exists") return setExists(value.number().boolValue());
  if (key == "absolutePath") return setAbsolutePath(value.string());
  if (key == "volume") return setVolume(value.objectAs<KRDBVolume>());
  if (key == kVolumePrimitive) return setVolumePrimitive(value.objectAs<KRDBVolume>());
  KRDBEntity::setValueForKey(value, key);
}
