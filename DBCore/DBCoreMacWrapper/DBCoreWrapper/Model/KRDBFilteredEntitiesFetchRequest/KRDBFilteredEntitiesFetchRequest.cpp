#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBValidationRecordCarrier.hpp"

KRDBFilteredEntitiesFetchRequest::SelectQueryPtr KRDBFilteredEntitiesFetchRequest::selectQuery() {
  const std::lock_guard lock(selectQueryMutex_);
  if (!selectQuery_) selectQuery_ = makeSelectQuery();
  return selectQuery_;
}

KRDBFilteredEntitiesFetchRequest::SelectQueryPtr KRDBFilteredEntitiesFetchRequest::makeSelectQuery() {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass", "makeSelectQuery");
  raiseUnrecognizedSelector("makeSelectQuery");
}

void KRDBFilteredEntitiesFetchRequest::reset() {
  const std::lock_guard lock(selectQueryMutex_);
  selectQuery_.reset();
}

int64_t KRDBFilteredEntitiesFetchRequest::entityType() const {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass", "entityType");
  raiseUnrecognizedSelector("entityType");
}

bool KRDBFilteredEntitiesFetchRequest::isEntitySatisfyingFilterConditions(
    const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return false;
  const auto closing = std::dynamic_pointer_cast<KRDBClosingEntityContext>(entity->context());
  if (closing && closing->isWaitingForClose()) return false;
  const SelectQueryPtr query = selectQuery();
  auto carrier = std::dynamic_pointer_cast<KRDBValidationRecordCarrier>(entity->validationRecord());
  if (!carrier || !carrier->values()) {
    const auto record = entity->dbentity();
    if (!record) return false;
    auto snapshot = record->clone();
    auto values = query->validationRecordForEntity(snapshot);
    carrier = std::make_shared<KRDBValidationRecordCarrier>(std::move(snapshot), std::move(values));
    entity->setValidationRecord(carrier);
  }
  if (entity->entityID()->entityType() != entityType()) return false;
  // One result map per thread: the query stores its answer there without allocating once it holds it.
  thread_local dbcore::ColumnValues resultMap;
  return query->Result(resultMap, carrier->values());
}

std::string KRDBFilteredEntitiesFetchRequest::notMarkedToDeleteConditionWith(const std::string& condition) {
  std::string text = kNotMarkedToDeleteCondition;
  if (!condition.empty()) text += " && (" + condition + ")";
  return text;
}

void KRDBFilteredEntitiesFetchRequest::raiseUnrecognizedSelector(const char* operation) const {
  KRException::raise(KRException::NSInvalidArgumentException,
                     "-[" + className() + " " + operation + "]: unrecognized selector");
}
