#include "Model/KRDBEntitiesFilter/KRDBCalendarRootNodeImagesFilter.hpp"

#include <utility>

#include "KRFoundation/KRSortDescriptor.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

std::shared_ptr<KRDBCalendarRootNodeImagesFilter> KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(
    const std::shared_ptr<KRDBEntitiesFilter>& baseFilter) {
  std::shared_ptr<KRDBCalendarRootNodeImagesFilter> root(new KRDBCalendarRootNodeImagesFilter());
  root->KRDBCalendarNodeImagesAbstractFilter::initWithBaseFilter(baseFilter);
  auto sorted = KRDBEntitiesSubfilter::initWithEntitiesFilter(baseFilter);
  sorted->setSortDescriptors(std::make_shared<const KRSortDescriptors>(KRSortDescriptors{
      KRSortDescriptor::sortDescriptorWithKey("exivAttributes.date.timeIntervalSince1970", true)}));
  sorted->setPredicate(
      KRPredicate::predicateWithBlock([](const KRValue& object, const KRDictionary& /*bindings*/) {
        return isShownImage(object.objectAs<KRDBEntity>());
      }));
  root->sortedByDateImagesFilter_ = std::move(sorted);
  return root;
}

bool KRDBCalendarRootNodeImagesFilter::isShownImage(const EntityPtr& entity) {
  if (!entity || entity->entityID()->entityType() != KRDBEntityTypeImage || entity->isMarkedToDelete())
    return false;
  const auto& attributes = std::static_pointer_cast<KRDBImage>(entity)->attributesPrimitive();
  return !attributes || (!attributes->isTrashed() && !attributes->isLost());
}

bool KRDBCalendarRootNodeImagesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  return isShownImage(entity);
}

void KRDBCalendarRootNodeImagesFilter::obtainSortedByDateImagesWithHandler(SortedEntitiesHandler handler) {
  sortedByDateImagesFilter_->obtainSortedEntities(std::move(handler));
}
