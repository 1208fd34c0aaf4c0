#include "Model/KRDBEntitiesFilter/KRDBRequestedEntitiesFilter.hpp"

#include <utility>

#include "Model/KRDBContext/KRDBContext.hpp"

std::shared_ptr<KRDBRequestedEntitiesFilter> KRDBRequestedEntitiesFilter::initWithContext(
    const std::shared_ptr<KRDBContext>& context, RequestPtr request) {
  std::shared_ptr<KRDBRequestedEntitiesFilter> filter(new KRDBRequestedEntitiesFilter());
  filter->setUpWithContext(context, std::move(request));
  return filter;
}

void KRDBRequestedEntitiesFilter::setUpWithContext(const std::shared_ptr<KRDBContext>& context,
                                                   RequestPtr request) {
  request_ = std::move(request);
  KRDBSpecifiedTypesEntitiesFilter::setUpWithContext(context);
}

KRDBSpecifiedTypesEntitiesFilter::EntityTypes KRDBRequestedEntitiesFilter::filteredEntitiesTypes() const {
  return {request_->entityType()};
}

bool KRDBRequestedEntitiesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  return request_->isEntitySatisfyingFilterConditions(entity);
}

void KRDBRequestedEntitiesFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  const auto context = this->context();
  if (!context) return;
  context->obtainEntitiesUsingFetchRequest(
      request_, [completion = std::move(completion)](KRDBEntitySet entities) {
        if (completion) completion(std::make_shared<KRDBEntitySet>(std::move(entities)));
      });
}

void KRDBRequestedEntitiesFilter::reset() {
  request_->reset();
  KRDBSpecifiedTypesEntitiesFilter::reset();
}
