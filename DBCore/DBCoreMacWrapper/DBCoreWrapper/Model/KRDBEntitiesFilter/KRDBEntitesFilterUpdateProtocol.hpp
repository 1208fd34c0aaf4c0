#pragma once

#include <memory>

#include "KRFoundation/KRDictionary.hpp"

class KRDBEntitiesFilter;

// What the observers of a live filter hear: a reset, a new or changed entity set, a new or changed
// sorted array, and changes of the entities themselves. The info dictionaries hold the filter's change
// keys; an info is nil after a wholesale replacement. Every method is optional (empty by default).
// Called on the filter's thread.
class KRDBEntitesFilterUpdateProtocol {
 public:
  virtual ~KRDBEntitesFilterUpdateProtocol() = default;

  virtual void entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/) {}
  virtual void entitiesFilterDidUpdateEntitiesList(const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/,
                                                   const KRDictionary& /*info*/) {}
  virtual void entitiesFilterDidUpdateSortedEntitiesList(
      const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/, const KRDictionary& /*info*/) {}
  virtual void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/,
                                       const KRDictionary& /*info*/) {}
};
