#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <set>

#include "KRFoundation/KRRunLoop.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRTestExifReader.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBFilteredPathsFetchRequest/KRDBFilteredPathsFetchRequest.hpp"
#include "Model/KRDBFilteredVolumesFetchRequest/KRDBFilteredVolumesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbpathselectquery.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

// A request of a given entity type whose query is a path query: the wrong class for every type but paths.
class PathQueryRequest : public KRDBFilteredEntitiesFetchRequest {
 public:
  explicit PathQueryRequest(int64_t type) : type_(type) {}
  int64_t entityType() const override { return type_; }
  SelectQueryPtr makeSelectQuery() override { return std::make_shared<dbcore::DBPathSelectQuery>(); }

 private:
  int64_t type_;
};

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(10));
}

class KRDBCatalogExecutionTest : public testing::Test {
 protected:
  void SetUp() override {
    catalog = KRDBCatalog::initWithContentsOfFile(directory.file("catalog.krcatalog"), nullptr);
    ASSERT_TRUE(catalog);
    catalog->initializeAndUpdateIfNeaded();
  }

  template <class Result>
  Result onQueue(const std::function<Result(KRDBCatalog&)>& work) {
    Result result{};
    catalog->performSynchronously(true, [&] { result = work(*catalog); });
    return result;
  }

  // Two folders on one volume and `count` images, alternately in them.
  KRDBEntityArray makeImages(int count) {
    const auto volume = onQueue<std::shared_ptr<KRDBEntity>>([](KRDBCatalog& queue) {
      return queue.createEntityWithTypeSync(KRDBEntityTypeVolume,
                                            {{"DBVolumeInfo", KRDictionary::dictionary()}});
    });
    folders = onQueue<KRDBEntityArray>([&](KRDBCatalog& queue) {
      return queue.createDBPathsWithEntitiesInfo({{{"DBPathInfoPath", "a"}, {"DBPathInfoVolume", volume}},
                                                  {{"DBPathInfoPath", "b"}, {"DBPathInfoVolume", volume}}});
    });
    std::vector<KRDictionary> infos;
    for (int index = 0; index < count; ++index) {
      const std::string name = "IMG_" + std::to_string(index) + ".jpg";
      infos.push_back(
          {{"DBImageInfoImageName", name},
           {"DBImageInfoExifReader", KRTestExifReader::make({KRString("/p/" + name), 40, 30, 1000 + index,
                                                             KRDate::dateWithTimeIntervalSince1970(5),
                                                             KRDate::dateWithTimeIntervalSince1970(4)})},
           {"DBImageInfoFolderDBPath", folders[index % 2]}});
    }
    return onQueue<KRDBEntityArray>(
        [&](KRDBCatalog& queue) { return queue.createDBImagesWithEntitiesInfo(infos); });
  }

  KRDBEntitySet fetch(const KRDBCatalog::FetchRequestPtr& request) {
    return onQueue<KRDBEntitySet>(
        [&](KRDBCatalog& queue) { return queue.fetchEntitiesUsingFetchRequestSync(request); });
  }

  KRTemporaryDirectory directory;
  std::shared_ptr<KRDBCatalog> catalog;
  KRDBEntityArray folders;
};

// ---- Requests

TEST_F(KRDBCatalogExecutionTest, AnImageRequestFetchesFreshImageEntities) {
  const KRDBEntityArray images = makeImages(5);
  const KRDBEntitySet fetched = fetch(KRDBFilteredImagesFetchRequest::init());
  ASSERT_EQ(fetched.size(), 5u);
  for (const auto& entity : fetched) {
    const auto image = std::dynamic_pointer_cast<KRDBImage>(entity);
    ASSERT_TRUE(image);
    EXPECT_EQ(std::count(images.begin(), images.end(), entity), 0);
    EXPECT_EQ(image->name().str().rfind("IMG_", 0), 0u);
  }
}

TEST_F(KRDBCatalogExecutionTest, TheRecordsOfARequestAreThoseItsEntitiesHold) {
  makeImages(3);
  const auto request = KRDBFilteredImagesFetchRequest::init();
  const auto records = onQueue<KRDBCatalog::Records>(
      [&](KRDBCatalog& queue) { return queue.fetchRecordsUsingFetchRequestSync(request); });
  std::set<int64_t> recordIDs;
  for (const auto& record : records) recordIDs.insert(record->id());
  std::set<int64_t> entityIDs;
  for (const auto& entity : fetch(request)) entityIDs.insert(entity->entityID()->dbid());
  EXPECT_EQ(recordIDs.size(), 3u);
  EXPECT_EQ(recordIDs, entityIDs);
}

