#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <unordered_map>
#include <utility>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRFoundation/KRDictionary.hpp"
#include "KRFoundation/KRSortDescriptor.hpp"
#include "KRFoundation/KRString.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitesFilterUpdateProtocol.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"

// The position answered for an entity that has none.
inline constexpr uint64_t KRNotFound = 0x7fffffffffffffffULL;

// The keys of the info dictionaries sent to the observers. The entity sets travel boxed in
// KRDBValueBox<KRDBEntitySet>, the change records in KRDBValueBox<KRDBEntityIDMapTable>.
extern const KRString KRDBEntitiesFilterAddedEntities;
extern const KRString KRDBEntitiesFilterDeletedEntities;
extern const KRString KRDBEntitiesFilterReorderedEntities;
extern const KRString KRDBEntitiesFilterUpdatedEntities;
extern const KRString KRDBEntitiesFilterEntitiesChanges;

// A live filter: the set of entities that satisfy a subclass's conditions, obtained once and then kept
// up to date from the change sets of the context, optionally also as an array sorted by a comparator or
// by sort descriptors, with an index from entity to position. Observers (KRDBEntitesFilterUpdateProtocol)
// hear of resets, new lists and changes. Subclasses supply the membership test and the initial obtain.
// Used on one thread, the one that delivers changes; nothing is locked, except that the membership test
// must allow concurrent calls. Completions hold the filter weakly.
class KRDBEntitiesFilter : public KRAbstractModel {
 public:
  using EntityPtr = std::shared_ptr<KRDBEntity>;
  using EntitySetPtr = std::shared_ptr<KRDBEntitySet>;
  using EntityArray = std::vector<EntityPtr>;
  using EntityArrayPtr = std::shared_ptr<EntityArray>;
  // Three-way comparison: -1 ascending, 0 same, 1 descending.
  using Comparator = std::function<int(const EntityPtr&, const EntityPtr&)>;
  using ComparatorPtr = std::shared_ptr<const Comparator>;
  using SortDescriptorsPtr = std::shared_ptr<const KRSortDescriptors>;
  using EntitiesHandler = std::function<void(const EntitySetPtr&)>;
  using SortedEntitiesHandler = std::function<void(const EntityArrayPtr&)>;
  using EntitiesIndexes = std::unordered_map<const KRDBEntity*, size_t>;
  using ChangesStoragePtr = std::shared_ptr<KRDBEntitiesChangesStorage>;

  // ---- Users of a filter
  // Gives the entity set to the handler (which may be empty) now, or once obtained.
  void obtainEntities(EntitiesHandler handler);
  // Gives the sorted array to the handler now, or once sorted; absent when no ordering is set.
  void obtainSortedEntities(SortedEntitiesHandler handler);
  // The entity's position in the sorted array, or KRNotFound.
  uint64_t indexOfEntity(const EntityPtr& entity) const;
  bool containsEntity(const EntityPtr& entity) const;
  // Drops both lists; a reset during an obtain is carried out when the obtain ends.
  virtual void reset();
  // Final: later changes are ignored; the lists are kept.
  void invalidate();
  // Setting the same object again changes nothing.
  void setSortDescriptors(SortDescriptorsPtr sortDescriptors);
  void setComparator(ComparatorPtr comparator);
  void setSortingDisabled(bool sortingDisabled);
  // Applies a change set and tells the observers the outcome; nothing once invalid.
  virtual void processChanges(const ChangesStoragePtr& changes);

  // ---- Subclass contract: the base logs the missing override and raises.
  // Whether the entity belongs to the filter. Called from several threads at once.
  virtual bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const;
  // Obtains the initial set and calls the completion with it on the filter's thread.
  virtual void initiallyObtainFilteredEntities(EntitiesHandler completion);

  // ---- State
  bool invalid() const { return invalid_; }
  bool sortingDisabled() const { return sortingDisabled_; }
  bool waitingForEntities() const { return waitingForEntities_; }
  bool waitingForSortedEntities() const { return waitingForSortedEntities_; }
  bool shouldReset() const { return shouldReset_; }
  const SortDescriptorsPtr& sortDescriptors() const { return sortDescriptors_; }
  const ComparatorPtr& comparator() const { return comparator_; }
  const EntitySetPtr& entities() const { return entities_; }
  const EntityArrayPtr& sortedEntities() const { return sortedEntities_; }
  const EntitiesIndexes& entitiesIndexes() const { return entitiesIndexes_; }
  // Changes received and not applied yet.
  const EntitySetPtr& addedEntities() const { return addedEntities_; }
  const EntitySetPtr& deletedEntities() const { return deletedEntities_; }
  const EntitySetPtr& updatedEntities() const { return updatedEntities_; }
  const std::vector<EntitiesHandler>& obtainEntitiesHandlers() const { return obtainEntitiesHandlers_; }
  const std::vector<SortedEntitiesHandler>& obtainSortedEntitiesHandlers() const {
    return obtainSortedEntitiesHandlers_;
  }

 protected:
  // What the processing of updated entities yields; each set may be absent.
  struct ProcessedUpdates {
    EntitySetPtr added;
    EntitySetPtr deleted;
    EntitySetPtr reordered;
    EntitySetPtr updated;
  };

  KRDBEntitiesFilter();
  std::shared_ptr<KRDBEntitiesFilter> selfPointer();

