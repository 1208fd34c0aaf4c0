#include "Model/KRDBImage/KRDBImage.hpp"

#include <algorithm>
#include <climits>
#include <cmath>
#include <type_traits>
#include <unordered_map>

#include "KRClasses/KRTCropDescription.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBImage/KRDBImageObserver.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Support/KRDBRecordConversions.hpp"

const char* const kKRDBImageDidChangeGuid = "kKRDBImageDidChangeGuid";
const char* const kKRDBImageDidChangeName = "kKRDBImageDidChangeName";
const char* const kKRDBImageDidChangeWidth = "kKRDBImageDidChangeWidth";
const char* const kKRDBImageDidChangeHeight = "kKRDBImageDidChangeHeight";
const char* const kKRDBImageDidChangeFileSize = "kKRDBImageDidChangeFileSize";
const char* const kKRDBImageDidChangeModificationDate = "kKRDBImageDidChangeModificationDate";
const char* const kKRDBImageDidChangeImportDate = "kKRDBImageDidChangeImportDate";
const char* const kKRDBImageDidChangeImportIndex = "kKRDBImageDidChangeImportIndex";

namespace {

using Conversions = KRDBRecordConversions;

// Posted like the others, but not exported.
const char* const kCreationDateKey = "kKRDBImageDidChangeCreationDate";
const char* const kAttributesPrimitive = "attributesPrimitive";
const char* const kExivAttributesPrimitive = "exivAttributesPrimitive";
const char* const kFolderDBPathPrimitive = "folderDBPathPrimitive";
const char* const kImagePrimitive = "imagePrimitive";
// A ratio that moves by no more than this is the same ratio.
constexpr float kAspectRatioTolerance = 1e-5f;

bool isQuarterTurned(uint64_t orientation) { return orientation >= 5 && orientation <= 8; }

// One side of the cropped size: the crop's share of the image's side, truncated toward zero to a 32-bit
// integer (0 where the crop's image size gives no finite share).
double croppedLength(double cropLength, int32_t imageLength, double cropImageLength) {
  const double length = std::trunc(cropLength * imageLength / cropImageLength);
  if (!std::isfinite(length)) return 0;
  return std::clamp(length, static_cast<double>(INT32_MIN), static_cast<double>(INT32_MAX));
}

}  // namespace

const std::vector<std::string>& KRDBImage::necessaryLinkedEntitiesKeys() {
  static const std::vector<std::string> keys = [] {
    std::vector<std::string> all = KRDBEntity::necessaryLinkedEntitiesKeys();
    all.insert(all.end(), {kAttributesPrimitive, kExivAttributesPrimitive, kFolderDBPathPrimitive});
    return all;
  }();
  return keys;
}

std::string KRDBImage::reverseKeyForNecessaryKey(const std::string& key) {
  return key == kAttributesPrimitive || key == kExivAttributesPrimitive ? kImagePrimitive : std::string();
}

// ---- Record

bool KRDBImage::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImage::storeInfoFromDBImage);
}

bool KRDBImage::storeInfoFromDBImage(const std::shared_ptr<dbcore::DBImage>& image) {
  name_ = Conversions::string(image->path).lastPathComponent();
  guid_ = Conversions::string(image->guid);
  width_ = image->width;
  height_ = image->height;
  fileSize_ = image->file_size;
  importIndex_ = image->import_index;
  modificationDate_ = Conversions::date(image->modification_date);
  importDate_ = Conversions::date(image->import_date);
  creationDate_ = Conversions::date(image->creation_date);
  fileName_.reset();
  fileType_.reset();
  dropSizeCaches();
  return true;
}

std::shared_ptr<dbcore::DBImage> KRDBImage::dbimage() const {
  return std::dynamic_pointer_cast<dbcore::DBImage>(dbentity());
}

// ---- Record properties

void KRDBImage::setGuid(const KRString& guid) {
  setRecordObject(guid_, guid, kKRDBImageDidChangeGuid,
                  [this](const KRString& value) { dbimage()->guid = Conversions::wideString(value); });
}

void KRDBImage::setName(const KRString& name) {
  setRecordValue(name_, name, kKRDBImageDidChangeName, [this](const KRString& value) {
    fileName_.reset();
    fileType_.reset();
    dbimage()->path = Conversions::wideString(value);
  });
}

