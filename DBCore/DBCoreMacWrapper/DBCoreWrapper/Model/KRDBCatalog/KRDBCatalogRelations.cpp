// The catalog's relations between records: folder trees and their members, history states, folders and
// volumes, attribute records and favorite aliases. The Sync forms run on the catalog's queue; the others
// queue them.

#include <algorithm>
#include <set>
#include <string>
#include <type_traits>
#include <utility>

#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbexception.hpp"
#include "dbreactor.hpp"

using dbcore::DBExivImgAttrib;
using dbcore::DBFilter;
using dbcore::DBImage;
using dbcore::DBImgHistoryState;
using dbcore::DBPath;
using dbcore::DBRefFolder;
using dbcore::DBSmartFilter;
using dbcore::DBUserImgAttrib;
using Reactor = KRDBCatalog::Reactor;
using EntityPtr = std::shared_ptr<KRDBEntity>;
using FolderPtr = KRDBCatalog::FolderPtr;

namespace {

const char* const kMoveFilterOperation = "MoveFilter";
const char* const kMoveRefFolderOperation = "MoveRefFolder";
const char* const kFilterAddImageOperation = "FilterAddImage";
const char* const kFilterDelImageOperation = "FilterDelImage";
const char* const kRefFolderAddImageOperation = "RefFolderAddImage";
const char* const kSetStatesOperation = "SetStatesByVector";
const char* const kSetCurrentStateOperation = "SetCurrentState";
const char* const kCreateFavoriteAliasOperation = "CreateFavoriteAlias";
const char* const kBindVolumeOperation = "BindDBPathDBVolume";
const char* const kRenamePathOperation = "RenamePath";
const char* const kBindImagesOperation = "BindDBAttributesDBImageArray";
const char* const kRebindImagesOperation = "ReBindDBAttributesDBImageArray";

int64_t entityTypeOf(const EntityPtr& entity) { return entity ? entity->entityClass().entityType : 0; }

// The entity's record as the engine type, or nil for another record or no entity.
template <class Record>
std::shared_ptr<Record> recordOf(const EntityPtr& entity) {
  return entity ? std::dynamic_pointer_cast<Record>(entity->dbentity()) : nullptr;
}

std::pair<int64_t, int64_t> identityOf(const EntityPtr& entity) {
  return {entity->entityID()->entityType(), entity->entityID()->dbid()};
}

// The given entities whose identifiers are not among those of `present`.
KRDBEntitySet missingFrom(const KRDBEntitySet& given, const KRDBEntitySet& present) {
  std::set<std::pair<int64_t, int64_t>> identities;
  for (const auto& entity : present) identities.insert(identityOf(entity));
  KRDBEntitySet missing;
  for (const auto& entity : given) {
    if (entity && !identities.contains(identityOf(entity))) missing.insert(entity);
  }
  return missing;
}

// Wraps each record as Entity into `found`, each linked to `parent` when there is one.
template <class Entity, class Record>
void wrapInto(const std::vector<std::shared_ptr<Record>>& records, const FolderPtr& parent,
              KRDBEntitySet& found) {
  for (const auto& record : records) {
    auto entity = Entity::initWithDBEntity(record);
    if (parent) entity->setParent(parent);
    found.insert(std::move(entity));
  }
}

// The children (linked to the folder, but for collections) or every level below a tree folder.
KRDBEntitySet treeEntities(const Reactor& reactor, const EntityPtr& filter, bool childrenOnly) {
  KRDBEntitySet found;
  if (!reactor) return found;
  const FolderPtr parent = childrenOnly ? std::dynamic_pointer_cast<KRDBAbstractBaseFolder>(filter) : nullptr;
  switch (entityTypeOf(filter)) {
    case KRDBEntityTypeCollection: {
      const auto record = recordOf<DBFilter>(filter);
      wrapInto<KRDBCollection>(childrenOnly ? reactor->Children(record) : reactor->Descendants(record),
                               nullptr, found);
      break;
    }
    case KRDBEntityTypeReferencedFolder: {
      const auto record = recordOf<DBRefFolder>(filter);
      wrapInto<KRDBReferencedFolder>(childrenOnly ? reactor->Children(record) : reactor->Descendants(record),
                                     parent, found);
      break;
    }
    case KRDBEntityTypeSmartFilter:
      // Smart filters have no deeper levels than their children.
      wrapInto<KRDBSmartFilter>(reactor->Children(recordOf<DBSmartFilter>(filter)), parent, found);
      break;
    default:
      break;
  }
  return found;
}

// Runs `write` for each item through the guard under `description`, all under one commit; nothing at all
// for no items. A failing write raises, keeping the writes before it.
template <class Item>
void writeEach(KRDBCatalog& catalog, const std::vector<Item>& items, const char* description,
               const std::function<void(const Reactor&, const Item&)>& write) {
  if (items.empty()) return;
  catalog.handleDBReactorBlock(
      [&](const Reactor& reactor) {
        reactor->Batch([&] {
          for (const Item& item : items) {
            catalog.handleDBReactorBlock([&](const Reactor& engine) { write(engine, item); }, description,
                                         true);
          }
        });
      },
      description, true);
}

// The records of the entities that hold a Record, in order.
template <class Record, class Entities>
std::vector<std::shared_ptr<Record>> recordsOf(const Entities& entities) {
  std::vector<std::shared_ptr<Record>> records;
  for (const auto& entity : entities) {
    if (auto record = recordOf<Record>(entity)) records.push_back(std::move(record));
  }
  return records;
}

// The operation pattern for work without a result; the handler, if any, runs after it.
void performWork(KRDBCatalog& catalog, std::function<void(KRDBCatalog&)> work, KRDBCatalog::Handler handler,
                 bool sync) {
  KRDBCatalog::ResultHandler<bool> finished;
  if (handler) finished = [handler = std::move(handler)](bool) { handler(); };
  catalog.performOperation<bool>(
      [work = std::move(work)](KRDBCatalog& queue) {
        work(queue);
        return true;
      },
      std::move(finished), sync);
}

// Queues work (sync false), which is dropped once new operations are disallowed.
void queueWork(KRDBCatalog& catalog, std::function<void(KRDBCatalog&)> work) {
  performWork(catalog, std::move(work), nullptr, false);
}

// The asynchronous form of a read: the operation pattern over the Sync worker with one argument.
template <class Result, class Argument>
void queueRead(KRDBCatalog& catalog, Result (KRDBCatalog::*workerSync)(const Argument&),
               const std::type_identity_t<Argument>& argument, KRDBCatalog::ResultHandler<Result> handler,
               bool sync) {
  catalog.performOperation<Result>(
      [workerSync, argument](KRDBCatalog& queue) { return (queue.*workerSync)(argument); },
      std::move(handler), sync);
}

// The synchronous convenience: calls the asynchronous form through `call` with sync true and answers what
// its handler got (empty when it never ran).
template <class Result>
Result waitFor(const std::function<void(KRDBCatalog::ResultHandler<Result>)>& call) {
  Result stored{};
  call([&stored](Result result) { stored = std::move(result); });
  return stored;
}

// The (states' records, position of the current one) pair of one image.
std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long> statesPair(
    const KRDBImageStates& states, const std::shared_ptr<KRDBImageState>& currentState) {
  const auto current = std::find_if(states.begin(), states.end(), [&currentState](const auto& state) {
    return state && state->isEqual(currentState);
  });
  const long long position = current == states.end() ? -1 : current - states.begin();
  return {recordsOf<DBImgHistoryState>(states), position};
}

}  // namespace

