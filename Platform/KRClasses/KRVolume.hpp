#pragma once

#include <memory>
#include <mutex>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRClasses/KRMountTable.hpp"
#include "KRClasses/KRVolumeInfo.hpp"
#include "KRClasses/KRVolumeObserver.hpp"

// A live disk volume: follows the mount table and tells its listeners (KRVolumeObserver) on the main
// run loop when it is mounted elsewhere, its info changes, or it comes or goes.
//
// The volume is identified by its volume UUID when its info has one, so that it is found again at
// another mount point; otherwise (or when a mount's UUID could not be read) by its device and mount
// point together. Its state starts from the
// mount table of the moment it is made (without notification) and may be read from any thread.
class KRVolume : public KRAbstractModel, public KRMountTableObserver {
 public:
  // Nil for a nil info or mount table. Many volumes may share one mount table.
  static std::shared_ptr<KRVolume> initWithVolumeInfo(
      std::shared_ptr<KRVolumeInfo> volumeInfo,
      std::shared_ptr<KRMountTable> mountTable = KRMountTable::defaultMountTable());
  ~KRVolume() override;

  // The latest info: the current mount's while mounted, the last known one otherwise.
  std::shared_ptr<KRVolumeInfo> volumeInfo() const;
  // Where the volume is mounted now; nil while it is not mounted.
  KRString mountPoint() const;
  bool isAvailable() const;

  void mountTableDidChange(const std::vector<KRMountEntry>& mounts) override;

 private:
  KRVolume(std::shared_ptr<KRVolumeInfo> volumeInfo, std::shared_ptr<KRMountTable> mountTable);

  // Callers hold stateMutex_.
  bool identifies(const KRMountEntry& entry) const;
  const KRMountEntry* findMount(const std::vector<KRMountEntry>& mounts) const;

  void post(void (KRVolumeObserver::*selector)(std::shared_ptr<KRVolume>));

  const std::shared_ptr<KRMountTable> mountTable_;
  mutable std::mutex stateMutex_;
  std::shared_ptr<KRVolumeInfo> volumeInfo_;
  bool available_ = false;
  // False until the first mount list arrived, which sets the state without notification.
  bool hasState_ = false;
};
