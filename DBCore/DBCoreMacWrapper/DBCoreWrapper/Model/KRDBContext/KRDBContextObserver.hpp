#pragma once

#include <memory>

class KRDBContext;
class KRDBEntitiesChangesStorage;

// What the observers of a context hear: the change set of one change-processing pass. Optional (empty by
// default). Called on the context's thread.
class KRDBContextObserver {
 public:
  virtual ~KRDBContextObserver() = default;
  virtual void contextDidUpdate(const std::shared_ptr<KRDBContext>& /*context*/,
                                const std::shared_ptr<KRDBEntitiesChangesStorage>& /*changes*/) {}
};
