#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"

bool KRDBCollectionAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBCollectionAttributes::storeInfoFromDBAttrib);
}

bool KRDBCollectionAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBFilterAttrib>& attributes) {
  return storeAttributesFromRecord(attributes);
}

std::shared_ptr<dbcore::DBFilterAttrib> KRDBCollectionAttributes::dbattrib() const {
  return std::dynamic_pointer_cast<dbcore::DBFilterAttrib>(dbentity());
}

void KRDBCollectionAttributes::setFavorite(bool favorite) {
  setRecordFavorite<dbcore::DBFilterAttrib>(favorite);
}

void KRDBCollectionAttributes::setSelectedFilterTypes(const KRSet& selectedFilterTypes) {
  setRecordSelectedFilterTypes<dbcore::DBFilterAttrib>(selectedFilterTypes);
}
