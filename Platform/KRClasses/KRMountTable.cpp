#include "KRClasses/KRMountTable.hpp"

#include <algorithm>

#include "KRClasses/KRSystemMountTable.hpp"

std::shared_ptr<KRMountTable> KRMountTable::defaultMountTable() {
  return KRSystemMountTable::sharedMountTable();
}

void KRMountTable::addObserver(const std::shared_ptr<KRMountTableObserver>& observer) {
  if (!observer) return;
  startMonitoring();
  std::lock_guard delivery(deliveryMutex_);
  {
    std::lock_guard lock(observersMutex_);
    registrations_.push_back({observer.get(), observer});
  }
  observer->mountTableDidChange(mounts());
}

void KRMountTable::removeObserver(const KRMountTableObserver* observer) {
  std::lock_guard lock(observersMutex_);
  std::erase_if(registrations_, [&](const Registration& entry) {
    return entry.address == observer || entry.observer.expired();
  });
}

size_t KRMountTable::observerCount() const { return liveObservers().size(); }

void KRMountTable::notifyObservers() {
  std::lock_guard delivery(deliveryMutex_);
  const auto current = mounts();
  for (const auto& observer : liveObservers()) observer->mountTableDidChange(current);
}

std::vector<std::shared_ptr<KRMountTableObserver>> KRMountTable::liveObservers() const {
  std::lock_guard lock(observersMutex_);
  std::vector<std::shared_ptr<KRMountTableObserver>> live;
  for (const auto& entry : registrations_) {
    if (auto observer = entry.observer.lock()) live.push_back(std::move(observer));
  }
  return live;
}
