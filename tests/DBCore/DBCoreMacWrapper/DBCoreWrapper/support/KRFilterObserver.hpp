#pragma once

#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRDictionary.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"

// Records the notifications it receives, in order.
class KRFilterObserver : public KRObject, public KRDBEntitesFilterUpdateProtocol {
 public:
  struct Event {
    std::string name;
    KRDictionary info;
  };

  void entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& filter) override {
    record("reset", filter, KRDictionary());
  }
  void entitiesFilterDidUpdateEntitiesList(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                                           const KRDictionary& info) override {
    record("entitiesList", filter, info);
  }
  void entitiesFilterDidUpdateSortedEntitiesList(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                                                 const KRDictionary& info) override {
    record("sortedList", filter, info);
  }
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary& info) override {
    record("change", filter, info);
  }

  std::vector<std::string> names() const {
    std::vector<std::string> names;
    for (const auto& event : events) names.push_back(event.name);
    return names;
  }

  std::vector<Event> events;
  std::vector<std::shared_ptr<KRDBEntitiesFilter>> senders;

 private:
  void record(const std::string& name, const std::shared_ptr<KRDBEntitiesFilter>& filter,
              const KRDictionary& info) {
    events.push_back({name, info});
    senders.push_back(filter);
  }
};

inline KRDBEntitiesFilter::EntitySetPtr setUnder(const KRDictionary& info, const KRString& key) {
  return KRDBValueBox<KRDBEntitySet>::heldBy(info.objectForKey(KRValue(key)));
}