// ---- Trees

KRDBEntitySet KRDBCatalog::fetchChildsOfFilterSync(const std::shared_ptr<KRDBEntity>& filter) {
  try {
    return treeEntities(dbReactor(), filter, true);
  } catch (const dbcore::DBException&) {
    return {};
  }
}

void KRDBCatalog::fetchChildsOfFilter(const std::shared_ptr<KRDBEntity>& filter,
                                      ResultHandler<KRDBEntitySet> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchChildsOfFilterSync, filter, std::move(handler), sync);
}

KRDBEntitySet KRDBCatalog::fetchChildsOfFilter(const std::shared_ptr<KRDBEntity>& filter) {
  return waitFor<KRDBEntitySet>([&](auto handler) { fetchChildsOfFilter(filter, handler, true); });
}

KRDBEntitySet KRDBCatalog::fetchDescendantsOfFilterSync(const std::shared_ptr<KRDBEntity>& filter) {
  return treeEntities(dbReactor(), filter, false);
}

void KRDBCatalog::fetchDescendantsOfFilter(const std::shared_ptr<KRDBEntity>& filter,
                                           ResultHandler<KRDBEntitySet> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchDescendantsOfFilterSync, filter, std::move(handler), sync);
}

FolderPtr KRDBCatalog::fetchParentOfFilterSync(const std::shared_ptr<KRDBEntity>& filter) {
  const Reactor reactor = dbReactor();
  if (!reactor) return nullptr;
  switch (entityTypeOf(filter)) {
    case KRDBEntityTypeCollection:
      return KRDBCollection::initWithDBEntity(reactor->GetParent(recordOf<DBFilter>(filter)));
    case KRDBEntityTypeReferencedFolder:
      return KRDBReferencedFolder::initWithDBEntity(reactor->GetParent(recordOf<DBRefFolder>(filter)));
    default:
      return nullptr;
  }
}

