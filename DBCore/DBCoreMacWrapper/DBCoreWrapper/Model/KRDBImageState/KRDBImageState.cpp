#include "Model/KRDBImageState/KRDBImageState.hpp"

bool KRDBImageState::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImageState::storeInfoFromDBState);
}

bool KRDBImageState::storeInfoFromDBState(const std::shared_ptr<dbcore::DBImgHistoryState>& /*state*/) {
  return true;
}
