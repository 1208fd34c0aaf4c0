// The incremental side of KRDBEntitiesFilter: applying the pending added, deleted and updated entities to
// the set, the sorted array and the index without sorting the whole array again.
#include <algorithm>
#include <cstdint>
#include <unordered_set>
#include <utility>
#include <vector>

#include "KRFoundation/KRConcurrentQueue.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"

namespace {

using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;
using EntityArray = KRDBEntitiesFilter::EntityArray;

// The number of concurrent iterations of the membership test.
constexpr size_t kMembershipIterations = 4;

EntitySetPtr emptySet() { return std::make_shared<KRDBEntitySet>(); }

}  // namespace

// ---- Lists as the filter changes them

KRDBEntitySet& KRDBEntitiesFilter::writableEntities() {
  // A set handed out earlier keeps its content: it is copied before the first change.
  if (entities_.use_count() > 1) entities_ = std::make_shared<KRDBEntitySet>(*entities_);
  return *entities_;
}

KRDBEntitiesFilter::EntityArray& KRDBEntitiesFilter::writableSortedEntities() {
  if (sortedEntities_.use_count() > 1) sortedEntities_ = std::make_shared<EntityArray>(*sortedEntities_);
  return *sortedEntities_;
}

KRDBEntitiesFilter::EntityArray KRDBEntitiesFilter::sortedByDescriptors(const KRDBEntitySet& entities) const {
  EntityArray array(entities.begin(), entities.end());
  if (!hasSortDescriptors()) return array;
  return KRSortDescriptor::sortedArrayUsingDescriptors(array, *sortDescriptors_);
}

void KRDBEntitiesFilter::indexFrom(size_t first) { indexRange(first, sortedEntities_->size()); }

// ---- Added

KRDBEntitiesFilter::EntitySetPtr KRDBEntitiesFilter::processAddedEntities() {
  if (!entities_) return nullptr;
  auto entered = emptySet();
  if (addedEntities_) {
    for (const auto& entity : *addedEntities_) {
      if (!entities_->contains(entity) && isEntitySatisfiesFilterConditions(entity)) entered->insert(entity);
    }
  }
  if (!entered->empty()) {
    writableEntities().insert(entered->begin(), entered->end());
    if (sortedEntities_) insertIntoSortedEntities(sortedByDescriptors(*entered));
  }
  addedEntities_.reset();
  return entered;
}

bool KRDBEntitiesFilter::isPendingChange(const EntityPtr& entity) const {
  return (updatedEntities_ && updatedEntities_->contains(entity)) ||
         (deletedEntities_ && deletedEntities_->contains(entity));
}

void KRDBEntitiesFilter::insertIntoSortedEntities(const EntityArray& entered) {
  EntityArray& array = writableSortedEntities();
  if (sortingDisabled_) {
    const size_t first = array.size();
    array.insert(array.end(), entered.begin(), entered.end());
    indexFrom(first);
    return;
  }
  // The old entity goes first only when it is ordered strictly before the new one. An old entity updated
  // or deleted in the same pass may no longer be in its place: it is passed over here, to be placed with
  // the updates or removed.
  EntityArray merged;
  merged.reserve(array.size() + entered.size());
  size_t old = 0;
  size_t fresh = 0;
  while (old < array.size() && fresh < entered.size()) {
    const bool oldFirst =
        isPendingChange(array[old]) || compareEntity(array[old], entered[fresh]) == KROrderedAscending;
    merged.push_back(oldFirst ? array[old++] : entered[fresh++]);
  }
  merged.insert(merged.end(), array.begin() + static_cast<std::ptrdiff_t>(old), array.end());
  merged.insert(merged.end(), entered.begin() + static_cast<std::ptrdiff_t>(fresh), entered.end());
  array = std::move(merged);
  indexFrom(0);
}

// ---- Deleted

KRDBEntitiesFilter::EntitySetPtr KRDBEntitiesFilter::processDeleteEntities() {
  if (!entities_) return nullptr;
  EntitySetPtr left;
  if (deletedEntities_ && !deletedEntities_->empty() && !entities_->empty()) {
    left = emptySet();
    for (const auto& entity : *deletedEntities_) {
      if (entities_->contains(entity)) left->insert(entity);
    }
    KRDBEntitySet& entities = writableEntities();
    for (const auto& entity : *deletedEntities_) entities.erase(entity);
    if (sortedEntities_ && !left->empty()) {
      removeFromSortedEntities(*left, {});
      indexFrom(0);
    }
  }
  deletedEntities_.reset();
  return left;
}

