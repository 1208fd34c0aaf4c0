#pragma once

#include <memory>

class KRDBVolume;

// What a volume entity tells its listeners (the paths on it). Every method is optional; calls arrive on
// the thread that the live volume reports on.
class KRDBVolumeObserver {
 public:
  virtual ~KRDBVolumeObserver() = default;
  virtual void volumeDidChangeMountPoint(const std::shared_ptr<KRDBVolume>& /*volume*/) {}
  virtual void volumeDidChangeAvailability(const std::shared_ptr<KRDBVolume>& /*volume*/) {}
};