void KRDBCatalog::fetchParentOfFilter(const std::shared_ptr<KRDBEntity>& filter,
                                      ResultHandler<FolderPtr> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchParentOfFilterSync, filter, std::move(handler), sync);
}

FolderPtr KRDBCatalog::fetchParentOfFilter(const std::shared_ptr<KRDBEntity>& filter) {
  return waitFor<FolderPtr>([&](auto handler) { fetchParentOfFilter(filter, handler, true); });
}

KRDBEntitySet KRDBCatalog::addChildsSync(const KRDBEntitySet& childs,
                                         const std::shared_ptr<KRDBEntity>& filter) {
  const KRDBEntitySet moving = missingFrom(childs, fetchChildsOfFilterSync(filter));
  switch (entityTypeOf(filter)) {
    case KRDBEntityTypeCollection:
      writeEach<std::shared_ptr<DBFilter>>(
          *this, recordsOf<DBFilter>(moving), kMoveFilterOperation,
          [target = recordOf<DBFilter>(filter)](const Reactor& reactor, const auto& child) {
            reactor->Move(child, target);
          });
      return moving;
    case KRDBEntityTypeReferencedFolder:
      writeEach<std::shared_ptr<DBRefFolder>>(
          *this, recordsOf<DBRefFolder>(moving), kMoveRefFolderOperation,
          [target = recordOf<DBRefFolder>(filter)](const Reactor& reactor, const auto& child) {
            reactor->Move(child, target);
          });
      return moving;
    default:
      return {};
  }
}

void KRDBCatalog::addChilds(const KRDBEntitySet& childs, const std::shared_ptr<KRDBEntity>& filter,
                            ResultHandler<KRDBEntitySet> handler, bool sync) {
  performOperation<KRDBEntitySet>(
      [childs, filter](KRDBCatalog& catalog) { return catalog.addChildsSync(childs, filter); },
      std::move(handler), sync);
}

// ---- Members

// The images of a tree folder through an image request: a collection's members, the images at or under a
// referenced folder's path (fetched first when the folder does not hold it), the images that satisfy a
// smart filter's conditions.
KRDBEntityArray KRDBCatalog::fetchImagesOfFilterSync(const std::shared_ptr<KRDBEntity>& filter) {
  const auto request = KRDBFilteredImagesFetchRequest::init();
  switch (entityTypeOf(filter)) {
    case KRDBEntityTypeCollection:
      request->setFilters(std::make_shared<const KRDBEntitySet>(KRDBEntitySet{filter}));
      break;
    case KRDBEntityTypeReferencedFolder: {
      const auto folder = std::static_pointer_cast<KRDBReferencedFolder>(filter);
      if (!folder->dbPath()) folder->setDbPath(fetchPathForReferencedFolderSync(folder));
      if (!folder->dbPath()) return {};
      request->setFolder(folder);
      break;
    }
    case KRDBEntityTypeSmartFilter:
      request->setFilterConditions(std::static_pointer_cast<KRDBSmartFilter>(filter)->filterConditions());
      break;
    default:
      return {};
  }
  const KRDBEntitySet images = fetchEntitiesUsingFetchRequestSync(request);
  return KRDBEntityArray(images.begin(), images.end());
}