TEST_F(KRDBCatalogExecutionTest, PathAndVolumeRequestsFetchTheirRecords) {
  makeImages(2);
  EXPECT_EQ(fetch(KRDBFilteredPathsFetchRequest::init()).size(), 2u);
  const KRDBEntitySet volumes = fetch(KRDBFilteredVolumesFetchRequest::init());
  ASSERT_EQ(volumes.size(), 1u);
  EXPECT_TRUE(std::dynamic_pointer_cast<KRDBVolume>(*volumes.begin()));
}

TEST_F(KRDBCatalogExecutionTest, CollectionsAndSmartFiltersCannotBeFetchedByRequest) {
  for (const int64_t type : {KRDBEntityTypeCollection, KRDBEntityTypeSmartFilter}) {
    KRCapturingLogSink sink;
    EXPECT_TRUE(fetch(std::make_shared<PathQueryRequest>(type)).empty());
    const std::vector<KRLogRecord> records = sink.records();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_EQ(records[0].level, 2);
    EXPECT_EQ(records[0].message, "Error: fetchEntitiesUsingFetchRequestSync: for entity type: " +
                                      std::to_string(type) + " does not implemented yet.");
  }
}

TEST_F(KRDBCatalogExecutionTest, ARequestWithoutAQueryOfItsTypesClassFetchesNothingSilently) {
  makeImages(2);
  KRCapturingLogSink sink;
  EXPECT_TRUE(fetch(std::make_shared<PathQueryRequest>(KRDBEntityTypeImage)).empty());
  EXPECT_TRUE(onQueue<KRDBEntitySet>([](KRDBCatalog& queue) {
                return queue.fetchImagesUsingFetchRequestSync(nullptr);
              }).empty());
  EXPECT_EQ(fetch(std::make_shared<PathQueryRequest>(KRDBEntityTypePath)).size(), 2u);
  EXPECT_TRUE(sink.records().empty());
}

TEST_F(KRDBCatalogExecutionTest, AnAsynchronousRequestDeliversOnTheMainThreadAndNeverAfterClosing) {
  makeImages(3);
  std::optional<size_t> delivered;
  catalog->obtainFetchedEntitiesUsingFetchRequest(
      KRDBFilteredImagesFetchRequest::init(), [&](KRDBEntitySet entities) { delivered = entities.size(); },
      false);
  ASSERT_TRUE(runMainLoopUntil([&] { return delivered.has_value(); }));
  EXPECT_EQ(*delivered, 3u);
  bool closed = false;
  catalog->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  bool late = false;
  catalog->obtainFetchedEntitiesUsingFetchRequest(
      KRDBFilteredImagesFetchRequest::init(), [&](KRDBEntitySet) { late = true; }, false);
  ASSERT_TRUE(runMainLoopUntil([&] { return closed; }));
  bool drained = false;
  catalog->waitForAllDataBaseOperationsWithHandler([&] { drained = true; });
  ASSERT_TRUE(runMainLoopUntil([&] { return drained; }));
  EXPECT_FALSE(late);
}

// ---- Connection table

TEST_F(KRDBCatalogExecutionTest, TheConnectionTableOfACatalogWithoutImagesIsEmpty) {
  std::optional<KRDictionary> table;
  catalog->fetchConnectionsForImagesWithDBPathesWithHandler(
      [&](KRDictionary connections) { table = connections; });
  ASSERT_TRUE(runMainLoopUntil([&] { return table.has_value(); }));
  EXPECT_FALSE(table->isNil());
  EXPECT_EQ(table->count(), 0u);
}

TEST_F(KRDBCatalogExecutionTest, TheConnectionTableMapsEachImageToItsFolder) {
  const KRDBEntityArray images = makeImages(4);
  std::optional<KRDictionary> table;
  bool onMain = false;
  catalog->fetchConnectionsForImagesWithDBPathesWithHandler([&](KRDictionary connections) {
    table = connections;
    onMain = KRRunLoop::isMainThread();
  });
  ASSERT_TRUE(runMainLoopUntil([&] { return table.has_value(); }));
  EXPECT_TRUE(onMain);
  ASSERT_EQ(table->count(), 4u);
  for (size_t index = 0; index < images.size(); ++index) {
    EXPECT_EQ(table->objectForKey(images[index]->entityID()->dbid()),
              KRValue(folders[index % 2]->entityID()->dbid()));
  }
}

