#include "Model/KRDBEntitiesFilter/KRDBIntersectEntitiesFilter.hpp"

#include <algorithm>
#include <utility>

namespace {

using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;

size_t sizeOf(const EntitySetPtr& set) { return set ? set->size() : 0; }

// The entities of every set, starting from a copy of the smallest.
EntitySetPtr intersection(std::vector<EntitySetPtr> sets) {
  std::stable_sort(sets.begin(), sets.end(),
                   [](const EntitySetPtr& a, const EntitySetPtr& b) { return sizeOf(a) < sizeOf(b); });
  auto common =
      sets.front() ? std::make_shared<KRDBEntitySet>(*sets.front()) : std::make_shared<KRDBEntitySet>();
  for (size_t index = 1; index < sets.size() && !common->empty(); ++index) {
    std::erase_if(*common,
                  [&](const auto& entity) { return !sets[index] || !sets[index]->contains(entity); });
  }
  return common;
}

}  // namespace

std::shared_ptr<KRDBIntersectEntitiesFilter> KRDBIntersectEntitiesFilter::initWithEntitiesFilters(
    const EntitiesFilters& entitiesFilters) {
  std::shared_ptr<KRDBIntersectEntitiesFilter> filter(new KRDBIntersectEntitiesFilter());
  filter->KRDBCompoundEntitiesFilter::initWithEntitiesFilters(entitiesFilters);
  return filter;
}

bool KRDBIntersectEntitiesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  return std::all_of(entitiesFilters().begin(), entitiesFilters().end(),
                     [&entity](const auto& member) { return member && member->containsEntity(entity); });
}

void KRDBIntersectEntitiesFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  if (entitiesFilters().empty()) return completion(std::make_shared<KRDBEntitySet>());
  obtainMembersEntities([completion = std::move(completion)](const std::vector<EntitySetPtr>& sets) {
    completion(intersection(sets));
  });
}
