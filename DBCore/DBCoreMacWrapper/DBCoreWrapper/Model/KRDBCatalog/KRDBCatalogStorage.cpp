// The catalog's reads by identifier, write-backs of changed entities, deletions and the cleanup of records
// nothing refers to. The Sync forms run on the catalog's queue; the others queue them.

#include <string>

#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCatalog/KRDBUpdateOperation.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Support/KRDBRecordConversions.hpp"
#include "dbimghistorystate.hpp"
#include "dbreactor.hpp"
#include "dbresource.hpp"

namespace {

using Reactor = KRDBCatalog::Reactor;
using EntityPtr = std::shared_ptr<KRDBEntity>;

const char* const kFetchOperation = "fetchEntityWithID";
const char* const kUpdateOperationPrefix = "UpdateEntity_";
const char* const kRemoveImagesOperation = "RemoveImage";
const char* const kClearPathsOperation = "ClearDanglingPaths";
const char* const kClearStatesOperation = "ClearDanglingHistoryStates";
const char* const kClearResourcesOperation = "ClearDanglingHistoryResourcesSync";

int64_t entityTypeOf(const EntityPtr& entity) { return entity ? entity->entityClass().entityType : 0; }

// The record of the given id wrapped in its entity class; nil when there is no such record.
template <class Entity, class Record>
EntityPtr fetchWrapped(const Reactor& reactor, long long id) {
  return Entity::initWithDBEntity(reactor->Get<Record>(id));
}

// Removes one record through the guard, raising the converted exception on failure.
template <class Record>
void removeRecord(KRDBCatalog& catalog, const std::shared_ptr<Record>& record, const char* description) {
  catalog.handleDBReactorBlock([&record](const Reactor& reactor) { reactor->Remove(record); }, description,
                               true);
}

// The string of one field of every record, in order. The wide strings always convert: the conversion
// turns text that is not valid Unicode into U+FFFD instead of failing.
template <class Record>
std::vector<KRString> stringsOf(const std::vector<std::shared_ptr<Record>>& records,
                                std::wstring Record::*field) {
  std::vector<KRString> strings;
  strings.reserve(records.size());
  for (const auto& record : records) strings.push_back(KRDBRecordConversions::string((*record).*field));
  return strings;
}

// The operation pattern for work without a result: dropped once new operations are disallowed; otherwise
// the work runs on the queue (waited for with sync) and the handler, if any, after it.
void performWork(KRDBCatalog& catalog, std::function<void(KRDBCatalog&)> work, KRDBCatalog::Handler handler,
                 bool sync) {
  if (catalog.isNewOperationsDisallowed()) return;
  const std::weak_ptr<KRDBCatalog> weak = std::static_pointer_cast<KRDBCatalog>(catalog.shared_from_this());
  catalog.performSynchronously(sync, [weak, work = std::move(work), handler = std::move(handler), sync] {
    const auto strong = weak.lock();
    if (!strong) return;
    work(*strong);
    strong->finishHandler(handler, sync);
  });
}

}  // namespace

// ---- Fetch

std::shared_ptr<KRDBEntity> KRDBCatalog::fetchEntityWithIDSync(const KRDBEntityIDPtr& entityID) {
  const Reactor reactor = dbReactor();
  if (!entityID || !reactor) return nullptr;
  const long long id = entityID->dbid();
  switch (entityID->entityType()) {
    case KRDBEntityTypeImage:
      return fetchWrapped<KRDBImage, dbcore::DBImage>(reactor, id);
    case KRDBEntityTypeCollection:
      return fetchWrapped<KRDBCollection, dbcore::DBFilter>(reactor, id);
    case KRDBEntityTypeReferencedFolder:
      return fetchWrapped<KRDBReferencedFolder, dbcore::DBRefFolder>(reactor, id);
    case KRDBEntityTypeImageAttributes:
      return fetchWrapped<KRDBImageAttributes, dbcore::DBUserImgAttrib>(reactor, id);
    case KRDBEntityTypeImageExivAttributes:
      return fetchWrapped<KRDBImageExivAttributes, dbcore::DBExivImgAttrib>(reactor, id);
    case KRDBEntityTypeSmartFilter:
      return fetchWrapped<KRDBSmartFilter, dbcore::DBSmartFilter>(reactor, id);
    default:
      return nullptr;
  }
}

