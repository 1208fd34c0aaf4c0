#pragma once

#include <cstdint>
#include <optional>
#include <utility>

#include "Model/KRDBImageExivAttributes/KRDBExifReader.hpp"

// An exif reader for tests: answers the file values it was made with and, once `withCamera` set them, a
// fixed set of camera values; otherwise the camera values of a reader that knows nothing of the camera.
// Immutable after setup; any thread.
class KRTestExifReader : public KRDBExifReader {
 public:
  struct File {
    KRString url;
    double width = 0;
    double height = 0;
    int64_t fileSize = 0;
    KRDate modificationDate;
    KRDate fileCreationDate;
  };

  // `taken` replaces the fixed capture date of a reader with camera values.
  static std::shared_ptr<KRTestExifReader> make(File file, bool withCamera = false,
                                                std::optional<KRDate> taken = std::nullopt) {
    auto reader = std::shared_ptr<KRTestExifReader>(new KRTestExifReader(std::move(file)));
    reader->camera_ = withCamera;
    reader->taken_ = std::move(taken);
    return reader;
  }

  KRString url() const override { return file_.url; }
  double width() const override { return file_.width; }
  double height() const override { return file_.height; }
  int64_t fileSize() const override { return file_.fileSize; }
  KRDate modificationDate() const override { return file_.modificationDate; }
  KRDate fileCreationDate() const override { return file_.fileCreationDate; }

  float isoSpeed() const override { return camera_ ? 400.0f : KRDBExifReader::isoSpeed(); }
  float shutterSpeed() const override { return camera_ ? 0.004f : KRDBExifReader::shutterSpeed(); }
  float fNumber() const override { return camera_ ? 2.8f : KRDBExifReader::fNumber(); }
  float focalLength() const override { return camera_ ? 35.0f : KRDBExifReader::focalLength(); }
  float focalLength35() const override { return camera_ ? 52.5f : KRDBExifReader::focalLength35(); }
  float ev() const override { return camera_ ? -0.7f : KRDBExifReader::ev(); }
  float minFocalLength() const override { return camera_ ? 24.0f : KRDBExifReader::minFocalLength(); }
  float maxFocalLength() const override { return camera_ ? 70.0f : KRDBExifReader::maxFocalLength(); }
  float minShutter() const override { return camera_ ? 0.0001f : KRDBExifReader::minShutter(); }
  float maxShutter() const override { return camera_ ? 30.0f : KRDBExifReader::maxShutter(); }
  float aperture() const override { return camera_ ? 2.97f : KRDBExifReader::aperture(); }
  float focusDistance() const override { return camera_ ? 3.5f : KRDBExifReader::focusDistance(); }
  float bps() const override { return camera_ ? 14.9f : KRDBExifReader::bps(); }
  int64_t whiteBalance() const override {
    return camera_ ? (int64_t{1} << 32) + 3 : KRDBExifReader::whiteBalance();
  }
  int32_t whiteBalanceIndex() const override { return camera_ ? 5 : KRDBExifReader::whiteBalanceIndex(); }
  int32_t lightSource() const override { return camera_ ? 9 : KRDBExifReader::lightSource(); }
  int32_t meteringMode() const override { return camera_ ? 2 : KRDBExifReader::meteringMode(); }
  KRString cameraMaker() const override { return camera_ ? "Canon" : KRDBExifReader::cameraMaker(); }
  KRString cameraName() const override { return camera_ ? "EOS R5" : KRDBExifReader::cameraName(); }
  KRString cameraModel() const override { return camera_ ? "Canon EOS R5" : KRDBExifReader::cameraModel(); }
  KRString lensMaker() const override { return camera_ ? "Sigma" : KRDBExifReader::lensMaker(); }
  KRString lensPrettyName() const override {
    return camera_ ? "24-70mm F2.8" : KRDBExifReader::lensPrettyName();
  }
  KRDate date() const override {
    if (!camera_) return KRDBExifReader::date();
    return taken_ ? *taken_ : KRDate::dateWithTimeIntervalSince1970(1700000000.9);
  }
  bool isRaw() const override { return camera_ || KRDBExifReader::isRaw(); }
  bool isFullFilled() const override { return camera_ || KRDBExifReader::isFullFilled(); }
  int32_t version() const override { return camera_ ? 3 : KRDBExifReader::version(); }

 private:
  explicit KRTestExifReader(File file) : file_(std::move(file)) {}

  File file_;
  bool camera_ = false;
  std::optional<KRDate> taken_;
};
