#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageExivAttributes/KRDBExifReader.hpp"
#include "Support/KRDBInternedStrings.hpp"

using dbcore::DBExivImgAttrib;

const char* const kKRDBImageExivAttributesDidChangeIsoSpeed = "kKRDBImageExivAttributesDidChangeIsoSpeed";
const char* const kKRDBImageExivAttributesDidChangeShutterSpeed =
    "kKRDBImageExivAttributesDidChangeShutterSpeed";
const char* const kKRDBImageExivAttributesDidChangeFNumber = "kKRDBImageExivAttributesDidChangeFNumber";
const char* const kKRDBImageExivAttributesDidChangeFocalLength =
    "kKRDBImageExivAttributesDidChangeFocalLength";
const char* const kKRDBImageExivAttributesDidChangeFocalLength35 =
    "kKRDBImageExivAttributesDidChangeFocalLength35";
const char* const kKRDBImageExivAttributesDidChangeEv = "kKRDBImageExivAttributesDidChangeEv";
const char* const kKRDBImageExivAttributesDidChangeMinFocalLength =
    "kKRDBImageExivAttributesDidChangeMinFocalLength";
const char* const kKRDBImageExivAttributesDidChangeMaxFocalLength =
    "kKRDBImageExivAttributesDidChangeMaxFocalLength";
const char* const kKRDBImageExivAttributesDidChangeMinShutter = "kKRDBImageExivAttributesDidChangeMinShutter";
const char* const kKRDBImageExivAttributesDidChangeMaxShutter = "kKRDBImageExivAttributesDidChangeMaxShutter";
const char* const kKRDBImageExivAttributesDidChangeAperture = "kKRDBImageExivAttributesDidChangeAperture";
const char* const kKRDBImageExivAttributesDidChangeFocusDistance =
    "kKRDBImageExivAttributesDidChangeFocusDistance";
const char* const kKRDBImageExivAttributesDidChangeBps = "kKRDBImageExivAttributesDidChangeBps";
const char* const kKRDBImageExivAttributesDidChangeWhiteBalance =
    "kKRDBImageExivAttributesDidChangeWhiteBalance";
const char* const kKRDBImageExivAttributesDidChangeWhiteBalanceIndex =
    "kKRDBImageExivAttributesDidChangeWhiteBalanceIndex";
const char* const kKRDBImageExivAttributesDidChangeLightSource =
    "kKRDBImageExivAttributesDidChangeLightSource";
const char* const kKRDBImageExivAttributesDidChangeMeteringMode =
    "kKRDBImageExivAttributesDidChangeMeteringMode";
const char* const kKRDBImageExivAttributesDidChangeCameraMaker =
    "kKRDBImageExivAttributesDidChangeCameraMaker";
const char* const kKRDBImageExivAttributesDidChangeCameraName = "kKRDBImageExivAttributesDidChangeCameraName";
const char* const kKRDBImageExivAttributesDidChangeCameraModel =
    "kKRDBImageExivAttributesDidChangeCameraModel";
const char* const kKRDBImageExivAttributesDidChangeLensMaker = "kKRDBImageExivAttributesDidChangeLensMaker";
const char* const kKRDBImageExivAttributesDidChangeLensPrettyName =
    "kKRDBImageExivAttributesDidChangeLensPrettyName";
const char* const kKRDBImageExivAttributesDidChangeDate = "kKRDBImageExivAttributesDidChangeDate";
const char* const kKRDBImageExivAttributesDidChangeRaw = "kKRDBImageExivAttributesDidChangeRaw";
const char* const kKRDBImageExivAttributesDidChangeFullFilled = "kKRDBImageExivAttributesDidChangeFullFilled";

namespace {

// Posted with this text but not exported.
const char* const kKRDBImageExivAttributesDidChangeVersion = "kKRDBImageExivAttributesDidChangeVersion";

}  // namespace

bool KRDBImageExivAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageExivAttributes::storeInfoFromDBExivAttributes);
}