void KRDBCatalog::fetchImagesOfFilter(const std::shared_ptr<KRDBEntity>& filter,
                                      ResultHandler<KRDBEntityArray> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchImagesOfFilterSync, filter, std::move(handler), sync);
}

KRDBEntityArray KRDBCatalog::fetchImagesOfFilter(const std::shared_ptr<KRDBEntity>& filter) {
  return waitFor<KRDBEntityArray>([&](auto handler) { fetchImagesOfFilter(filter, handler, true); });
}

KRDBEntitySet KRDBCatalog::membersAmongImagesSync(const KRDBEntitySet& images,
                                                  const std::shared_ptr<KRDBEntity>& filter) {
  const KRDBEntityArray found = fetchImagesOfFilterSync(filter);
  KRDBEntitySet members(found.begin(), found.end());
  if (entityTypeOf(filter) != KRDBEntityTypeCollection) return members;
  // The members query leaves out images marked to delete: those of the given images it did not find are
  // asked for their own collections.
  for (const auto& image : missingFrom(images, members)) {
    const auto filters = fetchFiltersOfImageSync(std::dynamic_pointer_cast<KRDBImage>(image));
    if (!missingFrom({filter}, filters).empty()) continue;
    members.insert(image);
  }
  return members;
}

KRDBEntitySet KRDBCatalog::addImagesSync(const KRDBEntitySet& images,
                                         const std::shared_ptr<KRDBEntity>& filter) {
  const int64_t type = entityTypeOf(filter);
  if (type != KRDBEntityTypeCollection && type != KRDBEntityTypeReferencedFolder) return {};
  const KRDBEntitySet added = missingFrom(images, membersAmongImagesSync(images, filter));
  const auto adding = recordsOf<DBImage>(added);
  if (type == KRDBEntityTypeCollection) {
    writeEach<std::shared_ptr<DBImage>>(
        *this, adding, kFilterAddImageOperation,
        [filterID = filter->entityID()->dbid()](const Reactor& reactor, const auto& image) {
          reactor->FilterAddImage(filterID, image);
        });
  } else {
    writeEach<std::shared_ptr<DBImage>>(
        *this, adding, kRefFolderAddImageOperation,
        [folder = recordOf<DBRefFolder>(filter)](const Reactor& reactor, const auto& image) {
          reactor->Bind(folder, image);
        });
  }
  return added;
}

void KRDBCatalog::addImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter,
                            ResultHandler<KRDBEntitySet> handler, bool sync) {
  performOperation<KRDBEntitySet>(
      [images, filter](KRDBCatalog& catalog) { return catalog.addImagesSync(images, filter); },
      std::move(handler), sync);
}

KRDBEntitySet KRDBCatalog::deleteImagesSync(const KRDBEntitySet& images,
                                            const std::shared_ptr<KRDBEntity>& filter) {
  if (entityTypeOf(filter) != KRDBEntityTypeCollection) return {};
  const KRDBEntitySet outside = missingFrom(images, membersAmongImagesSync(images, filter));
  KRDBEntitySet removing;
  for (const auto& image : images) {
    if (image && !outside.contains(image)) removing.insert(image);
  }
  writeEach<std::shared_ptr<DBImage>>(
      *this, recordsOf<DBImage>(removing), kFilterDelImageOperation,
      [filterID = filter->entityID()->dbid()](const Reactor& reactor, const auto& image) {
        reactor->FilterDelImage(filterID, image);
      });
  return removing;
}

void KRDBCatalog::deleteImages(const KRDBEntitySet& images, const std::shared_ptr<KRDBEntity>& filter,
                               ResultHandler<KRDBEntitySet> handler, bool sync) {
  performOperation<KRDBEntitySet>(
      [images, filter](KRDBCatalog& catalog) { return catalog.deleteImagesSync(images, filter); },
      std::move(handler), sync);
}

