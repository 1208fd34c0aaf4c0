#pragma once

#include <memory>

#include "KRFoundation/KRPredicate.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

// A live filter narrowing another: the entities of that filter that its predicate admits, kept up to date
// from that filter's change notifications. Starts with the narrowed filter's sort descriptors. Without a
// predicate it admits nothing. Used on the narrowed filter's thread; the predicate may be evaluated on
// several threads at once.
class KRDBEntitiesSubfilter : public KRDBEntitiesFilter, public KRDBEntitesFilterUpdateProtocol {
 public:
  using PredicatePtr = std::shared_ptr<KRPredicate>;

  static std::shared_ptr<KRDBEntitiesSubfilter> initWithEntitiesFilter(
      const std::shared_ptr<KRDBEntitiesFilter>& entitiesFilter);

  const std::shared_ptr<KRDBEntitiesFilter>& entitiesFilter() const { return entitiesFilter_; }
  const PredicatePtr& predicate() const { return predicate_; }
  // Another predicate object resets the subfilter; the same one again changes nothing.
  void setPredicate(PredicatePtr predicate);

  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The narrowed filter's entities that the predicate admits.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;

  void entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& filter) override;
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary& info) override;

 private:
  KRDBEntitiesSubfilter() = default;

  std::shared_ptr<KRDBEntitiesFilter> entitiesFilter_;
  PredicatePtr predicate_;
};