void KRDBImage::setWidth(int32_t width) {
  setRecordValue(width_, width, kKRDBImageDidChangeWidth, [this](int32_t value) {
    dropSizeCaches();
    dbimage()->width = value;
  });
}

void KRDBImage::setHeight(int32_t height) {
  setRecordValue(height_, height, kKRDBImageDidChangeHeight, [this](int32_t value) {
    dropSizeCaches();
    dbimage()->height = value;
  });
}

void KRDBImage::setFileSize(int64_t fileSize) {
  setRecordValue(fileSize_, fileSize, kKRDBImageDidChangeFileSize,
                 [this](int64_t value) { dbimage()->file_size = value; });
}

void KRDBImage::setModificationDate(const KRDate& date) {
  setRecordObject(modificationDate_, date, kKRDBImageDidChangeModificationDate, [this](const KRDate& value) {
    dbimage()->modification_date = Conversions::seconds(value);
  });
}

void KRDBImage::setImportDate(const KRDate& date) {
  setRecordObject(importDate_, date, kKRDBImageDidChangeImportDate,
                  [this](const KRDate& value) { dbimage()->import_date = Conversions::seconds(value); });
}

void KRDBImage::setImportIndex(int32_t importIndex) {
  setRecordValue(importIndex_, importIndex, kKRDBImageDidChangeImportIndex,
                 [this](int32_t value) { dbimage()->import_index = value; });
}

void KRDBImage::setCreationDate(const KRDate& date) {
  setRecordObject(creationDate_, date, kCreationDateKey,
                  [this](const KRDate& value) { dbimage()->creation_date = Conversions::seconds(value); });
}

// ---- Derived values

KRString KRDBImage::path() const {
  if (!folderDBPath_) return {};
  return folderDBPath_->absolutePath().stringByAppendingPathComponent(name_);
}

const KRString& KRDBImage::fileName() {
  if (!fileName_) fileName_ = name_.stringByDeletingPathExtension();
  return *fileName_;
}

const KRString& KRDBImage::fileType() {
  if (!fileType_) fileType_ = name_.pathExtension();
  return *fileType_;
}

uint64_t KRDBImage::imageOrientation() const {
  const uint64_t orientation = currentState_ ? currentState_->imageOrientation() : 0;
  return orientation >= 1 && orientation <= 8 ? orientation : 1;
}

KRSize KRDBImage::croppedSize() {
  if (croppedSize_ == KRSize{}) croppedSize_ = computedCroppedSize();
  return croppedSize_;
}

KRSize KRDBImage::computedCroppedSize() const {
  const auto crop = currentState_ ? currentState_->cropDesc() : nullptr;
  if (!crop) return KRSize{static_cast<double>(width_), static_cast<double>(height_)};
  return KRSize{croppedLength(crop->cropRect().size.width, width_, crop->imageSize().width),
                croppedLength(crop->cropRect().size.height, height_, crop->imageSize().height)};
}

KRNumber KRDBImage::sizeAspectRatio() {
  if (!sizeAspectRatio_) validateSizeAspectRatioAndNotify(false);
  return KRNumber::numberWithDouble(static_cast<double>(*sizeAspectRatio_));
}

float KRDBImage::aspectRatioOf(const KRSize& size) const {
  return static_cast<float>(isQuarterTurned(imageOrientation()) ? size.height / size.width
                                                                : size.width / size.height);
}

void KRDBImage::validateSizeAspectRatioAndNotify(bool notify) {
  const float ratio = aspectRatioOf(croppedSize());
  if (sizeAspectRatio_ && std::fabs(*sizeAspectRatio_ - ratio) <= kAspectRatioTolerance) return;
  sizeAspectRatio_ = ratio;
  if (notify) notifyImageObservers(&KRDBImageObserver::sizeAspectRatioDidChange);
}

void KRDBImage::dropSizeCaches() {
  croppedSize_ = KRSize{};
  sizeAspectRatio_.reset();
}

