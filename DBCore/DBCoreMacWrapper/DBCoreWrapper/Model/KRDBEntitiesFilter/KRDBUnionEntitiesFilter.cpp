#include "Model/KRDBEntitiesFilter/KRDBUnionEntitiesFilter.hpp"

#include <utility>

std::shared_ptr<KRDBUnionEntitiesFilter> KRDBUnionEntitiesFilter::initWithEntitiesFilters(
    const EntitiesFilters& entitiesFilters) {
  std::shared_ptr<KRDBUnionEntitiesFilter> filter(new KRDBUnionEntitiesFilter());
  filter->KRDBCompoundEntitiesFilter::initWithEntitiesFilters(entitiesFilters);
  return filter;
}

bool KRDBUnionEntitiesFilter::anyMemberContains(const EntityPtr& entity) const {
  for (const auto& member : entitiesFilters()) {
    if (member && member->containsEntity(entity)) return true;
  }
  return false;
}

bool KRDBUnionEntitiesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  return anyMemberContains(entity);
}

void KRDBUnionEntitiesFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  if (entitiesFilters().empty()) return completion(std::make_shared<KRDBEntitySet>());
  obtainMembersEntities([completion = std::move(completion)](const std::vector<EntitySetPtr>& sets) {
    auto united = std::make_shared<KRDBEntitySet>();
    for (const auto& set : sets) {
      if (set) united->insert(set->begin(), set->end());
    }
    completion(united);
  });
}

KRDBEntitiesFilter::EntitySetPtr KRDBUnionEntitiesFilter::filterDeletedEntities(
    const EntitySetPtr& deleted) const {
  if (!deleted) return nullptr;
  auto gone = std::make_shared<KRDBEntitySet>();
  for (const auto& entity : *deleted) {
    if (!anyMemberContains(entity)) gone->insert(entity);
  }
  return gone;
}