KRDBEntitySet KRDBCatalog::fetchFiltersOfImageSync(const std::shared_ptr<KRDBImage>& image) {
  const Reactor reactor = dbReactor();
  if (!reactor || !image) return {};
  KRDBEntitySet filters;
  wrapInto<KRDBCollection>(reactor->GetFiltersByImage(image->entityID()->dbid(), -1, -1), nullptr, filters);
  return filters;
}

void KRDBCatalog::fetchFiltersOfImage(const std::shared_ptr<KRDBImage>& image,
                                      ResultHandler<KRDBEntitySet> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchFiltersOfImageSync, image, std::move(handler), sync);
}

KRDBEntitySet KRDBCatalog::fetchFiltersOfImage(const std::shared_ptr<KRDBImage>& image) {
  return waitFor<KRDBEntitySet>([&](auto handler) { fetchFiltersOfImage(image, handler, true); });
}

// ---- History states

KRDBImageStates KRDBCatalog::fetchStatesOfImageSync(const std::shared_ptr<KRDBImage>& image) {
  const Reactor reactor = dbReactor();
  if (!reactor || !image) return {};
  KRDBImageStates states;
  for (const auto& record : reactor->GetStates<DBImage, DBImgHistoryState>(image->dbimage()))
    states.push_back(KRDBImageState::initWithDBEntity(record));
  return states;
}

void KRDBCatalog::fetchStatesOfImage(const std::shared_ptr<KRDBImage>& image,
                                     ResultHandler<KRDBImageStates> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchStatesOfImageSync, image, std::move(handler), sync);
}

KRDBImageStates KRDBCatalog::fetchStatesOfImage(const std::shared_ptr<KRDBImage>& image) {
  return waitFor<KRDBImageStates>([&](auto handler) { fetchStatesOfImage(image, handler, true); });
}

std::shared_ptr<KRDBImageState> KRDBCatalog::fetchStateForImageSync(const std::shared_ptr<KRDBImage>& image) {
  const Reactor reactor = dbReactor();
  if (!reactor || !image) return nullptr;
  return KRDBImageState::initWithDBEntity(
      reactor->GetCurrentState<DBImage, DBImgHistoryState>(image->dbimage()));
}

void KRDBCatalog::fetchCurrentStateForImage(const std::shared_ptr<KRDBImage>& image,
                                            ResultHandler<std::shared_ptr<KRDBImageState>> handler,
                                            bool sync) {
  queueRead(*this, &KRDBCatalog::fetchStateForImageSync, image, std::move(handler), sync);
}

std::shared_ptr<KRDBImageState> KRDBCatalog::fetchCurrentStateForImage(
    const std::shared_ptr<KRDBImage>& image) {
  return waitFor<std::shared_ptr<KRDBImageState>>(
      [&](auto handler) { fetchCurrentStateForImage(image, handler, true); });
}

void KRDBCatalog::fetchCurrentStatesForImages(const KRDBEntityArray& images,
                                              ResultHandler<ImageStatesByID> handler, bool sync) {
  using StateRecords = std::map<long long, std::shared_ptr<DBImgHistoryState>>;
  // The queue only reads the records; the entities are built where the handler runs.
  ResultHandler<StateRecords> building;
  if (handler) {
    building = [handler = std::move(handler)](StateRecords records) {
      ImageStatesByID states;
      for (const auto& [imageID, record] : records)
        states.emplace_hint(states.end(), imageID, KRDBImageState::initWithDBEntity(record));
      handler(std::move(states));
    };
  }
  performOperation<StateRecords>(
      [images](KRDBCatalog& catalog) {
        const Reactor reactor = catalog.dbReactor();
        if (!reactor) return StateRecords{};
        return reactor->GetCurrentStates<DBImage, DBImgHistoryState>(recordsOf<DBImage>(images));
      },
      std::move(building), sync);
}

void KRDBCatalog::setStates(const KRDBImageStates& states,
                            const std::shared_ptr<KRDBImageState>& currentState,
                            const std::shared_ptr<KRDBImage>& image) {
  setStatesArray({states}, {currentState}, {image});
}

