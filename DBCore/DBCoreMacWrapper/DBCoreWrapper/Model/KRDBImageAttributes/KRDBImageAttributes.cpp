#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

bool KRDBImageAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageAttributes::storeInfoFromDBAttrib);
}

bool KRDBImageAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBUserImgAttrib>& /*attributes*/) {
  return true;
}
