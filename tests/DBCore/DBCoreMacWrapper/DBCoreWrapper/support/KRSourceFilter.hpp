#pragma once

#include <functional>
#include <initializer_list>
#include <memory>

#include "KRTestEntities.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

// A filter for filters built on other filters to stand on: its first set is given, its membership test
// is a function the test may change, and changes reach it through `change`.
class KRSourceFilter : public KRDBEntitiesFilter {
 public:
  using Test = std::function<bool(const EntityPtr&)>;

  static std::shared_ptr<KRSourceFilter> withEntities(const KRDBEntitySet& initial) {
    auto filter = std::shared_ptr<KRSourceFilter>(new KRSourceFilter());
    filter->initial_ = initial;
    filter->test = [](const EntityPtr&) { return true; };
    return filter;
  }

  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override { return test(entity); }
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override {
    completion(std::make_shared<KRDBEntitySet>(initial_));
  }
  // Processes a change set of the given added, deleted and updated entities (any may be empty).
  void change(const KRDBEntitySet& added, const KRDBEntitySet& deleted, const KRDBEntitySet& updated) {
    const auto setOrNone = [](const KRDBEntitySet& set) {
      return set.empty() ? nullptr : std::make_shared<KRDBEntitySet>(set);
    };
    processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(setOrNone(added), setOrNone(deleted),
                                                                     setOrNone(updated), nullptr));
  }

  Test test;

 private:
  KRSourceFilter() = default;
  KRDBEntitySet initial_;
};

// The set a filter holds after obtaining it (the sources above obtain at once).
inline KRDBEntitySet obtainedNow(const std::shared_ptr<KRDBEntitiesFilter>& filter) {
  KRDBEntitySet obtained;
  filter->obtainEntities([&obtained](const KRDBEntitiesFilter::EntitySetPtr& set) {
    if (set) obtained = *set;
  });
  return obtained;
}