bool KRDBImageExivAttributes::storeInfoFromDBExivAttributes(
    const std::shared_ptr<DBExivImgAttrib>& attributes) {
  const DBExivImgAttrib& record = *attributes;
  imageID_ = KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, record.image_id);
  load(isoSpeed_, record, &DBExivImgAttrib::iso_speed);
  load(shutterSpeed_, record, &DBExivImgAttrib::shutter_speed);
  load(fNumber_, record, &DBExivImgAttrib::f_number);
  load(focalLength_, record, &DBExivImgAttrib::focal_length);
  load(focalLength35_, record, &DBExivImgAttrib::focal_length35);
  load(ev_, record, &DBExivImgAttrib::ev);
  load(minFocalLength_, record, &DBExivImgAttrib::min_focal_length);
  load(maxFocalLength_, record, &DBExivImgAttrib::max_focal_length);
  load(minShutter_, record, &DBExivImgAttrib::min_shutter);
  load(maxShutter_, record, &DBExivImgAttrib::max_shutter);
  load(aperture_, record, &DBExivImgAttrib::aperture);
  load(focusDistance_, record, &DBExivImgAttrib::focus_distance);
  load(bps_, record, &DBExivImgAttrib::bps);
  load(whiteBalance_, record, &DBExivImgAttrib::white_balance);
  load(whiteBalanceIndex_, record, &DBExivImgAttrib::white_balance_index);
  load(lightSource_, record, &DBExivImgAttrib::light_source);
  load(meteringMode_, record, &DBExivImgAttrib::metering_mode);
  // Camera and lens names repeat across a catalog: one shared string per name.
  cameraMaker_ = KRDBInternedStrings::string(record.camera_maker);
  cameraName_ = KRDBInternedStrings::string(record.camera_name);
  cameraModel_ = KRDBInternedStrings::string(record.camera_model);
  lensMaker_ = KRDBInternedStrings::string(record.lens_maker);
  lensPrettyName_ = KRDBInternedStrings::string(record.lens_pretty_name);
  load(date_, record, &DBExivImgAttrib::date);
  load(raw_, record, &DBExivImgAttrib::raw);
  load(fullFilled_, record, &DBExivImgAttrib::full_filled);
  load(version_, record, &DBExivImgAttrib::version);
  return true;
}

void KRDBImageExivAttributes::setIsoSpeed(float isoSpeed) {
  setRecordField(isoSpeed_, isoSpeed, kKRDBImageExivAttributesDidChangeIsoSpeed, &DBExivImgAttrib::iso_speed);
}

void KRDBImageExivAttributes::setShutterSpeed(float shutterSpeed) {
  setRecordField(shutterSpeed_, shutterSpeed, kKRDBImageExivAttributesDidChangeShutterSpeed,
                 &DBExivImgAttrib::shutter_speed);
}

void KRDBImageExivAttributes::setFNumber(float fNumber) {
  setRecordField(fNumber_, fNumber, kKRDBImageExivAttributesDidChangeFNumber, &DBExivImgAttrib::f_number);
}

void KRDBImageExivAttributes::setFocalLength(float focalLength) {
  setRecordField(focalLength_, focalLength, kKRDBImageExivAttributesDidChangeFocalLength,
                 &DBExivImgAttrib::focal_length);
}

void KRDBImageExivAttributes::setFocalLength35(float focalLength35) {
  setRecordField(focalLength35_, focalLength35, kKRDBImageExivAttributesDidChangeFocalLength35,
                 &DBExivImgAttrib::focal_length35);
}

void KRDBImageExivAttributes::setEv(float ev) {
  setRecordField(ev_, ev, kKRDBImageExivAttributesDidChangeEv, &DBExivImgAttrib::ev);
}

void KRDBImageExivAttributes::setMinFocalLength(float minFocalLength) {
  setRecordField(minFocalLength_, minFocalLength, kKRDBImageExivAttributesDidChangeMinFocalLength,
                 &DBExivImgAttrib::min_focal_length);
}

void KRDBImageExivAttributes::setMaxFocalLength(float maxFocalLength) {
  setRecordField(maxFocalLength_, maxFocalLength, kKRDBImageExivAttributesDidChangeMaxFocalLength,
                 &DBExivImgAttrib::max_focal_length);
}

void KRDBImageExivAttributes::setMinShutter(float minShutter) {
  setRecordField(minShutter_, minShutter, kKRDBImageExivAttributesDidChangeMinShutter,
                 &DBExivImgAttrib::min_shutter);
}

void KRDBImageExivAttributes::setMaxShutter(float maxShutter) {
  setRecordField(maxShutter_, maxShutter, kKRDBImageExivAttributesDidChangeMaxShutter,
                 &DBExivImgAttrib::max_shutter);
}

void KRDBImageExivAttributes::setAperture(float aperture) {
  setRecordField(aperture_, aperture, kKRDBImageExivAttributesDidChangeAperture, &DBExivImgAttrib::aperture);
}

void KRDBImageExivAttributes::setFocusDistance(float focusDistance) {
  setRecordField(focusDistance_, focusDistance, kKRDBImageExivAttributesDidChangeFocusDistance,
                 &DBExivImgAttrib::focus_distance);
}

