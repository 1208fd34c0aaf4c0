#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBEntity/KRDBTypedRecordEntity.hpp"
#include "dbexivimgattrib.hpp"

extern const char* const kKRDBImageExivAttributesDidChangeIsoSpeed;
extern const char* const kKRDBImageExivAttributesDidChangeShutterSpeed;
extern const char* const kKRDBImageExivAttributesDidChangeFNumber;
extern const char* const kKRDBImageExivAttributesDidChangeFocalLength;
extern const char* const kKRDBImageExivAttributesDidChangeFocalLength35;
extern const char* const kKRDBImageExivAttributesDidChangeEv;
extern const char* const kKRDBImageExivAttributesDidChangeMinFocalLength;
extern const char* const kKRDBImageExivAttributesDidChangeMaxFocalLength;
extern const char* const kKRDBImageExivAttributesDidChangeMinShutter;
extern const char* const kKRDBImageExivAttributesDidChangeMaxShutter;
extern const char* const kKRDBImageExivAttributesDidChangeAperture;
extern const char* const kKRDBImageExivAttributesDidChangeFocusDistance;
extern const char* const kKRDBImageExivAttributesDidChangeBps;
extern const char* const kKRDBImageExivAttributesDidChangeWhiteBalance;
extern const char* const kKRDBImageExivAttributesDidChangeWhiteBalanceIndex;
extern const char* const kKRDBImageExivAttributesDidChangeLightSource;
extern const char* const kKRDBImageExivAttributesDidChangeMeteringMode;
extern const char* const kKRDBImageExivAttributesDidChangeCameraMaker;
extern const char* const kKRDBImageExivAttributesDidChangeCameraName;
extern const char* const kKRDBImageExivAttributesDidChangeCameraModel;
extern const char* const kKRDBImageExivAttributesDidChangeLensMaker;
extern const char* const kKRDBImageExivAttributesDidChangeLensPrettyName;
extern const char* const kKRDBImageExivAttributesDidChangeDate;
extern const char* const kKRDBImageExivAttributesDidChangeRaw;
extern const char* const kKRDBImageExivAttributesDidChangeFullFilled;

class KRDBImage;
class KRDBExifReader;

