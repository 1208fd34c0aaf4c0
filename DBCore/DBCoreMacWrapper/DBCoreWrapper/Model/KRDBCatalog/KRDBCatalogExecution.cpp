#include <map>
#include <set>

#include "KRServices/KRLog.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBFilteredEntitiesFetchRequest/KRDBFilteredEntitiesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbentityfavoritealiasselectquery.hpp"
#include "dbentityreffolderselectquery.hpp"
#include "dbexivimgattribselectquery.hpp"
#include "dbimgselectquery.hpp"
#include "dbpathselectquery.hpp"
#include "dbreactor.hpp"
#include "dbuserimgattribselectquery.hpp"
#include "dbvolumeselectquery.hpp"

// Running fetch requests on the engine, the image-to-folder table, and the additional fetching of the
// records that entities need before they are handed out. Runs on the catalog's queue.

namespace {

using namespace dbcore;

// The records that a request of query class Query selects; none for a request without a query of that
// class or a catalog without an engine. Engine exceptions pass (no guard on this path).
template <class Query, class Record>
KRDBCatalog::Records recordsWithRequest(KRDBCatalog& catalog, const KRDBCatalog::FetchRequestPtr& request) {
  const auto query = request ? std::dynamic_pointer_cast<Query>(request->selectQuery()) : nullptr;
  const auto reactor = catalog.dbReactor();
  if (!query || !reactor) return {};
  auto records = reactor->GetBySelectQuery<Record>(query);
  return {std::make_move_iterator(records.begin()), std::make_move_iterator(records.end())};
}

// The entities of the records.
KRDBEntitySet entitiesOf(const KRDBCatalog::Records& records) {
  KRDBEntitySet entities;
  entities.reserve(records.size());
  for (const auto& record : records) {
    if (auto entity = KRDBEntity::entityWithDBEntity(record)) entities.insert(std::move(entity));
  }
  return entities;
}

template <class Query, class Record>
KRDBEntitySet fetchWithRequest(KRDBCatalog& catalog, const KRDBCatalog::FetchRequestPtr& request) {
  return entitiesOf(recordsWithRequest<Query, Record>(catalog, request));
}

// Adds the linked entity to the array when there is one.
template <class T>
void safeAddObject(KRDBEntityArray& array, const std::shared_ptr<T>& entity) {
  if (entity) array.push_back(entity);
}

}  // namespace

void KRDBCatalog::obtainFetchedEntitiesUsingFetchRequest(const FetchRequestPtr& request,
                                                         ResultHandler<KRDBEntitySet> handler, bool sync) {
  // The queue only reads the records; the entities are built where the handler runs, so that the queue
  // goes on with the next operation meanwhile.
  ResultHandler<Records> building;
  if (handler) building = [handler = std::move(handler)](Records records) { handler(entitiesOf(records)); };
  performOperation<Records>(
      [request](KRDBCatalog& catalog) { return catalog.fetchRecordsUsingFetchRequestSync(request); },
      std::move(building), sync);
}

KRDBEntitySet KRDBCatalog::fetchEntitiesUsingFetchRequestSync(const FetchRequestPtr& request) {
  return entitiesOf(fetchRecordsUsingFetchRequestSync(request));
}

KRDBCatalog::Records KRDBCatalog::fetchRecordsUsingFetchRequestSync(const FetchRequestPtr& request) {
  const int64_t entityType = request ? request->entityType() : KRDBEntityTypeNone;
  switch (entityType) {
    case KRDBEntityTypeImage:
      return recordsWithRequest<DBImgSelectQuery, DBImage>(*this, request);
    case KRDBEntityTypeReferencedFolder:
      return recordsWithRequest<DBEntityReffolderSelectQuery, DBRefFolder>(*this, request);
    case KRDBEntityTypePath:
      return recordsWithRequest<DBPathSelectQuery, DBPath>(*this, request);
    case KRDBEntityTypeImageAttributes:
      return recordsWithRequest<DBUserImgAttribSelectQuery, DBUserImgAttrib>(*this, request);
    case KRDBEntityTypeImageExivAttributes:
      return recordsWithRequest<DBExivImgAttribSelectQuery, DBExivImgAttrib>(*this, request);
    case KRDBEntityTypeFavoriteAlias:
      return recordsWithRequest<DBEntityFavoriteAliasSelectQuery, DBEntityFavoriteAlias>(*this, request);
    case KRDBEntityTypeVolume:
      return recordsWithRequest<DBVolumeSelectQuery, DBVolume>(*this, request);
    default:
      KRLog(KRLogLevelError, "Error: %@ for entity type: %ld does not implemented yet.",
            "fetchEntitiesUsingFetchRequestSync:", static_cast<long>(entityType));
      return {};
  }
}

KRDBEntitySet KRDBCatalog::fetchImagesUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBImgSelectQuery, DBImage>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchReffoldersUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBEntityReffolderSelectQuery, DBRefFolder>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchPathsUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBPathSelectQuery, DBPath>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchImageAttributesUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBUserImgAttribSelectQuery, DBUserImgAttrib>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchImageExivAttributesUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBExivImgAttribSelectQuery, DBExivImgAttrib>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchFavoriteAliasUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBEntityFavoriteAliasSelectQuery, DBEntityFavoriteAlias>(*this, request);
}

