#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBSpecifiedTypesEntitiesFilter.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

// A live filter over a fetch request: the entities of the request's type that the request selects, obtained
// through the context and tested in memory by the request. Used on the context's thread; the membership
// test may run on several threads at once (the request allows it).
class KRDBRequestedEntitiesFilter : public KRDBSpecifiedTypesEntitiesFilter {
 public:
  using RequestPtr = std::shared_ptr<KRDBFilteredEntitiesFetchRequest>;

  static std::shared_ptr<KRDBRequestedEntitiesFilter> initWithContext(
      const std::shared_ptr<KRDBContext>& context, RequestPtr request);

  const RequestPtr& request() const { return request_; }
  // The request's entity type.
  EntityTypes filteredEntitiesTypes() const override;
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The request's entities as the context's prepared instances.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;
  // Drops the request's cached query and predicates, then the lists.
  void reset() override;

 protected:
  KRDBRequestedEntitiesFilter() = default;
  void setUpWithContext(const std::shared_ptr<KRDBContext>& context, RequestPtr request);

 private:
  RequestPtr request_;
};
