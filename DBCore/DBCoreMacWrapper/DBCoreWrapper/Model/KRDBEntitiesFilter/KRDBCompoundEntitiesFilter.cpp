#include "Model/KRDBEntitiesFilter/KRDBCompoundEntitiesFilter.hpp"

#include <utility>

#include "KRServices/KRLog.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"

void KRDBCompoundEntitiesFilter::initWithEntitiesFilters(const EntitiesFilters& entitiesFilters) {
  entitiesFilters_ = entitiesFilters;
  listenToMembers();
}

void KRDBCompoundEntitiesFilter::listenToMembers() {
  for (const auto& member : entitiesFilters_) {
    if (member) member->addListener(selfPointer());
  }
}

void KRDBCompoundEntitiesFilter::setEntitiesFilters(const EntitiesFilters& entitiesFilters) {
  if (entitiesFilters == entitiesFilters_) return;
  for (const auto& member : entitiesFilters_) {
    if (member) member->removeListener(selfPointer());
  }
  entitiesFilters_ = entitiesFilters;
  reset();
  listenToMembers();
}

KRDBEntitiesFilter::EntitySetPtr KRDBCompoundEntitiesFilter::filterAddedEntities(
    const EntitySetPtr& added) const {
  return added;
}

KRDBEntitiesFilter::EntitySetPtr KRDBCompoundEntitiesFilter::filterDeletedEntities(
    const EntitySetPtr& deleted) const {
  return deleted;
}

void KRDBCompoundEntitiesFilter::entitiesFilterDidReset(
    const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/) {
  reset();
}

void KRDBCompoundEntitiesFilter::entitiesFilterDidChange(
    const std::shared_ptr<KRDBEntitiesFilter>& /*filter*/, const KRDictionary& info) {
  const auto changes = changesOfInfo(info);
  processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      filterAddedEntities(changes->addedEntities()), filterDeletedEntities(changes->deletedEntities()),
      changes->updatedEntities(), changes->entitiesChanges()));
}

void KRDBCompoundEntitiesFilter::obtainMembersEntities(
    std::function<void(const std::vector<EntitySetPtr>&)> combine) {
  struct Answers {
    std::vector<EntitySetPtr> sets;
    size_t count = 0;
  };
  const auto answers = std::make_shared<Answers>();
  answers->sets.resize(entitiesFilters_.size());
  const std::weak_ptr<KRObject> weakSelf = weak_from_this();
  for (size_t position = 0; position < entitiesFilters_.size(); ++position) {
    entitiesFilters_[position]->obtainEntities(
        [weakSelf, answers, position, combine](const EntitySetPtr& set) {
          const auto self = weakSelf.lock();
          if (!self) return;
          if (answers->count == answers->sets.size()) {
            KRLog(KRLogLevelError, "Error: %@", self->description());
            return;
          }
          answers->sets[position] = set;
          if (++answers->count == answers->sets.size()) combine(answers->sets);
        });
  }
}
