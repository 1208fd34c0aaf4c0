#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRClasses/KRBlockDispatcher.hpp"
#include "KRFoundation/KRError.hpp"
#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBEntity/KRDBEntityID.hpp"

namespace dbcore {
class DBEntity;
class DBReactor;
}  // namespace dbcore
class KRDBEntity;
class KRDBAbstractBaseFolder;
class KRDBEntityFavoriteAlias;
class KRDBImage;
class KRDBFilteredEntitiesFetchRequest;
class KRDBImageState;
class KRDBPath;
class KRDBVolume;
class KRDBImageAttributes;
class KRDBImageExivAttributes;
class KRDBCollection;
class KRDBCollectionAttributes;
class KRDBReferencedFolder;
class KRDBRefFolderAttributes;
class KRDBSmartFilter;
class KRDBSmartFilterAttributes;

using KRDBEntityArray = std::vector<std::shared_ptr<KRDBEntity>>;

// The gateway to one catalog file: opens it through the engine, keeps the product version stored in it,
// and runs every engine operation on one serial queue (the dispatcher) inside an exception guard that
// turns engine exceptions into platform exceptions.
//
// Operations come in pairs: one that takes a handler and a sync flag, and its worker whose name ends in
// Sync. With sync true the caller waits and the handler runs on the queue before the caller resumes; with
// sync false the operation is queued and its handler runs later on the main thread. Once new operations
// are disallowed (closing), such calls return at once and never call their handler. Queued blocks hold
// the catalog weakly. Thread-safe: any thread may queue operations.
class KRDBCatalog : public KRAbstractModel {
 public:
  using Reactor = std::shared_ptr<dbcore::DBReactor>;
  using ReactorBlock = std::function<void(const Reactor& reactor)>;
  using Handler = std::function<void()>;

  // The application identity given to the engine.
  static int32_t applicationInfo() { return 5; }
  static int32_t applicationID() { return applicationInfo(); }

  // Opens the file (nil path: the empty path). Nil for a file that cannot be opened; for a file of an
  // incompatible version, nil and *error (when given) set to kr_incompatibleAppVersion().
  static std::shared_ptr<KRDBCatalog> initWithContentsOfFile(const KRString& path, KRErrorPtr* error);
  ~KRDBCatalog() override;

  // A copy of the engine's pointer, so that an operation keeps the engine alive while it runs; empty
  // once the catalog closed.
  Reactor dbReactor() const;
  void setDbReactor(Reactor reactor);
  const std::shared_ptr<KRBlockDispatcher>& dispatcher() const { return dispatcher_; }
  bool needUpdate() const { return needUpdate_; }
  void setNeedUpdate(bool needUpdate) { needUpdate_ = needUpdate; }
  bool containsUserData() const { return containsUserData_; }
  void setContainsUserData(bool containsUserData) { containsUserData_ = containsUserData; }
  // newOperationsDisallowed: once set (when closing), asynchronous operations are dropped.
  bool isNewOperationsDisallowed() const { return newOperationsDisallowed_; }
  void setNewOperationsDisallowed(bool disallowed) { newOperationsDisallowed_ = disallowed; }
  int32_t dbProductVersion() const { return dbProductVersion_; }
  // Stores the version and writes it to the file through the guard; an unchanged value writes nothing.
  void setDbProductVersion(int32_t version);
  // The product version stored in the file, or -1 for a schema older than the one that stores it.
  int32_t getDBProductVersion() const;
  // Pending update operations by entity identifier, made on first use. Written from the caller's thread and
  // the queue: hold updateOperationsLock() while using it.
  KRDBEntityIDMapTable& updateOperations();
  std::mutex& updateOperationsLock() { return updateOperationsMutex_; }

  // Creates or migrates the schema (an engine exception reaches the caller), then computes
  // containsUserData. Called by the application after opening when needUpdate is true.
  void initializeAndUpdateIfNeaded();
  // Whether the catalog holds any image, top-level collection or referenced folder; false when the
  // engine fails.
  bool containsUserData(const Reactor& reactor);

