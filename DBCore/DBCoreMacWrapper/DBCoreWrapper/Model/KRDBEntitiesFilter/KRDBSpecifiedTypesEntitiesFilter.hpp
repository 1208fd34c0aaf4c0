#pragma once

#include <cstdint>
#include <memory>
#include <set>

#include "Model/KRDBContext/KRDBContextObserver.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

class KRDBContext;

// A live filter fed by its context's change sets and restricted to some entity types: it observes the
// context and keeps, of each change set, the entities of its types. Subclasses name the types. Used on the
// context's thread; holds the context weakly (the context owns filters).
class KRDBSpecifiedTypesEntitiesFilter : public KRDBEntitiesFilter, public KRDBContextObserver {
 public:
  using EntityTypes = std::set<int64_t>;

  std::shared_ptr<KRDBContext> context() const { return context_.lock(); }
  // The types of filteredEntitiesTypes, taken once when the filter is made.
  const EntityTypes& entityTypes() const { return entityTypes_; }
  // The entity types the filter holds; the base logs the missing override and raises.
  virtual EntityTypes filteredEntitiesTypes() const;

  // Keeps of the change set the entities (and change records) of the filter's types.
  void processChanges(const ChangesStoragePtr& changes) override;
  void contextDidUpdate(const std::shared_ptr<KRDBContext>& context,
                        const ChangesStoragePtr& changes) override;

 protected:
  KRDBSpecifiedTypesEntitiesFilter() = default;
  // Stores the context, takes the types and starts observing the context. Called once, by the factories.
  void setUpWithContext(const std::shared_ptr<KRDBContext>& context);

 private:
  std::weak_ptr<KRDBContext> context_;
  EntityTypes entityTypes_;
};
