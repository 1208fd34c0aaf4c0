#include "KRClasses/KRVolume.hpp"

std::shared_ptr<KRVolume> KRVolume::initWithVolumeInfo(std::shared_ptr<KRVolumeInfo> volumeInfo,
                                                       std::shared_ptr<KRMountTable> mountTable) {
  if (!volumeInfo || !mountTable) return nullptr;
  auto volume = std::shared_ptr<KRVolume>(new KRVolume(std::move(volumeInfo), mountTable));
  mountTable->addObserver(volume);
  return volume;
}

KRVolume::KRVolume(std::shared_ptr<KRVolumeInfo> volumeInfo, std::shared_ptr<KRMountTable> mountTable)
    : mountTable_(std::move(mountTable)), volumeInfo_(std::move(volumeInfo)) {}

KRVolume::~KRVolume() { mountTable_->removeObserver(this); }

std::shared_ptr<KRVolumeInfo> KRVolume::volumeInfo() const {
  std::lock_guard lock(stateMutex_);
  return volumeInfo_;
}

KRString KRVolume::mountPoint() const {
  std::lock_guard lock(stateMutex_);
  return available_ ? volumeInfo_->mountPoint() : KRString();
}

bool KRVolume::isAvailable() const {
  std::lock_guard lock(stateMutex_);
  return available_;
}

void KRVolume::mountTableDidChange(const std::vector<KRMountEntry>& mounts) {
  bool infoChanged = false;
  bool availabilityChanged = false;
  {
    std::lock_guard lock(stateMutex_);
    const KRMountEntry* mount = findMount(mounts);
    const bool available = mount != nullptr;
    auto latestInfo = mount ? KRVolumeInfo::volumeInfoWithMountEntry(*mount) : volumeInfo_;
    infoChanged = hasState_ && !latestInfo->isEqual(volumeInfo_);
    availabilityChanged = hasState_ && available != available_;
    volumeInfo_ = std::move(latestInfo);
    available_ = available;
    hasState_ = true;
  }
  // The new place first, so that listeners of the appearance already see it.
  if (infoChanged) post(&KRVolumeObserver::volumeInfoDidChange);
  if (availabilityChanged) post(&KRVolumeObserver::volumeAppearedStatusDidChange);
}

bool KRVolume::identifies(const KRMountEntry& entry) const {
  const std::string& uuid = volumeInfo_->volumeUUID().str();
  // A mount whose UUID could not be read cannot contradict the known one: it is matched by place.
  if (!uuid.empty() && !entry.volumeUUID.empty()) return entry.volumeUUID == uuid;
  return entry.device == volumeInfo_->device().str() && entry.mountPoint == volumeInfo_->mountPoint().str();
}

// A volume mounted at several places keeps the place it has; otherwise the first in table order wins.
const KRMountEntry* KRVolume::findMount(const std::vector<KRMountEntry>& mounts) const {
  const KRMountEntry* found = nullptr;
  for (const auto& entry : mounts) {
    if (!identifies(entry)) continue;
    if (entry.mountPoint == volumeInfo_->mountPoint().str()) return &entry;
    if (!found) found = &entry;
  }
  return found;
}

// Delivered on the main run loop; a volume destroyed before then notifies nobody.
void KRVolume::post(void (KRVolumeObserver::*selector)(std::shared_ptr<KRVolume>)) {
  asyncPerformMainThreadBlock([weakSelf = weak_from_this(), selector] {
    if (auto self = std::static_pointer_cast<KRVolume>(weakSelf.lock())) {
      self->notifyObserversWithSelector(selector, self);
    }
  });
}