  // Runs the block on the dispatcher: waiting for it (sync) or queued.
  void performSynchronously(bool sync, std::function<void()> block);
  // Calls the handler in place (sync) or later on the main thread; a nil handler is ignored.
  void finishHandler(const Handler& handler, bool sync);
  template <class Result>
  void finishHandler(const std::function<void(Result)>& handler, Result result, bool sync);
  // Calls the block with the engine. True when it returned normally; false when there is no engine
  // (logged) or when it threw an engine exception and `raiseException` is false; with `raiseException`
  // the converted exception is raised. The description tags the operation in the exception.
  bool handleDBReactorBlock(const ReactorBlock& block, const KRString& description, bool raiseException);

  // The asynchronous operation pattern: nothing once new operations are disallowed; otherwise queues
  // (or runs and waits, for sync) the worker on the dispatcher and hands its result to the handler.
  template <class Result>
  void performOperation(std::function<Result(KRDBCatalog& catalog)> workerSync,
                        std::function<void(Result)> handler, bool sync);
  // The synchronous convenience: the worker's result, or an empty one when operations are disallowed.
  template <class Result>
  Result performOperationAndWait(std::function<Result(KRDBCatalog& catalog)> workerSync);

  // The handler runs on the main thread after every operation queued before.
  void waitForAllDataBaseOperationsWithHandler(Handler handler);
  // Disallows new operations at once, then, after the queued ones, closes the engine and calls the
  // handler on the main thread.
  void closeAfterAllDataBaseOperationsWithHandler(Handler handler);
  // Closes the engine now (after the running operation), leaving new operations allowed.
  void forceCloseDB();
  // Copies the catalog file to `path` after the queued operations; the handler gets the outcome on the
  // main thread.
  void backupDBFileToPath(const KRString& path, std::function<void(bool)> handler);

  // ---- Creation (KRDBCatalogCreation.cpp). The Sync forms run on the queue.
  using EntityHandler = std::function<void(std::shared_ptr<KRDBEntity>)>;
  using EntitiesHandler = std::function<void(KRDBEntityArray)>;
  // A new record of the type built from the info, wrapped as its entity; nil for a type that cannot be
  // created this way.
  std::shared_ptr<KRDBEntity> createEntityWithTypeSync(int64_t entityType,
                                                       const KRDictionary& additionalInfo);
  KRDBEntityArray createEntitiesWithTypeSync(int64_t entityType,
                                             const std::vector<KRDictionary>& entitiesInfo);
  KRDBEntityArray createDBImagesWithEntitiesInfo(const std::vector<KRDictionary>& entitiesInfo);
  KRDBEntityArray createDBPathsWithEntitiesInfo(const std::vector<KRDictionary>& entitiesInfo);
  KRDBEntityArray createDBRefFoldersWithEntitiesInfo(const std::vector<KRDictionary>& entitiesInfo);
  void createEntityWithType(int64_t entityType, const KRDictionary& additionalInfo, EntityHandler handler,
                            bool sync);
  void createEntityWithType(int64_t entityType, EntityHandler handler, bool sync);
  void createEntitiesWithType(int64_t entityType, const std::vector<KRDictionary>& entitiesInfo,
                              EntitiesHandler handler, bool sync);