KRNumber KRDBImage::sizeAspectRatioValue() const {
  const float ratio = sizeAspectRatio_ ? *sizeAspectRatio_ : aspectRatioOf(computedCroppedSize());
  return KRNumber::numberWithDouble(static_cast<double>(ratio));
}

bool KRDBImage::isLostPrimitive() const { return attributes_ && attributes_->isLost(); }

bool KRDBImage::isAvailablePrimitive() const {
  return folderDBPath_ && folderDBPath_->isAvailable() && !isLostPrimitive();
}

bool KRDBImage::isLost() {
  const auto userAttributes = attributes();
  return userAttributes && userAttributes->isLost();
}

void KRDBImage::setLost(bool lost) {
  const auto userAttributes = attributes();
  if (!userAttributes || userAttributes->isLost() == lost) return;
  userAttributes->setLost(lost);
  notifyImageObservers(&KRDBImageObserver::imageFolderPathDidChange);
}

bool KRDBImage::isAvailable() { return folderDBPath_ && folderDBPath_->isAvailable() && !isLost(); }

bool KRDBImage::canBeMarkedAsLost() {
  if (!currentState_ || currentState_->isOriginal()) return false;
  const auto userAttributes = attributes();
  return !(userAttributes && userAttributes->isTrashed());
}

bool KRDBImage::isPossibleDuplicateOf(const std::shared_ptr<KRDBImage>& other) const {
  if (!other) return false;
  if (creationDate_ && other->creationDate_) {
    return fileSize_ == other->fileSize_ && creationDate_ == other->creationDate_;
  }
  return name_ == other->name_ && fileSize_ == other->fileSize_;
}

// ---- Linked entities

std::shared_ptr<KRDBImageAttributes> KRDBImage::attributes() {
  if (attributes_) return attributes_;
  const auto owner = context();
  if (!owner) return nullptr;
  attributes_ = owner->attributesForImage(selfImage());
  if (attributes_) attributes_->setImagePrimitive(selfImage());
  return attributes_;
}

void KRDBImage::setAttributesPrimitive(const std::shared_ptr<KRDBImageAttributes>& attributes) {
  attributes_ = attributes;
}

std::shared_ptr<KRDBImageExivAttributes> KRDBImage::exivAttributes() {
  if (exivAttributes_) return exivAttributes_;
  const auto owner = context();
  if (!owner) return nullptr;
  exivAttributes_ = owner->exivAttributesForImage(selfImage());
  if (exivAttributes_) exivAttributes_->setImagePrimitive(selfImage());
  return exivAttributes_;
}

void KRDBImage::setExivAttributesPrimitive(const std::shared_ptr<KRDBImageExivAttributes>& attributes) {
  exivAttributes_ = attributes;
}

KRDBImage::FoldersPtr KRDBImage::filters() {
  if (filters_) return filters_;
  if (const auto owner = context())
    filters_ = std::make_shared<const KRDBEntitySet>(owner->filtersOfImage(selfImage()));
  return filters_;
}

// Images never fail on an unknown key (predicates and bindings ask them for keys of other classes): the
// key is logged and the value ignored. The report's line is part of the log interface (line 279).
void KRDBImage::setValueForUndefinedKey(const KRValue& /*value*/, const std::string& key) {
  KRLog(KRLogLevelWarning, "Warning!!!\nUndefined Key: %@\nFor obj Class: %@", key, className());
}

void KRDBImage::setFiltersPrimitive(FoldersPtr filters) {
  if (filters == filters_) return;
  filters_ = std::move(filters);
  didChangeWithoutRecord();
}

KRDBImage::StatesPtr KRDBImage::states() {
  if (states_ || !currentState_) return states_;
  if (const auto owner = context())
    states_ = std::make_shared<const KRDBImageStates>(owner->statesForImage(selfImage()));
  return states_;
}

void KRDBImage::setStatesPrimitive(StatesPtr states) {
  if (states == states_) return;
  states_ = std::move(states);
  didChangeWithoutRecord();
  notifyImageObservers(&KRDBImageObserver::statesDidChange);
}

void KRDBImage::setCurrentStatePrimitive(const std::shared_ptr<KRDBImageState>& state) {
  if (state == currentState_) return;
  currentState_ = state;
  didChangeWithoutRecord();
  notifyImageObservers(&KRDBImageObserver::currentStateDidChange);
  croppedSize_ = KRSize{};
  validateSizeAspectRatio();
}