void KRDBCatalog::setStatesArray(const std::vector<KRDBImageStates>& statesArray,
                                 const KRDBImageStates& currentStatesArray,
                                 const KRDBEntityArray& imagesArray) {
  queueWork(*this, [statesArray, currentStatesArray, imagesArray](KRDBCatalog& catalog) {
    std::map<std::shared_ptr<DBImage>, std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long>>
        byImage;
    const size_t count = std::min({statesArray.size(), currentStatesArray.size(), imagesArray.size()});
    for (size_t index = 0; index < count; ++index) {
      if (auto image = recordOf<DBImage>(imagesArray[index]))
        byImage[image] = statesPair(statesArray[index], currentStatesArray[index]);
    }
    catalog.handleDBReactorBlock(
        [&byImage](const Reactor& reactor) {
          reactor->SetStatesByVector<DBImage, DBImgHistoryState>(byImage);
        },
        kSetStatesOperation, true);
  });
}

void KRDBCatalog::setCurrentState(const std::shared_ptr<KRDBImageState>& state,
                                  const std::shared_ptr<KRDBImage>& image) {
  queueWork(*this, [state, image](KRDBCatalog& catalog) {
    catalog.handleDBReactorBlock(
        [&](const Reactor& reactor) {
          reactor->SetCurrentState<DBImage, DBImgHistoryState>(recordOf<DBImage>(image),
                                                               recordOf<DBImgHistoryState>(state));
        },
        kSetCurrentStateOperation, true);
  });
}

// ---- Favorite aliases

std::shared_ptr<KRDBEntityFavoriteAlias> KRDBCatalog::fetchFavoriteAliasForEntitySync(
    const std::shared_ptr<KRDBEntity>& entity, bool* created) {
  const Reactor reactor = dbReactor();
  if (!reactor || !entity) return nullptr;
  const KRDBEntity::Record original = entity->dbentity();
  auto record = reactor->GetBy<dbcore::DBEntityFavoriteAlias, dbcore::DBEntity>(original);
  if (!record) {
    record = std::make_shared<dbcore::DBEntityFavoriteAlias>();
    record->orig_type = original->type();
    record->orig_id = original->id();
    handleDBReactorBlock(
        [&record, created](const Reactor& engine) {
          *engine << record;
          if (created) *created = true;
        },
        kCreateFavoriteAliasOperation, true);
  }
  auto alias = KRDBEntityFavoriteAlias::initWithDBEntity(record);
  alias->setOriginalEntityPrimitive(entity);
  entity->setFavoriteAliasPrimitive(alias);
  return alias;
}

void KRDBCatalog::fetchFavoritealiasForEntity(const std::shared_ptr<KRDBEntity>& entity, bool* created,
                                              ResultHandler<std::shared_ptr<KRDBEntityFavoriteAlias>> handler,
                                              bool sync) {
  performOperation<std::shared_ptr<KRDBEntityFavoriteAlias>>(
      [entity, created](KRDBCatalog& catalog) {
        return catalog.fetchFavoriteAliasForEntitySync(entity, created);
      },
      std::move(handler), sync);
}

std::shared_ptr<KRDBEntityFavoriteAlias> KRDBCatalog::fetchFavoriteAliasForEntity(
    const std::shared_ptr<KRDBEntity>& entity, bool* created) {
  return waitFor<std::shared_ptr<KRDBEntityFavoriteAlias>>(
      [&](auto handler) { fetchFavoritealiasForEntity(entity, created, handler, true); });
}

// ---- Folders and volumes

std::shared_ptr<KRDBVolume> KRDBCatalog::fetchVolumeForPathSync(const std::shared_ptr<KRDBPath>& path) {
  const Reactor reactor = dbReactor();
  if (!reactor || !path) return nullptr;
  return KRDBVolume::initWithDBEntity(reactor->GetBy<dbcore::DBVolume, DBPath>(path->dbpath()));
}

void KRDBCatalog::fetchVolumeForPath(const std::shared_ptr<KRDBPath>& path,
                                     ResultHandler<std::shared_ptr<KRDBVolume>> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchVolumeForPathSync, path, std::move(handler), sync);
}

