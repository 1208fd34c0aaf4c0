#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"

bool KRDBSmartFilterAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBSmartFilterAttributes::storeInfoFromDBAttrib);
}

bool KRDBSmartFilterAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBSmartFilterAttrib>& attributes) {
  return storeAttributesFromRecord(attributes);
}

std::shared_ptr<dbcore::DBSmartFilterAttrib> KRDBSmartFilterAttributes::dbattrib() const {
  return std::dynamic_pointer_cast<dbcore::DBSmartFilterAttrib>(dbentity());
}

void KRDBSmartFilterAttributes::setSelectedFilterTypes(const KRSet& selectedFilterTypes) {
  setRecordSelectedFilterTypes<dbcore::DBSmartFilterAttrib>(selectedFilterTypes);
}
