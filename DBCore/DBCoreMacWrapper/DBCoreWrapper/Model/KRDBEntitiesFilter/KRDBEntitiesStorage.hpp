#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"

class KRDBEntity;

// The context's entity cache: one identifier-keyed map per entity type (codes 0 to 13), so that the one
// object of an entity is found by its identifier and the objects of one type can be listed. A type code
// outside 0 to 13 is a programming error. Not locked: used on the context's thread.
class KRDBEntitiesStorage {
 public:
  static constexpr size_t kTypeCount = 14;

  static std::shared_ptr<KRDBEntitiesStorage> init();

  std::shared_ptr<KRDBEntity> entityForID(const KRDBEntityIDPtr& entityID) const;
  // Stores the entity under the identifier, replacing an earlier one.
  void setEntity(const std::shared_ptr<KRDBEntity>& entity, const KRDBEntityIDPtr& entityID);
  void removeEntityForID(const KRDBEntityIDPtr& entityID);
  // The objects of one type, in map order.
  std::vector<std::shared_ptr<KRDBEntity>> allEntitiesWithType(int64_t entityType) const;
  // The objects of every type, types in order 0 to 13, each in map order.
  std::vector<std::shared_ptr<KRDBEntity>> allEntities() const;
  // The maps, by type code.
  const std::array<std::shared_ptr<KRDBEntityIDMapTable>, kTypeCount>& entitiesStorage() const {
    return entitiesStorage_;
  }

 private:
  KRDBEntitiesStorage() = default;
  // Makes the 14 maps through the storage factory bound in the injector.
  void initializeMaps();
  KRDBEntityIDMapTable& mapOfType(int64_t entityType) const;

  std::array<std::shared_ptr<KRDBEntityIDMapTable>, kTypeCount> entitiesStorage_;
};