std::shared_ptr<KRDBVolume> KRDBCatalog::fetchVolumeForPath(const std::shared_ptr<KRDBPath>& path) {
  return waitFor<std::shared_ptr<KRDBVolume>>([&](auto handler) { fetchVolumeForPath(path, handler, true); });
}

void KRDBCatalog::setVolume(const std::shared_ptr<KRDBVolume>& volume,
                            const std::shared_ptr<KRDBPath>& path) {
  queueWork(*this, [volume, path](KRDBCatalog& catalog) {
    catalog.handleDBReactorBlock(
        [&](const Reactor& reactor) {
          reactor->Bind(recordOf<DBPath>(path), recordOf<dbcore::DBVolume>(volume));
        },
        kBindVolumeOperation, true);
  });
}

void KRDBCatalog::renamePath(const KRString& path, const std::shared_ptr<KRDBVolume>& volume,
                             const KRString& newPath, const std::shared_ptr<KRDBVolume>& newVolume,
                             std::function<void(bool)> completion) {
  queueWork(*this,
            [path, volume, newPath, newVolume, completion = std::move(completion)](KRDBCatalog& catalog) {
              bool renamed = false;
              const auto report = [&catalog, &completion, &renamed] {
                catalog.asyncPerformMainThreadBlock([completion, renamed] {
                  if (completion) completion(renamed);
                });
              };
              try {
                catalog.handleDBReactorBlock(
                    [&](const Reactor& reactor) {
                      renamed = reactor->RenamePath(path.krs_wstring(), newPath.krs_wstring(),
                                                    recordOf<dbcore::DBVolume>(volume),
                                                    recordOf<dbcore::DBVolume>(newVolume));
                    },
                    kRenamePathOperation, true);
              } catch (...) {
                // The completion learns of the failure before the queue logs the exception.
                report();
                throw;
              }
              report();
            });
}

namespace {

// The image records of the entities, each paired with the folder's record or id.
template <class Folder>
std::vector<std::pair<Folder, std::shared_ptr<DBImage>>> folderPairs(const Folder& folder,
                                                                     const KRDBEntityArray& images) {
  std::vector<std::pair<Folder, std::shared_ptr<DBImage>>> pairs;
  for (auto& image : recordsOf<DBImage>(images)) pairs.emplace_back(folder, std::move(image));
  return pairs;
}

}  // namespace

void KRDBCatalog::bindFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images) {
  queueWork(*this, [path, images](KRDBCatalog& catalog) {
    const auto pairs = folderPairs(recordOf<DBPath>(path), images);
    catalog.handleDBReactorBlock([&pairs](const Reactor& reactor) { *reactor << pairs; },
                                 kBindImagesOperation, true);
  });
}

void KRDBCatalog::rebindFolderDBPath(const std::shared_ptr<KRDBPath>& path, const KRDBEntityArray& images) {
  queueWork(*this, [path, images](KRDBCatalog& catalog) {
    const auto pairs = folderPairs(static_cast<long long>(path ? path->entityID()->dbid() : 0), images);
    catalog.handleDBReactorBlock([&pairs](const Reactor& reactor) { reactor->RebindPathImages(pairs); },
                                 kRebindImagesOperation, true);
  });
}

std::shared_ptr<KRDBPath> KRDBCatalog::fetchDBPathForImageSync(const std::shared_ptr<KRDBImage>& image) {
  const Reactor reactor = dbReactor();
  if (!reactor || !image) return nullptr;
  return KRDBPath::initWithDBEntity(reactor->GetBy<DBPath, DBImage>(image->dbimage()));
}

std::shared_ptr<KRDBPath> KRDBCatalog::fetchPathForReferencedFolderSync(
    const std::shared_ptr<KRDBReferencedFolder>& folder) {
  const Reactor reactor = dbReactor();
  const auto record = recordOf<DBRefFolder>(folder);
  if (!reactor || !record) return nullptr;
  return KRDBPath::initWithDBEntity(reactor->Get<DBPath>(record->path_id));
}

