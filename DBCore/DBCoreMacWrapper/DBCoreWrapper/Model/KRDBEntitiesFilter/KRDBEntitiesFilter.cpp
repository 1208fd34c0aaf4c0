#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

#include <algorithm>

#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Support/KRDBCoreInjectorService.hpp"

const KRString KRDBEntitiesFilterAddedEntities = "KRDBEntitiesFilterAddedEntities";
const KRString KRDBEntitiesFilterDeletedEntities = "KRDBEntitiesFilterDeletedEntities";
const KRString KRDBEntitiesFilterReorderedEntities = "KRDBEntitiesFilterReorderedEntities";
const KRString KRDBEntitiesFilterUpdatedEntities = "KRDBEntitiesFilterUpdatedEntities";
const KRString KRDBEntitiesFilterEntitiesChanges = "KRDBEntitiesFilterEntitiesChanges";

namespace {

using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;

bool isNonEmpty(const EntitySetPtr& entities) { return entities && !entities->empty(); }

// Adds the entities to the set, making the set when it is absent.
void unite(EntitySetPtr& target, const EntitySetPtr& entities) {
  if (!entities) return;
  if (!target) target = std::make_shared<KRDBEntitySet>();
  target->insert(entities->begin(), entities->end());
}

}  // namespace

KRDBEntitiesFilter::KRDBEntitiesFilter() = default;

// ---- Obtaining

void KRDBEntitiesFilter::obtainEntities(EntitiesHandler handler) {
  if (entities_) {
    if (handler) handler(entities_);
    return;
  }
  if (handler) obtainEntitiesHandlers_.push_back(std::move(handler));
  if (waitingForEntities_) return;
  waitingForEntities_ = true;
  const std::weak_ptr<KRObject> weakSelf = weak_from_this();
  initiallyObtainFilteredEntities([weakSelf](const EntitySetPtr& obtained) {
    if (const auto self = weakSelf.lock())
      std::static_pointer_cast<KRDBEntitiesFilter>(self)->didObtainEntities(obtained);
  });
}

void KRDBEntitiesFilter::didObtainEntities(const EntitySetPtr& obtained) {
  waitingForEntities_ = false;
  setEntities(obtained, false);
  // Changes that arrived during the obtain apply to the fresh set without being published.
  processAddedEntities();
  processDeleteEntities();
  processUpdateEntities();
  if (shouldReset_) {
    processReset();
  } else {
    completeObtainEntitiesHandlers();
  }
}

void KRDBEntitiesFilter::obtainSortedEntities(SortedEntitiesHandler handler) {
  if (sortedEntities_) {
    if (handler) handler(sortedEntities_);
    return;
  }
  if (handler) obtainSortedEntitiesHandlers_.push_back(std::move(handler));
  if (waitingForSortedEntities_) return;
  waitingForSortedEntities_ = true;
  const std::weak_ptr<KRObject> weakSelf = weak_from_this();
  obtainEntities([weakSelf](const EntitySetPtr& obtained) {
    if (const auto self = weakSelf.lock())
      std::static_pointer_cast<KRDBEntitiesFilter>(self)->sortObtainedEntities(obtained);
  });
}

void KRDBEntitiesFilter::sortObtainedEntities(const EntitySetPtr& obtained) {
  waitingForSortedEntities_ = false;
  if (!comparator_ && !hasSortDescriptors()) {
    completeObtainSortedEntitiesHandlers();
    return;
  }
  setSortedEntities(obtained ? sortedArrayOf(*obtained) : nullptr, false);
  indexSortedEntities();
  completeObtainSortedEntitiesHandlers();
}

KRDBEntitiesFilter::EntityArrayPtr KRDBEntitiesFilter::sortedArrayOf(const KRDBEntitySet& entities) const {
  EntityArray array(entities.begin(), entities.end());
  if (!comparator_) {
    return std::make_shared<EntityArray>(
        KRSortDescriptor::sortedArrayUsingDescriptors(array, *sortDescriptors_));
  }
  const Comparator& comparator = *comparator_;
  std::stable_sort(array.begin(), array.end(),
                   [&comparator](const EntityPtr& a, const EntityPtr& b) { return comparator(a, b) < 0; });
  return std::make_shared<EntityArray>(std::move(array));
}

