#include "Model/KRDBVolume/KRDBVolume.hpp"

bool KRDBVolume::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBVolume::storeInfoFromDBVolume);
}

bool KRDBVolume::storeInfoFromDBVolume(const std::shared_ptr<dbcore::DBVolume>& /*volume*/) { return true; }