  // ---- Attribute records of images and folders (KRDBCatalogCreation.cpp). A folder without one gets one.
  std::shared_ptr<KRDBImageAttributes> fetchAttributesForImageSync(const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBImageExivAttributes> fetchExivAttributesForImageSync(
      const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBCollectionAttributes> fetchAttributesForFilterSync(
      const std::shared_ptr<KRDBCollection>& filter);
  std::shared_ptr<KRDBRefFolderAttributes> fetchAttributesForRefFolderSync(
      const std::shared_ptr<KRDBReferencedFolder>& folder);
  std::shared_ptr<KRDBSmartFilterAttributes> fetchAttributesForSmartFilterSync(
      const std::shared_ptr<KRDBSmartFilter>& filter);
  // Attaches the folder's attributes; answers the linked entities attached (empty or the attributes).
  KRDBEntityArray additionalFetchingForFilter(const std::shared_ptr<KRDBCollection>& filter);
  KRDBEntityArray additionalFetchingForSmartFilter(const std::shared_ptr<KRDBSmartFilter>& filter);

  // ---- Relations (KRDBCatalogRelations.cpp): trees, members, history states, folders, volumes, attributes
  // and favorite aliases. The Sync forms run on the queue; the forms with a handler follow the operation
  // pattern; the forms without one wait for the result (nil or empty once operations are disallowed). The
  // forms without a Sync form or handler queue their write and return at once (nothing once disallowed).
  template <class Result>
  using ResultHandler = std::function<void(Result)>;
  using FolderPtr = std::shared_ptr<KRDBAbstractBaseFolder>;
  // Current states by image id.
  using ImageStatesByID = std::map<int64_t, std::shared_ptr<KRDBImageState>>;

  // The children of a collection, referenced folder or smart filter (these last two linked to their parent);
  // empty for another entity or when the engine fails.
  KRDBEntitySet fetchChildsOfFilterSync(const std::shared_ptr<KRDBEntity>& filter);
  void fetchChildsOfFilter(const std::shared_ptr<KRDBEntity>& filter, ResultHandler<KRDBEntitySet> handler,
                           bool sync);
  KRDBEntitySet fetchChildsOfFilter(const std::shared_ptr<KRDBEntity>& filter);
  // Every level below a collection or referenced folder; a smart filter's children.
  KRDBEntitySet fetchDescendantsOfFilterSync(const std::shared_ptr<KRDBEntity>& filter);
  void fetchDescendantsOfFilter(const std::shared_ptr<KRDBEntity>& filter,
                                ResultHandler<KRDBEntitySet> handler, bool sync);
  // The parent of a collection or referenced folder; nil for the root and other entities.
  FolderPtr fetchParentOfFilterSync(const std::shared_ptr<KRDBEntity>& filter);
  void fetchParentOfFilter(const std::shared_ptr<KRDBEntity>& filter, ResultHandler<FolderPtr> handler,
                           bool sync);
  FolderPtr fetchParentOfFilter(const std::shared_ptr<KRDBEntity>& filter);
  // Moves the given folders that are not children yet under a collection or referenced folder, in one commit;
  // answers the folders moved.
  KRDBEntitySet addChildsSync(const KRDBEntitySet& childs, const std::shared_ptr<KRDBEntity>& filter);
  void addChilds(const KRDBEntitySet& childs, const std::shared_ptr<KRDBEntity>& filter,
                 ResultHandler<KRDBEntitySet> handler, bool sync);

  // The images of a collection, referenced folder (at or under its path) or smart filter (its conditions),
  // not marked to delete, by id.
  KRDBEntityArray fetchImagesOfFilterSync(const std::shared_ptr<KRDBEntity>& filter);
  void fetchImagesOfFilter(const std::shared_ptr<KRDBEntity>& filter, ResultHandler<KRDBEntityArray> handler,
                           bool sync);
  KRDBEntityArray fetchImagesOfFilter(const std::shared_ptr<KRDBEntity>& filter);
  // The members of a collection or referenced folder among the images (of a collection, those marked to
  // delete included).
  KRDBEntitySet membersAmongImagesSync(const KRDBEntitySet& images,
                                       const std::shared_ptr<KRDBEntity>& filter);
  // Adds the images not yet members to a collection or referenced folder, in one commit; answers the images
  // added.
  KRDBEntitySet addImagesSync(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter);
  void addImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter,
                 ResultHandler<KRDBEntitySet> handler, bool sync);
  // Removes the images that are members from a collection, in one commit; answers the images removed.
  KRDBEntitySet deleteImagesSync(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter);
  void deleteImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter,
                    ResultHandler<KRDBEntitySet> handler, bool sync);
  // The collections that hold the image.
  KRDBEntitySet fetchFiltersOfImageSync(const std::shared_ptr<KRDBImage>& image);
  void fetchFiltersOfImage(const std::shared_ptr<KRDBImage>& image, ResultHandler<KRDBEntitySet> handler,
                           bool sync);
  KRDBEntitySet fetchFiltersOfImage(const std::shared_ptr<KRDBImage>& image);