void KRDBImage::setFolderDBPathPrimitive(const std::shared_ptr<KRDBPath>& path, bool notify) {
  if (path == folderDBPath_) return;
  if (folderDBPath_) folderDBPath_->removeListener(self());
  folderDBPath_ = path;
  if (folderDBPath_) folderDBPath_->addListener(self());
  if (!notify) return;
  notifyImageObservers(&KRDBImageObserver::imageFolderPathDidChange);
  didChangeWithoutRecord();
}

std::shared_ptr<KRDBEntity> KRDBImage::necessaryLinkedEntity(const std::string& key) const {
  if (key == kAttributesPrimitive) return attributes_;
  if (key == kExivAttributesPrimitive) return exivAttributes_;
  if (key == kFolderDBPathPrimitive) return folderDBPath_;
  return KRDBEntity::necessaryLinkedEntity(key);
}

void KRDBImage::updateNecessaryEntityForKey(const std::string& key,
                                            const std::shared_ptr<KRDBEntity>& entity) {
  if (linkedDirectly(key, entity)) return;
  KRDBEntity::updateNecessaryEntityForKey(key, entity);
  const std::string reverseKey = reverseKeyForNecessaryKey(key);
  if (!reverseKey.empty() && entity) entity->setValueForKey(KRValue(self()), reverseKey);
}

bool KRDBImage::linkedDirectly(const std::string& key, const std::shared_ptr<KRDBEntity>& entity) {
  if (key == kAttributesPrimitive)
    return linkAttributes(std::dynamic_pointer_cast<KRDBImageAttributes>(entity));
  if (key == kExivAttributesPrimitive)
    return linkAttributes(std::dynamic_pointer_cast<KRDBImageExivAttributes>(entity));
  if (key != kFolderDBPathPrimitive) return false;
  const auto path = std::dynamic_pointer_cast<KRDBPath>(entity);
  if (!path) return false;
  setFolderDBPathPrimitive(path);
  return true;
}

template <class Attributes>
bool KRDBImage::linkAttributes(const std::shared_ptr<Attributes>& attributes) {
  if (!attributes) return false;
  if constexpr (std::is_same_v<Attributes, KRDBImageAttributes>) {
    setAttributesPrimitive(attributes);
  } else {
    setExivAttributesPrimitive(attributes);
  }
  attributes->setImagePrimitive(selfImage());
  return true;
}

void KRDBImage::pathDidChange(const std::shared_ptr<KRDBPath>& path) {
  if (!path || path != folderDBPath_) return;
  didChangeWithoutRecord();
  notifyImageObservers(&KRDBImageObserver::imageFolderPathDidChange);
}

void KRDBImage::volumeDidUpdate(const std::shared_ptr<KRDBPath>& path) {
  if (!path || path != folderDBPath_) return;
  notifyImageObservers(&KRDBImageObserver::imageFolderVolumeDidUpdate);
}

// ---- Collections

void KRDBImage::addFilters(const KRDBEntitySet& filters) {
  const auto owner = context();
  if (!owner) return;
  for (const auto& filter : filters) {
    owner->addImages(KRDBEntitySet{self()}, std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(filter));
  }
}

void KRDBImage::deleteFilters(const KRDBEntitySet& filters) {
  const auto owner = context();
  if (!owner) return;
  for (const auto& filter : filters) {
    owner->deleteImages(KRDBEntitySet{self()}, std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(filter));
  }
}

KRDBEntitySet KRDBImage::addFiltersPrimitive(const KRDBEntitySet& filters) {
  const FoldersPtr current = this->filters();
  KRDBEntitySet added;
  for (const auto& filter : filters) {
    if (!current || !current->contains(filter)) added.insert(filter);
  }
  if (added.empty()) return added;
  auto united = std::make_shared<KRDBEntitySet>(added);
  if (current) united->insert(current->begin(), current->end());
  setFiltersPrimitive(std::move(united));
  return added;
}

