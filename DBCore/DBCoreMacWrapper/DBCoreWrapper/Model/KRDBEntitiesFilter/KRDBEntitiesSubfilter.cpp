#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"

#include <utility>

#include "Model/KRDBEntity/KRDBEntity.hpp"

std::shared_ptr<KRDBEntitiesSubfilter> KRDBEntitiesSubfilter::initWithEntitiesFilter(
    const std::shared_ptr<KRDBEntitiesFilter>& entitiesFilter) {
  std::shared_ptr<KRDBEntitiesSubfilter> subfilter(new KRDBEntitiesSubfilter());
  subfilter->entitiesFilter_ = entitiesFilter;
  if (entitiesFilter) {
    subfilter->setSortDescriptors(entitiesFilter->sortDescriptors());
    entitiesFilter->addListener(subfilter);
  }
  return subfilter;
}

void KRDBEntitiesSubfilter::setPredicate(PredicatePtr predicate) {
  if (predicate == predicate_) return;
  predicate_ = std::move(predicate);
  reset();
}

bool KRDBEntitiesSubfilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  return predicate_ && predicate_->evaluateWithObject(KRValue(entity));
}

void KRDBEntitiesSubfilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  obtainAdmittedEntitiesOf(entitiesFilter_, std::move(completion));
}

void KRDBEntitiesSubfilter::entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/) {
  reset();
}

void KRDBEntitiesSubfilter::entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/,
                                                    const KRDictionary& info) {
  processChanges(changesOfInfo(info));
}