void KRDBImageExivAttributes::setBps(float bps) {
  setRecordField(bps_, bps, kKRDBImageExivAttributesDidChangeBps, &DBExivImgAttrib::bps);
}

void KRDBImageExivAttributes::setWhiteBalance(int64_t whiteBalance) {
  setRecordField(whiteBalance_, whiteBalance, kKRDBImageExivAttributesDidChangeWhiteBalance,
                 &DBExivImgAttrib::white_balance);
}

void KRDBImageExivAttributes::setWhiteBalanceIndex(int32_t whiteBalanceIndex) {
  setRecordField(whiteBalanceIndex_, whiteBalanceIndex, kKRDBImageExivAttributesDidChangeWhiteBalanceIndex,
                 &DBExivImgAttrib::white_balance_index);
}

void KRDBImageExivAttributes::setLightSource(int32_t lightSource) {
  setRecordField(lightSource_, lightSource, kKRDBImageExivAttributesDidChangeLightSource,
                 &DBExivImgAttrib::light_source);
}

void KRDBImageExivAttributes::setMeteringMode(int32_t meteringMode) {
  setRecordField(meteringMode_, meteringMode, kKRDBImageExivAttributesDidChangeMeteringMode,
                 &DBExivImgAttrib::metering_mode);
}

void KRDBImageExivAttributes::setCameraMaker(const KRString& cameraMaker) {
  setRecordField(cameraMaker_, cameraMaker, kKRDBImageExivAttributesDidChangeCameraMaker,
                 &DBExivImgAttrib::camera_maker);
}

void KRDBImageExivAttributes::setCameraName(const KRString& cameraName) {
  setRecordField(cameraName_, cameraName, kKRDBImageExivAttributesDidChangeCameraName,
                 &DBExivImgAttrib::camera_name);
}

void KRDBImageExivAttributes::setCameraModel(const KRString& cameraModel) {
  setRecordField(cameraModel_, cameraModel, kKRDBImageExivAttributesDidChangeCameraModel,
                 &DBExivImgAttrib::camera_model);
}

void KRDBImageExivAttributes::setLensMaker(const KRString& lensMaker) {
  setRecordField(lensMaker_, lensMaker, kKRDBImageExivAttributesDidChangeLensMaker,
                 &DBExivImgAttrib::lens_maker);
}

void KRDBImageExivAttributes::setLensPrettyName(const KRString& lensPrettyName) {
  setRecordField(lensPrettyName_, lensPrettyName, kKRDBImageExivAttributesDidChangeLensPrettyName,
                 &DBExivImgAttrib::lens_pretty_name);
}

void KRDBImageExivAttributes::setDate(const KRDate& date) {
  setRecordField(date_, date, kKRDBImageExivAttributesDidChangeDate, &DBExivImgAttrib::date);
}

void KRDBImageExivAttributes::setRaw(bool raw) {
  setRecordField(raw_, raw, kKRDBImageExivAttributesDidChangeRaw, &DBExivImgAttrib::raw);
}

void KRDBImageExivAttributes::setFullFilled(bool fullFilled) {
  setRecordField(fullFilled_, fullFilled, kKRDBImageExivAttributesDidChangeFullFilled,
                 &DBExivImgAttrib::full_filled);
}

void KRDBImageExivAttributes::setVersion(int32_t version) {
  setRecordField(version_, version, kKRDBImageExivAttributesDidChangeVersion, &DBExivImgAttrib::version);
}

namespace {

// Stores a reader's value into a record field, converted as the setters convert it.
template <class Field, class T>
void put(Field& field, const T& value) {
  field = KRDBRecordFieldConversion::toRecord<Field>(value);
}

}  // namespace

