#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRClasses/KRBlockDispatcher.hpp"
#include "KRFoundation/KRString.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBEntity/KRDBDataStorageCreating.hpp"
#include "Model/KRDBEntity/KRDBEntityContext.hpp"
#include "Model/KRDBEntity/KRDBEntityObserver.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"

class KRDBAdditionalFetchForImagesService;
class KRDBCollection;
class KRDBEntitiesFilter;
class KRDBEntitiesStorage;
class KRDBReferencedFolder;

// The object graph over one open catalog: at most one live entity object per identifier. Every entity
// that reaches the application (fetched by identifier, by request or as a linked record) passes through
// the cache first, and is handed out only once the records it cannot be used without are attached. The
// context observes its entities and gathers their changes into one pass per turn of the main run loop (the
// catalog's writes, one change set for its observers, one undo step); it creates and deletes entities and
// changes their relations, memory first and then the catalog.
//
// The context lives on the main thread: catalog results arrive there, and the cache, the preparation of
// entities and the callbacks run there; the cache is not locked. entityWithID and preparedEntity turn the
// calling thread's run loop until the linked records arrived, so they are called on the main thread. Only
// the queue of callbacks waiting for a change-processing pass is locked, as any thread may add to it.
class KRDBContext : public KRAbstractModel,
                    public KRDBEntityContext,
                    public KRDBClosingEntityContext,
                    public KRDBEntityObserver {
 public:
  using Handler = std::function<void()>;
  using EntitiesHandler = std::function<void(KRDBEntitySet)>;
  using FetchRequestPtr = std::shared_ptr<KRDBFilteredEntitiesFetchRequest>;

  // Builds the context over the catalog: the cache and the change sets, then the root collection and the
  // root referenced folder (fetched at once), the all-images filter and the additional-fetch service.
  static std::shared_ptr<KRDBContext> initWithCatalog(std::shared_ptr<KRDBCatalog> catalog);
  ~KRDBContext() override;

  // ---- State. waitingForProcessChanges: a change-processing pass is scheduled and has not finished;
  // waitingForClose: set for good by closeAfterAllDataBaseOperationsWithHandler;
  // waitingForResetValidationRecords: a reset of the validation records is scheduled.
  bool isWaitingForProcessChanges() const { return waitingForProcessChanges_; }
  void setWaitingForProcessChanges(bool waiting) { waitingForProcessChanges_ = waiting; }
  bool isWaitingForClose() const override { return waitingForClose_; }
  bool isWaitingForResetValidationRecords() const { return waitingForResetValidationRecords_; }
  void setWaitingForResetValidationRecords(bool waiting) { waitingForResetValidationRecords_ = waiting; }
  bool contextUndoGrouping() const { return contextUndoGrouping_; }
  const std::shared_ptr<KRUndoManager>& undoManager() const { return undoManager_; }
  const std::shared_ptr<KRBlockDispatcher>& blockDispatcher() const { return blockDispatcher_; }
  const std::shared_ptr<KRDBCollection>& rootFilter() const { return rootFilter_; }
  const std::shared_ptr<KRDBCatalog>& catalog() const { return catalog_; }
  const std::shared_ptr<KRDBReferencedFolder>& rootReferencedFolder() const { return rootReferencedFolder_; }
  const std::shared_ptr<KRDBEntitiesFilter>& allImagesFilter() const { return allImagesFilter_; }
  const std::shared_ptr<KRDBEntitiesStorage>& fetchedEntities() const { return fetchedEntities_; }
  KRDBEntitySet& addedEntities() { return addedEntities_; }
  KRDBEntitySet& deletedEntities() { return deletedEntities_; }
  KRDBEntitySet& updatedEntities() { return updatedEntities_; }
  const std::shared_ptr<KRDBEntityIDMapTable>& entitiesChanges() const { return entitiesChanges_; }
  KRDBEntitySet& entitiesWithValidationRecord() { return entitiesWithValidationRecord_; }
  const std::shared_ptr<KRDBAdditionalFetchForImagesService>& additionalFetchForImagesService() const {
    return additionalFetchForImagesService_;
  }
  // A new empty map keyed by entity identifiers of any type, from the storage factory.
  static std::shared_ptr<KRDBEntityIDMapTable> emptyEntitiesChangesMapTable();

  // ---- Entity cache
  // The cached object of the identifier, or nil; never asks the catalog.
  std::shared_ptr<KRDBEntity> cachedEntityForEntityID(const KRDBEntityIDPtr& entityID) const;
  // The one object of the identifier with its linked records attached, fetched when not cached; nil when
  // the catalog has no such record.
  std::shared_ptr<KRDBEntity> entityWithID(const KRDBEntityIDPtr& entityID);
  // Caches a freshly fetched entity (an entity already cached for its identifier wins and this one is
  // dropped) and starts fetching its linked records; it is prepared once they are attached.
  void cacheEntityAndFetchLinkedEntities(const std::shared_ptr<KRDBEntity>& entity);
  // Attaches the entity to the context and its linked slots to the cached instances.
  void prepareFetchedEntity(const std::shared_ptr<KRDBEntity>& entity);
  // The cached instance for the entity's identifier (the entity itself when none), fully prepared.
  std::shared_ptr<KRDBEntity> preparedEntity(const std::shared_ptr<KRDBEntity>& entity);
  // The cached instances of the entities, handed over once all are prepared (at once for none).
  void preparedEntities(KRDBEntitySet entities, EntitiesHandler handler);
  // The linked-record fetch driver: the fast path for images, then the catalog for what is still missing.
  void additionalFetchingForEntity(const std::shared_ptr<KRDBEntity>& entity);
  void makeFastAdditionalFetchesForEntity(const std::shared_ptr<KRDBEntity>& entity, Handler completion);
  // The request's entities as cached, prepared instances, on the main thread.
  void obtainEntitiesUsingFetchRequest(const FetchRequestPtr& request, EntitiesHandler handler);

  // ---- Dispatcher, waiting, closing, backup
  void performBlock(std::function<void()> block);
  void performBlockAndWait(const std::function<void()>& block);
  void enqueueWaitingBlock(Handler block);
  Handler dequeueWaitingChangesBlock();
  // Calls the handler now when no change-processing pass is pending, else at the end of that pass.
  void waitForProcessChangesWithHandler(Handler handler);
  void waitForAllDataBaseOperationsWithHandler(Handler handler);
  void closeAfterAllDataBaseOperationsWithHandler(Handler handler);
  // The handler is required.
  void backupDBToPath(const KRString& path, std::function<void(bool)> handler);
  // The path with one "/" appended when it does not end in one; nil stays nil.
  static KRString normilizedPath(const KRString& path);

  // ---- Changes (KRDBContextChanges.cpp). Entities report to the context, one of their observers; the
  // changes of one run-loop turn make one pass: the catalog writes the updated records, the observers
  // (KRDBContextObserver) get one change set, and the undo manager one undo step.
  void entityWillChange(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& info) override;
  // Ignored for a deleted entity; otherwise the entity is updated and its change keys merged (later
  // values win).
  void entityDidChange(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& info) override;
  // The entity's validation record is dropped at the end of the turn.
  void validationRecordDidSet(const std::shared_ptr<KRDBEntity>& entity) override;
  // Schedules one pass on the next turn of the main run loop unless one is scheduled.
  void shouldProcessChanges();
  // The pass: added, deleted and updated entities as one change set; again at once for changes the
  // observers made meanwhile.
  void processChanges();
  void shouldResetValidationRecords();
  // Setting the same manager again does nothing; another one first closes the group of the old.
  void setUndoManager(std::shared_ptr<KRUndoManager> undoManager);
  // Opening begins an undo group; closing ends it only when there is something to undo.
  void setContextUndoGrouping(bool grouping);
  // Gives the live entity of the snapshot the snapshot's record back.
  void processUndo(const std::shared_ptr<KRDBEntity>& snapshot);
  // Marks each entity to delete; nothing else.
  void markToRemoveEntities(const KRDBEntitySet& entities);
  // Moves entities into the deleted state: out of the added and updated ones, their change records, the
  // cache and the context's reach. The callers schedule the pass.
  void prepareDeleteEntity(const std::shared_ptr<KRDBEntity>& entity);
  void prepareDeletedEntities(const KRDBEntitySet& entities);

  // ---- Creation and deletion (KRDBContextGraph.cpp)
  using EntityHandler = std::function<void(std::shared_ptr<KRDBEntity>)>;
  using ArrayHandler = std::function<void(const KRDBEntityArray&)>;
  // The last entity the catalog created, at once (the catalog's queue is waited for).
  std::shared_ptr<KRDBEntity> createEntityWithType(int64_t entityType);
  std::shared_ptr<KRDBEntity> createEntityWithType(int64_t entityType, const KRDictionary& additionalInfo);
  // The same, delivered on the main thread.
  void createEntityWithType(int64_t entityType, EntityHandler handler);
  void createEntityWithType(int64_t entityType, const KRDictionary& additionalInfo, EntityHandler handler);
  void createEntitiesWithType(int64_t entityType, const std::vector<KRDictionary>& entitiesInfo,
                              ArrayHandler handler);
  // One entity per info, or one without info when there is no array; each created entity is processed
  // with its own info (or the first, when the counts differ) and its deletion registered for undo.
  void createEntitiesWithType(int64_t entityType,
                              const std::optional<std::vector<KRDictionary>>& entitiesInfo,
                              ArrayHandler handler, bool sync);
  // Takes a created entity into the graph: prepared, added, placed under its parent; schedules a pass.
  void processCreateEntity(const std::shared_ptr<KRDBEntity>& entity, const KRDictionary& additionalInfo);
  // The info's parent for a referenced folder; the import index and date for an image.
  void applyInfo(const KRDictionary& info, const std::shared_ptr<KRDBEntity>& entity);
  // A referenced folder takes its unused images and its subfolders with it; then deleteEntityPrimitive.
  void deleteEntity(const std::shared_ptr<KRDBEntity>& entity);
  void deleteEntities(const KRDBEntitySet& entities);
  void deleteEntitiesPrimitives(const KRDBEntitySet& entities);
  // The steps of the entity's type, then (unless it is marked to delete) the deleted state, the catalog's
  // deletion and a pass. Paths and volumes are never deleted here.
  void deleteEntityPrimitive(const std::shared_ptr<KRDBEntity>& entity);
  // The image's attribute records leave with it, and its collections drop it.
  void deleteImage(const std::shared_ptr<KRDBImage>& image);
  // deleteImage, the deleted state and a pass for each image, then one catalog deletion of them all.
  void deleteImages(const KRDBEntitySet& images);
  // Marks the collection, its favorite alias and all its descendants to delete; writes nothing.
  void deleteFilter(const std::shared_ptr<KRDBCollection>& collection);
  // Deletes the folder's favorite alias and takes it out of its parent's children.
  void deleteReffolder(const std::shared_ptr<KRDBReferencedFolder>& folder);
  // Every folder below the folder, not the folder itself.
  static KRDBEntitySet recursiveSubfolders(const std::shared_ptr<KRDBAbstractBaseFolder>& folder);

  // ---- Relations (KRDBContextRelations.cpp): the catalog's answers as cached, prepared instances
  std::shared_ptr<KRDBEntityFavoriteAlias> favoriteAliasForEntity(
      const std::shared_ptr<KRDBEntity>& entity) override;
  std::shared_ptr<KRDBAbstractBaseFolder> parentOfFilter(
      const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  KRDBEntitySet childsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  void obtainChildsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter, EntitiesHandler handler);
  void obtainDescendantsOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter,
                                 EntitiesHandler handler);
  KRDBEntitySet imagesOfFilter(const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  KRDBEntitySet filtersOfImage(const std::shared_ptr<KRDBImage>& image) override;
  std::shared_ptr<KRDBImageAttributes> attributesForImage(const std::shared_ptr<KRDBImage>& image) override;
  std::shared_ptr<KRDBImage> imageForAttributes(
      const std::shared_ptr<KRDBImageAttributes>& attributes) override;
  std::shared_ptr<KRDBImageExivAttributes> exivAttributesForImage(
      const std::shared_ptr<KRDBImage>& image) override;
  std::shared_ptr<KRDBImage> imageForExivAttributes(
      const std::shared_ptr<KRDBImageExivAttributes>& attributes) override;
  std::shared_ptr<KRDBPath> pathForReferencedFolder(
      const std::shared_ptr<KRDBReferencedFolder>& folder) override;
  KRDBImageStates statesForImage(const std::shared_ptr<KRDBImage>& image) override;
  std::shared_ptr<KRDBImageState> currentStateForImage(const std::shared_ptr<KRDBImage>& image) override;
  // No images means every image; the handler gets the current states by image id, as prepared instances.
  void obtainCurrentStatesForImages(const KRDBEntityArray& images,
                                    std::function<void(KRDBCatalog::ImageStatesByID)> handler);
  std::shared_ptr<KRDBVolume> volumeForPath(const std::shared_ptr<KRDBPath>& path) override;

  // ---- Relation changes (KRDBContextMembership.cpp). Memory first, then the catalog, whose answer is
  // compared with memory (a mismatch is logged); each registers its inverse for undo, except adding images
  // to a referenced folder.
  void addChilds(const KRDBEntitySet& childs, const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  void addImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  void addImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBReferencedFolder>& folder) override;
  void deleteImages(const KRDBEntitySet& images,
                    const std::shared_ptr<KRDBAbstractBaseFolder>& filter) override;
  void setStates(const KRDBImageStates& states, const std::shared_ptr<KRDBImageState>& currentState,
                 const std::shared_ptr<KRDBImage>& image) override;
  void setCurrentState(const std::shared_ptr<KRDBImageState>& state,
                       const std::shared_ptr<KRDBImage>& image) override;
  // Parallel arrays: each image gets its states and current state, in one catalog write.
  void setStatesArray(const std::vector<KRDBImageStates>& statesArray,
                      const KRDBImageStates& currentStatesArray, const KRDBEntityArray& imagesArray);
  // The catalog's write, then the path's tracked setter.
  void setVolume(const std::shared_ptr<KRDBVolume>& volume, const std::shared_ptr<KRDBPath>& path);
  // Moves the images that are not in the folder yet into it: rebinding those that had a folder, binding the
  // others.
  void setFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images);
  // Renames the folder in the catalog; on success the cached paths at and under it follow in memory.
  void setNewPath(const KRString& newPath, const std::shared_ptr<KRDBVolume>& newVolume,
                  const std::shared_ptr<KRDBPath>& path, std::function<void(bool)> completion);

 private:
  explicit KRDBContext(std::shared_ptr<KRDBCatalog> catalog);
  void buildRootsAndServices();
  std::shared_ptr<KRDBContext> selfPtr() { return std::static_pointer_cast<KRDBContext>(shared_from_this()); }
  std::weak_ptr<KRDBContext> weakSelf() { return selfPtr(); }
  // Turns the current run loop until the entity's linked records are attached.
  static void waitForNecessaryEntities(const std::shared_ptr<KRDBEntity>& entity);
  // Uncached images that preparedEntities takes together wait for the additional-fetch service's maps as
  // one batch rather than with callbacks of their own; those the maps cannot complete go on to the catalog.
  struct PreparationProgress;
  bool joinsImageBatch(const KRDBEntity& entity) const;
  void cacheForImageBatch(const std::shared_ptr<KRDBEntity>& image,
                          std::vector<std::shared_ptr<KRDBImage>>& batch);
  void fetchLinkedEntitiesOfImageBatch(std::shared_ptr<const std::vector<std::shared_ptr<KRDBImage>>> images,
                                       const std::shared_ptr<PreparationProgress>& progress);
  // Prepares an attached image and answers true, or hands it to the catalog for what the maps lacked.
  bool finishFastFetch(const std::shared_ptr<KRDBImage>& image,
                       const std::shared_ptr<PreparationProgress>& progress);
  // The catalog's additional fetching for one entity; its count follows the linked entities' preparation.
  void fetchLinkedEntitiesFromCatalog(const std::shared_ptr<KRDBEntity>& entity);
  // cacheEntityAndFetchLinkedEntities for an entity known not to be cached.
  void cacheUncachedEntity(const std::shared_ptr<KRDBEntity>& entity);
  // The cached instance of an entity, caching (and starting the preparation of) the entity on a miss.
  std::shared_ptr<KRDBEntity> cachedOrCachingInstance(const std::shared_ptr<KRDBEntity>& entity);
  // Takes the linked records the catalog fetched for the entity: each is cached and the entity's count
  // goes down as each is prepared.
  void takeLinkedEntities(const std::shared_ptr<KRDBEntity>& entity, const KRDBEntitySet& linked);
  // A catalog answer of one entity as its prepared instance.
  template <class T>
  std::shared_ptr<T> prepared(const std::shared_ptr<T>& entity);
  KRDBEntitySet preparedSet(const KRDBEntitySet& entities);
  void mergeChangeRecord(const KRDBEntityIDPtr& entityID, const KRDictionary& info);
  // The block of a scheduled pass: the pass, the waiting callbacks, then the flag and the undo group.
  void runScheduledPass();
  void resetValidationRecords();
  void detachDeletedEntity(const std::shared_ptr<KRDBEntity>& entity);
  static std::optional<std::vector<KRDictionary>> infosOf(const KRDictionary& info);
  // The catalog's creation: one entity per info, or one without info when there is no array.
  void createInCatalog(int64_t entityType, const std::optional<std::vector<KRDictionary>>& infos,
                       ArrayHandler handler, bool sync);
  void takeCreatedEntities(int64_t entityType, const KRDBEntityArray& entities,
                           const std::optional<std::vector<KRDictionary>>& infos);
  void attachCreatedReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>& folder,
                                     const KRDictionary& info);
  void deleteReferencedFolderContents(const std::shared_ptr<KRDBReferencedFolder>& folder);
  void renameCachedPaths(const KRString& oldPath, const std::shared_ptr<KRDBVolume>& oldVolume,
                         const KRString& newPath, const std::shared_ptr<KRDBVolume>& newVolume);
  // Registers the action, called with this context, as the undo step of what follows; nothing without an
  // undo manager.
  template <class Action>
  void registerUndo(Action action) {
    if (undoManager_) undoManager_->prepareWithInvocationTarget<KRDBContext>(selfPtr(), std::move(action));
  }

  bool waitingForProcessChanges_ = false;
  bool waitingForClose_ = false;
  bool waitingForResetValidationRecords_ = false;
  bool contextUndoGrouping_ = false;
  std::shared_ptr<KRUndoManager> undoManager_;
  std::shared_ptr<KRBlockDispatcher> blockDispatcher_;
  std::shared_ptr<KRDBCollection> rootFilter_;
  std::shared_ptr<KRDBCatalog> catalog_;
  std::shared_ptr<KRDBReferencedFolder> rootReferencedFolder_;
  std::shared_ptr<KRDBEntitiesFilter> allImagesFilter_;
  std::shared_ptr<KRDBEntitiesStorage> fetchedEntities_;
  KRDBEntitySet addedEntities_;
  KRDBEntitySet deletedEntities_;
  KRDBEntitySet updatedEntities_;
  std::shared_ptr<KRDBEntityIDMapTable> entitiesChanges_;
  KRDBEntitySet entitiesWithValidationRecord_;
  // waitForProcessChangesHandlers: the callbacks waiting for the end of the pending pass, under their lock.
  std::mutex waitForProcessChangesHandlersMutex_;
  std::vector<Handler> waitForProcessChangesHandlers_;
  std::shared_ptr<KRDBAdditionalFetchForImagesService> additionalFetchForImagesService_;
};

using KRDBContextPtr = std::shared_ptr<KRDBContext>;
