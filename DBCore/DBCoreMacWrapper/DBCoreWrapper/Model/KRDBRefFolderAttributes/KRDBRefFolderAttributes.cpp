#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"

bool KRDBRefFolderAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBRefFolderAttributes::storeInfoFromDBAttrib);
}

bool KRDBRefFolderAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBRefFolderAttrib>& attributes) {
  return storeAttributesFromRecord(attributes);
}

std::shared_ptr<dbcore::DBRefFolderAttrib> KRDBRefFolderAttributes::dbattrib() const {
  return std::dynamic_pointer_cast<dbcore::DBRefFolderAttrib>(dbentity());
}

void KRDBRefFolderAttributes::setFavorite(bool favorite) {
  setRecordFavorite<dbcore::DBRefFolderAttrib>(favorite);
}

void KRDBRefFolderAttributes::setSelectedFilterTypes(const KRSet& selectedFilterTypes) {
  setRecordSelectedFilterTypes<dbcore::DBRefFolderAttrib>(selectedFilterTypes);
}
