#include "Model/KRDBContext/KRDBContext.hpp"

#include <utility>

#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBAdditionalFetchForImagesService.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Support/KRDBCoreInjectorService.hpp"

namespace {

// The database id of the root collection and of the root referenced folder.
constexpr int64_t kRootDatabaseID = 1;

}  // namespace

// ---- Construction

KRDBContext::KRDBContext(std::shared_ptr<KRDBCatalog> catalog)
    : blockDispatcher_(catalog->dispatcher()),
      catalog_(std::move(catalog)),
      fetchedEntities_(KRDBEntitiesStorage::init()),
      entitiesChanges_(emptyEntitiesChangesMapTable()) {}

std::shared_ptr<KRDBContext> KRDBContext::initWithCatalog(std::shared_ptr<KRDBCatalog> catalog) {
  if (!catalog) return nullptr;
  std::shared_ptr<KRDBContext> context(new KRDBContext(std::move(catalog)));
  context->buildRootsAndServices();
  return context;
}

KRDBContext::~KRDBContext() {
  // An image and its collections hold each other once both relations were read: dropping the images'
  // cached relations lets them all go with the context.
  for (const auto& image : fetchedEntities_->allEntitiesWithType(KRDBEntityTypeImage)) image->reset();
}

void KRDBContext::buildRootsAndServices() {
  rootFilter_ = std::dynamic_pointer_cast<KRDBCollection>(
      entityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypeCollection, kRootDatabaseID)));
  rootReferencedFolder_ = std::dynamic_pointer_cast<KRDBReferencedFolder>(
      entityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypeReferencedFolder, kRootDatabaseID)));
  allImagesFilter_ = KRDBImagesFilter::initWithContext(selfPtr(), KRDBFilteredImagesFetchRequest::init());
  additionalFetchForImagesService_ = KRDBAdditionalFetchForImagesService::initWithContext(selfPtr());
}

std::shared_ptr<KRDBEntityIDMapTable> KRDBContext::emptyEntitiesChangesMapTable() {
  KRDBCoreInjectorService::load();
  return KRDBCoreInjectorService::resolveImplementationClassForProtocol<KRDBDataStorageCreating>()
      ->makeMapTableWithObjectsMappedByEntityIDs();
}

// ---- Entity cache

std::shared_ptr<KRDBEntity> KRDBContext::cachedEntityForEntityID(const KRDBEntityIDPtr& entityID) const {
  return entityID ? fetchedEntities_->entityForID(entityID) : nullptr;
}

std::shared_ptr<KRDBEntity> KRDBContext::entityWithID(const KRDBEntityIDPtr& entityID) {
  if (!entityID) return nullptr;
  auto entity = cachedEntityForEntityID(entityID);
  if (!entity) {
    entity = catalog_->fetchEntityWithID(entityID);
    if (!entity) return nullptr;
    cacheEntityAndFetchLinkedEntities(entity);
  }
  waitForNecessaryEntities(entity);
  return entity;
}

void KRDBContext::waitForNecessaryEntities(const std::shared_ptr<KRDBEntity>& entity) {
  if (entity->necesserryEntitiesToFetchCount() == 0) return;
  KRRunLoop::currentRunLoop()->runUntil([&entity] { return entity->necesserryEntitiesToFetchCount() == 0; },
                                        KRDate::distantFuture());
}

void KRDBContext::cacheEntityAndFetchLinkedEntities(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity || !entity->entityID() || cachedEntityForEntityID(entity->entityID())) return;
  cacheUncachedEntity(entity);
}

void KRDBContext::cacheUncachedEntity(const std::shared_ptr<KRDBEntity>& entity) {
  // Cached first, so that lookups made while its linked records are fetched find this object.
  fetchedEntities_->setEntity(entity, entity->entityID());
  if (entity->needFetchNecessaryEntities()) additionalFetchingForEntity(entity);
  if (entity->necesserryEntitiesToFetchCount() == 0) return prepareFetchedEntity(entity);
  std::weak_ptr<KRDBContext> weak = weakSelf();
  entity->pushCompletionFetchingNecessaryEntities([weak, entity] {
    if (const auto context = weak.lock()) context->prepareFetchedEntity(entity);
  });
}

void KRDBContext::prepareFetchedEntity(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return;
  entity->addListener(selfPtr());
  entity->setContext(selfPtr());
  // The entries of the linked-entities dictionary, read one by one rather than through a dictionary built
  // per entity.
  for (const auto& key : entity->entityClass().necessaryLinkedEntitiesKeys()) {
    const auto linked = entity->necessaryLinkedEntity(key);
    if (!linked) continue;
    auto instance = cachedEntityForEntityID(linked->entityID());
    if (!instance) {
      prepareFetchedEntity(linked);
      instance = linked;
    }
    entity->updateNecessaryEntityForKey(key, instance);
  }
  entity->awakeFromFetch();
  fetchedEntities_->setEntity(entity, entity->entityID());
}

