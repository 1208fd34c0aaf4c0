#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"

bool KRDBRefFolderAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBRefFolderAttributes::storeInfoFromDBAttrib);
}

bool KRDBRefFolderAttributes::storeInfoFromDBAttrib(
    const std::shared_ptr<dbcore::DBRefFolderAttrib>& /*attributes*/) {
  return true;
}