void KRDBCatalog::fetchPathForReferencedFolder(const std::shared_ptr<KRDBReferencedFolder>& folder,
                                               ResultHandler<std::shared_ptr<KRDBPath>> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchPathForReferencedFolderSync, folder, std::move(handler), sync);
}

std::shared_ptr<KRDBPath> KRDBCatalog::fetchPathForReferencedFolder(
    const std::shared_ptr<KRDBReferencedFolder>& folder) {
  return waitFor<std::shared_ptr<KRDBPath>>(
      [&](auto handler) { fetchPathForReferencedFolder(folder, handler, true); });
}

// ---- Attribute records of images

void KRDBCatalog::fetchAttributesForImage(const std::shared_ptr<KRDBImage>& image,
                                          ResultHandler<std::shared_ptr<KRDBImageAttributes>> handler,
                                          bool sync) {
  queueRead(*this, &KRDBCatalog::fetchAttributesForImageSync, image, std::move(handler), sync);
}

std::shared_ptr<KRDBImageAttributes> KRDBCatalog::fetchAttributesForImage(
    const std::shared_ptr<KRDBImage>& image) {
  return waitFor<std::shared_ptr<KRDBImageAttributes>>(
      [&](auto handler) { fetchAttributesForImage(image, handler, true); });
}

namespace {

// The image of an attribute record of kind Record; nil without an engine or such a record.
template <class Record>
std::shared_ptr<KRDBImage> imageOfAttributes(const Reactor& reactor, const EntityPtr& attributes) {
  const auto record = recordOf<Record>(attributes);
  if (!reactor || !record) return nullptr;
  return KRDBImage::initWithDBEntity(reactor->GetBy<DBImage, Record>(record));
}

}  // namespace

std::shared_ptr<KRDBImage> KRDBCatalog::fetchImageForAttributesSync(
    const std::shared_ptr<KRDBImageAttributes>& attributes) {
  return imageOfAttributes<DBUserImgAttrib>(dbReactor(), attributes);
}

void KRDBCatalog::fetchImageForAttributes(const std::shared_ptr<KRDBImageAttributes>& attributes,
                                          ResultHandler<std::shared_ptr<KRDBImage>> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchImageForAttributesSync, attributes, std::move(handler), sync);
}

std::shared_ptr<KRDBImage> KRDBCatalog::fetchImageForAttributes(
    const std::shared_ptr<KRDBImageAttributes>& attributes) {
  return waitFor<std::shared_ptr<KRDBImage>>(
      [&](auto handler) { fetchImageForAttributes(attributes, handler, true); });
}

void KRDBCatalog::fetchExivAttributesForImage(const std::shared_ptr<KRDBImage>& image,
                                              ResultHandler<std::shared_ptr<KRDBImageExivAttributes>> handler,
                                              bool sync) {
  queueRead(*this, &KRDBCatalog::fetchExivAttributesForImageSync, image, std::move(handler), sync);
}

std::shared_ptr<KRDBImageExivAttributes> KRDBCatalog::fetchExivAttributesForImage(
    const std::shared_ptr<KRDBImage>& image) {
  return waitFor<std::shared_ptr<KRDBImageExivAttributes>>(
      [&](auto handler) { fetchExivAttributesForImage(image, handler, true); });
}

std::shared_ptr<KRDBImage> KRDBCatalog::fetchImageForExivAttributesSync(
    const std::shared_ptr<KRDBImageExivAttributes>& attributes) {
  return imageOfAttributes<DBExivImgAttrib>(dbReactor(), attributes);
}

void KRDBCatalog::fetchImageForExivAttributes(const std::shared_ptr<KRDBImageExivAttributes>& attributes,
                                              ResultHandler<std::shared_ptr<KRDBImage>> handler, bool sync) {
  queueRead(*this, &KRDBCatalog::fetchImageForExivAttributesSync, attributes, std::move(handler), sync);
}

std::shared_ptr<KRDBImage> KRDBCatalog::fetchImageForExivAttributes(
    const std::shared_ptr<KRDBImageExivAttributes>& attributes) {
  return waitFor<std::shared_ptr<KRDBImage>>(
      [&](auto handler) { fetchImageForExivAttributes(attributes, handler, true); });
}
