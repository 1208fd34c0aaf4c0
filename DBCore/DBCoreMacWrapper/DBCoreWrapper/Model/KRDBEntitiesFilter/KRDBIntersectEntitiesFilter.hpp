#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBCompoundEntitiesFilter.hpp"

// The entities every member filter holds. Used on the members' thread.
class KRDBIntersectEntitiesFilter : public KRDBCompoundEntitiesFilter {
 public:
  static std::shared_ptr<KRDBIntersectEntitiesFilter> initWithEntitiesFilters(
      const EntitiesFilters& entitiesFilters);

  // Every member holds the entity (true without members).
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The intersection of the members' sets once all have answered, from the smallest set on; empty
  // without members.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;

 private:
  KRDBIntersectEntitiesFilter() = default;
};
