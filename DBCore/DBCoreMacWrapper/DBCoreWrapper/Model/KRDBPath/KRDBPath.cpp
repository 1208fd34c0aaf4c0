#include "Model/KRDBPath/KRDBPath.hpp"

bool KRDBPath::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBPath::storeInfoFromDBPath);
}

bool KRDBPath::storeInfoFromDBPath(const std::shared_ptr<dbcore::DBPath>& /*path*/) { return true; }
