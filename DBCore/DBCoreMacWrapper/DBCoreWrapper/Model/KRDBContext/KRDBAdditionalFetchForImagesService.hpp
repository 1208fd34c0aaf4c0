#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <unordered_map>
#include <vector>

#include "KRFoundation/KRObject.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Support/KRDBIDIndexedMap.hpp"

class KRDBContext;
class KRDBImage;
class KRDBImageAttributes;
class KRDBImageExivAttributes;
class KRDBImageState;
class KRDBPath;

// Attaches to images their folder path, attributes, exif attributes and current history state from four
// whole-catalog maps keyed by image database id, fetched once per context, instead of four queries per
// image. The maps are indexed by image id: each image is looked up in all four. Images asked for before the
// maps arrived wait in a queue and are served in order when the last map arrives. The maps are never
// refreshed: images created later get their links the ordinary way. Main thread only; not locked.
class KRDBAdditionalFetchForImagesService : public KRObject {
 public:
  using Handler = std::function<void()>;
  using PathIDs = KRDBIDIndexedMap<int64_t>;
  using AttributesByImage = KRDBIDIndexedMap<std::shared_ptr<KRDBImageAttributes>>;
  using ExivAttributesByImage = KRDBIDIndexedMap<std::shared_ptr<KRDBImageExivAttributes>>;
  using StatesByImage = KRDBIDIndexedMap<std::shared_ptr<KRDBImageState>>;
  using Images = std::shared_ptr<const std::vector<std::shared_ptr<KRDBImage>>>;

  static std::shared_ptr<KRDBAdditionalFetchForImagesService> initWithContext(
      const std::shared_ptr<KRDBContext>& context);

  // Attaches what the maps hold and then calls the handler: at once when the maps are here, otherwise
  // once they arrived. Without a handler nothing happens.
  void fastAdditionalFetchesForImage(const std::shared_ptr<KRDBImage>& image, Handler handler);
  // Attaches from the maps; links the maps lack are left alone.
  void fastAdditionalFetchesForImage(const std::shared_ptr<KRDBImage>& image);
  // The same for many images at once, as one queued callback: the images are attached in order, then the
  // handler is called once. Loading a catalog's images this way queues nothing per image.
  void fastAdditionalFetchesForImages(Images images, Handler handler);

  // Starts the four map fetches unless they are running.
  void requestFetchingMaps();
  // When the four maps are here: runs the queued callbacks in order and drops the queue.
  void validateCompletionFetching();
  bool allFetchesCompleted() const;
  bool isFetchingMaps() const { return fetchingMaps_; }

  // The maps: absent until fetched, present (maybe empty) afterwards.
  const std::optional<PathIDs>& imagesPathesMap() const { return imagesPathesMap_; }
  const std::optional<AttributesByImage>& imagesImageAttributesMap() const {
    return imagesImageAttributesMap_;
  }
  const std::optional<ExivAttributesByImage>& imagesImageExivAttributesMap() const {
    return imagesImageExivAttributesMap_;
  }
  const std::optional<StatesByImage>& imagesCurrentStatesMap() const { return imagesCurrentStatesMap_; }

 private:
  KRDBAdditionalFetchForImagesService() = default;
  std::weak_ptr<KRDBAdditionalFetchForImagesService> weakSelf() {
    return std::static_pointer_cast<KRDBAdditionalFetchForImagesService>(shared_from_this());
  }
  // The map fetches; each stores its map and checks whether all four are here.
  void fetchPathesMap(const std::shared_ptr<KRDBContext>& context);
  void fetchAttributesMap(const std::shared_ptr<KRDBContext>& context);
  void fetchExivAttributesMap(const std::shared_ptr<KRDBContext>& context);
  void fetchCurrentStatesMap(const std::shared_ptr<KRDBContext>& context);
  // Runs `store` on this service (when still alive) and then validateCompletionFetching.
  template <class Result>
  std::function<void(Result)> storing(void (KRDBAdditionalFetchForImagesService::*store)(Result));
  void storePathes(KRDictionary connections);
  void storeAttributes(KRDBEntitySet entities);
  void storeExivAttributes(KRDBEntitySet entities);
  void storeCurrentStates(KRDBCatalog::ImageStatesByID states);
  // Queues a callback for the maps' arrival and asks for them.
  void enqueueUntilMapsArrive(Handler callback);
  // The folder paths already taken from the context while attaching a batch, by path id.
  using PathsByID = std::unordered_map<int64_t, std::shared_ptr<KRDBPath>>;
  void attach(const std::shared_ptr<KRDBImage>& image, PathsByID& paths);
  void attachPath(const std::shared_ptr<KRDBImage>& image, int64_t imageID, PathsByID& paths);

  // fetchingMaps: the four map fetches are running; fastFetchingCompletions: the images waiting for them,
  // made on first use.
  bool fetchingMaps_ = false;
  std::weak_ptr<KRDBContext> context_;
  std::optional<PathIDs> imagesPathesMap_;
  std::optional<AttributesByImage> imagesImageAttributesMap_;
  std::optional<ExivAttributesByImage> imagesImageExivAttributesMap_;
  std::optional<StatesByImage> imagesCurrentStatesMap_;
  std::unique_ptr<std::vector<Handler>> fastFetchingCompletions_;
};
