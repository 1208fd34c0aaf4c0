#include "Model/KRDBCollection/KRDBCollection.hpp"

bool KRDBCollection::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBCollection::storeInfoFromDBFilter);
}

bool KRDBCollection::storeInfoFromDBFilter(const std::shared_ptr<dbcore::DBFilter>& /*filter*/) {
  return true;
}
