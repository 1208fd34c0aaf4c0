// Creating and deleting entities through the context: the object graph in memory changes at once, the
// inverse step goes to the undo manager, the storage work to the catalog, and a change-processing pass is
// scheduled.
#include <optional>
#include <utility>

#include "KRServices/KRLog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesStorage.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"

namespace {

// The info for the created entity at the index: its own when there is one per entity, else the first.
KRDictionary infoAt(const std::optional<std::vector<KRDictionary>>& infos, size_t index, size_t created) {
  if (!infos || infos->empty()) return {};
  return infos->size() == created ? (*infos)[index] : infos->front();
}

template <class T>
std::shared_ptr<T> as(const std::shared_ptr<KRDBEntity>& entity) {
  return std::static_pointer_cast<T>(entity);
}

}  // namespace

// ---- Creation

std::shared_ptr<KRDBEntity> KRDBContext::createEntityWithType(int64_t entityType) {
  return createEntityWithType(entityType, KRDictionary());
}

std::shared_ptr<KRDBEntity> KRDBContext::createEntityWithType(int64_t entityType, const KRDictionary& info) {
  std::shared_ptr<KRDBEntity> last;
  createEntitiesWithType(
      entityType, infosOf(info),
      [&last](const KRDBEntityArray& created) {
        if (!created.empty()) last = created.back();
      },
      true);
  return last;
}

void KRDBContext::createEntityWithType(int64_t entityType, EntityHandler handler) {
  createEntityWithType(entityType, KRDictionary(), std::move(handler));
}

void KRDBContext::createEntityWithType(int64_t entityType, const KRDictionary& info, EntityHandler handler) {
  createEntitiesWithType(
      entityType, infosOf(info),
      [handler = std::move(handler)](const KRDBEntityArray& created) {
        if (handler) handler(created.empty() ? nullptr : created.back());
      },
      false);
}

void KRDBContext::createEntitiesWithType(int64_t entityType, const std::vector<KRDictionary>& infos,
                                         ArrayHandler handler) {
  createEntitiesWithType(entityType, std::optional(infos), std::move(handler), false);
}

std::optional<std::vector<KRDictionary>> KRDBContext::infosOf(const KRDictionary& info) {
  if (info.isNil()) return std::nullopt;
  return std::vector{info};
}

void KRDBContext::createEntitiesWithType(int64_t entityType,
                                         const std::optional<std::vector<KRDictionary>>& infos,
                                         ArrayHandler handler, bool sync) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  auto created = [weak, entityType, infos, handler = std::move(handler)](const KRDBEntityArray& entities) {
    if (const auto context = weak.lock()) context->takeCreatedEntities(entityType, entities, infos);
    if (handler) handler(entities);
  };
  if (!sync) return createInCatalog(entityType, infos, std::move(created), false);
  // A synchronous catalog answers on its queue: the entities are taken here, on the caller's thread.
  KRDBEntityArray entities;
  createInCatalog(
      entityType, infos, [&entities](const KRDBEntityArray& made) { entities = made; }, true);
  created(entities);
}

void KRDBContext::createInCatalog(int64_t entityType, const std::optional<std::vector<KRDictionary>>& infos,
                                  ArrayHandler handler, bool sync) {
  if (infos) return catalog_->createEntitiesWithType(entityType, *infos, std::move(handler), sync);
  catalog_->createEntityWithType(
      entityType,
      [handler = std::move(handler)](std::shared_ptr<KRDBEntity> entity) {
        handler(entity ? KRDBEntityArray{entity} : KRDBEntityArray{});
      },
      sync);
}

void KRDBContext::takeCreatedEntities(int64_t entityType, const KRDBEntityArray& entities,
                                      const std::optional<std::vector<KRDictionary>>& infos) {
  registerUndo([entityType, made = KRDBEntitySet(entities.begin(), entities.end())](const auto& context) {
    if (entityType == KRDBEntityTypeImage) return context->deleteImages(made);
    context->deleteEntitiesPrimitives(made);
  });
  for (size_t index = 0; index < entities.size(); ++index)
    processCreateEntity(entities[index], infoAt(infos, index, entities.size()));
}

void KRDBContext::processCreateEntity(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& info) {
  if (!entity || deletedEntities_.contains(entity)) return;
  prepareFetchedEntity(entity);
  addedEntities_.insert(entity);
  switch (entity->entityID()->entityType()) {
    case KRDBEntityTypeCollection:
      rootFilter_->addChildsPrimitive({entity});
      break;
    case KRDBEntityTypeReferencedFolder:
      attachCreatedReferencedFolder(as<KRDBReferencedFolder>(entity), info);
      break;
    default:
      break;
  }
  shouldProcessChanges();
}

void KRDBContext::attachCreatedReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>& folder,
                                                const KRDictionary& info) {
  std::shared_ptr<KRDBAbstractBaseFolder> parent;
  if (!info.objectForKey(KRValue("DBReferencedFolderChildsPaths")).isNil()) {
    processCreateEntity(folder->dbPath(), KRDictionary());
    parent = folder->parentPrimitive();
  } else {
    parent = info.objectForKey(KRValue("DBReferencedFolderParent")).objectAs<KRDBAbstractBaseFolder>();
  }
  if (!parent) return;
  parent->addChildsPrimitive({folder});
  folder->setParentPrimitive(parent);
}

