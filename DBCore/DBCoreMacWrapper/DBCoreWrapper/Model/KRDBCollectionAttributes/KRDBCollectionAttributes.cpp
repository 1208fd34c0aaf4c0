#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"

bool KRDBCollectionAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBCollectionAttributes::storeInfoFromDBAttrib);
}

bool KRDBCollectionAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBFilterAttrib>& /*attributes*/) {
  return true;
}