// The camera (exif) data of one image, over a dbcore::DBExivImgAttrib record. Its values are cached from the
// record by its store hook; it points back weakly at its image (the image holds it). Used on its context's
// thread.
class KRDBImageExivAttributes
    : public KRDBConcreteEntity<KRDBImageExivAttributes, KRDBTypedRecordEntity<dbcore::DBExivImgAttrib>,
                                KRDBEntityTypeImageExivAttributes, dbcore::kDBExivImgAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBExivImgAttrib> dbexivattrib() const { return typedRecord(); }

  // The owning image's identifier (entity type 1), built on load.
  const KRDBEntityIDPtr& imageID() const { return imageID_; }

  float isoSpeed() const { return isoSpeed_; }
  void setIsoSpeed(float isoSpeed);
  float shutterSpeed() const { return shutterSpeed_; }
  void setShutterSpeed(float shutterSpeed);
  float fNumber() const { return fNumber_; }
  void setFNumber(float fNumber);
  float focalLength() const { return focalLength_; }
  void setFocalLength(float focalLength);
  float focalLength35() const { return focalLength35_; }
  void setFocalLength35(float focalLength35);
  float ev() const { return ev_; }
  void setEv(float ev);
  float minFocalLength() const { return minFocalLength_; }
  void setMinFocalLength(float minFocalLength);
  float maxFocalLength() const { return maxFocalLength_; }
  void setMaxFocalLength(float maxFocalLength);
  float minShutter() const { return minShutter_; }
  void setMinShutter(float minShutter);
  float maxShutter() const { return maxShutter_; }
  void setMaxShutter(float maxShutter);
  float aperture() const { return aperture_; }
  void setAperture(float aperture);
  float focusDistance() const { return focusDistance_; }
  void setFocusDistance(float focusDistance);
  // Bits per sample. The record keeps an integer (truncated toward zero); the attributes keep the
  // whole value until reloaded.
  float bps() const { return bps_; }
  void setBps(float bps);
  // The record keeps the low 32 bits; the attributes keep the whole value until reloaded.
  int64_t whiteBalance() const { return whiteBalance_; }
  void setWhiteBalance(int64_t whiteBalance);
  int32_t whiteBalanceIndex() const { return whiteBalanceIndex_; }
  void setWhiteBalanceIndex(int32_t whiteBalanceIndex);
  int32_t lightSource() const { return lightSource_; }
  void setLightSource(int32_t lightSource);
  int32_t meteringMode() const { return meteringMode_; }
  void setMeteringMode(int32_t meteringMode);
  const KRString& cameraMaker() const { return cameraMaker_; }
  void setCameraMaker(const KRString& cameraMaker);
  const KRString& cameraName() const { return cameraName_; }
  void setCameraName(const KRString& cameraName);
  const KRString& cameraModel() const { return cameraModel_; }
  void setCameraModel(const KRString& cameraModel);
  const KRString& lensMaker() const { return lensMaker_; }
  void setLensMaker(const KRString& lensMaker);
  const KRString& lensPrettyName() const { return lensPrettyName_; }
  void setLensPrettyName(const KRString& lensPrettyName);
  const KRDate& date() const { return date_; }
  void setDate(const KRDate& date);
  bool isRaw() const { return raw_; }
  void setRaw(bool raw);
  bool isFullFilled() const { return fullFilled_; }
  void setFullFilled(bool fullFilled);
  int32_t version() const { return version_; }
  void setVersion(int32_t version);

  // Takes every camera value of the reader straight into the held record (with the record conversions of
  // the setters) and reloads the cached values from it: for attributes about to be written for the first
  // time, so nothing is posted and the entity is not marked changed. A nil reader changes nothing.
  void updateByExifReader(const std::shared_ptr<KRDBExifReader>& reader);

  // Drops the back reference and the base's cached relations.
  void reset() override;
  // The image: the back reference, else asked of the context on first read; nil without a context.
  std::shared_ptr<KRDBImage> image();
  std::shared_ptr<KRDBImage> imagePrimitive() const { return image_.lock(); }
  // Sets the back reference without notification. Held weakly: the image holds its exif attributes.
  void setImagePrimitive(const std::shared_ptr<KRDBImage>& image) { image_ = image; }

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes every field of a record of this class.
  bool storeInfoFromDBExivAttributes(const std::shared_ptr<dbcore::DBExivImgAttrib>& attributes);

 private:
  static const KRDBKeyAccessors<KRDBImageExivAttributes>& keyAccessors();

  KRDBEntityIDPtr imageID_;
  float isoSpeed_ = 0.0f;
  float shutterSpeed_ = 0.0f;
  float fNumber_ = 0.0f;
  float focalLength_ = 0.0f;
  float focalLength35_ = 0.0f;
  float ev_ = 0.0f;
  float minFocalLength_ = 0.0f;
  float maxFocalLength_ = 0.0f;
  float minShutter_ = 0.0f;
  float maxShutter_ = 0.0f;
  float aperture_ = 0.0f;
  float focusDistance_ = 0.0f;
  float bps_ = 0.0f;
  int64_t whiteBalance_ = 0;
  int32_t whiteBalanceIndex_ = 0;
  int32_t lightSource_ = 0;
  int32_t meteringMode_ = 0;
  KRString cameraMaker_;
  KRString cameraName_;
  KRString cameraModel_;
  KRString lensMaker_;
  KRString lensPrettyName_;
  KRDate date_;
  bool raw_ = false;
  bool fullFilled_ = false;
  int32_t version_ = 0;
  std::weak_ptr<KRDBImage> image_;
};