  // ---- History states
  KRDBImageStates fetchStatesOfImageSync(const std::shared_ptr<KRDBImage>& image);
  void fetchStatesOfImage(const std::shared_ptr<KRDBImage>& image, ResultHandler<KRDBImageStates> handler,
                          bool sync);
  KRDBImageStates fetchStatesOfImage(const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBImageState> fetchStateForImageSync(const std::shared_ptr<KRDBImage>& image);
  void fetchCurrentStateForImage(const std::shared_ptr<KRDBImage>& image,
                                 ResultHandler<std::shared_ptr<KRDBImageState>> handler, bool sync);
  std::shared_ptr<KRDBImageState> fetchCurrentStateForImage(const std::shared_ptr<KRDBImage>& image);
  // The current states of the images, or of every image for none.
  void fetchCurrentStatesForImages(const KRDBEntityArray& images, ResultHandler<ImageStatesByID> handler,
                                   bool sync);
  // Each image gets its states in order and the position of its current one among them (-1 when it is not
  // one of them), all in one write.
  void setStates(const KRDBImageStates& states, const std::shared_ptr<KRDBImageState>& currentState,
                 const std::shared_ptr<KRDBImage>& image);
  void setStatesArray(const std::vector<KRDBImageStates>& statesArray,
                      const KRDBImageStates& currentStatesArray, const KRDBEntityArray& imagesArray);
  void setCurrentState(const std::shared_ptr<KRDBImageState>& state, const std::shared_ptr<KRDBImage>& image);

  // ---- Favorite aliases. An entity without one gets one, and *created (when given) is set to true.
  std::shared_ptr<KRDBEntityFavoriteAlias> fetchFavoriteAliasForEntitySync(
      const std::shared_ptr<KRDBEntity>& entity, bool* created);
  void fetchFavoritealiasForEntity(const std::shared_ptr<KRDBEntity>& entity, bool* created,
                                   ResultHandler<std::shared_ptr<KRDBEntityFavoriteAlias>> handler,
                                   bool sync);
  std::shared_ptr<KRDBEntityFavoriteAlias> fetchFavoriteAliasForEntity(
      const std::shared_ptr<KRDBEntity>& entity, bool* created);

  // ---- Folders and volumes
  std::shared_ptr<KRDBVolume> fetchVolumeForPathSync(const std::shared_ptr<KRDBPath>& path);
  void fetchVolumeForPath(const std::shared_ptr<KRDBPath>& path,
                          ResultHandler<std::shared_ptr<KRDBVolume>> handler, bool sync);
  std::shared_ptr<KRDBVolume> fetchVolumeForPath(const std::shared_ptr<KRDBPath>& path);
  void setVolume(const std::shared_ptr<KRDBVolume>& volume, const std::shared_ptr<KRDBPath>& path);
  // Renames the folder path (and the paths below it) from one volume to another; the completion gets the
  // outcome on the main thread (false when the engine failed).
  void renamePath(const KRString& path, const std::shared_ptr<KRDBVolume>& volume, const KRString& newPath,
                  const std::shared_ptr<KRDBVolume>& newVolume, std::function<void(bool)> completion);
  // Puts the images, in order, into the folder in one write; the rebinding replaces their folder.
  void bindFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images);
  void rebindFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images);
  std::shared_ptr<KRDBPath> fetchDBPathForImageSync(const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBPath> fetchPathForReferencedFolderSync(
      const std::shared_ptr<KRDBReferencedFolder>& folder);
  void fetchPathForReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>& folder,
                                    ResultHandler<std::shared_ptr<KRDBPath>> handler, bool sync);
  std::shared_ptr<KRDBPath> fetchPathForReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>& folder);

  // ---- An image's attribute records and the other way round (the Sync fetches of the attributes are above)
  void fetchAttributesForImage(const std::shared_ptr<KRDBImage>& image,
                               ResultHandler<std::shared_ptr<KRDBImageAttributes>> handler, bool sync);
  std::shared_ptr<KRDBImageAttributes> fetchAttributesForImage(const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBImage> fetchImageForAttributesSync(
      const std::shared_ptr<KRDBImageAttributes>& attributes);
  void fetchImageForAttributes(const std::shared_ptr<KRDBImageAttributes>& attributes,
                               ResultHandler<std::shared_ptr<KRDBImage>> handler, bool sync);
  std::shared_ptr<KRDBImage> fetchImageForAttributes(const std::shared_ptr<KRDBImageAttributes>& attributes);
  void fetchExivAttributesForImage(const std::shared_ptr<KRDBImage>& image,
                                   ResultHandler<std::shared_ptr<KRDBImageExivAttributes>> handler,
                                   bool sync);
  std::shared_ptr<KRDBImageExivAttributes> fetchExivAttributesForImage(
      const std::shared_ptr<KRDBImage>& image);
  std::shared_ptr<KRDBImage> fetchImageForExivAttributesSync(
      const std::shared_ptr<KRDBImageExivAttributes>& attributes);
  void fetchImageForExivAttributes(const std::shared_ptr<KRDBImageExivAttributes>& attributes,
                                   ResultHandler<std::shared_ptr<KRDBImage>> handler, bool sync);
  std::shared_ptr<KRDBImage> fetchImageForExivAttributes(
      const std::shared_ptr<KRDBImageExivAttributes>& attributes);

  // ---- Fetch-request execution and additional fetching (KRDBCatalogExecution.cpp). The entities built
  // here are not cached yet: the context replaces them by its own instances.
  using FetchRequestPtr = std::shared_ptr<KRDBFilteredEntitiesFetchRequest>;
  void obtainFetchedEntitiesUsingFetchRequest(const FetchRequestPtr& request,
                                              ResultHandler<KRDBEntitySet> handler, bool sync);
  // The entities that the request selects; an empty set (and a logged error) for a type that cannot be
  // fetched by request, an empty set for a request without a query of the type's class.
  KRDBEntitySet fetchEntitiesUsingFetchRequestSync(const FetchRequestPtr& request);
  // The records behind fetchEntitiesUsingFetchRequestSync, before they become entities.
  using Records = std::vector<std::shared_ptr<dbcore::DBEntity>>;
  Records fetchRecordsUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchImagesUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchReffoldersUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchPathsUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchImageAttributesUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchImageExivAttributesUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchFavoriteAliasUsingFetchRequestSync(const FetchRequestPtr& request);
  KRDBEntitySet fetchVolumesUsingFetchRequestSync(const FetchRequestPtr& request);
  // Image id -> folder path id (the smallest, for an image in several), delivered on the main thread.
  void fetchConnectionsForImagesWithDBPathesWithHandler(ResultHandler<KRDictionary> handler);
  void additionalFetchingForEntities(const KRDBEntitySet& entities, ResultHandler<KRDBEntitySet> handler,
                                     bool sync);
  // Attaches the linked records each entity needs; answers the linked entities fetched now.
  KRDBEntitySet additionalFetchingSyncForEntities(const KRDBEntitySet& entities);
  KRDBEntityArray additionalFetchingForImage(const std::shared_ptr<KRDBImage>& image);
  KRDBEntityArray additionalFetchingForReffolderSync(const std::shared_ptr<KRDBReferencedFolder>& folder);
  KRDBEntityArray additionalFetchingForDBPath(const std::shared_ptr<KRDBPath>& path);
  KRDBEntityArray additionalFetchingForFavoriteAlias(const std::shared_ptr<KRDBEntityFavoriteAlias>& alias);

  // ---- Fetch, update, deletion, dangling records (KRDBCatalogStorage.cpp)
  using StringsHandler = std::function<void(std::vector<KRString>)>;
  std::shared_ptr<KRDBEntity> fetchEntityWithIDSync(const KRDBEntityIDPtr& entityID);
  // Never raises: an engine failure hands nil to the handler.
  void fetchEntityWithID(const KRDBEntityIDPtr& entityID, EntityHandler handler, bool sync);
  std::shared_ptr<KRDBEntity> fetchEntityWithID(const KRDBEntityIDPtr& entityID);
  void updateEntitySync(const std::shared_ptr<KRDBEntity>& entity);
  // Writes a snapshot of the entity later; a newer call for the same entity before the queue reaches the
  // older one replaces it.
  void updateEntity(const std::shared_ptr<KRDBEntity>& entity);
  void updateEntitiesSync(const KRDBEntityArray& entities);
  // Queues snapshots of the changed entities and marks them unchanged.
  void updateEntities(const KRDBEntityArray& entities);
  void deleteEntitySync(const std::shared_ptr<KRDBEntity>& entity);
  void deleteEntity(const std::shared_ptr<KRDBEntity>& entity);
  void deleteImagesSync(const KRDBEntityArray& images);
  void deleteImages(const KRDBEntityArray& images);
  std::vector<KRString> fetchUUIDsOfDanglingStatesSync();
  void fetchUUIDsOfDanglingStatesWithHandler(StringsHandler handler, bool sync);
  void deleteDanglingPathesSync();
  void deleteDanglingDBPathesWithHandler(Handler handler, bool sync);
  void deleteDanglingHistoryStatesSync();
  void deleteDanglingHistoryStatesWithHandler(Handler handler, bool sync);
  std::vector<KRString> fetchNamesOfDanglingHistoryResourcesSync();
  void fetchNamesOfDanglingHistoryResourcesWithHandler(StringsHandler handler, bool sync);
  void deleteDanglingHistoryResourcesSync();
  void deleteDanglingHistoryResourcesWithHandler(Handler handler, bool sync);

 protected:
  KRDBCatalog() = default;

 private:
  bool openFile(const KRString& path, KRErrorPtr* error);
  void makeDispatcher();
  // Runs engine work that needs no guard on the queue once there is one.
  void runOnQueue(const std::function<void()>& work) const;
  void closeEngine();
  std::weak_ptr<KRDBCatalog> weakSelf();

  mutable std::mutex reactorMutex_;
  Reactor dbReactor_;
  std::shared_ptr<KRBlockDispatcher> dispatcher_;
  std::atomic<bool> needUpdate_ = false;
  std::atomic<bool> containsUserData_ = false;
  std::atomic<bool> newOperationsDisallowed_ = false;
  std::atomic<int32_t> dbProductVersion_ = -1;
  std::once_flag updateOperationsOnce_;
  std::mutex updateOperationsMutex_;
  std::shared_ptr<KRDBEntityIDMapTable> updateOperations_;
};

template <class Result>
void KRDBCatalog::finishHandler(const std::function<void(Result)>& handler, Result result, bool sync) {
  if (!handler) return;
  if (sync) return handler(std::move(result));
  asyncPerformMainThreadBlock(
      [handler, result = std::move(result)]() mutable { handler(std::move(result)); });
}

template <class Result>
void KRDBCatalog::performOperation(std::function<Result(KRDBCatalog& catalog)> workerSync,
                                   std::function<void(Result)> handler, bool sync) {
  if (isNewOperationsDisallowed()) return;
  performSynchronously(
      sync, [weak = weakSelf(), workerSync = std::move(workerSync), handler = std::move(handler), sync] {
        const auto catalog = weak.lock();
        if (catalog) catalog->finishHandler(handler, workerSync(*catalog), sync);
      });
}

template <class Result>
Result KRDBCatalog::performOperationAndWait(std::function<Result(KRDBCatalog& catalog)> workerSync) {
  Result stored{};
  performOperation<Result>(
      std::move(workerSync), [&stored](Result result) { stored = std::move(result); }, true);
  return stored;
}
