#include "Model/KRDBEntitiesFilter/KRDBSpecifiedTypesEntitiesFilter.hpp"

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"

namespace {

// Adds the entities of one type of a change set to `into` (made when absent).
void addOfType(KRDBEntitiesFilter::EntitySetPtr& into, const KRDBEntitiesFilter::EntitySetPtr& ofType) {
  if (!ofType) return;
  if (!into) into = std::make_shared<KRDBEntitySet>();
  into->insert(ofType->begin(), ofType->end());
}

}  // namespace

void KRDBSpecifiedTypesEntitiesFilter::setUpWithContext(const std::shared_ptr<KRDBContext>& context) {
  context_ = context;
  entityTypes_ = filteredEntitiesTypes();
  if (context) context->addListener(shared_from_this());
}

KRDBSpecifiedTypesEntitiesFilter::EntityTypes KRDBSpecifiedTypesEntitiesFilter::filteredEntitiesTypes()
    const {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass", "filteredEntitiesTypes");
  KRException::raise(KRException::NSInvalidArgumentException,
                     "-[" + className() + " filteredEntitiesTypes]: unrecognized selector");
}

void KRDBSpecifiedTypesEntitiesFilter::processChanges(const ChangesStoragePtr& changes) {
  if (invalid() || !changes) return;
  EntitySetPtr added;
  EntitySetPtr deleted;
  EntitySetPtr updated;
  for (const int64_t type : entityTypes_) {
    addOfType(updated, changes->updatedEntitiesOfType(type));
    addOfType(added, changes->addedEntitiesOfType(type));
    addOfType(deleted, changes->deletedEntitiesOfType(type));
  }
  const auto records = emptyEntitiesChangesMapTable();
  if (updated && changes->entitiesChanges()) {
    for (const auto& entity : *updated) {
      if (const auto record = changes->entitiesChanges()->objectForKey(entity->entityID()))
        records->setObject(record, entity->entityID());
    }
  }
  KRDBEntitiesFilter::processChanges(
      KRDBEntitiesChangesStorage::initWithAddedEntities(added, deleted, updated, records));
}

void KRDBSpecifiedTypesEntitiesFilter::contextDidUpdate(const std::shared_ptr<KRDBContext>& /*context*/,
                                                        const ChangesStoragePtr& changes) {
  processChanges(changes);
}
