// How the context gathers the changes its entities report and hands them on once per turn of the main run
// loop: to the catalog, to its observers as one change set, and to the undo manager as one undo step.
#include <utility>
#include <vector>

#include "KRFoundation/KRRunLoop.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBContext/KRDBContextObserver.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"

namespace {

using ChangeRecord = KRDBValueBox<KRDictionary>;

// The set's members taken out of it, as a set of their own; nil for an empty set.
std::shared_ptr<KRDBEntitySet> takeAll(KRDBEntitySet& entities) {
  if (entities.empty()) return nullptr;
  return std::make_shared<KRDBEntitySet>(std::exchange(entities, {}));
}

}  // namespace

// ---- What entities report

void KRDBContext::entityWillChange(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& /*info*/) {
  if (!undoManager_ || !entity) return;
  if (undoManager_->isUndoRegistrationEnabled() && !undoManager_->isUndoing() && !undoManager_->isRedoing() &&
      !contextUndoGrouping_) {
    setContextUndoGrouping(true);
  }
  const auto snapshot = entity->copyEntity();
  undoManager_->prepareWithInvocationTarget<KRDBContext>(
      selfPtr(), [snapshot](const std::shared_ptr<KRDBContext>& context) { context->processUndo(snapshot); });
}

void KRDBContext::entityDidChange(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& info) {
  if (!entity || deletedEntities_.contains(entity)) return;
  updatedEntities_.insert(entity);
  if (!info.isNil()) mergeChangeRecord(entity->entityID(), info);
  shouldProcessChanges();
}

void KRDBContext::mergeChangeRecord(const KRDBEntityIDPtr& entityID, const KRDictionary& info) {
  KRDictionary merged = info;
  if (const auto earlier =
          std::dynamic_pointer_cast<ChangeRecord>(entitiesChanges_->objectForKey(entityID))) {
    // Later values win; the keys of earlier changes stay.
    std::vector<KRDictionary::Entry> entries = earlier->held()->entries();
    entries.insert(entries.end(), info.entries().begin(), info.entries().end());
    merged = KRDictionary(entries);
  }
  entitiesChanges_->setObject(std::make_shared<ChangeRecord>(std::make_shared<KRDictionary>(merged)),
                              entityID);
}

void KRDBContext::validationRecordDidSet(const std::shared_ptr<KRDBEntity>& entity) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  performMainThreadBlock([weak, entity] {
    const auto context = weak.lock();
    if (!context) return;
    context->entitiesWithValidationRecord_.insert(entity);
    context->shouldResetValidationRecords();
  });
}

// ---- The pass

void KRDBContext::shouldProcessChanges() {
  if (waitingForProcessChanges_) return;
  waitingForProcessChanges_ = true;
  std::weak_ptr<KRDBContext> weak = weakSelf();
  performOnNextRunLoopIterationBlock(
      [weak] {
        if (const auto context = weak.lock()) context->runScheduledPass();
      },
      {KRRunLoop::NSRunLoopCommonModes, KRRunLoop::NSDefaultRunLoopMode});
}

void KRDBContext::runScheduledPass() {
  processChanges();
  // The flag is still set: a callback that waits again is queued and called in this same drain.
  while (const Handler waiting = dequeueWaitingChangesBlock()) waiting();
  waitingForProcessChanges_ = false;
  if (contextUndoGrouping_) setContextUndoGrouping(false);
}

void KRDBContext::processChanges() {
  const auto added = takeAll(addedEntities_);
  const auto deleted = takeAll(deletedEntities_);
  std::shared_ptr<KRDBEntitySet> updated;
  std::shared_ptr<KRDBEntityIDMapTable> changes;
  if (!updatedEntities_.empty()) {
    catalog_->updateEntities(KRDBEntityArray(updatedEntities_.begin(), updatedEntities_.end()));
    updated = takeAll(updatedEntities_);
    changes = std::exchange(entitiesChanges_, emptyEntitiesChangesMapTable());
  }
  if (!added && !deleted && !updated) return;
  notifyObserversWithSelector(
      &KRDBContextObserver::contextDidUpdate, selfPtr(),
      KRDBEntitiesChangesStorage::initWithAddedEntities(added, deleted, updated, changes));
  if (deleted) {
    for (const auto& entity : *deleted) entity->reset();
  }
  // Observers may have changed entities in turn: those changes make a pass of their own, now.
  if (!addedEntities_.empty() || !deletedEntities_.empty() || !updatedEntities_.empty()) processChanges();
}

// ---- Validation records

void KRDBContext::shouldResetValidationRecords() {
  if (waitingForResetValidationRecords_) return;
  waitingForResetValidationRecords_ = true;
  std::weak_ptr<KRDBContext> weak = weakSelf();
  performOnNextRunLoopIterationBlock([weak] {
    if (const auto context = weak.lock()) context->resetValidationRecords();
  });
}

void KRDBContext::resetValidationRecords() {
  for (const auto& entity : std::exchange(entitiesWithValidationRecord_, {})) entity->resetValidationRecord();
  waitingForResetValidationRecords_ = false;
}

// ---- Undo

void KRDBContext::setUndoManager(std::shared_ptr<KRUndoManager> undoManager) {
  if (undoManager == undoManager_) return;
  setContextUndoGrouping(false);
  undoManager_ = std::move(undoManager);
}

void KRDBContext::setContextUndoGrouping(bool grouping) {
  if (grouping == contextUndoGrouping_) return;
  contextUndoGrouping_ = grouping;
  if (!undoManager_) return;
  if (grouping) {
    undoManager_->beginUndoGrouping();
  } else if (undoManager_->canUndo()) {
    // An empty group is left open on purpose: closing it would make an empty undo step.
    undoManager_->kr_endUndoGrouping();
  }
}

void KRDBContext::processUndo(const std::shared_ptr<KRDBEntity>& snapshot) {
  if (!snapshot) return;
  if (const auto live = entityWithID(snapshot->entityID())) live->updateWithDBEntity(snapshot->dbentity());
}

// ---- Deletion bookkeeping

void KRDBContext::markToRemoveEntities(const KRDBEntitySet& entities) {
  for (const auto& entity : entities) {
    if (entity) entity->setMarkedToDelete(true);
  }
}

void KRDBContext::prepareDeleteEntity(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return;
  deletedEntities_.insert(entity);
  addedEntities_.erase(entity);
  updatedEntities_.erase(entity);
  detachDeletedEntity(entity);
}

void KRDBContext::prepareDeletedEntities(const KRDBEntitySet& entities) {
  deletedEntities_.insert(entities.begin(), entities.end());
  for (const auto& entity : entities) {
    addedEntities_.erase(entity);
    updatedEntities_.erase(entity);
  }
  for (const auto& entity : entities) {
    if (entity) detachDeletedEntity(entity);
  }
}

void KRDBContext::detachDeletedEntity(const std::shared_ptr<KRDBEntity>& entity) {
  entitiesChanges_->removeObjectForKey(entity->entityID());
  fetchedEntities_->removeEntityForID(entity->entityID());
  entity->removeListener(selfPtr());
  entity->setContext(nullptr);
}
