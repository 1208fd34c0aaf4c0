#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

#include "Model/KRDBImage/KRDBImage.hpp"

using dbcore::DBUserImgAttrib;

const char* const kKRDBImageAttributesDidChangeTrashed = "kKRDBImageAttributesDidChangeTrashed";
const char* const kKRDBImageAttributesDidChangeMarker = "kKRDBImageAttributesDidChangeMarker";
const char* const kKRDBImageAttributesDidChangeColor = "kKRDBImageAttributesDidChangeColor";
const char* const kKRDBImageAttributesDidChangeRating = "kKRDBImageAttributesDidChangeRating";
const char* const kKRDBImageAttributesDidChangeEditDate = "kKRDBImageAttributesDidChangeEditDate";
const char* const kKRDBImageAttributesDidChangeOpened = "kKRDBImageAttributesDidChangeOpened";
const char* const kKRDBImageAttributesDidChangeTrashedDate = "kKRDBImageAttributesDidChangeTrashedDate";

namespace {

// Posted with these texts but not exported.
const char* const kKRDBImageAttributesDidChangeTutorial = "kKRDBImageAttributesDidChangeTutorial";
const char* const kKRDBImageAttributesDidChangeLost = "kKRDBImageAttributesDidChangeLost";

}  // namespace

bool KRDBImageAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageAttributes::storeInfoFromDBAttrib);
}

bool KRDBImageAttributes::storeInfoFromDBAttrib(const std::shared_ptr<DBUserImgAttrib>& attributes) {
  const DBUserImgAttrib& record = *attributes;
  load(trashed_, record, &DBUserImgAttrib::trashed);
  load(marker_, record, &DBUserImgAttrib::marker);
  load(color_, record, &DBUserImgAttrib::color);
  load(rating_, record, &DBUserImgAttrib::rating);
  load(editDate_, record, &DBUserImgAttrib::edit_date);
  load(opened_, record, &DBUserImgAttrib::opened);
  load(trashedDate_, record, &DBUserImgAttrib::trashed_date);
  load(originName_, record, &DBUserImgAttrib::origin_name);
  load(lost_, record, &DBUserImgAttrib::lost);
  load(tutorial_, record, &DBUserImgAttrib::tutorial);
  return true;
}

void KRDBImageAttributes::setTrashed(bool trashed) {
  setRecordField(trashed_, trashed, kKRDBImageAttributesDidChangeTrashed, &DBUserImgAttrib::trashed);
}

void KRDBImageAttributes::setMarker(int32_t marker) {
  setRecordField(marker_, marker, kKRDBImageAttributesDidChangeMarker, &DBUserImgAttrib::marker);
}

void KRDBImageAttributes::setColor(int32_t color) {
  setRecordField(color_, color, kKRDBImageAttributesDidChangeColor, &DBUserImgAttrib::color);
}

void KRDBImageAttributes::setRating(int32_t rating) {
  setRecordField(rating_, rating, kKRDBImageAttributesDidChangeRating, &DBUserImgAttrib::rating);
}

void KRDBImageAttributes::setEditDate(const KRDate& editDate) {
  setRecordField(editDate_, editDate, kKRDBImageAttributesDidChangeEditDate, &DBUserImgAttrib::edit_date);
}

void KRDBImageAttributes::setOpened(bool opened) {
  setRecordField(opened_, opened, kKRDBImageAttributesDidChangeOpened, &DBUserImgAttrib::opened);
}

void KRDBImageAttributes::setTrashedDate(const KRDate& trashedDate) {
  setRecordField(trashedDate_, trashedDate, kKRDBImageAttributesDidChangeTrashedDate,
                 &DBUserImgAttrib::trashed_date);
}

void KRDBImageAttributes::setLost(bool lost) {
  setRecordField(lost_, lost, kKRDBImageAttributesDidChangeLost, &DBUserImgAttrib::lost);
}

void KRDBImageAttributes::setTutorial(int64_t tutorial) {
  setRecordField(tutorial_, tutorial, kKRDBImageAttributesDidChangeTutorial, &DBUserImgAttrib::tutorial);
}

void KRDBImageAttributes::updateModificationDate() { setEditDate(KRDate::date()); }

std::shared_ptr<KRDBImage> KRDBImageAttributes::image() {
  return lazyRelation<KRDBImage, KRDBImageAttributes>(image_, &KRDBEntityContext::imageForAttributes);
}

void KRDBImageAttributes::resetToDefaultState() {
  KRDBEntity::resetToDefaultState();
  const auto held = dbattrib();
  if (!held) return;
  auto defaults = std::make_shared<DBUserImgAttrib>();
  defaults->set_id(held->id());
  defaults->image_id = held->image_id;
  updateWithDBEntity(defaults);
}

void KRDBImageAttributes::reset() {
  image_.reset();
  KRDBEntity::reset();
}

const KRDBKeyAccessors<KRDBImageAttributes>& KRDBImageAttributes::keyAccessors() {
  using Self = KRDBImageAttributes;
  static const KRDBKeyAccessors<Self> accessors{
      {"trashed", krdbKey(&Self::isTrashed, &Self::setTrashed)},
      {"marker", krdbKey(&Self::marker, &Self::setMarker)},
      {"color", krdbKey(&Self::color, &Self::setColor)},
      {"rating", krdbKey(&Self::rating, &Self::setRating)},
      {"editDate", krdbKey(&Self::editDate, &Self::setEditDate)},
      {"opened", krdbKey(&Self::isOpened, &Self::setOpened)},
      {"trashedDate", krdbKey(&Self::trashedDate, &Self::setTrashedDate)},
      {"originName", krdbKey(&Self::originName, &Self::setOriginName)},
      {"lost", krdbKey(&Self::isLost, &Self::setLost)},
      {"tutorial", krdbKey(&Self::tutorial, &Self::setTutorial)},
      {"image", krdbReadOnlyKey(&Self::imagePrimitive)},
      {"imagePrimitive", krdbKey(&Self::imagePrimitive, &Self::setImagePrimitive)},
  };
  return accessors;
}

KRValue KRDBImageAttributes::valueForKey(const std::string& key) const {
  return valueForTableKey(keyAccessors(), key);
}

void KRDBImageAttributes::setValueForKey(const KRValue& value, const std::string& key) {
  setValueForTableKey(keyAccessors(), value, key);
}
