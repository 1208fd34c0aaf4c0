#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBCompoundEntitiesFilter.hpp"

// The entities of any member filter. An entity one member deletes stays while another member holds it.
// Used on the members' thread.
class KRDBUnionEntitiesFilter : public KRDBCompoundEntitiesFilter {
 public:
  static std::shared_ptr<KRDBUnionEntitiesFilter> initWithEntitiesFilters(
      const EntitiesFilters& entitiesFilters);

  // Some member holds the entity.
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The union of the members' sets once all have answered; empty without members.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;
  // The deleted entities that no member holds any more.
  EntitySetPtr filterDeletedEntities(const EntitySetPtr& deleted) const override;

 private:
  KRDBUnionEntitiesFilter() = default;
  bool anyMemberContains(const EntityPtr& entity) const;
};
