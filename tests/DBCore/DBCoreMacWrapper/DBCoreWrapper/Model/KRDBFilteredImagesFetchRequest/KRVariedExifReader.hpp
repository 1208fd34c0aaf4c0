#pragma once

#include <cstdint>
#include <utility>

#include "KRTestExifReader.hpp"

// An exif reader for tests whose file and camera values are all given at creation, so that every image
// of a test catalog can carry its own. Immutable after creation; any thread.
class KRVariedExifReader : public KRDBExifReader {
 public:
  struct Camera {
    float isoSpeed = 0;
    float shutterSpeed = 0;
    float fNumber = 0;
    float focalLength = 0;
    float focalLength35 = 0;
    float minFocalLength = 0;
    float maxFocalLength = 0;
    float minShutter = 0;
    float maxShutter = 0;
    float focusDistance = 0;
    float bps = 0;
    int64_t whiteBalance = 0;
    int32_t whiteBalanceIndex = 0;
    int32_t lightSource = 0;
    int32_t meteringMode = 0;
    KRString cameraMaker;
    KRString cameraName;
    KRString cameraModel;
    KRString lensMaker;
    KRString lensPrettyName;
    KRDate date;
    bool raw = false;
    bool fullFilled = false;
  };

  KRVariedExifReader(KRTestExifReader::File file, Camera camera)
      : file_(std::move(file)), camera_(std::move(camera)) {}

  KRString url() const override { return file_.url; }
  double width() const override { return file_.width; }
  double height() const override { return file_.height; }
  int64_t fileSize() const override { return file_.fileSize; }
  KRDate modificationDate() const override { return file_.modificationDate; }
  KRDate fileCreationDate() const override { return file_.fileCreationDate; }

  float isoSpeed() const override { return camera_.isoSpeed; }
  float shutterSpeed() const override { return camera_.shutterSpeed; }
  float fNumber() const override { return camera_.fNumber; }
  float focalLength() const override { return camera_.focalLength; }
  float focalLength35() const override { return camera_.focalLength35; }
  float minFocalLength() const override { return camera_.minFocalLength; }
  float maxFocalLength() const override { return camera_.maxFocalLength; }
  float minShutter() const override { return camera_.minShutter; }
  float maxShutter() const override { return camera_.maxShutter; }
  float focusDistance() const override { return camera_.focusDistance; }
  float bps() const override { return camera_.bps; }
  int64_t whiteBalance() const override { return camera_.whiteBalance; }
  int32_t whiteBalanceIndex() const override { return camera_.whiteBalanceIndex; }
  int32_t lightSource() const override { return camera_.lightSource; }
  int32_t meteringMode() const override { return camera_.meteringMode; }
  KRString cameraMaker() const override { return camera_.cameraMaker; }
  KRString cameraName() const override { return camera_.cameraName; }
  KRString cameraModel() const override { return camera_.cameraModel; }
  KRString lensMaker() const override { return camera_.lensMaker; }
  KRString lensPrettyName() const override { return camera_.lensPrettyName; }
  KRDate date() const override { return camera_.date; }
  bool isRaw() const override { return camera_.raw; }
  bool isFullFilled() const override { return camera_.fullFilled; }

 private:
  KRTestExifReader::File file_;
  Camera camera_;
};
