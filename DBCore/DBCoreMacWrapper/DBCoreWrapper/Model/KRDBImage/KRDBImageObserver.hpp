#pragma once

#include <memory>

class KRDBImage;

// What an image tells its observers beyond the entity notifications. Every method is optional; calls
// arrive on the image's thread.
class KRDBImageObserver {
 public:
  virtual ~KRDBImageObserver() = default;
  // The folder path entity changed, or its path did (a volume mounted elsewhere), or the image got lost.
  virtual void imageFolderPathDidChange(const std::shared_ptr<KRDBImage>& /*image*/) {}
  // The volume of the image's folder came or went.
  virtual void imageFolderVolumeDidUpdate(const std::shared_ptr<KRDBImage>& /*image*/) {}
  virtual void currentStateDidChange(const std::shared_ptr<KRDBImage>& /*image*/) {}
  virtual void statesDidChange(const std::shared_ptr<KRDBImage>& /*image*/) {}
  virtual void sizeAspectRatioDidChange(const std::shared_ptr<KRDBImage>& /*image*/) {}
};
