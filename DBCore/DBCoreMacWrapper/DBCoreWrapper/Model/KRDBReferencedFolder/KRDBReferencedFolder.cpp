#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

bool KRDBReferencedFolder::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBReferencedFolder::storeInfoFromDBReferencedFolder);
}

bool KRDBReferencedFolder::storeInfoFromDBReferencedFolder(
    const std::shared_ptr<dbcore::DBRefFolder>& /*folder*/) {
  return true;
}
