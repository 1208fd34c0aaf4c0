#include "Model/KRDBCatalog/KRDBUpdateOperation.hpp"

std::shared_ptr<KRDBUpdateOperation> KRDBUpdateOperation::operationWithBlock(Block block) {
  return std::shared_ptr<KRDBUpdateOperation>(new KRDBUpdateOperation(std::move(block)));
}

const std::string& KRDBUpdateOperation::name() const {
  static const std::string kName = "updateEntity:";
  return kName;
}

void KRDBUpdateOperation::start() {
  if (!isCancelled() && block_) block_(*this);
}
