#pragma once

#include <memory>

class KRDBPath;

// What a folder path tells its listeners (the images in it, the referenced folder over it). Every method
// is optional; calls arrive on the path's thread.
class KRDBPathObserver {
 public:
  virtual ~KRDBPathObserver() = default;
  // The path, its existence or its absolute location (the volume's mount point) changed.
  virtual void pathDidChange(const std::shared_ptr<KRDBPath>& /*path*/) {}
  // The path's volume came or went.
  virtual void volumeDidUpdate(const std::shared_ptr<KRDBPath>& /*path*/) {}
};
