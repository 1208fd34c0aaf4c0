#pragma once

#include <cstdint>
#include <string>

#include "KRFoundation/KRValue.hpp"

// What the application knows of one image file, as image creation reads it: the file's location, size and
// dates, and the camera (exif) values that the new exif attributes take. The application implements it
// over its own metadata reader; the camera values answer 0, nil or false unless overridden (a reader that
// knows nothing of the camera). Read on the catalog's queue while the image is created; an implementation
// must answer from that thread.
class KRDBExifReader : public KRObject {
 public:
  // The file's absolute path; also answered by valueForKey("url").
  virtual KRString url() const = 0;
  virtual double width() const = 0;
  virtual double height() const = 0;
  virtual int64_t fileSize() const = 0;
  virtual KRDate modificationDate() const = 0;
  virtual KRDate fileCreationDate() const = 0;

  virtual float isoSpeed() const { return 0.0f; }
  virtual float shutterSpeed() const { return 0.0f; }
  virtual float fNumber() const { return 0.0f; }
  virtual float focalLength() const { return 0.0f; }
  virtual float focalLength35() const { return 0.0f; }
  virtual float ev() const { return 0.0f; }
  virtual float minFocalLength() const { return 0.0f; }
  virtual float maxFocalLength() const { return 0.0f; }
  virtual float minShutter() const { return 0.0f; }
  virtual float maxShutter() const { return 0.0f; }
  virtual float aperture() const { return 0.0f; }
  virtual float focusDistance() const { return 0.0f; }
  virtual float bps() const { return 0.0f; }
  virtual int64_t whiteBalance() const { return 0; }
  virtual int32_t whiteBalanceIndex() const { return 0; }
  virtual int32_t lightSource() const { return 0; }
  virtual int32_t meteringMode() const { return 0; }
  virtual KRString cameraMaker() const { return {}; }
  virtual KRString cameraName() const { return {}; }
  virtual KRString cameraModel() const { return {}; }
  virtual KRString lensMaker() const { return {}; }
  virtual KRString lensPrettyName() const { return {}; }
  virtual KRDate date() const { return {}; }
  virtual bool isRaw() const { return false; }
  virtual bool isFullFilled() const { return false; }
  virtual int32_t version() const { return 0; }

  KRValue valueForKey(const std::string& key) const override {
    if (key == "url") return url();
    return KRObject::valueForKey(key);
  }
};