void KRDBImageExivAttributes::updateByExifReader(const std::shared_ptr<KRDBExifReader>& reader) {
  const auto attributes = typedRecord();
  if (!reader || !attributes) return;
  DBExivImgAttrib& record = *attributes;
  const KRDBExifReader& exif = *reader;
  put(record.iso_speed, exif.isoSpeed());
  put(record.shutter_speed, exif.shutterSpeed());
  put(record.f_number, exif.fNumber());
  put(record.focal_length, exif.focalLength());
  put(record.focal_length35, exif.focalLength35());
  put(record.ev, exif.ev());
  put(record.min_focal_length, exif.minFocalLength());
  put(record.max_focal_length, exif.maxFocalLength());
  put(record.min_shutter, exif.minShutter());
  put(record.max_shutter, exif.maxShutter());
  put(record.aperture, exif.aperture());
  put(record.focus_distance, exif.focusDistance());
  put(record.bps, exif.bps());
  put(record.white_balance, exif.whiteBalance());
  put(record.white_balance_index, exif.whiteBalanceIndex());
  put(record.light_source, exif.lightSource());
  put(record.metering_mode, exif.meteringMode());
  put(record.camera_maker, exif.cameraMaker());
  put(record.camera_name, exif.cameraName());
  put(record.camera_model, exif.cameraModel());
  put(record.lens_maker, exif.lensMaker());
  put(record.lens_pretty_name, exif.lensPrettyName());
  put(record.date, exif.date());
  put(record.raw, exif.isRaw());
  put(record.full_filled, exif.isFullFilled());
  put(record.version, exif.version());
  storeInfoFromDBExivAttributes(attributes);
}

std::shared_ptr<KRDBImage> KRDBImageExivAttributes::image() {
  return lazyRelation<KRDBImage, KRDBImageExivAttributes>(image_, &KRDBEntityContext::imageForExivAttributes);
}

void KRDBImageExivAttributes::reset() {
  image_.reset();
  KRDBEntity::reset();
}

const KRDBKeyAccessors<KRDBImageExivAttributes>& KRDBImageExivAttributes::keyAccessors() {
  using Self = KRDBImageExivAttributes;
  static const KRDBKeyAccessors<Self> accessors{
      {"imageID", krdbReadOnlyKey(&Self::imageID)},
      {"isoSpeed", krdbKey(&Self::isoSpeed, &Self::setIsoSpeed)},
      {"shutterSpeed", krdbKey(&Self::shutterSpeed, &Self::setShutterSpeed)},
      {"fNumber", krdbKey(&Self::fNumber, &Self::setFNumber)},
      {"focalLength", krdbKey(&Self::focalLength, &Self::setFocalLength)},
      {"focalLength35", krdbKey(&Self::focalLength35, &Self::setFocalLength35)},
      {"ev", krdbKey(&Self::ev, &Self::setEv)},
      {"minFocalLength", krdbKey(&Self::minFocalLength, &Self::setMinFocalLength)},
      {"maxFocalLength", krdbKey(&Self::maxFocalLength, &Self::setMaxFocalLength)},
      {"minShutter", krdbKey(&Self::minShutter, &Self::setMinShutter)},
      {"maxShutter", krdbKey(&Self::maxShutter, &Self::setMaxShutter)},
      {"aperture", krdbKey(&Self::aperture, &Self::setAperture)},
      {"focusDistance", krdbKey(&Self::focusDistance, &Self::setFocusDistance)},
      {"bps", krdbKey(&Self::bps, &Self::setBps)},
      {"whiteBalance", krdbKey(&Self::whiteBalance, &Self::setWhiteBalance)},
      {"whiteBalanceIndex", krdbKey(&Self::whiteBalanceIndex, &Self::setWhiteBalanceIndex)},
      {"lightSource", krdbKey(&Self::lightSource, &Self::setLightSource)},
      {"meteringMode", krdbKey(&Self::meteringMode, &Self::setMeteringMode)},
      {"cameraMaker", krdbKey(&Self::cameraMaker, &Self::setCameraMaker)},
      {"cameraName", krdbKey(&Self::cameraName, &Self::setCameraName)},
      {"cameraModel", krdbKey(&Self::cameraModel, &Self::setCameraModel)},
      {"lensMaker", krdbKey(&Self::lensMaker, &Self::setLensMaker)},
      {"lensPrettyName", krdbKey(&Self::lensPrettyName, &Self::setLensPrettyName)},
      {"date", krdbKey(&Self::date, &Self::setDate)},
      {"raw", krdbKey(&Self::isRaw, &Self::setRaw)},
      {"fullFilled", krdbKey(&Self::isFullFilled, &Self::setFullFilled)},
      {"version", krdbKey(&Self::version, &Self::setVersion)},
      {"image", krdbReadOnlyKey(&Self::imagePrimitive)},
      {"imagePrimitive", krdbKey(&Self::imagePrimitive, &Self::setImagePrimitive)},
  };
  return accessors;
}

KRValue KRDBImageExivAttributes::valueForKey(const std::string& key) const {
  return valueForTableKey(keyAccessors(), key);
}

void KRDBImageExivAttributes::setValueForKey(const KRValue& value, const std::string& key) {
  setValueForTableKey(keyAccessors(), value, key);
}
