#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesFilter.hpp"

#include <algorithm>
#include <limits>
#include <utility>

#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;

// The image's capture date in seconds since 1970; minus infinity (sorting first, as a missing date does)
// for an entity without one.
double captureTimeOf(const EntityPtr& entity) {
  constexpr double kNone = -std::numeric_limits<double>::infinity();
  if (!entity || entity->entityID()->entityType() != KRDBEntityTypeImage) return kNone;
  const auto& exif = std::static_pointer_cast<KRDBImage>(entity)->exivAttributesPrimitive();
  if (!exif || exif->date().isNil()) return kNone;
  return exif->date().timeIntervalSince1970();
}

}  // namespace

std::shared_ptr<KRDBCalendarNodeImagesFilter> KRDBCalendarNodeImagesFilter::initWithParentFilter(
    const std::shared_ptr<KRDBCalendarNodeImagesAbstractFilter>& parentFilter, double startTimeInterval,
    double endTimeInterval) {
  std::shared_ptr<KRDBCalendarNodeImagesFilter> node(new KRDBCalendarNodeImagesFilter());
  node->parentFilter_ = parentFilter;
  node->startTimeInterval_ = startTimeInterval;
  node->endTimeInterval_ = endTimeInterval;
  node->initWithBaseFilter(parentFilter);
  return node;
}

bool KRDBCalendarNodeImagesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& entity) const {
  const double time = captureTimeOf(entity);
  return startTimeInterval_ <= time && time < endTimeInterval_;
}

void KRDBCalendarNodeImagesFilter::initiallyObtainFilteredEntities(EntitiesHandler completion) {
  if (!parentFilter_) return completion(std::make_shared<KRDBEntitySet>());
  const std::weak_ptr<KRObject> weakSelf = weak_from_this();
  parentFilter_->obtainSortedByDateImagesWithHandler(
      [weakSelf, completion = std::move(completion)](const EntityArrayPtr& sortedByDate) {
        const auto self = std::static_pointer_cast<KRDBCalendarNodeImagesFilter>(weakSelf.lock());
        if (!self) return;
        completion(sortedByDate ? self->imagesInRange(*sortedByDate) : std::make_shared<KRDBEntitySet>());
      });
}

KRDBEntitiesFilter::EntitySetPtr KRDBCalendarNodeImagesFilter::imagesInRange(
    const EntityArray& sortedByDate) const {
  auto images = std::make_shared<KRDBEntitySet>();
  // The whole array before the range or after it: nothing to search.
  if (sortedByDate.empty() || captureTimeOf(sortedByDate.back()) < startTimeInterval_ ||
      captureTimeOf(sortedByDate.front()) >= endTimeInterval_) {
    return images;
  }
  const auto before = [](const EntityPtr& entity, double time) { return captureTimeOf(entity) < time; };
  const auto first = std::lower_bound(sortedByDate.begin(), sortedByDate.end(), startTimeInterval_, before);
  const auto last = std::lower_bound(first, sortedByDate.end(), endTimeInterval_, before);
  images->insert(first, last);
  return images;
}

void KRDBCalendarNodeImagesFilter::obtainSortedByDateImagesWithHandler(SortedEntitiesHandler handler) {
  if (parentFilter_) parentFilter_->obtainSortedByDateImagesWithHandler(std::move(handler));
}
