#pragma once

#include <memory>

class KRVolume;

// Listener of a KRVolume, called on the main thread. Every method has an empty default body.
class KRVolumeObserver {
 public:
  virtual ~KRVolumeObserver() = default;
  // The volume was mounted at another place, or its info changed otherwise.
  virtual void volumeInfoDidChange(std::shared_ptr<KRVolume>) {}
  // The volume was mounted or unmounted.
  virtual void volumeAppearedStatusDidChange(std::shared_ptr<KRVolume>) {}
};
