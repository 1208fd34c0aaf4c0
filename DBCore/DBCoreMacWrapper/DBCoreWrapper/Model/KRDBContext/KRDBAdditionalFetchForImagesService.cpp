#include "Model/KRDBContext/KRDBAdditionalFetchForImagesService.hpp"

#include <utility>

#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBFilteredImageAttributesFetchRequest/KRDBFilteredImageAttributesFetchRequest.hpp"
#include "Model/KRDBFilteredImageExivAttributesFetchRequest/KRDBFilteredImageExivAttributesFetchRequest.hpp"
#include "Model/KRDBFilteredPathsFetchRequest/KRDBFilteredPathsFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"

namespace {

// The entity of the map under the key, or nil.
template <class Entity>
std::shared_ptr<Entity> entryOf(const KRDBIDIndexedMap<std::shared_ptr<Entity>>& map, int64_t key) {
  const auto* found = map.find(key);
  return found ? *found : nullptr;
}

// Attribute entities by the image id of their records.
template <class Entity>
KRDBIDIndexedMap<std::shared_ptr<Entity>> byImageID(const KRDBEntitySet& entities, auto record) {
  std::vector<std::pair<int64_t, std::shared_ptr<Entity>>> entries;
  entries.reserve(entities.size());
  for (const auto& entity : entities) {
    auto typed = std::static_pointer_cast<Entity>(entity);
    if (const auto held = ((*typed).*record)()) entries.emplace_back(held->image_id, std::move(typed));
  }
  return KRDBIDIndexedMap<std::shared_ptr<Entity>>(std::move(entries));
}

}  // namespace

std::shared_ptr<KRDBAdditionalFetchForImagesService> KRDBAdditionalFetchForImagesService::initWithContext(
    const std::shared_ptr<KRDBContext>& context) {
  std::shared_ptr<KRDBAdditionalFetchForImagesService> service(new KRDBAdditionalFetchForImagesService());
  service->context_ = context;
  return service;
}

void KRDBAdditionalFetchForImagesService::fastAdditionalFetchesForImage(
    const std::shared_ptr<KRDBImage>& image, Handler handler) {
  if (!handler) return;
  if (allFetchesCompleted()) {
    fastAdditionalFetchesForImage(image);
    return handler();
  }
  enqueueUntilMapsArrive([weak = weakSelf(), image, handler = std::move(handler)] {
    if (const auto service = weak.lock()) service->fastAdditionalFetchesForImage(image);
    handler();
  });
}

void KRDBAdditionalFetchForImagesService::fastAdditionalFetchesForImages(Images images, Handler handler) {
  if (!handler) return;
  auto attachAll = [weak = weakSelf(), images = std::move(images), handler = std::move(handler)] {
    if (const auto service = weak.lock()) {
      PathsByID paths;
      for (const auto& image : *images) service->attach(image, paths);
    }
    handler();
  };
  if (allFetchesCompleted()) return attachAll();
  enqueueUntilMapsArrive(std::move(attachAll));
}

void KRDBAdditionalFetchForImagesService::enqueueUntilMapsArrive(Handler callback) {
  if (!fastFetchingCompletions_) fastFetchingCompletions_ = std::make_unique<std::vector<Handler>>();
  fastFetchingCompletions_->push_back(std::move(callback));
  requestFetchingMaps();
}

void KRDBAdditionalFetchForImagesService::fastAdditionalFetchesForImage(
    const std::shared_ptr<KRDBImage>& image) {
  PathsByID paths;
  attach(image, paths);
}

void KRDBAdditionalFetchForImagesService::attach(const std::shared_ptr<KRDBImage>& image, PathsByID& paths) {
  if (!image || !allFetchesCompleted()) return;
  const int64_t imageID = image->entityID()->dbid();
  attachPath(image, imageID, paths);
  if (const auto attributes = entryOf(*imagesImageAttributesMap_, imageID)) {
    attributes->setImagePrimitive(image);
    image->setAttributesPrimitive(attributes);
  }
  if (const auto attributes = entryOf(*imagesImageExivAttributesMap_, imageID)) {
    attributes->setImagePrimitive(image);
    image->setExivAttributesPrimitive(attributes);
  }
  if (const auto state = entryOf(*imagesCurrentStatesMap_, imageID)) image->setCurrentStatePrimitive(state);
}

void KRDBAdditionalFetchForImagesService::attachPath(const std::shared_ptr<KRDBImage>& image, int64_t imageID,
                                                     PathsByID& paths) {
  const int64_t* pathID = imagesPathesMap_->find(imageID);
  if (!pathID) return;
  auto& path = paths[*pathID];
  if (!path) {
    const auto context = context_.lock();
    if (!context) return;
    path = std::static_pointer_cast<KRDBPath>(
        context->entityWithID(KRDBEntityID::initWithEntityType(KRDBEntityTypePath, *pathID)));
  }
  image->setFolderDBPathPrimitive(path);
}

