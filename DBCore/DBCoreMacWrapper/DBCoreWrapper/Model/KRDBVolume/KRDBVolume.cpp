#include "Model/KRDBVolume/KRDBVolume.hpp"

#include "KRClasses/KRVolumeInfo.hpp"
#include "KRFoundation/KRUUID.hpp"
#include "Model/KRDBVolume/KRDBVolumeObserver.hpp"
#include "Support/KRDBRecordConversions.hpp"
#include "Support/KRDictionaryJSON.hpp"

const char* const kKRDBVolumeDidChangeUuid = "kKRDBVolumeDidChangeUuid";
const char* const kKRDBVolumeDidChangeInfo = "kKRDBVolumeDidChangeInfo";

bool KRDBVolume::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBVolume::storeInfoFromDBVolume);
}

bool KRDBVolume::storeInfoFromDBVolume(const std::shared_ptr<dbcore::DBVolume>& volume) {
  info_ = KRDictionaryJSON::dictionaryWithJsonWString(volume->info);
  uuid_ = KRDBRecordConversions::string(volume->uuid);
  return true;
}

std::shared_ptr<dbcore::DBVolume> KRDBVolume::dbvolume() const {
  return std::dynamic_pointer_cast<dbcore::DBVolume>(dbentity());
}

KRString KRDBVolume::uuid() {
  if (!uuid_.empty()) return uuid_;
  uuid_ = KRUUID::UUIDString();
  if (const auto record = dbvolume()) record->uuid = KRDBRecordConversions::wideString(uuid_);
  didChange({{kKRDBVolumeDidChangeUuid, true}});
  return uuid_;
}

void KRDBVolume::setInfo(const KRDictionary& info) {
  setRecordObject(info_, info, kKRDBVolumeDidChangeInfo, [this](const KRDictionary& value) {
    if (const auto record = dbvolume()) record->info = KRDictionaryJSON::jsonWString(value);
  });
}

KRString KRDBVolume::mountPoint() const {
  const auto volumeInfo = volume_ ? volume_->volumeInfo() : nullptr;
  return volumeInfo ? volumeInfo->mountPoint() : KRString();
}

bool KRDBVolume::isAvailable() const { return volume_ && volume_->isAvailable(); }

void KRDBVolume::awakeFromFetch() { awakeFromFetch(KRMountTable::defaultMountTable()); }

void KRDBVolume::awakeFromFetch(const std::shared_ptr<KRMountTable>& mountTable) {
  volume_ = KRVolume::initWithVolumeInfo(KRVolumeInfo::initWithDictionarySerialization(info_), mountTable);
  if (volume_) volume_->addListener(self());
}

// ---- Live volume listener

void KRDBVolume::volumeInfoDidChange(std::shared_ptr<KRVolume> volume) {
  if (const auto volumeInfo = volume->volumeInfo()) setInfo(volumeInfo->dictionarySerialization());
  notifyObserversWithSelector(&KRDBVolumeObserver::volumeDidChangeMountPoint, volumeSelf());
}

void KRDBVolume::volumeAppearedStatusDidChange(std::shared_ptr<KRVolume> /*volume*/) {
  notifyObserversWithSelector(&KRDBVolumeObserver::volumeDidChangeAvailability, volumeSelf());
}

// ---- Key-value coding

KRValue KRDBVolume::valueForKey(const std::string& key) const {
  if (key == "uuid") return uuid_;
  if (key == "info") return info_;
  if (key == "volume") return volume_;
  if (key == "mountPoint") return mountPoint();
  if (key == "available") return isAvailable();
  return KRDBEntity::valueForKey(key);
}

void KRDBVolume::setValueForKey(const KRValue& value, const std::string& key) {
  if (key == "info") return setInfo(value.dictionary());
  if (key == "volume") return setVolume(value.objectAs<KRVolume>());
  KRDBEntity::setValueForKey(value, key);
}
