#include "Model/KRDBImageState/KRDBImageState.hpp"

#include <vector>

#include "Support/KRDBInternedStrings.hpp"

using dbcore::DBImgHistoryState;

const char* const kKRDBImageStateDidChangeActionName = "kKRDBImageStateDidChangeActionName";
// Spelled without the second l: observers match this text.
const char* const kKRDBImageStateDidChangeAdditionaInfo = "kKRDBImageStateDidChangeAdditionaInfo";
const char* const kKRDBImageStateDidChangeGuid = "kKRDBImageStateDidChangeGuid";
const char* const kKRDBImageStateDidChangeCropDesc = "kKRDBImageStateDidChangeCropDesc";
const char* const kKRDBImageStateDidChangeImageOrientation = "kKRDBImageStateDidChangeImageOrientation";
const char* const kKRDBImageStateDidChangeStateHash = "kKRDBImageStateDidChangeStateHash";
const char* const kKRDBImageStateDidChangeOriginal = "kKRDBImageStateDidChangeOriginal";

namespace {

// The crop as the record keeps it: its property-list text, empty for none.
std::wstring cropText(const std::shared_ptr<KRTCropDescription>& crop) {
  return crop ? KRDBRecordConversions::wideString(KRString(crop->plistSerialization())) : std::wstring();
}

std::shared_ptr<KRTCropDescription> cropFromText(const std::wstring& text) {
  if (text.empty()) return nullptr;
  return KRTCropDescription::initWithPlistSerialization(KRDBRecordConversions::string(text).str());
}

}  // namespace

bool KRDBImageState::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageState::storeInfoFromDBState);
}

bool KRDBImageState::storeInfoFromDBState(const std::shared_ptr<DBImgHistoryState>& state) {
  const DBImgHistoryState& record = *state;
  // Action names repeat across the states of a catalog ("Import", "Crop", ...): one object each.
  actionName_ = KRDBInternedStrings::string(record.action_name);
  load(additionalInfo_, record, &DBImgHistoryState::additional_info);
  load(guid_, record, &DBImgHistoryState::guid);
  cropDesc_ = cropFromText(record.crop_description);
  load(imageOrientation_, record, &DBImgHistoryState::image_orientation);
  load(stateHash_, record, &DBImgHistoryState::state_hash);
  load(original_, record, &DBImgHistoryState::original);
  return true;
}

void KRDBImageState::setActionName(const KRString& actionName) {
  setRecordField(actionName_, actionName, kKRDBImageStateDidChangeActionName,
                 &DBImgHistoryState::action_name);
}

void KRDBImageState::setAdditionalInfo(const KRString& additionalInfo) {
  setRecordField(additionalInfo_, additionalInfo, kKRDBImageStateDidChangeAdditionaInfo,
                 &DBImgHistoryState::additional_info);
}

void KRDBImageState::setGuid(const KRString& guid) {
  setRecordField(guid_, guid, kKRDBImageStateDidChangeGuid, &DBImgHistoryState::guid);
}

void KRDBImageState::setCropDesc(const std::shared_ptr<KRTCropDescription>& cropDesc) {
  // Shared pointers compare by identity, as the crop description must.
  setRecordValue(cropDesc_, cropDesc, kKRDBImageStateDidChangeCropDesc,
                 [this](const std::shared_ptr<KRTCropDescription>& stored) {
                   if (const auto record = dbstate()) record->crop_description = cropText(stored);
                 });
}

void KRDBImageState::setImageOrientation(uint64_t imageOrientation) {
  setRecordField(imageOrientation_, imageOrientation, kKRDBImageStateDidChangeImageOrientation,
                 &DBImgHistoryState::image_orientation);
}

void KRDBImageState::setStateHash(const KRString& stateHash) {
  setRecordField(stateHash_, stateHash, kKRDBImageStateDidChangeStateHash, &DBImgHistoryState::state_hash);
}

void KRDBImageState::setOriginal(bool original) {
  setRecordField(original_, original, kKRDBImageStateDidChangeOriginal, &DBImgHistoryState::original);
}

KRDictionary KRDBImageState::imageStateDictionary() const {
  const std::vector<KRDictionary::Entry> candidates{
      {"guid", guid_},
      {"actionName", actionName_},
      {"additionalInfo", additionalInfo_},
      {"cropInfo", cropDesc_ ? KRValue(cropDesc_->cropDescriptionDictionary()) : KRValue()},
      {"imageOrientationInfo", imageOrientation_},
      {"hash", stateHash_},
      {"original", original_},
  };
  std::vector<KRDictionary::Entry> entries;
  for (const auto& entry : candidates) {
    if (!entry.second.isNil()) entries.push_back(entry);
  }
  return KRDictionary(entries);
}

const KRDBKeyAccessors<KRDBImageState>& KRDBImageState::keyAccessors() {
  using Self = KRDBImageState;
  static const KRDBKeyAccessors<Self> accessors{
      {"actionName", krdbKey(&Self::actionName, &Self::setActionName)},
      {"additionalInfo", krdbKey(&Self::additionalInfo, &Self::setAdditionalInfo)},
      {"guid", krdbKey(&Self::guid, &Self::setGuid)},
      {"cropDesc", krdbKey(&Self::cropDesc, &Self::setCropDesc)},
      {"imageOrientation", krdbKey(&Self::imageOrientation, &Self::setImageOrientation)},
      {"stateHash", krdbKey(&Self::stateHash, &Self::setStateHash)},
      {"original", krdbKey(&Self::isOriginal, &Self::setOriginal)},
  };
  return accessors;
}

KRValue KRDBImageState::valueForKey(const std::string& key) const {
  return valueForTableKey(keyAccessors(), key);
}

void KRDBImageState::setValueForKey(const KRValue& value, const std::string& key) {
  setValueForTableKey(keyAccessors(), value, key);
}