// ---- Additional fetching

TEST_F(KRDBCatalogExecutionTest, AnImageGetsItsAttributesExifAndFolderInThatOrder) {
  makeImages(1);
  const auto image =
      std::static_pointer_cast<KRDBImage>(*fetch(KRDBFilteredImagesFetchRequest::init()).begin());
  ASSERT_FALSE(image->attributesPrimitive());
  const KRDBEntityArray linked =
      onQueue<KRDBEntityArray>([&](KRDBCatalog& queue) { return queue.additionalFetchingForImage(image); });
  ASSERT_EQ(linked.size(), 3u);
  EXPECT_EQ(linked[0], image->attributesPrimitive());
  EXPECT_EQ(linked[1], image->exivAttributesPrimitive());
  EXPECT_EQ(linked[2], image->folderDBPathPrimitive());
  EXPECT_EQ(image->folderDBPathPrimitive()->path(), KRString("a"));
}

TEST_F(KRDBCatalogExecutionTest, AnImageThatHasItsLinksFetchesNothing) {
  const auto image = std::static_pointer_cast<KRDBImage>(makeImages(1)[0]);
  onQueue<KRDBEntityArray>([&](KRDBCatalog& queue) { return queue.additionalFetchingForImage(image); });
  const auto attributes = image->attributesPrimitive();
  const auto exif = image->exivAttributesPrimitive();
  const auto path = image->folderDBPathPrimitive();
  ASSERT_TRUE(attributes && exif && path);
  EXPECT_TRUE(onQueue<KRDBEntityArray>([&](KRDBCatalog& queue) {
                return queue.additionalFetchingForImage(image);
              }).empty());
  EXPECT_EQ(image->attributesPrimitive(), attributes);
  EXPECT_EQ(image->exivAttributesPrimitive(), exif);
  EXPECT_EQ(image->folderDBPathPrimitive(), path);
}

TEST_F(KRDBCatalogExecutionTest, ForASetEveryKindAttachesItsLinks) {
  makeImages(1);
  const auto collection = onQueue<std::shared_ptr<KRDBEntity>>(
      [](KRDBCatalog& queue) { return queue.createEntityWithTypeSync(KRDBEntityTypeCollection, {}); });
  KRDBEntitySet entities = fetch(KRDBFilteredPathsFetchRequest::init());
  entities.insert(collection);
  const KRDBEntitySet linked = onQueue<KRDBEntitySet>(
      [&](KRDBCatalog& queue) { return queue.additionalFetchingSyncForEntities(entities); });
  size_t volumes = 0;
  size_t attributes = 0;
  for (const auto& entity : linked) {
    volumes += std::dynamic_pointer_cast<KRDBVolume>(entity) ? 1 : 0;
    attributes += std::dynamic_pointer_cast<KRDBCollectionAttributes>(entity) ? 1 : 0;
  }
  // Each path gets an entity of its own for the one volume: the context makes them one later.
  EXPECT_EQ(volumes, 2u);
  EXPECT_EQ(attributes, 1u);
  EXPECT_EQ(linked.size(), 3u);
  for (const auto& entity : entities) {
    if (const auto path = std::dynamic_pointer_cast<KRDBPath>(entity)) {
      EXPECT_TRUE(path->volumePrimitive());
    }
  }
}

TEST_F(KRDBCatalogExecutionTest, AFavoriteAliasGetsItsOriginalEntityAndGivesItTheBackLink) {
  const auto image = std::static_pointer_cast<KRDBImage>(makeImages(1)[0]);
  const auto alias = onQueue<std::shared_ptr<KRDBEntityFavoriteAlias>>([&](KRDBCatalog& queue) {
    bool created = false;
    return queue.fetchFavoriteAliasForEntitySync(image, &created);
  });
  ASSERT_TRUE(alias);
  const auto fresh = KRDBEntityFavoriteAlias::initWithDBEntity(alias->dbentity()->clone());
  const KRDBEntityArray linked = onQueue<KRDBEntityArray>(
      [&](KRDBCatalog& queue) { return queue.additionalFetchingForFavoriteAlias(fresh); });
  ASSERT_EQ(linked.size(), 1u);
  EXPECT_EQ(linked[0]->entityID()->dbid(), image->entityID()->dbid());
  EXPECT_EQ(fresh->originalEntityPrimitive(), linked[0]);
  EXPECT_EQ(linked[0]->favoriteAliasPrimitive(), fresh);
}

}  // namespace