void KRDBCatalog::fetchEntityWithID(const KRDBEntityIDPtr& entityID, EntityHandler handler, bool sync) {
  performOperation<EntityPtr>(
      [entityID](KRDBCatalog& catalog) {
        EntityPtr entity;
        catalog.handleDBReactorBlock(
            [&](const Reactor&) { entity = catalog.fetchEntityWithIDSync(entityID); }, kFetchOperation,
            false);
        return entity;
      },
      std::move(handler), sync);
}

std::shared_ptr<KRDBEntity> KRDBCatalog::fetchEntityWithID(const KRDBEntityIDPtr& entityID) {
  EntityPtr fetched;
  fetchEntityWithID(
      entityID, [&fetched](EntityPtr entity) { fetched = std::move(entity); }, true);
  return fetched;
}

// ---- Update

void KRDBCatalog::updateEntitySync(const std::shared_ptr<KRDBEntity>& entity) {
  const KRDBEntity::Record record = entity ? entity->dbentity() : nullptr;
  handleDBReactorBlock([&record](const Reactor& reactor) { *reactor << record; },
                       kUpdateOperationPrefix + std::to_string(entityTypeOf(entity)), true);
}

void KRDBCatalog::updateEntity(const std::shared_ptr<KRDBEntity>& entity) {
  if (isNewOperationsDisallowed() || !entity) return;
  const KRDBEntityIDPtr entityID = entity->entityID();
  const EntityPtr snapshot = entity->copyEntity();
  const std::weak_ptr<KRDBCatalog> weak = std::static_pointer_cast<KRDBCatalog>(shared_from_this());
  auto operation =
      KRDBUpdateOperation::operationWithBlock([weak, snapshot](const KRDBUpdateOperation& started) {
        const auto catalog = weak.lock();
        if (!catalog) return;
        catalog->updateEntitySync(snapshot);
        std::lock_guard lock(catalog->updateOperationsLock());
        KRDBEntityIDMapTable& operations = catalog->updateOperations();
        // A newer operation stored while this one ran stays pending.
        if (operations.objectForKey(snapshot->entityID()).get() == &started)
          operations.removeObjectForKey(snapshot->entityID());
      });
  {
    std::lock_guard lock(updateOperationsLock());
    KRDBEntityIDMapTable& operations = updateOperations();
    if (const auto pending =
            std::dynamic_pointer_cast<KRDBUpdateOperation>(operations.objectForKey(entityID)))
      pending->cancel();
    operations.setObject(operation, entityID);
  }
  performSynchronously(false, [operation] { operation->start(); });
}

void KRDBCatalog::updateEntitiesSync(const KRDBEntityArray& entities) {
  const auto writeAll = [this, &entities] {
    for (const auto& entity : entities) updateEntitySync(entity);
  };
  const Reactor reactor = dbReactor();
  if (reactor) {
    reactor->Batch(writeAll);
  } else {
    writeAll();
  }
}

void KRDBCatalog::updateEntities(const KRDBEntityArray& entities) {
  if (isNewOperationsDisallowed()) return;
  KRDBEntityArray snapshots;
  for (const auto& entity : entities) {
    if (!entity || !entity->isDbEntityChanged()) continue;
    snapshots.push_back(entity->copyEntity());
    entity->setDbEntityChanged(false);
  }
  if (snapshots.empty()) return;
  performWork(
      *this, [snapshots](KRDBCatalog& catalog) { catalog.updateEntitiesSync(snapshots); }, nullptr, false);
}

// ---- Deletion

