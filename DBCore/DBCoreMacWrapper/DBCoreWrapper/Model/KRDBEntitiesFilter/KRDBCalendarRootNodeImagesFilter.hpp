#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesAbstractFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"

// The root of a calendar tree: the base filter's images that are shown (not marked to delete, neither
// trashed nor lost), with the one array of them sorted by capture date that the whole tree searches. Used
// on the base filter's thread.
class KRDBCalendarRootNodeImagesFilter : public KRDBCalendarNodeImagesAbstractFilter {
 public:
  static std::shared_ptr<KRDBCalendarRootNodeImagesFilter> initWithBaseFilter(
      const std::shared_ptr<KRDBEntitiesFilter>& baseFilter);

  // The subfilter of the base filter holding the shown images, sorted by capture date.
  const std::shared_ptr<KRDBEntitiesSubfilter>& sortedByDateImagesFilter() const {
    return sortedByDateImagesFilter_;
  }
  void obtainSortedByDateImagesWithHandler(SortedEntitiesHandler handler) override;
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;

  // Whether an image is shown in a calendar: an image, not marked to delete, neither trashed nor lost.
  static bool isShownImage(const EntityPtr& entity);

 private:
  KRDBCalendarRootNodeImagesFilter() = default;

  std::shared_ptr<KRDBEntitiesSubfilter> sortedByDateImagesFilter_;
};