void KRDBContext::applyInfo(const KRDictionary& info, const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return;
  switch (entity->entityID()->entityType()) {
    case KRDBEntityTypeReferencedFolder: {
      const auto folder = as<KRDBReferencedFolder>(entity);
      const auto parent =
          info.objectForKey(KRValue("DBReferencedFolderParent")).objectAs<KRDBAbstractBaseFolder>();
      if (parent && parent != folder->parent()) addChilds({folder}, parent);
      break;
    }
    case KRDBEntityTypeImage: {
      const auto image = as<KRDBImage>(entity);
      const KRValue index = info.objectForKey(KRValue("DBImageImportIndex"));
      if (!index.isNil()) image->setImportIndex(index.number().intValue());
      const KRValue seconds = info.objectForKey(KRValue("DBImageImportTimeIntervalNumber"));
      if (!seconds.isNil())
        image->setImportDate(KRDate::dateWithTimeIntervalSince1970(seconds.number().doubleValue()));
      break;
    }
    default:
      break;
  }
}

// ---- Deletion

void KRDBContext::deleteEntity(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return;
  if (entity->entityID()->entityType() == KRDBEntityTypeReferencedFolder)
    deleteReferencedFolderContents(as<KRDBReferencedFolder>(entity));
  deleteEntityPrimitive(entity);
}

void KRDBContext::deleteReferencedFolderContents(const std::shared_ptr<KRDBReferencedFolder>& folder) {
  KRDBEntitySet unused;
  if (const auto images = folder->images()) {
    for (const auto& entity : *images) {
      const auto& attributes = as<KRDBImage>(entity)->attributesPrimitive();
      if (!attributes || (!attributes->isOpened() && !attributes->isLost())) unused.insert(entity);
    }
  }
  deleteImages(unused);
  const KRDBEntitySet subfolders = recursiveSubfolders(folder);
  for (const auto& subfolder : subfolders) deleteEntity(subfolder->favoriteAliasPrimitive());
  prepareDeletedEntities(subfolders);
}

void KRDBContext::deleteEntities(const KRDBEntitySet& entities) {
  for (const auto& entity : entities) deleteEntity(entity);
}

void KRDBContext::deleteEntitiesPrimitives(const KRDBEntitySet& entities) {
  for (const auto& entity : entities) deleteEntityPrimitive(entity);
}

void KRDBContext::deleteEntityPrimitive(const std::shared_ptr<KRDBEntity>& entity) {
  if (!entity) return;
  switch (entity->entityID()->entityType()) {
    case KRDBEntityTypeImage:
      deleteImage(as<KRDBImage>(entity));
      break;
    case KRDBEntityTypeCollection:
      deleteFilter(as<KRDBCollection>(entity));
      break;
    case KRDBEntityTypeReferencedFolder:
      deleteReffolder(as<KRDBReferencedFolder>(entity));
      break;
    case KRDBEntityTypePath:
    case KRDBEntityTypeVolume:
      return;
    case KRDBEntityTypeImageAttributes:
      KRLog(KRLogLevelWarning, "Warning: Should not delete image attributes");
      break;
    case KRDBEntityTypeImageExivAttributes:
      KRLog(KRLogLevelWarning, "Warning: Should not delete image exiv attributes");
      break;
    default:
      break;
  }
  // A collection, marked by deleteFilter, is left to the catalog's clean-up of marked records.
  if (entity->isMarkedToDelete()) return;
  prepareDeleteEntity(entity);
  catalog_->deleteEntity(entity);
  shouldProcessChanges();
}

void KRDBContext::deleteImage(const std::shared_ptr<KRDBImage>& image) {
  if (const auto& attributes = image->attributesPrimitive()) prepareDeleteEntity(attributes);
  if (const auto exif = image->exivAttributes()) prepareDeleteEntity(exif);
  if (const auto filters = image->filtersPrimitive()) {
    for (const auto& filter : *filters) {
      if (const auto collection = std::dynamic_pointer_cast<KRDBCollection>(filter))
        collection->removeImages({image});
    }
  }
}

void KRDBContext::deleteImages(const KRDBEntitySet& images) {
  for (const auto& image : images) {
    if (!image) continue;
    deleteImage(as<KRDBImage>(image));
    prepareDeleteEntity(image);
    shouldProcessChanges();
  }
  catalog_->deleteImages(KRDBEntityArray(images.begin(), images.end()));
}

void KRDBContext::deleteFilter(const std::shared_ptr<KRDBCollection>& collection) {
  collection->setMarkedToDelete(true);
  if (const auto& alias = collection->favoriteAliasPrimitive()) alias->setMarkedToDelete(true);
  if (const auto childs = collection->childsPrimitive()) {
    for (const auto& child : *childs) {
      if (const auto subcollection = std::dynamic_pointer_cast<KRDBCollection>(child))
        deleteFilter(subcollection);
    }
  }
}

void KRDBContext::deleteReffolder(const std::shared_ptr<KRDBReferencedFolder>& folder) {
  deleteEntity(folder->favoriteAliasPrimitive());
  if (const auto parent = folder->parent()) parent->deleteChildsPrimitive({folder});
}

KRDBEntitySet KRDBContext::recursiveSubfolders(const std::shared_ptr<KRDBAbstractBaseFolder>& folder) {
  KRDBEntitySet subfolders;
  const auto childs = folder ? folder->childsPrimitive() : nullptr;
  if (!childs) return subfolders;
  for (const auto& child : *childs) {
    subfolders.insert(child);
    const auto below = recursiveSubfolders(std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(child));
    subfolders.insert(below.begin(), below.end());
  }
  return subfolders;
}