void KRDBEntitiesFilter::indexSortedEntities() {
  if (!sortedEntities_) return;
  for (size_t position = 0; position < sortedEntities_->size(); ++position) {
    entitiesIndexes_[(*sortedEntities_)[position].get()] = position;
  }
}

void KRDBEntitiesFilter::completeObtainEntitiesHandlers() {
  // Taken out first: a handler may queue a new one.
  const auto handlers = std::exchange(obtainEntitiesHandlers_, {});
  for (const auto& handler : handlers) handler(entities_);
}

void KRDBEntitiesFilter::completeObtainSortedEntitiesHandlers() {
  const auto handlers = std::exchange(obtainSortedEntitiesHandlers_, {});
  for (const auto& handler : handlers) handler(sortedEntities_);
}

uint64_t KRDBEntitiesFilter::indexOfEntity(const EntityPtr& entity) const {
  const auto found = entitiesIndexes_.find(entity.get());
  return found == entitiesIndexes_.end() ? KRNotFound : found->second;
}

bool KRDBEntitiesFilter::containsEntity(const EntityPtr& entity) const {
  return entities_ && entities_->contains(entity);
}

// ---- Ordering

void KRDBEntitiesFilter::setSortDescriptors(SortDescriptorsPtr sortDescriptors) {
  if (sortDescriptors == sortDescriptors_) return;
  sortDescriptors_ = std::move(sortDescriptors);
  // With a comparator the descriptors do not order the array.
  if (!comparator_) resetSortedEntities();
}

void KRDBEntitiesFilter::setComparator(ComparatorPtr comparator) {
  if (comparator == comparator_) return;
  comparator_ = std::move(comparator);
  resetSortedEntities();
}

void KRDBEntitiesFilter::setSortingDisabled(bool sortingDisabled) {
  if (sortingDisabled == sortingDisabled_) return;
  sortingDisabled_ = sortingDisabled;
  if (!sortingDisabled_) resetSortedEntities();
}

bool KRDBEntitiesFilter::hasSortDescriptors() const { return sortDescriptors_ && !sortDescriptors_->empty(); }

KRComparisonResult KRDBEntitiesFilter::compareEntity(const EntityPtr& entity,
                                                     const EntityPtr& otherEntity) const {
  if (comparator_) {
    const int answer = (*comparator_)(entity, otherEntity);
    return answer < 0 ? KROrderedAscending : answer > 0 ? KROrderedDescending : KROrderedSame;
  }
  if (!sortDescriptors_) return KROrderedSame;
  return KRSortDescriptor::compareWithDescriptors(KRValue(entity), KRValue(otherEntity), *sortDescriptors_);
}

// ---- Lists and reset

void KRDBEntitiesFilter::setEntities(EntitySetPtr entities, bool notify) {
  if (entities == entities_) return;
  entities_ = std::move(entities);
  if (notify) {
    notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidUpdateEntitiesList,
                                selfPointer(), KRDictionary());
  }
}

void KRDBEntitiesFilter::setEntities(EntitySetPtr entities) { setEntities(std::move(entities), true); }

void KRDBEntitiesFilter::setSortedEntities(EntityArrayPtr sortedEntities, bool notify) {
  if (sortedEntities == sortedEntities_) return;
  sortedEntities_ = std::move(sortedEntities);
  if (notify) {
    notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidUpdateSortedEntitiesList,
                                selfPointer(), KRDictionary());
  }
}

void KRDBEntitiesFilter::setSortedEntities(EntityArrayPtr sortedEntities) {
  setSortedEntities(std::move(sortedEntities), true);
}

void KRDBEntitiesFilter::resetSortedEntities() {
  if (sortedEntities_) {
    for (const auto& entity : *sortedEntities_) entitiesIndexes_.erase(entity.get());
  }
  setSortedEntities(nullptr);
}