  // Replace a list; the same object again changes nothing. The one-argument forms notify.
  void setEntities(EntitySetPtr entities, bool notify);
  void setEntities(EntitySetPtr entities);
  void setSortedEntities(EntityArrayPtr sortedEntities, bool notify);
  void setSortedEntities(EntityArrayPtr sortedEntities);
  // Drops the sorted array and its index entries (notifying); the next obtain sorts again.
  void resetSortedEntities();
  // Carries out a reset remembered during an obtain, once no obtain runs.
  void processReset();
  // Call the queued handlers in order with the current list and empty the queue.
  void completeObtainEntitiesHandlers();
  void completeObtainSortedEntitiesHandlers();
  // The comparator's answer if one is set, otherwise that of the sort descriptors.
  KRComparisonResult compareEntity(const EntityPtr& entity, const EntityPtr& otherEntity) const;
  // A new empty map keyed by entity identifiers of any type.
  static std::shared_ptr<KRDBEntityIDMapTable> emptyEntitiesChangesMapTable();
  // The entity set under the key of a change notification's info, or absent.
  static EntitySetPtr entitiesOfInfo(const KRDictionary& info, const KRString& key);
  // Obtains the source filter's entities and gives the completion those this filter's test admits (an
  // empty set without a source). The completion holds this filter weakly.
  void obtainAdmittedEntitiesOf(const std::shared_ptr<KRDBEntitiesFilter>& source,
                                EntitiesHandler completion);
  // The change set a filter's change notification describes: its added, deleted and updated entities and
  // their change records, as they are.
  static ChangesStoragePtr changesOfInfo(const KRDictionary& info);

  // Apply the pending changes to the set, the sorted array and the index (KRDBEntitiesFilterChanges.cpp)
  // and answer what changed; absent while no set is obtained, the pending sets then being kept. The
  // updated entities are tested concurrently: four equal runs on the global concurrent queue, the
  // remainder on the calling thread.
  virtual EntitySetPtr processAddedEntities();
  virtual EntitySetPtr processDeleteEntities();
  virtual ProcessedUpdates processUpdateEntities();
  // Tells the observers the outcome of a change set: the entity list, the sorted list and the entities'
  // changes, each only when it changed. Absent sets count as empty.
  void publishChanges(const EntitySetPtr& added, const EntitySetPtr& deleted, const EntitySetPtr& reordered,
                      const EntitySetPtr& updated, const ChangesStoragePtr& changes);

 private:
  using KeyedSets = std::vector<std::pair<KRString, EntitySetPtr>>;
  // ---- Incremental changes (KRDBEntitiesFilterChanges.cpp)
  // The lists to change: a list handed out earlier (still held elsewhere) is copied first, so that its
  // holders keep what they were given.
  KRDBEntitySet& writableEntities();
  EntityArray& writableSortedEntities();
  // The entities in the order of the sort descriptors alone; in set order without descriptors.
  EntityArray sortedByDescriptors(const KRDBEntitySet& entities) const;
  // Index entries for the sorted array's positions from `first` on, or in [first, last).
  void indexFrom(size_t first);
  void indexRange(size_t first, size_t last);
  // The one reordered entity of a pass that adds and removes nothing, moved to its place in the array.
  void moveReorderedEntity(const EntityPtr& entity);
  void insertIntoSortedEntities(const EntityArray& entered);
  // Whether the entity is among the pending updated or deleted ones.
  bool isPendingChange(const EntityPtr& entity) const;
  // Drops the removed entities from the sorted array and their index entries, and takes the taken-out
  // ones out of the array (keeping their entries, to be set again).
  void removeFromSortedEntities(const KRDBEntitySet& removed, const KRDBEntitySet& takenOut);
  std::vector<uint8_t> membershipOf(const EntityArray& candidates) const;
  // Whether a neighbour in the sorted array now orders wrongly against the entity.
  bool isOutOfOrder(const EntityPtr& entity) const;
  // Neighbours that changed together can each look in place against the other while their run sits
  // wrongly among the unchanged entities: within every run of updated, staying entities, those that would
  // leave the rest out of order are taken as reordered too.
  void reorderDisorderedRuns(const EntityArray& staying, KRDBEntitySet& reordered) const;
  // The first and last position of the run of updated entities around a position.
  std::pair<size_t, size_t> updatedRunAround(size_t position) const;
  // The entity's position in the sorted array: its index entry, or, when it has none (logged as an
  // inconsistency), its place found by searching; the array's size when it is not there.
  size_t sortedPositionOf(const EntityPtr& entity) const;
  void applyUpdates(const ProcessedUpdates& outcome);
  // Merges the sorted array (less removed and reordered entities) with the inserted and the reordered ones.
  void mergeIntoSortedEntities(const EntityArray& inserted, const EntityArray& reordered);

  void didObtainEntities(const EntitySetPtr& obtained);
  void sortObtainedEntities(const EntitySetPtr& obtained);
  EntityArrayPtr sortedArrayOf(const KRDBEntitySet& entities) const;
  void indexSortedEntities();
  bool hasSortDescriptors() const;
  static KRDictionary infoWithSets(const KeyedSets& sets);
  static std::shared_ptr<KRDBEntityIDMapTable> changesOfEntities(const EntitySetPtr& entities,
                                                                 const ChangesStoragePtr& changes);
  [[noreturn]] void raiseUnrecognizedSelector(const char* operation) const;

  bool invalid_ = false;
  bool sortingDisabled_ = false;
  bool waitingForEntities_ = false;
  bool waitingForSortedEntities_ = false;
  bool shouldReset_ = false;
  SortDescriptorsPtr sortDescriptors_;
  ComparatorPtr comparator_;
  EntitySetPtr entities_;
  EntityArrayPtr sortedEntities_;
  EntitiesIndexes entitiesIndexes_;
  EntitySetPtr addedEntities_;
  EntitySetPtr deletedEntities_;
  EntitySetPtr updatedEntities_;
  std::vector<EntitiesHandler> obtainEntitiesHandlers_;
  std::vector<SortedEntitiesHandler> obtainSortedEntitiesHandlers_;
};
