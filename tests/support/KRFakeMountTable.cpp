#include "support/KRFakeMountTable.hpp"

std::shared_ptr<KRFakeMountTable> KRFakeMountTable::create(std::vector<KRMountEntry> mounts) {
  return std::shared_ptr<KRFakeMountTable>(new KRFakeMountTable(std::move(mounts)));
}

KRFakeMountTable::KRFakeMountTable(std::vector<KRMountEntry> mounts) : mounts_(std::move(mounts)) {}

std::vector<KRMountEntry> KRFakeMountTable::mounts() const {
  std::lock_guard lock(mutex_);
  return mounts_;
}

void KRFakeMountTable::setMounts(std::vector<KRMountEntry> mounts) {
  {
    std::lock_guard lock(mutex_);
    mounts_ = std::move(mounts);
  }
  notifyObservers();
}
