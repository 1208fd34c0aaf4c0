#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"

#include <utility>

#include "Model/KRDBEntity/KRDBEntity.hpp"

std::shared_ptr<KRDBEntitiesChangesStorage> KRDBEntitiesChangesStorage::initWithAddedEntities(
    EntitySetPtr addedEntities, EntitySetPtr deletedEntities, EntitySetPtr updatedEntities,
    EntitiesChangesPtr entitiesChanges) {
  return std::shared_ptr<KRDBEntitiesChangesStorage>(
      new KRDBEntitiesChangesStorage(std::move(addedEntities), std::move(deletedEntities),
                                     std::move(updatedEntities), std::move(entitiesChanges)));
}

KRDBEntitiesChangesStorage::KRDBEntitiesChangesStorage(EntitySetPtr addedEntities,
                                                       EntitySetPtr deletedEntities,
                                                       EntitySetPtr updatedEntities,
                                                       EntitiesChangesPtr entitiesChanges)
    : addedEntities_(std::move(addedEntities)),
      deletedEntities_(std::move(deletedEntities)),
      updatedEntities_(std::move(updatedEntities)),
      entitiesChanges_(std::move(entitiesChanges)) {}

KRDBEntitiesChangesStorage::EntitySetPtr KRDBEntitiesChangesStorage::addedEntitiesOfType(
    int64_t entityType) const {
  return entitiesOfType(addedEntities_, addedEntitiesFilteredByType_, entityType);
}

KRDBEntitiesChangesStorage::EntitySetPtr KRDBEntitiesChangesStorage::deletedEntitiesOfType(
    int64_t entityType) const {
  return entitiesOfType(deletedEntities_, deletedEntitiesFilteredByType_, entityType);
}

KRDBEntitiesChangesStorage::EntitySetPtr KRDBEntitiesChangesStorage::updatedEntitiesOfType(
    int64_t entityType) const {
  return entitiesOfType(updatedEntities_, updatedEntitiesFilteredByType_, entityType);
}

KRDBEntitiesChangesStorage::EntityPredicate KRDBEntitiesChangesStorage::predicateForEntityType(
    int64_t entityType) {
  return [entityType](const std::shared_ptr<KRDBEntity>& entity) {
    return entity && entity->entityID()->entityType() == entityType;
  };
}

KRDBEntitiesChangesStorage::EntitySetPtr KRDBEntitiesChangesStorage::entitiesOfType(
    const EntitySetPtr& entities, TypeCache& cache, int64_t entityType) const {
  if (!entities) return nullptr;
  const std::lock_guard lock(cacheMutex_);
  auto& cached = cache[entityType];
  if (cached) return cached;
  cached = std::make_shared<KRDBEntitySet>();
  const EntityPredicate keeps = predicateForEntityType(entityType);
  for (const auto& entity : *entities) {
    if (keeps(entity)) cached->insert(entity);
  }
  return cached;
}