std::shared_ptr<KRDBEntity> KRDBContext::cachedOrCachingInstance(const std::shared_ptr<KRDBEntity>& entity) {
  if (auto cached = cachedEntityForEntityID(entity->entityID())) return cached;
  if (entity->entityID()) cacheUncachedEntity(entity);
  return entity;
}

std::shared_ptr<KRDBEntity> KRDBContext::preparedEntity(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return nullptr;
  auto instance = cachedOrCachingInstance(entity);
  waitForNecessaryEntities(instance);
  return instance;
}

// The bookkeeping of one preparedEntities call: the handler gets the result once every input entity is
// prepared.
struct KRDBContext::PreparationProgress {
  KRDBEntitySet result;
  size_t finished = 0;
  size_t expected = 0;
  EntitiesHandler handler;
  void finish(size_t count) {
    finished += count;
    if (finished == expected && handler) handler(std::move(result));
  }
};

void KRDBContext::preparedEntities(KRDBEntitySet entities, EntitiesHandler handler) {
  const auto progress = std::make_shared<PreparationProgress>();
  progress->expected = entities.size();
  progress->handler = std::move(handler);
  size_t preparedAtOnce = 0;
  auto images = std::make_shared<std::vector<std::shared_ptr<KRDBImage>>>();
  // The set becomes the result: only the members that are not their own cached instance are replaced, so
  // a freshly fetched million is not copied.
  std::vector<std::pair<std::shared_ptr<KRDBEntity>, std::shared_ptr<KRDBEntity>>> replaced;
  for (const auto& entity : entities) {
    auto instance = entity ? cachedEntityForEntityID(entity->entityID()) : nullptr;
    if (!instance && entity) {
      instance = entity;
      if (joinsImageBatch(*entity)) {
        cacheForImageBatch(entity, *images);
        continue;
      }
      if (entity->entityID()) cacheUncachedEntity(entity);
    }
    if (instance != entity || !entity) replaced.emplace_back(entity, instance);
    if (instance && instance->necesserryEntitiesToFetchCount() != 0) {
      instance->pushCompletionFetchingNecessaryEntities([progress] { progress->finish(1); });
    } else {
      ++preparedAtOnce;
    }
  }
  for (const auto& [fetched, instance] : replaced) {
    entities.erase(fetched);
    if (instance) entities.insert(instance);
  }
  progress->result = std::move(entities);
  progress->finish(preparedAtOnce);
  if (!images->empty()) fetchLinkedEntitiesOfImageBatch(std::move(images), progress);
}

bool KRDBContext::joinsImageBatch(const KRDBEntity& entity) const {
  return entity.entityID() && entity.entityID()->entityType() == KRDBEntityTypeImage &&
         entity.needFetchNecessaryEntities();
}

void KRDBContext::cacheForImageBatch(const std::shared_ptr<KRDBEntity>& image,
                                     std::vector<std::shared_ptr<KRDBImage>>& batch) {
  fetchedEntities_->setEntity(image, image->entityID());
  image->setNecesserryEntitiesToFetchCount(image->entityClass().necessaryLinkedEntitiesKeys().size());
  batch.push_back(std::static_pointer_cast<KRDBImage>(image));
}

void KRDBContext::fetchLinkedEntitiesOfImageBatch(KRDBAdditionalFetchForImagesService::Images images,
                                                  const std::shared_ptr<PreparationProgress>& progress) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  additionalFetchForImagesService_->fastAdditionalFetchesForImages(images, [weak, images, progress] {
    const auto context = weak.lock();
    if (!context) return;
    size_t prepared = 0;
    for (const auto& image : *images) prepared += context->finishFastFetch(image, progress) ? 1 : 0;
    progress->finish(prepared);
  });
}

bool KRDBContext::finishFastFetch(const std::shared_ptr<KRDBImage>& image,
                                  const std::shared_ptr<PreparationProgress>& progress) {
  if (image->needFetchNecessaryEntities()) {
    // The maps lacked a link: the image is prepared, before whatever else waits on it, once the catalog
    // delivered the rest.
    std::weak_ptr<KRDBContext> weak = weakSelf();
    auto& waiting = image->necessaryEntitiesFetchingCompletions();
    waiting.insert(waiting.begin(), [weak, image] {
      if (const auto context = weak.lock()) context->prepareFetchedEntity(image);
    });
    image->pushCompletionFetchingNecessaryEntities([progress] { progress->finish(1); });
    fetchLinkedEntitiesFromCatalog(image);
    return false;
  }
  prepareFetchedEntity(image);
  image->setNecesserryEntitiesToFetchCount(0);
  return true;
}