void KRDBEntitiesFilter::removeFromSortedEntities(const KRDBEntitySet& removed,
                                                  const KRDBEntitySet& takenOut) {
  EntityArray& array = writableSortedEntities();
  EntityArray kept;
  kept.reserve(array.size());
  for (const auto& entity : array) {
    if (removed.contains(entity)) {
      entitiesIndexes_.erase(entity.get());
    } else if (!takenOut.contains(entity)) {
      kept.push_back(entity);
    }
  }
  array = std::move(kept);
}

// ---- Updated

KRDBEntitiesFilter::ProcessedUpdates KRDBEntitiesFilter::processUpdateEntities() {
  if (!entities_) return {};
  if (!updatedEntities_ || updatedEntities_->empty()) {
    updatedEntities_.reset();
    return {};
  }
  const EntityArray candidates(updatedEntities_->begin(), updatedEntities_->end());
  const std::vector<uint8_t> satisfied = membershipOf(candidates);
  ProcessedUpdates outcome{emptySet(), emptySet(), emptySet(), emptySet()};
  const bool checkOrder = sortedEntities_ && !sortingDisabled_;
  EntityArray staying;
  for (size_t index = 0; index < candidates.size(); ++index) {
    const EntityPtr& entity = candidates[index];
    const bool member = entities_->contains(entity);
    if (member && !satisfied[index]) outcome.deleted->insert(entity);
    if (!member && satisfied[index]) outcome.added->insert(entity);
    if (!satisfied[index]) continue;
    outcome.updated->insert(entity);
    if (!member || !checkOrder) continue;
    if (isOutOfOrder(entity)) {
      outcome.reordered->insert(entity);
    } else {
      staying.push_back(entity);
    }
  }
  if (candidates.size() > 1) reorderDisorderedRuns(staying, *outcome.reordered);
  applyUpdates(outcome);
  updatedEntities_.reset();
  return outcome;
}

std::vector<uint8_t> KRDBEntitiesFilter::membershipOf(const EntityArray& candidates) const {
  std::vector<uint8_t> satisfied(candidates.size());
  const auto test = [&](size_t index) {
    satisfied[index] = isEntitySatisfiesFilterConditions(candidates[index]);
  };
  // Four equal runs concurrently on the global queue, then the remainder here.
  const size_t run = candidates.size() / kMembershipIterations;
  if (run > 0) {
    KRConcurrentQueue::globalQueue().apply(kMembershipIterations, [&](size_t iteration) {
      for (size_t index = iteration * run; index < (iteration + 1) * run; ++index) test(index);
    });
  }
  for (size_t index = run * kMembershipIterations; index < candidates.size(); ++index) test(index);
  return satisfied;
}

bool KRDBEntitiesFilter::isOutOfOrder(const EntityPtr& entity) const {
  const EntityArray& array = *sortedEntities_;
  const size_t position = sortedPositionOf(entity);
  if (position >= array.size()) return false;
  if (position > 0 && compareEntity(array[position - 1], entity) == KROrderedDescending) return true;
  return position + 1 < array.size() && compareEntity(entity, array[position + 1]) == KROrderedDescending;
}

void KRDBEntitiesFilter::reorderDisorderedRuns(const EntityArray& staying, KRDBEntitySet& reordered) const {
  const EntityArray& array = *sortedEntities_;
  const KRDBEntitySet keep(staying.begin(), staying.end());
  std::unordered_set<size_t> runsSeen;
  for (const auto& entity : staying) {
    const size_t position = sortedPositionOf(entity);
    if (position >= array.size()) continue;
    const auto [first, last] = updatedRunAround(position);
    if (first == last || !runsSeen.insert(first).second) continue;
    // A sorted stack of the run's kept entities after the unchanged entity before it: an updated entity
    // that orders after a later one leaves it; one that orders before an unchanged one is not taken.
    std::vector<std::pair<EntityPtr, bool>> kept;
    if (first > 0) kept.emplace_back(array[first - 1], false);
    const auto orderedBefore = [this, &kept](const EntityPtr& next) {
      return kept.empty() || compareEntity(kept.back().first, next) != KROrderedDescending;
    };
    const auto popUpdatedAfter = [&](const EntityPtr& next) {
      while (!orderedBefore(next) && kept.back().second) {
        reordered.insert(kept.back().first);
        kept.pop_back();
      }
    };
    for (size_t position = first; position <= last; ++position) {
      const EntityPtr& next = array[position];
      if (!keep.contains(next)) continue;
      popUpdatedAfter(next);
      if (orderedBefore(next)) {
        kept.emplace_back(next, true);
      } else {
        reordered.insert(next);
      }
    }
    if (last + 1 < array.size()) popUpdatedAfter(array[last + 1]);
  }
}

