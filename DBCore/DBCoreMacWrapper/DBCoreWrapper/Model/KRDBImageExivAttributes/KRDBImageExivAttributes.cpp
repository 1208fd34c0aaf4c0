#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

bool KRDBImageExivAttributes::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageExivAttributes::storeInfoFromDBExivAttributes);
}

bool KRDBImageExivAttributes::storeInfoFromDBExivAttributes(
    const std::shared_ptr<dbcore::DBExivImgAttrib>& /*attributes*/) {
  return true;
}