void KRDBEntitiesFilter::reset() {
  shouldReset_ = waitingForEntities_;
  setEntities(nullptr);
  resetSortedEntities();
  if (shouldReset_) completeObtainEntitiesHandlers();
  notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidReset, selfPointer());
}

void KRDBEntitiesFilter::processReset() {
  if (!shouldReset_ || waitingForEntities_) return;
  shouldReset_ = false;
  setEntities(nullptr);
  resetSortedEntities();
  // The handlers queued since the reset are served by a new obtain.
  if (!obtainEntitiesHandlers_.empty()) obtainEntities(nullptr);
}

void KRDBEntitiesFilter::invalidate() { invalid_ = true; }

// ---- Changes

void KRDBEntitiesFilter::processChanges(const ChangesStoragePtr& changes) {
  if (invalid_ || !changes) return;
  EntitySetPtr added;
  EntitySetPtr deleted;
  EntitySetPtr reordered;
  EntitySetPtr updated;
  // The deleted and updated entities are pending before the added ones are placed: they may have left
  // their place.
  const bool anyDeleted = isNonEmpty(changes->deletedEntities());
  const bool anyUpdated = isNonEmpty(changes->updatedEntities());
  if (anyDeleted) unite(deletedEntities_, changes->deletedEntities());
  if (anyUpdated) unite(updatedEntities_, changes->updatedEntities());
  if (isNonEmpty(changes->addedEntities())) {
    unite(addedEntities_, changes->addedEntities());
    unite(added, processAddedEntities());
  }
  if (anyDeleted) unite(deleted, processDeleteEntities());
  if (anyUpdated) {
    const ProcessedUpdates processed = processUpdateEntities();
    unite(reordered, processed.reordered);
    unite(added, processed.added);
    unite(deleted, processed.deleted);
    unite(updated, processed.updated);
  }
  publishChanges(added, deleted, reordered, updated, changes);
}

size_t KRDBEntitiesFilter::sortedPositionOf(const EntityPtr& entity) const {
  const auto indexed = entitiesIndexes_.find(entity.get());
  if (indexed != entitiesIndexes_.end()) return indexed->second;
  KRLog(KRLogLevelWarning, "Warning: inconsistence");
  const auto found = std::find(sortedEntities_->begin(), sortedEntities_->end(), entity);
  return static_cast<size_t>(found - sortedEntities_->begin());
}

void KRDBEntitiesFilter::publishChanges(const EntitySetPtr& added, const EntitySetPtr& deleted,
                                        const EntitySetPtr& reordered, const EntitySetPtr& updated,
                                        const ChangesStoragePtr& changes) {
  const bool listChanged = isNonEmpty(added) || isNonEmpty(deleted);
  if (listChanged) {
    notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidUpdateEntitiesList,
                                selfPointer(),
                                infoWithSets({{KRDBEntitiesFilterAddedEntities, added},
                                              {KRDBEntitiesFilterDeletedEntities, deleted}}));
  }
  if (listChanged || isNonEmpty(reordered)) {
    notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidUpdateSortedEntitiesList,
                                selfPointer(),
                                infoWithSets({{KRDBEntitiesFilterAddedEntities, added},
                                              {KRDBEntitiesFilterDeletedEntities, deleted},
                                              {KRDBEntitiesFilterReorderedEntities, reordered}}));
  }
  if (listChanged || isNonEmpty(updated)) {
    const KRDictionary info =
        infoWithSets({{KRDBEntitiesFilterAddedEntities, added},
                      {KRDBEntitiesFilterDeletedEntities, deleted},
                      {KRDBEntitiesFilterUpdatedEntities, updated}})
            .dictionaryBySettingObject(
                KRDBValueBox<KRDBEntityIDMapTable>::valueWith(changesOfEntities(updated, changes)),
                KRDBEntitiesFilterEntitiesChanges);
    notifyObserversWithSelector(&KRDBEntitesFilterUpdateProtocol::entitiesFilterDidChange, selfPointer(),
                                info);
  }
}