KRDBEntitySet KRDBImage::deleteFiltersPrimitive(const KRDBEntitySet& filters) {
  const FoldersPtr current = this->filters();
  KRDBEntitySet removed;
  if (!current) return removed;
  for (const auto& filter : filters) {
    if (current->contains(filter)) removed.insert(filter);
  }
  if (removed.empty()) return removed;
  auto remaining = std::make_shared<KRDBEntitySet>(*current);
  for (const auto& filter : removed) remaining->erase(filter);
  setFiltersPrimitive(std::move(remaining));
  return removed;
}

// ---- History

void KRDBImage::updateModificationDate() {
  if (const auto userAttributes = attributes()) userAttributes->updateModificationDate();
}

void KRDBImage::setStates(const KRDBImageStates& states,
                          const std::shared_ptr<KRDBImageState>& currentState) {
  updateModificationDate();
  if (const auto owner = context()) owner->setStates(states, currentState, selfImage());
}

void KRDBImage::setStates(const KRDBImageStates& states) {
  setStates(states, states.empty() ? nullptr : states.back());
}

void KRDBImage::setCurrentState(const std::shared_ptr<KRDBImageState>& state) {
  updateModificationDate();
  if (const auto owner = context()) owner->setCurrentState(state, selfImage());
}

void KRDBImage::pushState(const std::shared_ptr<KRDBImageState>& state) {
  setStates(statesByPushingState(state), state);
}

KRDBImageStates KRDBImage::statesByPushingState(const std::shared_ptr<KRDBImageState>& state) {
  const StatesPtr current = states();
  KRDBImageStates result = current ? *current : KRDBImageStates();
  const auto position = std::find(result.begin(), result.end(), currentState_);
  if (position != result.end()) result.erase(position + 1, result.end());
  if (state && state->cropDesc()) {
    state->setCropDesc(state->cropDesc()->convertToImageSize(
        KRSize{static_cast<double>(width_), static_cast<double>(height_)}));
  }
  result.push_back(state);
  return result;
}

// ---- Deletion, reset

KRString KRDBImage::markedToDeleteHashKey() const {
  const KRString location = path();
  return KRString(std::to_string(KRDBEntityTypeImage) + "-" + (location ? location.str() : "(null)"));
}

void KRDBImage::reset() {
  attributes_ = nullptr;
  exivAttributes_ = nullptr;
  filters_ = nullptr;
  fileName_.reset();
  fileType_.reset();
  setFolderDBPathPrimitive(nullptr, false);
}

void KRDBImage::resetToDefaultState() {
  KRDBEntity::resetToDefaultState();
  if (const FoldersPtr current = filters()) deleteFilters(*current);
  setStates(KRDBImageStates());
  if (const auto userAttributes = attributes()) userAttributes->resetToDefaultState();
}

// ---- Key-value coding