void KRDBContext::additionalFetchingForEntity(const std::shared_ptr<KRDBEntity>& entity) {
  entity->setNecesserryEntitiesToFetchCount(entity->entityClass().necessaryLinkedEntitiesKeys().size());
  std::weak_ptr<KRDBContext> weak = weakSelf();
  makeFastAdditionalFetchesForEntity(entity, [weak, entity] {
    const auto context = weak.lock();
    if (!context) return;
    if (!entity->needFetchNecessaryEntities()) return entity->setNecesserryEntitiesToFetchCount(0);
    context->fetchLinkedEntitiesFromCatalog(entity);
  });
}

void KRDBContext::fetchLinkedEntitiesFromCatalog(const std::shared_ptr<KRDBEntity>& entity) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->additionalFetchingForEntities(
      {entity},
      [weak, entity](KRDBEntitySet linked) {
        if (const auto context = weak.lock()) context->takeLinkedEntities(entity, linked);
      },
      false);
}

void KRDBContext::takeLinkedEntities(const std::shared_ptr<KRDBEntity>& entity, const KRDBEntitySet& linked) {
  entity->setNecesserryEntitiesToFetchCount(linked.size());
  const auto decrement = [entity] {
    entity->setNecesserryEntitiesToFetchCount(entity->necesserryEntitiesToFetchCount() - 1);
  };
  for (const auto& each : linked) {
    const auto instance = cachedOrCachingInstance(each);
    if (instance->necesserryEntitiesToFetchCount() != 0) {
      instance->pushCompletionFetchingNecessaryEntities(decrement);
    } else {
      decrement();
    }
  }
}

void KRDBContext::makeFastAdditionalFetchesForEntity(const std::shared_ptr<KRDBEntity>& entity,
                                                     Handler completion) {
  if (entity->entityID()->entityType() != KRDBEntityTypeImage) return completion();
  additionalFetchForImagesService_->fastAdditionalFetchesForImage(std::static_pointer_cast<KRDBImage>(entity),
                                                                  std::move(completion));
}

void KRDBContext::obtainEntitiesUsingFetchRequest(const FetchRequestPtr& request, EntitiesHandler handler) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->obtainFetchedEntitiesUsingFetchRequest(
      request,
      [weak, handler = std::move(handler)](KRDBEntitySet entities) {
        if (const auto context = weak.lock()) context->preparedEntities(std::move(entities), handler);
      },
      false);
}

// ---- Dispatcher, waiting, closing, backup

void KRDBContext::performBlock(std::function<void()> block) {
  blockDispatcher_->performBlock(std::move(block));
}

void KRDBContext::performBlockAndWait(const std::function<void()>& block) {
  blockDispatcher_->performBlockAndWait(block);
}

void KRDBContext::enqueueWaitingBlock(Handler block) {
  const std::lock_guard lock(waitForProcessChangesHandlersMutex_);
  waitForProcessChangesHandlers_.push_back(std::move(block));
}

KRDBContext::Handler KRDBContext::dequeueWaitingChangesBlock() {
  const std::lock_guard lock(waitForProcessChangesHandlersMutex_);
  if (waitForProcessChangesHandlers_.empty()) return nullptr;
  Handler first = std::move(waitForProcessChangesHandlers_.front());
  waitForProcessChangesHandlers_.erase(waitForProcessChangesHandlers_.begin());
  return first;
}

void KRDBContext::waitForProcessChangesWithHandler(Handler handler) {
  if (isWaitingForProcessChanges()) return enqueueWaitingBlock(std::move(handler));
  if (handler) handler();
}

void KRDBContext::waitForAllDataBaseOperationsWithHandler(Handler handler) {
  waitForProcessChangesWithHandler([catalog = catalog_, handler = std::move(handler)] {
    catalog->waitForAllDataBaseOperationsWithHandler(handler);
  });
}

void KRDBContext::closeAfterAllDataBaseOperationsWithHandler(Handler handler) {
  waitingForClose_ = true;
  waitForProcessChangesWithHandler([catalog = catalog_, handler = std::move(handler)] {
    catalog->closeAfterAllDataBaseOperationsWithHandler(handler);
  });
}

void KRDBContext::backupDBToPath(const KRString& path, std::function<void(bool)> handler) {
  waitForProcessChangesWithHandler([catalog = catalog_, path, handler = std::move(handler)] {
    catalog->backupDBFileToPath(path, [handler](bool succeeded) { handler(succeeded); });
  });
}

KRString KRDBContext::normilizedPath(const KRString& path) {
  if (!path || path.str().ends_with('/')) return path;
  return KRString(path.str() + "/");
}
