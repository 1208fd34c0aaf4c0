#pragma once

#include <memory>
#include <vector>

#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

// A live filter built on member filters and fed by their change notifications; the union and the
// intersection say how the members combine. A member's reset resets the compound. Used on the members'
// thread.
class KRDBCompoundEntitiesFilter : public KRDBEntitiesFilter, public KRDBEntitesFilterUpdateProtocol {
 public:
  using EntitiesFilters = std::vector<std::shared_ptr<KRDBEntitiesFilter>>;

  const EntitiesFilters& entitiesFilters() const { return entitiesFilters_; }
  // The same members again change nothing; others replace the listened-to members and reset the compound.
  void setEntitiesFilters(const EntitiesFilters& entitiesFilters);

  // What of a member's added and deleted entities the compound takes on; the base takes them all.
  virtual EntitySetPtr filterAddedEntities(const EntitySetPtr& added) const;
  virtual EntitySetPtr filterDeletedEntities(const EntitySetPtr& deleted) const;

  void entitiesFilterDidReset(const std::shared_ptr<KRDBEntitiesFilter>& filter) override;
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary& info) override;

 protected:
  KRDBCompoundEntitiesFilter() = default;
  // Stores the members and listens to each. Called once, by the factories.
  void initWithEntitiesFilters(const EntitiesFilters& entitiesFilters);
  // Obtains every member's set and hands them, in member order, to `combine` once all have answered.
  void obtainMembersEntities(std::function<void(const std::vector<EntitySetPtr>&)> combine);

 private:
  void listenToMembers();

  EntitiesFilters entitiesFilters_;
};