KRDBEntitySet KRDBCatalog::fetchVolumesUsingFetchRequestSync(const FetchRequestPtr& request) {
  return fetchWithRequest<DBVolumeSelectQuery, DBVolume>(*this, request);
}

// ---- Image-to-folder table

void KRDBCatalog::fetchConnectionsForImagesWithDBPathesWithHandler(ResultHandler<KRDictionary> handler) {
  using Connections = std::map<long long, std::set<long long>>;
  // The queue only reads the table; the dictionary is built where the handler runs.
  ResultHandler<Connections> building;
  if (handler) {
    building = [handler = std::move(handler)](Connections connections) {
      std::vector<KRDictionary::Entry> entries;
      entries.reserve(connections.size());
      for (const auto& [imageId, pathIds] : connections) {
        if (!pathIds.empty())
          entries.emplace_back(static_cast<int64_t>(imageId), static_cast<int64_t>(*pathIds.begin()));
      }
      handler(KRDictionary(entries));
    };
  }
  performOperation<Connections>(
      [](KRDBCatalog& catalog) {
        const auto reactor = catalog.dbReactor();
        return reactor ? reactor->Connections<DBPath, DBImage>(true) : Connections{};
      },
      std::move(building), false);
}

// ---- Additional fetching

void KRDBCatalog::additionalFetchingForEntities(const KRDBEntitySet& entities,
                                                ResultHandler<KRDBEntitySet> handler, bool sync) {
  performOperation<KRDBEntitySet>(
      [entities](KRDBCatalog& catalog) { return catalog.additionalFetchingSyncForEntities(entities); },
      std::move(handler), sync);
}

KRDBEntitySet KRDBCatalog::additionalFetchingSyncForEntities(const KRDBEntitySet& entities) {
  KRDBEntitySet linked;
  for (const auto& entity : entities) {
    KRDBEntityArray fetched;
    if (const auto image = std::dynamic_pointer_cast<KRDBImage>(entity)) {
      fetched = additionalFetchingForImage(image);
    } else if (const auto filter = std::dynamic_pointer_cast<KRDBCollection>(entity)) {
      fetched = additionalFetchingForFilter(filter);
    } else if (const auto folder = std::dynamic_pointer_cast<KRDBReferencedFolder>(entity)) {
      fetched = additionalFetchingForReffolderSync(folder);
    } else if (const auto path = std::dynamic_pointer_cast<KRDBPath>(entity)) {
      fetched = additionalFetchingForDBPath(path);
    } else if (const auto alias = std::dynamic_pointer_cast<KRDBEntityFavoriteAlias>(entity)) {
      fetched = additionalFetchingForFavoriteAlias(alias);
    } else if (const auto smartFilter = std::dynamic_pointer_cast<KRDBSmartFilter>(entity)) {
      fetched = additionalFetchingForSmartFilter(smartFilter);
    }
    linked.insert(fetched.begin(), fetched.end());
  }
  return linked;
}

KRDBEntityArray KRDBCatalog::additionalFetchingForImage(const std::shared_ptr<KRDBImage>& image) {
  KRDBEntityArray fetched;
  if (!image->attributesPrimitive()) {
    const auto attributes = fetchAttributesForImageSync(image);
    image->setAttributesPrimitive(attributes);
    safeAddObject(fetched, attributes);
  }
  if (!image->exivAttributesPrimitive()) {
    const auto attributes = fetchExivAttributesForImageSync(image);
    image->setExivAttributesPrimitive(attributes);
    safeAddObject(fetched, attributes);
  }
  if (!image->folderDBPathPrimitive()) {
    const auto path = fetchDBPathForImageSync(image);
    image->setFolderDBPathPrimitive(path);
    safeAddObject(fetched, path);
  }
  return fetched;
}

KRDBEntityArray KRDBCatalog::additionalFetchingForReffolderSync(
    const std::shared_ptr<KRDBReferencedFolder>& folder) {
  KRDBEntityArray fetched;
  const auto attributes = fetchAttributesForRefFolderSync(folder);
  folder->setAttributesPrimitive(attributes);
  const auto path = fetchPathForReferencedFolderSync(folder);
  folder->setDbPath(path);
  safeAddObject(fetched, path);
  safeAddObject(fetched, attributes);
  return fetched;
}

KRDBEntityArray KRDBCatalog::additionalFetchingForDBPath(const std::shared_ptr<KRDBPath>& path) {
  KRDBEntityArray fetched;
  const auto volume = fetchVolumeForPathSync(path);
  path->setVolumePrimitive(volume);
  safeAddObject(fetched, volume);
  return fetched;
}

KRDBEntityArray KRDBCatalog::additionalFetchingForFavoriteAlias(
    const std::shared_ptr<KRDBEntityFavoriteAlias>& alias) {
  KRDBEntityArray fetched;
  const auto original =
      alias->originalEntityID() ? fetchEntityWithIDSync(alias->originalEntityID()) : nullptr;
  if (!original) return fetched;
  alias->setOriginalEntityPrimitive(original);
  original->setFavoriteAliasPrimitive(alias);
  fetched.push_back(original);
  return fetched;
}
