#pragma once

#include <memory>

#include "KRFoundation/KRValue.hpp"

class KRDBEntity;

// What an entity tells its observers (the owning context, application objects). Every method is
// optional; notifications arrive on the entity's thread.
class KRDBEntityObserver {
 public:
  virtual ~KRDBEntityObserver() = default;
  // Before a change; `info` is as the changer gave it (often nil).
  virtual void entityWillChange(const std::shared_ptr<KRDBEntity>& /*entity*/, const KRDictionary& /*info*/) {
  }
  // After a change: the change keys that changed, never the kKRDBEntityDidNotChange marker.
  virtual void entityDidChange(const std::shared_ptr<KRDBEntity>& /*entity*/, const KRDictionary& /*info*/) {}
  // A fetch request left a fresh validation record on the entity.
  virtual void validationRecordDidSet(const std::shared_ptr<KRDBEntity>& /*entity*/) {}
};