std::pair<size_t, size_t> KRDBEntitiesFilter::updatedRunAround(size_t position) const {
  const EntityArray& array = *sortedEntities_;
  size_t first = position;
  size_t last = position;
  while (first > 0 && updatedEntities_->contains(array[first - 1])) --first;
  while (last + 1 < array.size() && updatedEntities_->contains(array[last + 1])) ++last;
  return {first, last};
}

void KRDBEntitiesFilter::applyUpdates(const ProcessedUpdates& outcome) {
  const KRDBEntitySet& inserted = *outcome.added;
  const KRDBEntitySet& removed = *outcome.deleted;
  const KRDBEntitySet& reordered = *outcome.reordered;
  if (!inserted.empty() || !removed.empty()) {
    KRDBEntitySet& entities = writableEntities();
    entities.insert(inserted.begin(), inserted.end());
    for (const auto& entity : removed) entities.erase(entity);
  }
  if ((inserted.empty() && removed.empty() && reordered.empty()) || !sortedEntities_) return;
  // One moved entity in an array whose index is whole: only the entities it passes move.
  if (inserted.empty() && removed.empty() && reordered.size() == 1 && !sortingDisabled_ &&
      entitiesIndexes_.size() == sortedEntities_->size())
    return moveReorderedEntity(*reordered.begin());
  removeFromSortedEntities(removed, reordered);
  const EntityArray sortedInserted = sortedByDescriptors(inserted);
  if (sortingDisabled_) {
    EntityArray& array = writableSortedEntities();
    array.insert(array.end(), sortedInserted.begin(), sortedInserted.end());
  } else {
    mergeIntoSortedEntities(sortedInserted, sortedByDescriptors(reordered));
  }
  indexFrom(0);
}

void KRDBEntitiesFilter::moveReorderedEntity(const EntityPtr& entity) {
  EntityArray& array = writableSortedEntities();
  const size_t from = sortedPositionOf(entity);
  if (from >= array.size()) return;
  // The merge of the array less the entity with the entity alone puts it before the first other entity
  // ordered strictly after it; the rest of the array is sorted, so that place is found by bisection, on
  // the side it moved to, and only the entities between its old and new places change position.
  const auto notAfter = [this, &entity](const EntityPtr& other) {
    return compareEntity(entity, other) != KROrderedAscending;
  };
  const auto begin = array.begin();
  const auto at = begin + static_cast<std::ptrdiff_t>(from);
  const auto right = std::partition_point(at + 1, array.end(), notAfter);
  if (right != at + 1) {
    std::rotate(at, at + 1, right);
    return indexRange(from, static_cast<size_t>(right - begin));
  }
  const auto left = std::partition_point(begin, at, notAfter);
  std::rotate(left, at, at + 1);
  indexRange(static_cast<size_t>(left - begin), from + 1);
}

void KRDBEntitiesFilter::indexRange(size_t first, size_t last) {
  const EntityArray& array = *sortedEntities_;
  for (size_t position = first; position < last; ++position)
    entitiesIndexes_[array[position].get()] = position;
}

void KRDBEntitiesFilter::mergeIntoSortedEntities(const EntityArray& inserted, const EntityArray& reordered) {
  const EntityArray kept = std::move(writableSortedEntities());
  EntityArray merged;
  merged.reserve(kept.size() + inserted.size() + reordered.size());
  size_t old = 0;
  size_t fresh = 0;
  size_t moved = 0;
  while (fresh < inserted.size() || moved < reordered.size()) {
    // The smaller of the two new candidates; at a tie the inserted one.
    const bool takeMoved =
        fresh == inserted.size() ||
        (moved < reordered.size() && compareEntity(inserted[fresh], reordered[moved]) == KROrderedDescending);
    const EntityPtr& candidate = takeMoved ? reordered[moved] : inserted[fresh];
    if (old < kept.size() && compareEntity(candidate, kept[old]) != KROrderedAscending) {
      merged.push_back(kept[old++]);
      continue;
    }
    merged.push_back(candidate);
    ++(takeMoved ? moved : fresh);
  }
  merged.insert(merged.end(), kept.begin() + static_cast<std::ptrdiff_t>(old), kept.end());
  *sortedEntities_ = std::move(merged);
}