namespace {

KRValue statesValue(const KRDBImage::StatesPtr& states) {
  if (!states) return {};
  std::vector<KRValue> values(states->begin(), states->end());
  return KRArray(std::move(values));
}

KRValue foldersValue(const KRDBImage::FoldersPtr& folders) {
  if (!folders) return {};
  std::vector<KRValue> values(folders->begin(), folders->end());
  return KRSet(values);
}

using Getter = KRValue (*)(const KRDBImage&);

const std::unordered_map<std::string, Getter>& getters() {
  static const std::unordered_map<std::string, Getter> table{
      {"guid", [](const KRDBImage& image) { return KRValue(image.guid()); }},
      {"name", [](const KRDBImage& image) { return KRValue(image.name()); }},
      {"width", [](const KRDBImage& image) { return KRValue(image.width()); }},
      {"height", [](const KRDBImage& image) { return KRValue(image.height()); }},
      {"fileSize", [](const KRDBImage& image) { return KRValue(image.fileSize()); }},
      {"modificationDate", [](const KRDBImage& image) { return KRValue(image.modificationDate()); }},
      {"importDate", [](const KRDBImage& image) { return KRValue(image.importDate()); }},
      {"importIndex", [](const KRDBImage& image) { return KRValue(image.importIndex()); }},
      {"creationDate", [](const KRDBImage& image) { return KRValue(image.creationDate()); }},
      {"path", [](const KRDBImage& image) { return KRValue(image.path()); }},
      {"imageOrientation", [](const KRDBImage& image) { return KRValue(image.imageOrientation()); }},
      {kAttributesPrimitive, [](const KRDBImage& image) { return KRValue(image.attributesPrimitive()); }},
      {kExivAttributesPrimitive,
       [](const KRDBImage& image) { return KRValue(image.exivAttributesPrimitive()); }},
      {kFolderDBPathPrimitive, [](const KRDBImage& image) { return KRValue(image.folderDBPathPrimitive()); }},
      {"folderDBPath", [](const KRDBImage& image) { return KRValue(image.folderDBPath()); }},
      {"currentState", [](const KRDBImage& image) { return KRValue(image.currentState()); }},
      {"filtersPrimitive", [](const KRDBImage& image) { return foldersValue(image.filtersPrimitive()); }},
      {"statesPrimitive", [](const KRDBImage& image) { return statesValue(image.statesPrimitive()); }},
      {"fileName",
       [](const KRDBImage& image) { return KRValue(image.name().stringByDeletingPathExtension()); }},
      {"fileType", [](const KRDBImage& image) { return KRValue(image.name().pathExtension()); }},
      {"sizeAspectRatio", [](const KRDBImage& image) { return KRValue(image.sizeAspectRatioValue()); }},
      {"isLost", [](const KRDBImage& image) { return KRValue(image.isLostPrimitive()); }},
      {"isAvailable", [](const KRDBImage& image) { return KRValue(image.isAvailablePrimitive()); }},
      {"attributes", [](const KRDBImage& image) { return KRValue(image.attributesPrimitive()); }},
      {"exivAttributes", [](const KRDBImage& image) { return KRValue(image.exivAttributesPrimitive()); }},
      {"filters", [](const KRDBImage& image) { return foldersValue(image.filtersPrimitive()); }},
      {"states", [](const KRDBImage& image) { return statesValue(image.statesPrimitive()); }},
  };
  return table;
}

using Setter = void (*)(KRDBImage&, const KRValue&);

const std::unordered_map<std::string, Setter>& setters() {
  static const std::unordered_map<std::string, Setter> table{
      {"guid", [](KRDBImage& image, const KRValue& value) { image.setGuid(value.string()); }},
      {"name", [](KRDBImage& image, const KRValue& value) { image.setName(value.string()); }},
      {"width", [](KRDBImage& image, const KRValue& value) { image.setWidth(value.number().intValue()); }},
      {"height", [](KRDBImage& image, const KRValue& value) { image.setHeight(value.number().intValue()); }},
      {"fileSize",
       [](KRDBImage& image, const KRValue& value) { image.setFileSize(value.number().longLongValue()); }},
      {"modificationDate",
       [](KRDBImage& image, const KRValue& value) { image.setModificationDate(value.date()); }},
      {"importDate", [](KRDBImage& image, const KRValue& value) { image.setImportDate(value.date()); }},
      {"importIndex",
       [](KRDBImage& image, const KRValue& value) { image.setImportIndex(value.number().intValue()); }},
      {"creationDate", [](KRDBImage& image, const KRValue& value) { image.setCreationDate(value.date()); }},
      {kAttributesPrimitive,
       [](KRDBImage& image, const KRValue& value) {
         image.setAttributesPrimitive(value.objectAs<KRDBImageAttributes>());
       }},
      {kExivAttributesPrimitive,
       [](KRDBImage& image, const KRValue& value) {
         image.setExivAttributesPrimitive(value.objectAs<KRDBImageExivAttributes>());
       }},
      {kFolderDBPathPrimitive,
       [](KRDBImage& image, const KRValue& value) {
         image.setFolderDBPathPrimitive(value.objectAs<KRDBPath>());
       }},
  };
  return table;
}

}  // namespace

KRValue KRDBImage::valueForKey(const std::string& key) const {
  if (const auto getter = getters().find(key); getter != getters().end()) return getter->second(*this);
  return KRDBEntity::valueForKey(key);
}

void KRDBImage::setValueForKey(const KRValue& value, const std::string& key) {
  if (const auto setter = setters().find(key); setter != setters().end()) return setter->second(*this, value);
  KRDBEntity::setValueForKey(value, key);
}