// ---- Maps

void KRDBAdditionalFetchForImagesService::requestFetchingMaps() {
  const auto context = context_.lock();
  if (fetchingMaps_ || !context) return;
  fetchingMaps_ = true;
  // The catalog's queue serves them in this order, and the main thread takes each as it arrives; the maps
  // whose taking costs the main thread most come first, so that the queue's later work hides it.
  fetchPathesMap(context);
  fetchCurrentStatesMap(context);
  fetchExivAttributesMap(context);
  fetchAttributesMap(context);
}

template <class Result>
std::function<void(Result)> KRDBAdditionalFetchForImagesService::storing(
    void (KRDBAdditionalFetchForImagesService::*store)(Result)) {
  return [weak = weakSelf(), store](Result result) {
    const auto service = weak.lock();
    if (!service) return;
    ((*service).*store)(std::move(result));
    service->validateCompletionFetching();
  };
}

void KRDBAdditionalFetchForImagesService::fetchPathesMap(const std::shared_ptr<KRDBContext>& context) {
  struct Pending {
    std::optional<KRDictionary> connections;
    bool pathsCached = false;
  };
  const auto pending = std::make_shared<Pending>();
  const auto storeWhenBothArrived = [pending,
                                     store = storing(&KRDBAdditionalFetchForImagesService::storePathes)] {
    if (pending->connections && pending->pathsCached) store(std::move(*pending->connections));
  };
  // Folder paths are not fetched by identifier: they are cached alongside, so that attaching an image's
  // path finds it in the context's cache.
  context->obtainEntitiesUsingFetchRequest(KRDBFilteredPathsFetchRequest::init(),
                                           [pending, storeWhenBothArrived](KRDBEntitySet) {
                                             pending->pathsCached = true;
                                             storeWhenBothArrived();
                                           });
  context->catalog()->fetchConnectionsForImagesWithDBPathesWithHandler(
      [pending, storeWhenBothArrived](KRDictionary connections) {
        pending->connections = std::move(connections);
        storeWhenBothArrived();
      });
}

void KRDBAdditionalFetchForImagesService::fetchAttributesMap(const std::shared_ptr<KRDBContext>& context) {
  context->obtainEntitiesUsingFetchRequest(KRDBFilteredImageAttributesFetchRequest::init(),
                                           storing(&KRDBAdditionalFetchForImagesService::storeAttributes));
}

void KRDBAdditionalFetchForImagesService::fetchExivAttributesMap(
    const std::shared_ptr<KRDBContext>& context) {
  context->obtainEntitiesUsingFetchRequest(
      KRDBFilteredImageExivAttributesFetchRequest::init(),
      storing(&KRDBAdditionalFetchForImagesService::storeExivAttributes));
}

void KRDBAdditionalFetchForImagesService::fetchCurrentStatesMap(const std::shared_ptr<KRDBContext>& context) {
  context->obtainCurrentStatesForImages({},
                                        storing(&KRDBAdditionalFetchForImagesService::storeCurrentStates));
}

void KRDBAdditionalFetchForImagesService::storePathes(KRDictionary connections) {
  std::vector<PathIDs::Entry> pathIDs;
  pathIDs.reserve(connections.count());
  for (const auto& [image, path] : connections.entries())
    pathIDs.emplace_back(image.number().longLongValue(), path.number().longLongValue());
  imagesPathesMap_.emplace(std::move(pathIDs));
}

void KRDBAdditionalFetchForImagesService::storeAttributes(KRDBEntitySet entities) {
  imagesImageAttributesMap_ = byImageID<KRDBImageAttributes>(entities, &KRDBImageAttributes::dbattrib);
}

void KRDBAdditionalFetchForImagesService::storeExivAttributes(KRDBEntitySet entities) {
  imagesImageExivAttributesMap_ =
      byImageID<KRDBImageExivAttributes>(entities, &KRDBImageExivAttributes::dbexivattrib);
}

void KRDBAdditionalFetchForImagesService::storeCurrentStates(KRDBCatalog::ImageStatesByID states) {
  imagesCurrentStatesMap_.emplace(std::vector<StatesByImage::Entry>(states.begin(), states.end()));
}

bool KRDBAdditionalFetchForImagesService::allFetchesCompleted() const {
  return imagesPathesMap_ && imagesImageAttributesMap_ && imagesImageExivAttributesMap_ &&
         imagesCurrentStatesMap_;
}

void KRDBAdditionalFetchForImagesService::validateCompletionFetching() {
  if (!allFetchesCompleted()) return;
  fetchingMaps_ = false;
  const auto completions = std::move(fastFetchingCompletions_);
  if (!completions) return;
  for (const auto& completion : *completions) completion();
}
