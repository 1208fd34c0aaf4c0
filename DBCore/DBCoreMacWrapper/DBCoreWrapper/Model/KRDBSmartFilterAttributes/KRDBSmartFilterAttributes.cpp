#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"

bool KRDBSmartFilterAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBSmartFilterAttributes::storeInfoFromDBAttrib);
}

bool KRDBSmartFilterAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBSmartFilterAttrib>& /*attributes*/) {
  return true;
}