void KRDBCatalog::deleteEntitySync(const std::shared_ptr<KRDBEntity>& entity) {
  switch (entityTypeOf(entity)) {
    case KRDBEntityTypeImage:
      return removeRecord(*this, std::static_pointer_cast<KRDBImage>(entity)->dbimage(), "RemoveDBImage");
    case KRDBEntityTypeCollection:
      return removeRecord(*this, std::dynamic_pointer_cast<dbcore::DBFilter>(entity->dbentity()),
                          "RemoveDBFilter");
    case KRDBEntityTypeReferencedFolder:
      return removeRecord(*this, std::dynamic_pointer_cast<dbcore::DBRefFolder>(entity->dbentity()),
                          "RemoveDBRefFolder");
    case KRDBEntityTypeImageAttributes:
      return removeRecord(*this, std::dynamic_pointer_cast<dbcore::DBUserImgAttrib>(entity->dbentity()),
                          "RemoveDBAttributes");
    case KRDBEntityTypeFavoriteAlias:
      return removeRecord(*this, std::static_pointer_cast<KRDBEntityFavoriteAlias>(entity)->dbalias(),
                          "RemoveDBFavAlias");
    default:
      return;
  }
}

void KRDBCatalog::deleteEntity(const std::shared_ptr<KRDBEntity>& entity) {
  performWork(
      *this, [entity](KRDBCatalog& catalog) { catalog.deleteEntitySync(entity); }, nullptr, false);
}

void KRDBCatalog::deleteImagesSync(const KRDBEntityArray& images) {
  std::vector<std::shared_ptr<dbcore::DBImage>> records;
  records.reserve(images.size());
  for (const auto& image : images)
    records.push_back(std::dynamic_pointer_cast<dbcore::DBImage>(image->dbentity()));
  handleDBReactorBlock([&records](const Reactor& reactor) { reactor->Remove(records); },
                       kRemoveImagesOperation, true);
}

void KRDBCatalog::deleteImages(const KRDBEntityArray& images) {
  performWork(
      *this, [images](KRDBCatalog& catalog) { catalog.deleteImagesSync(images); }, nullptr, false);
}

// ---- Dangling records

std::vector<KRString> KRDBCatalog::fetchUUIDsOfDanglingStatesSync() {
  const Reactor reactor = dbReactor();
  if (!reactor) return {};
  return stringsOf(reactor->GetDanglingHistoryStates(), &dbcore::DBImgHistoryState::guid);
}

void KRDBCatalog::fetchUUIDsOfDanglingStatesWithHandler(StringsHandler handler, bool sync) {
  performOperation<std::vector<KRString>>(
      [](KRDBCatalog& catalog) { return catalog.fetchUUIDsOfDanglingStatesSync(); }, std::move(handler),
      sync);
}

std::vector<KRString> KRDBCatalog::fetchNamesOfDanglingHistoryResourcesSync() {
  const Reactor reactor = dbReactor();
  if (!reactor) return {};
  return stringsOf(reactor->GetDangling<dbcore::DBResource>(), &dbcore::DBResource::name);
}

void KRDBCatalog::fetchNamesOfDanglingHistoryResourcesWithHandler(StringsHandler handler, bool sync) {
  performOperation<std::vector<KRString>>(
      [](KRDBCatalog& catalog) { return catalog.fetchNamesOfDanglingHistoryResourcesSync(); },
      std::move(handler), sync);
}

void KRDBCatalog::deleteDanglingPathesSync() {
  handleDBReactorBlock([](const Reactor& reactor) { reactor->ClearDanglingPaths(); }, kClearPathsOperation,
                       true);
}

void KRDBCatalog::deleteDanglingDBPathesWithHandler(Handler handler, bool sync) {
  performWork(*this, &KRDBCatalog::deleteDanglingPathesSync, std::move(handler), sync);
}

void KRDBCatalog::deleteDanglingHistoryStatesSync() {
  handleDBReactorBlock([](const Reactor& reactor) { reactor->ClearDanglingHistoryStates(); },
                       kClearStatesOperation, true);
}

void KRDBCatalog::deleteDanglingHistoryStatesWithHandler(Handler handler, bool sync) {
  performWork(*this, &KRDBCatalog::deleteDanglingHistoryStatesSync, std::move(handler), sync);
}

void KRDBCatalog::deleteDanglingHistoryResourcesSync() {
  handleDBReactorBlock([](const Reactor& reactor) { reactor->ClearDangling<dbcore::DBResource>(); },
                       kClearResourcesOperation, true);
}

void KRDBCatalog::deleteDanglingHistoryResourcesWithHandler(Handler handler, bool sync) {
  performWork(*this, &KRDBCatalog::deleteDanglingHistoryResourcesSync, std::move(handler), sync);
}
