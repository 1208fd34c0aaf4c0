#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"

bool KRDBSmartFilter::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBSmartFilter::storeInfoFromDBSmartFilter);
}

bool KRDBSmartFilter::storeInfoFromDBSmartFilter(
    const std::shared_ptr<dbcore::DBSmartFilter>& /*smartFilter*/) {
  return true;
}
