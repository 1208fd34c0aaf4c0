#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRClasses/KRTCropDescription.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBEntity/KRDBTypedRecordEntity.hpp"
#include "dbimghistorystate.hpp"

extern const char* const kKRDBImageStateDidChangeActionName;
extern const char* const kKRDBImageStateDidChangeAdditionaInfo;
extern const char* const kKRDBImageStateDidChangeGuid;
extern const char* const kKRDBImageStateDidChangeCropDesc;
extern const char* const kKRDBImageStateDidChangeImageOrientation;
extern const char* const kKRDBImageStateDidChangeStateHash;
extern const char* const kKRDBImageStateDidChangeOriginal;

// One step of an image's edit history (the action that made it, the editor's data, the crop and orientation
// in force, a hash of its content), over a dbcore::DBImgHistoryState record. Its values are cached from the
// record by its store hook. Used on its context's thread.
class KRDBImageState
    : public KRDBConcreteEntity<KRDBImageState, KRDBTypedRecordEntity<dbcore::DBImgHistoryState>,
                                KRDBEntityTypeImageState, dbcore::kDBImgHistoryStateType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  // The held record; empty when it is of another class.
  std::shared_ptr<dbcore::DBImgHistoryState> dbstate() const { return typedRecord(); }

  const KRString& actionName() const { return actionName_; }
  void setActionName(const KRString& actionName);
  // The editor's own data for the step. This is the state's record field and hides on purpose the base's
  // map of per-entity annotations (KRDBEntity::additionalInfo), which states do not use.
  const KRString& additionalInfo() const { return additionalInfo_; }
  void setAdditionalInfo(const KRString& additionalInfo);
  const KRString& guid() const { return guid_; }
  void setGuid(const KRString& guid);
  // The crop in force, or nil. Compared by identity; the record keeps its property-list text.
  std::shared_ptr<KRTCropDescription> cropDesc() const { return cropDesc_; }
  void setCropDesc(const std::shared_ptr<KRTCropDescription>& cropDesc);
  uint64_t imageOrientation() const { return imageOrientation_; }
  void setImageOrientation(uint64_t imageOrientation);
  const KRString& stateHash() const { return stateHash_; }
  void setStateHash(const KRString& stateHash);
  bool isOriginal() const { return original_; }
  void setOriginal(bool original);

  // The state for the application: "guid", "actionName", "additionalInfo", "cropInfo" (the crop's
  // dictionary), "imageOrientationInfo", "hash" and "original"; missing values are left out.
  KRDictionary imageStateDictionary() const;

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBState(const std::shared_ptr<dbcore::DBImgHistoryState>& state);

 private:
  static const KRDBKeyAccessors<KRDBImageState>& keyAccessors();

  KRString actionName_;
  KRString additionalInfo_;
  KRString guid_;
  std::shared_ptr<KRTCropDescription> cropDesc_;
  uint64_t imageOrientation_ = 0;
  KRString stateHash_;
  bool original_ = false;
};