KRDictionary KRDBEntitiesFilter::infoWithSets(const KeyedSets& sets) {
  std::vector<KRDictionary::Entry> entries;
  for (const auto& [key, entities] : sets) {
    if (isNonEmpty(entities)) entries.emplace_back(key, KRDBValueBox<KRDBEntitySet>::valueWith(entities));
  }
  return KRDictionary(entries);
}

std::shared_ptr<KRDBEntityIDMapTable> KRDBEntitiesFilter::changesOfEntities(
    const EntitySetPtr& entities, const ChangesStoragePtr& changes) {
  auto map = emptyEntitiesChangesMapTable();
  const auto& records = changes ? changes->entitiesChanges() : nullptr;
  if (!entities || !records) return map;
  for (const auto& entity : *entities) {
    const auto& entityID = entity->entityID();
    if (records->containsKey(entityID)) map->setObject(records->objectForKey(entityID), entityID);
  }
  return map;
}

std::shared_ptr<KRDBEntityIDMapTable> KRDBEntitiesFilter::emptyEntitiesChangesMapTable() {
  KRDBCoreInjectorService::load();
  const auto factory =
      KRDBCoreInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>();
  return factory->makeMapTableWithObjectsMappedByEntityIDs();
}

void KRDBEntitiesFilter::obtainAdmittedEntitiesOf(const std::shared_ptr<KRDBEntitiesFilter>& source,
                                                  EntitiesHandler completion) {
  if (!source) return completion(std::make_shared<KRDBEntitySet>());
  const std::weak_ptr<KRObject> weakSelf = weak_from_this();
  source->obtainEntities([weakSelf, completion = std::move(completion)](const EntitySetPtr& offered) {
    const auto self = std::static_pointer_cast<KRDBEntitiesFilter>(weakSelf.lock());
    if (!self) return;
    auto admitted = std::make_shared<KRDBEntitySet>();
    if (offered) {
      for (const auto& entity : *offered) {
        if (self->isEntitySatisfiesFilterConditions(entity)) admitted->insert(entity);
      }
    }
    completion(admitted);
  });
}

KRDBEntitiesFilter::EntitySetPtr KRDBEntitiesFilter::entitiesOfInfo(const KRDictionary& info,
                                                                    const KRString& key) {
  return KRDBValueBox<KRDBEntitySet>::heldBy(info.objectForKey(KRValue(key)));
}

KRDBEntitiesFilter::ChangesStoragePtr KRDBEntitiesFilter::changesOfInfo(const KRDictionary& info) {
  return KRDBEntitiesChangesStorage::initWithAddedEntities(
      entitiesOfInfo(info, KRDBEntitiesFilterAddedEntities),
      entitiesOfInfo(info, KRDBEntitiesFilterDeletedEntities),
      entitiesOfInfo(info, KRDBEntitiesFilterUpdatedEntities),
      KRDBValueBox<KRDBEntityIDMapTable>::heldBy(
          info.objectForKey(KRValue(KRDBEntitiesFilterEntitiesChanges))));
}

std::shared_ptr<KRDBEntitiesFilter> KRDBEntitiesFilter::selfPointer() {
  return std::static_pointer_cast<KRDBEntitiesFilter>(shared_from_this());
}

// ---- Subclass contract

bool KRDBEntitiesFilter::isEntitySatisfiesFilterConditions(const EntityPtr& /*entity*/) const {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass",
        "isEntitySatisfiesFilterConditions");
  raiseUnrecognizedSelector("isEntitySatisfiesFilterConditions");
}

void KRDBEntitiesFilter::initiallyObtainFilteredEntities(EntitiesHandler /*completion*/) {
  KRLog(KRLogLevelMissingOverride, "Error: %@ should be overrided in subclass",
        "initiallyObtainFilteredEntities");
  raiseUnrecognizedSelector("initiallyObtainFilteredEntities");
}

void KRDBEntitiesFilter::raiseUnrecognizedSelector(const char* operation) const {
  KRException::raise(KRException::NSInvalidArgumentException,
                     "-[" + className() + " " + operation + "]: unrecognized selector");
}
