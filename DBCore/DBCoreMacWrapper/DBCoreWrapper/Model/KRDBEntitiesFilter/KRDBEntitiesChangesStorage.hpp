#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <unordered_map>

#include "KRFoundation/KRObject.hpp"
#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"

// The change set the context hands to every live filter: the added, deleted and updated entities and
// each changed entity's change record, with the subsets of one entity type cached on first request.
// The sets and the map are not changed after construction, so one storage may be read by several
// filters; the per-type caches are filled by whichever thread reads first and are guarded by a mutex.
class KRDBEntitiesChangesStorage : public KRObject {
 public:
  using EntitySetPtr = std::shared_ptr<KRDBEntitySet>;
  using EntitiesChangesPtr = std::shared_ptr<KRDBEntityIDMapTable>;
  using EntityPredicate = std::function<bool(const std::shared_ptr<KRDBEntity>&)>;

  // Any of the four may be empty (absent).
  static std::shared_ptr<KRDBEntitiesChangesStorage> initWithAddedEntities(
      EntitySetPtr addedEntities, EntitySetPtr deletedEntities, EntitySetPtr updatedEntities,
      EntitiesChangesPtr entitiesChanges);

  const EntitySetPtr& addedEntities() const { return addedEntities_; }
  const EntitySetPtr& deletedEntities() const { return deletedEntities_; }
  const EntitySetPtr& updatedEntities() const { return updatedEntities_; }
  const EntitiesChangesPtr& entitiesChanges() const { return entitiesChanges_; }

  // The entities of the set whose identifier has the type; absent when the set is. The same set object
  // is answered every time for one type (an empty one too).
  EntitySetPtr addedEntitiesOfType(int64_t entityType) const;
  EntitySetPtr deletedEntitiesOfType(int64_t entityType) const;
  EntitySetPtr updatedEntitiesOfType(int64_t entityType) const;

  // Keeps the entities whose identifier has the type.
  static EntityPredicate predicateForEntityType(int64_t entityType);

 private:
  using TypeCache = std::unordered_map<int64_t, EntitySetPtr>;

  KRDBEntitiesChangesStorage(EntitySetPtr addedEntities, EntitySetPtr deletedEntities,
                             EntitySetPtr updatedEntities, EntitiesChangesPtr entitiesChanges);
  EntitySetPtr entitiesOfType(const EntitySetPtr& entities, TypeCache& cache, int64_t entityType) const;

  EntitySetPtr addedEntities_;
  EntitySetPtr deletedEntities_;
  EntitySetPtr updatedEntities_;
  EntitiesChangesPtr entitiesChanges_;
  // addedEntitiesFilteredByType, deletedEntitiesFilteredByType, updatedEntitiesFilteredByType: the subsets
  // by entity type, under cacheMutex_.
  mutable std::mutex cacheMutex_;
  mutable TypeCache addedEntitiesFilteredByType_;
  mutable TypeCache deletedEntitiesFilteredByType_;
  mutable TypeCache updatedEntitiesFilteredByType_;
};
