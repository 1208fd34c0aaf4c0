#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

// A node of a calendar tree of images: the images of a base filter that the node's own test admits, kept
// up to date from the base filter's change notifications. The root and the date-range nodes say which
// images they take and where the date-sorted images come from. Used on the base filter's thread.
class KRDBCalendarNodeImagesAbstractFilter : public KRDBEntitiesFilter,
                                             public KRDBEntitesFilterUpdateProtocol {
 public:
  const std::shared_ptr<KRDBEntitiesFilter>& baseFilter() const { return baseFilter_; }
  // Hands over the tree's images sorted by capture date; the abstract node logs the missing override and
  // raises.
  virtual void obtainSortedByDateImagesWithHandler(SortedEntitiesHandler handler);

  // The base filter's entities that the node's test admits.
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override;
  void entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& filter) override;
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary& info) override;

 protected:
  KRDBCalendarNodeImagesAbstractFilter() = default;
  // Stores the base filter and listens to it. Called once, by the factories.
  void initWithBaseFilter(const std::shared_ptr<KRDBEntitiesFilter>& baseFilter);

 private:
  std::shared_ptr<KRDBEntitiesFilter> baseFilter_;
};
