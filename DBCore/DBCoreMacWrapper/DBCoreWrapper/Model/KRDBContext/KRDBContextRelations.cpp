#include "KRFoundation/KRException.hpp"
#include "KRServices/KRLog.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"

namespace {

// The database id of the root collection.
constexpr int64_t kRootDatabaseID = 1;

}  // namespace

template <class T>
std::shared_ptr<T> KRDBContext::prepared(const std::shared_ptr<T>& entity) {
  return std::static_pointer_cast<T>(preparedEntity(entity));
}

KRDBEntitySet KRDBContext::preparedSet(const KRDBEntitySet& entities) {
  KRDBEntitySet instances;
  instances.reserve(entities.size());
  for (const auto& entity : entities) instances.insert(preparedEntity(entity));
  return instances;
}

// ---- Folder trees and members

std::shared_ptr<KRDBAbstractBaseFolder> KRDBContext::parentOfFilter(
    const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  if (!filter || filter->entityID()->dbid() == kRootDatabaseID) return nullptr;
  return prepared(catalog_->fetchParentOfFilter(filter));
}

KRDBEntitySet KRDBContext::childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  return preparedSet(catalog_->fetchChildsOfFilter(filter));
}

void KRDBContext::obtainChildsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter,
                                       EntitiesHandler handler) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->fetchChildsOfFilter(
      filter,
      [weak, filter, handler = std::move(handler)](KRDBEntitySet childs) {
        const auto context = weak.lock();
        if (!context) return;
        context->preparedEntities(std::move(childs), [filter, handler](KRDBEntitySet instances) {
          filter->setChildsPrimitive(std::make_shared<KRDBEntitySet>(instances));
          for (const auto& child : instances)
            std::static_pointer_cast<KRDBAbstractBaseFolder>(child)->setParentPrimitive(filter);
          if (handler) handler(std::move(instances));
        });
      },
      false);
}

void KRDBContext::obtainDescendantsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter,
                                            EntitiesHandler handler) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->fetchDescendantsOfFilter(
      filter,
      [weak, handler = std::move(handler)](KRDBEntitySet descendants) {
        if (const auto context = weak.lock()) context->preparedEntities(std::move(descendants), handler);
      },
      false);
}

KRDBEntitySet KRDBContext::imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) {
  const KRDBEntityArray images = catalog_->fetchImagesOfFilter(filter);
  return preparedSet(KRDBEntitySet(images.begin(), images.end()));
}

KRDBEntitySet KRDBContext::filtersOfImage(const std::shared_ptr<KRDBImage>& image) {
  return preparedSet(catalog_->fetchFiltersOfImage(image));
}

std::shared_ptr<KRDBPath> KRDBContext::pathForReferencedFolder(
    const std::shared_ptr<KRDBReferencedFolder>& folder) {
  return prepared(catalog_->fetchPathForReferencedFolder(folder));
}

// ---- Attribute records

std::shared_ptr<KRDBImageAttributes> KRDBContext::attributesForImage(
    const std::shared_ptr<KRDBImage>& image) {
  return prepared(catalog_->fetchAttributesForImage(image));
}

std::shared_ptr<KRDBImage> KRDBContext::imageForAttributes(
    const std::shared_ptr<KRDBImageAttributes>& attributes) {
  return prepared(catalog_->fetchImageForAttributes(attributes));
}

std::shared_ptr<KRDBImageExivAttributes> KRDBContext::exivAttributesForImage(
    const std::shared_ptr<KRDBImage>& image) {
  return prepared(catalog_->fetchExivAttributesForImage(image));
}

std::shared_ptr<KRDBImage> KRDBContext::imageForExivAttributes(
    const std::shared_ptr<KRDBImageExivAttributes>& attributes) {
  return prepared(catalog_->fetchImageForExivAttributes(attributes));
}

// ---- History states

KRDBImageStates KRDBContext::statesForImage(const std::shared_ptr<KRDBImage>& image) {
  KRDBImageStates states = catalog_->fetchStatesOfImage(image);
  for (auto& state : states) state = prepared(state);
  return states;
}

std::shared_ptr<KRDBImageState> KRDBContext::currentStateForImage(const std::shared_ptr<KRDBImage>& image) {
  return prepared(catalog_->fetchCurrentStateForImage(image));
}

void KRDBContext::obtainCurrentStatesForImages(const KRDBEntityArray& images,
                                               std::function<void(KRDBCatalog::ImageStatesByID)> handler) {
  std::weak_ptr<KRDBContext> weak = weakSelf();
  catalog_->fetchCurrentStatesForImages(
      images,
      [weak, handler = std::move(handler)](KRDBCatalog::ImageStatesByID states) {
        const auto context = weak.lock();
        if (!context) return;
        KRDBEntitySet fetched;
        fetched.reserve(states.size());
        for (const auto& entry : states) fetched.insert(entry.second);
        context->preparedEntities(std::move(fetched),
                                  [context, states = std::move(states), handler](KRDBEntitySet) mutable {
                                    for (auto& entry : states) {
                                      entry.second = std::static_pointer_cast<KRDBImageState>(
                                          context->cachedEntityForEntityID(entry.second->entityID()));
                                    }
                                    if (handler) handler(std::move(states));
                                  });
      },
      false);
}

// ---- Favorite aliases and volumes

std::shared_ptr<KRDBEntityFavoriteAlias> KRDBContext::favoriteAliasForEntity(
    const std::shared_ptr<KRDBEntity>& entity) {
  bool created = false;
  const auto alias = catalog_->fetchFavoriteAliasForEntity(entity, &created);
  if (!alias || !created) return prepared(alias);
  // A new alias is a created entity of the next change-processing pass.
  processCreateEntity(alias, KRDictionary());
  return alias;
}

std::shared_ptr<KRDBVolume> KRDBContext::volumeForPath(const std::shared_ptr<KRDBPath>& path) {
  return prepared(catalog_->fetchVolumeForPath(path));
}
