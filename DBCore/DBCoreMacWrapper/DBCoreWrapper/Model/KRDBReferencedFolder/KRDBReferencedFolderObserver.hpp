#pragma once

#include <memory>

class KRDBReferencedFolder;

// What a referenced folder tells its observers about the folder on disk under it. Every method is
// optional; calls arrive on the folder's thread.
class KRDBReferencedFolderObserver {
 public:
  virtual ~KRDBReferencedFolderObserver() = default;
  virtual void refFolderPathDidChange(const std::shared_ptr<KRDBReferencedFolder>& /*folder*/) {}
  virtual void refFolderVolumeDidUpdate(const std::shared_ptr<KRDBReferencedFolder>& /*folder*/) {}
};
