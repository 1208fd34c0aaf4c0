#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesAbstractFilter.hpp"

// A calendar node below another: the parent's images captured from startTimeInterval (included) to
// endTimeInterval (excluded), in seconds since 1970. Its first set is a run of the tree's date-sorted
// array, found by bisection. Used on the tree's thread.
class KRDBCalendarNodeImagesFilter : public KRDBCalendarNodeImagesAbstractFilter {
 public:
  static std::shared_ptr<KRDBCalendarNodeImagesFilter> initWithParentFilter(
      const std::shared_ptr<KRDBCalendarNodeImagesAbstractFilter>& parentFilter, double startTimeInterval,
      double endTimeInterval);

  const std::shared_ptr<KRDBCalendarNodeImagesAbstractFilter>& parentFilter() const { return parentFilter_; }
  double startTimeInterval() const { return startTimeInterval_; }
  double endTimeInterval() const { return endTimeInterval_; }

  // An image whose capture date lies in the node's range.
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override;
  // The run of the parent's date-sorted images that lies in the range.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;
  // The parent's, so that a tree shares the root's array.
  void obtainSortedByDateImagesWithHandler(SortedEntitiesHandler handler) override;

 private:
  KRDBCalendarNodeImagesFilter() = default;
  EntitySetPtr imagesInRange(const EntityArray& sortedByDate) const;

  std::shared_ptr<KRDBCalendarNodeImagesAbstractFilter> parentFilter_;
  double startTimeInterval_ = 0;
  double endTimeInterval_ = 0;
};
