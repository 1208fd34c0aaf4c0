#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"

#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Support/KRDBCoreInjectorService.hpp"

std::shared_ptr<KRDBEntitiesStorage> KRDBEntitiesStorage::init() {
  std::shared_ptr<KRDBEntitiesStorage> storage(new KRDBEntitiesStorage());
  storage->initializeMaps();
  return storage;
}

void KRDBEntitiesStorage::initializeMaps() {
  KRDBCoreInjectorService::load();
  const auto factory =
      KRDBCoreInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>();
  for (auto& map : entitiesStorage_) map = factory->makeMapTableWithObjectsMappedBySameTypeEntityIDs();
}

KRDBEntityIDMapTable& KRDBEntitiesStorage::mapOfType(int64_t entityType) const {
  return *entitiesStorage_.at(static_cast<size_t>(entityType));
}

std::shared_ptr<KRDBEntity> KRDBEntitiesStorage::entityForID(const KRDBEntityIDPtr& entityID) const {
  return std::static_pointer_cast<KRDBEntity>(mapOfType(entityID->entityType()).objectForKey(entityID));
}

void KRDBEntitiesStorage::setEntity(const std::shared_ptr<KRDBEntity>& entity,
                                    const KRDBEntityIDPtr& entityID) {
  mapOfType(entityID->entityType()).setObject(entity, entityID);
}

void KRDBEntitiesStorage::removeEntityForID(const KRDBEntityIDPtr& entityID) {
  mapOfType(entityID->entityType()).removeObjectForKey(entityID);
}

std::vector<std::shared_ptr<KRDBEntity>> KRDBEntitiesStorage::allEntitiesWithType(int64_t entityType) const {
  std::vector<std::shared_ptr<KRDBEntity>> entities;
  const KRDBEntityIDMapTable& map = mapOfType(entityType);
  entities.reserve(map.count());
  map.forEach([&entities](const KRDBEntityIDPtr&, const std::shared_ptr<KRObject>& object) {
    entities.push_back(std::static_pointer_cast<KRDBEntity>(object));
  });
  return entities;
}

std::vector<std::shared_ptr<KRDBEntity>> KRDBEntitiesStorage::allEntities() const {
  std::vector<std::shared_ptr<KRDBEntity>> entities;
  for (size_t type = 0; type < kTypeCount; ++type) {
    auto ofType = allEntitiesWithType(static_cast<int64_t>(type));
    entities.insert(entities.end(), ofType.begin(), ofType.end());
  }
  return entities;
}
