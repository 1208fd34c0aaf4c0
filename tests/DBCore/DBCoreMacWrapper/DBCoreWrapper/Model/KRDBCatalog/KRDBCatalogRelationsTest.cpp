#include <gtest/gtest.h>
#include <sqlite3.h>

#include <algorithm>
#include <functional>
#include <optional>
#include <thread>

#include "KRCommitCounter.hpp"
#include "KRContextCatalog.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRTestExifReader.hpp"
#include "Model/KRDBCatalog/DBCoreUtils.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"
#include "dbreactor.hpp"

namespace {

using Reactor = KRDBCatalog::Reactor;
using EntityPtr = std::shared_ptr<KRDBEntity>;

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::dateWithTimeIntervalSinceNow(10));
}

std::shared_ptr<KRTestExifReader> reader(const std::string& url) {
  return KRTestExifReader::make({url, 6000, 4000, 1000, KRDate::dateWithTimeIntervalSince1970(1600000000),
                                 KRDate::dateWithTimeIntervalSince1970(1500000000)});
}

int64_t dbidOf(const EntityPtr& entity) { return entity->entityID()->dbid(); }

// The dbids of the entities, sorted.
template <class Entities>
std::vector<int64_t> idsOf(const Entities& entities) {
  std::vector<int64_t> ids;
  for (const auto& entity : entities) ids.push_back(dbidOf(entity));
  std::sort(ids.begin(), ids.end());
  return ids;
}

// Whether one captured log line carries the converted engine exception tagged with the description.
bool loggedTag(const KRCapturingLogSink& sink, const std::string& tag) {
  for (const auto& record : sink.records()) {
    if (record.level == KRLogLevelError && record.message.find(", tag:" + tag + ": ") != std::string::npos)
      return true;
  }
  return false;
}

// Checks that the action raises the converted engine exception tagged with the description.
void expectRaisesTagged(const std::function<void()>& action, const std::string& tag) {
  KRCapturingLogSink sink;
  try {
    action();
    ADD_FAILURE() << "no exception for " << tag;
  } catch (const KRException& exception) {
    EXPECT_NE(exception.name().str().find(", tag:" + tag + ": "), std::string::npos)
        << exception.name().str();
    EXPECT_EQ(exception.userInfo().objectForKey(KRDBExceptionDescription), KRValue(tag));
  }
  EXPECT_TRUE(loggedTag(sink, tag)) << tag;
}

class KRDBCatalogRelationsTest : public testing::Test {
 protected:
  void SetUp() override { counter = std::make_unique<KRCommitCounter>(path()); }

  std::string path() const { return store.file("catalog.krcatalog"); }

  // A catalog over a second file whose schema was never made: every engine read and write fails.
  std::shared_ptr<KRDBCatalog> catalogWithoutSchema() const {
    return KRDBCatalog::initWithContentsOfFile(store.file("empty.krcatalog"), nullptr);
  }

  void onQueue(const std::function<void(KRDBCatalog&)>& work) { store.onQueue(work); }
  template <class T>
  std::shared_ptr<T> create(int64_t type, const KRDictionary& info = {}) {
    return store.create<T>(type, info);
  }
  std::shared_ptr<KRDBCollection> collection() { return create<KRDBCollection>(KRDBEntityTypeCollection); }
  std::shared_ptr<KRDBImage> image() { return create<KRDBImage>(KRDBEntityTypeImage); }
  std::shared_ptr<KRDBPath> folderPath(const std::string& text,
                                       const std::shared_ptr<KRDBVolume>& volume = {}) {
    KRDBEntityArray paths;
    KRDictionary info{{"DBPathInfoPath", text}};
    if (volume) info = KRDictionary{{"DBPathInfoPath", text}, {"DBPathInfoVolume", volume}};
    onQueue([&](KRDBCatalog& queue) { paths = queue.createDBPathsWithEntitiesInfo({info}); });
    return std::dynamic_pointer_cast<KRDBPath>(paths.at(0));
  }
  // An image whose folder is the path.
  std::shared_ptr<KRDBImage> imageIn(const std::shared_ptr<KRDBPath>& folder, const std::string& name) {
    KRDBEntityArray images;
    onQueue([&](KRDBCatalog& queue) {
      images =
          queue.createDBImagesWithEntitiesInfo({KRDictionary{{"DBImageInfoExifReader", reader("/" + name)},
                                                             {"DBImageInfoImageName", name},
                                                             {"DBImageInfoFolderDBPath", folder}}});
    });
    return std::dynamic_pointer_cast<KRDBImage>(images.at(0));
  }
  std::shared_ptr<KRDBReferencedFolder> referencedFolder(const std::shared_ptr<KRDBPath>& folder,
                                                         const EntityPtr& parent = {}) {
    KRDictionary info{{"DBReferencedFolderPath", folder}};
    if (parent) info = KRDictionary{{"DBReferencedFolderPath", folder}, {"DBReferencedFolderParent", parent}};
    return create<KRDBReferencedFolder>(KRDBEntityTypeReferencedFolder, info);
  }
  std::shared_ptr<KRDBImageState> state(const std::string& guid) {
    return create<KRDBImageState>(KRDBEntityTypeImageState, {{"guid", guid}});
  }
  int64_t rows(const std::string& table) const { return counter->integer("SELECT count(*) FROM " + table); }
  // Runs SQL on the file through a writable connection of the test's own.
  void execute(const std::string& sql) const {
    sqlite3* db = nullptr;
    ASSERT_EQ(sqlite3_open(path().c_str(), &db), SQLITE_OK);
    EXPECT_EQ(sqlite3_exec(db, sql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK) << sql;
    sqlite3_close(db);
  }
  // Runs the main loop until every block the queue posted to it before now has run.
  void drain() const {
    bool drained = false;
    catalog->waitForAllDataBaseOperationsWithHandler([&drained] { drained = true; });
    ASSERT_TRUE(runMainLoopUntil([&drained] { return drained; }));
  }

  KRContextCatalog store;
  std::shared_ptr<KRDBCatalog> catalog = store.catalog();
  std::unique_ptr<KRCommitCounter> counter;
};

// ---- Trees

TEST_F(KRDBCatalogRelationsTest, CollectionChildrenDescendantsAndParentFollowTheTree) {
  const auto top = collection();
  const auto child = collection();
  const auto grandchild = collection();
  catalog->addChilds({child}, top, nullptr, true);
  catalog->addChilds({grandchild}, child, nullptr, true);
  const KRDBEntitySet children = catalog->fetchChildsOfFilter(top);
  EXPECT_EQ(idsOf(children), std::vector<int64_t>{dbidOf(child)});
  const auto wrapped = std::dynamic_pointer_cast<KRDBCollection>(*children.begin());
  ASSERT_TRUE(wrapped);
  EXPECT_FALSE(wrapped->parentPrimitive());
  KRDBEntitySet descendants;
  onQueue([&](KRDBCatalog& queue) { descendants = queue.fetchDescendantsOfFilterSync(top); });
  EXPECT_EQ(idsOf(descendants), (std::vector<int64_t>{dbidOf(child), dbidOf(grandchild)}));
  const auto parent = catalog->fetchParentOfFilter(grandchild);
  ASSERT_TRUE(std::dynamic_pointer_cast<KRDBCollection>(parent));
  EXPECT_EQ(dbidOf(parent), dbidOf(child));
  const auto root = catalog->fetchParentOfFilter(top);
  ASSERT_TRUE(root);
  EXPECT_EQ(dbidOf(root), 1);
  EXPECT_FALSE(catalog->fetchParentOfFilter(root));
}

TEST_F(KRDBCatalogRelationsTest, ReferencedFolderChildrenAreLinkedToTheirParent) {
  const auto top = referencedFolder(folderPath("/Photos"));
  const auto child = referencedFolder(folderPath("/Photos/2024"), top);
  const auto grandchild = referencedFolder(folderPath("/Photos/2024/May"), child);
  const KRDBEntitySet children = catalog->fetchChildsOfFilter(top);
  ASSERT_EQ(idsOf(children), std::vector<int64_t>{dbidOf(child)});
  const auto wrapped = std::dynamic_pointer_cast<KRDBReferencedFolder>(*children.begin());
  ASSERT_TRUE(wrapped);
  EXPECT_EQ(wrapped->parentPrimitive(), top);
  std::optional<KRDBEntitySet> descendants;
  catalog->fetchDescendantsOfFilter(
      top, [&](KRDBEntitySet found) { descendants = std::move(found); }, true);
  ASSERT_TRUE(descendants);
  EXPECT_EQ(idsOf(*descendants), (std::vector<int64_t>{dbidOf(child), dbidOf(grandchild)}));
  const auto parent = catalog->fetchParentOfFilter(grandchild);
  ASSERT_TRUE(std::dynamic_pointer_cast<KRDBReferencedFolder>(parent));
  EXPECT_EQ(dbidOf(parent), dbidOf(child));
}

TEST_F(KRDBCatalogRelationsTest, SmartFilterChildrenAreItsOnlyLevelAndAreLinkedToIt) {
  const auto top = create<KRDBSmartFilter>(KRDBEntityTypeSmartFilter);
  auto record = std::make_shared<dbcore::DBSmartFilter>();
  record->name = L"Child";
  onQueue([&](KRDBCatalog& queue) {
    queue.handleDBReactorBlock([&](const Reactor& reactor) { *reactor << record; }, "test", true);
  });
  // The engine has no call that puts a smart filter under another: the test links them itself.
  execute("UPDATE smart_filters SET parent_id = " + std::to_string(dbidOf(top)) +
          " WHERE _id_int_64 = " + std::to_string(record->id()));
  const KRDBEntitySet children = catalog->fetchChildsOfFilter(top);
  ASSERT_EQ(idsOf(children), std::vector<int64_t>{record->id()});
  const auto wrapped = std::dynamic_pointer_cast<KRDBSmartFilter>(*children.begin());
  ASSERT_TRUE(wrapped);
  EXPECT_EQ(wrapped->parentPrimitive(), top);
  KRDBEntitySet descendants;
  onQueue([&](KRDBCatalog& queue) { descendants = queue.fetchDescendantsOfFilterSync(top); });
  EXPECT_EQ(idsOf(descendants), std::vector<int64_t>{record->id()});
  EXPECT_FALSE(catalog->fetchParentOfFilter(top));
}

TEST_F(KRDBCatalogRelationsTest, ChildrenOfAnEntityThatIsNoTreeFolderFormAnEmptySet) {
  EXPECT_TRUE(catalog->fetchChildsOfFilter(image()).empty());
  EXPECT_TRUE(catalog->fetchChildsOfFilter(create<KRDBVolume>(KRDBEntityTypeVolume)).empty());
  EXPECT_TRUE(catalog->fetchChildsOfFilter(nullptr).empty());
  EXPECT_FALSE(catalog->fetchParentOfFilter(image()));
}

TEST_F(KRDBCatalogRelationsTest, ChildrenThatTheEngineCannotReadFormAnEmptySet) {
  const auto broken = catalogWithoutSchema();
  auto record = std::make_shared<dbcore::DBFilter>();
  record->set_id(2);
  const auto folder = KRDBCollection::initWithDBEntity(record);
  EXPECT_TRUE(broken->fetchChildsOfFilter(folder).empty());
}

TEST_F(KRDBCatalogRelationsTest, AddingChildrenThatAreAlreadyChildrenMakesNoEngineCall) {
  const auto top = collection();
  const auto first = collection();
  const auto second = collection();
  catalog->addChilds({first, second}, top, nullptr, true);
  EXPECT_EQ(idsOf(catalog->fetchChildsOfFilter(top)), (std::vector<int64_t>{dbidOf(first), dbidOf(second)}));
  counter->changedSinceLastLook();
  // Fresh entities of the same records: the identifiers decide.
  catalog->addChilds({KRDBCollection::initWithDBEntity(first->dbentity()), second}, top, nullptr, true);
  EXPECT_FALSE(counter->changedSinceLastLook());
  EXPECT_EQ(idsOf(catalog->fetchChildsOfFilter(top)), (std::vector<int64_t>{dbidOf(first), dbidOf(second)}));
}

TEST_F(KRDBCatalogRelationsTest, AddingSeveralChildrenIsOneCommitAndOtherTargetsDoNothing) {
  const auto top = referencedFolder(folderPath("/A"));
  const auto first = referencedFolder(folderPath("/B"));
  const auto second = referencedFolder(folderPath("/C"));
  const int64_t before = counter->commitsInLog();
  catalog->addChilds({first, second}, top, nullptr, true);
  EXPECT_EQ(counter->commitsInLog() - before, 1);
  EXPECT_EQ(idsOf(catalog->fetchChildsOfFilter(top)), (std::vector<int64_t>{dbidOf(first), dbidOf(second)}));
  counter->changedSinceLastLook();
  catalog->addChilds({collection()}, image(), nullptr, true);
  counter->changedSinceLastLook();
  const auto smart = create<KRDBSmartFilter>(KRDBEntityTypeSmartFilter);
  counter->changedSinceLastLook();
  catalog->addChilds({create<KRDBSmartFilter>(KRDBEntityTypeSmartFilter)}, smart, nullptr, true);
  counter->changedSinceLastLook();
  catalog->addChilds({first}, smart, nullptr, true);
  EXPECT_FALSE(counter->changedSinceLastLook());
}

// The children read fails into an empty set on a file without schema, so the moves reach the engine.
TEST_F(KRDBCatalogRelationsTest, MovesTheEngineRefusesRaiseTaggedExceptions) {
  const auto broken = catalogWithoutSchema();
  const auto folderWithID = []<class Entity, class Record>(std::shared_ptr<Record> record, int64_t id) {
    record->set_id(id);
    return Entity::initWithDBEntity(record);
  };
  const auto top = folderWithID.operator()<KRDBCollection>(std::make_shared<dbcore::DBFilter>(), 2);
  const auto child = folderWithID.operator()<KRDBCollection>(std::make_shared<dbcore::DBFilter>(), 3);
  const auto folder =
      folderWithID.operator()<KRDBReferencedFolder>(std::make_shared<dbcore::DBRefFolder>(), 2);
  const auto subfolder =
      folderWithID.operator()<KRDBReferencedFolder>(std::make_shared<dbcore::DBRefFolder>(), 3);
  expectRaisesTagged([&] { broken->addChilds({child}, top, nullptr, true); }, "MoveFilter");
  expectRaisesTagged([&] { broken->addChilds({subfolder}, folder, nullptr, true); }, "MoveRefFolder");
}

// ---- Members

TEST_F(KRDBCatalogRelationsTest, AnImageAddedTwiceToACollectionIsAMemberOnce) {
  const auto trip = collection();
  const auto first = image();
  const auto second = image();
  catalog->addImages({first}, trip, nullptr, true);
  counter->changedSinceLastLook();
  catalog->addImages({KRDBImage::initWithDBEntity(first->dbentity())}, trip, nullptr, true);
  EXPECT_FALSE(counter->changedSinceLastLook());
  catalog->addImages({first, second}, trip, nullptr, true);
  EXPECT_EQ(rows("filter_images"), 2);
  EXPECT_EQ(idsOf(catalog->fetchImagesOfFilter(trip)), (std::vector<int64_t>{dbidOf(first), dbidOf(second)}));
  EXPECT_EQ(idsOf(catalog->fetchFiltersOfImage(first)), std::vector<int64_t>{dbidOf(trip)});
}

TEST_F(KRDBCatalogRelationsTest, AMemberMarkedToDeleteIsStillAMemberForAddingAndRemoving) {
  const auto trip = collection();
  const auto marked = image();
  catalog->addImages({marked}, trip, nullptr, true);
  marked->setMarkedToDelete(true);
  catalog->updateEntitiesSync({marked});
  ASSERT_TRUE(catalog->fetchImagesOfFilter(trip).empty());
  KRDBEntitySet added{marked};
  catalog->addImages(
      {marked}, trip, [&added](KRDBEntitySet answer) { added = std::move(answer); }, true);
  EXPECT_TRUE(added.empty());
  EXPECT_EQ(rows("filter_images"), 1);
  KRDBEntitySet removed;
  catalog->deleteImages(
      {marked}, trip, [&removed](KRDBEntitySet answer) { removed = std::move(answer); }, true);
  EXPECT_EQ(removed, KRDBEntitySet{marked});
  EXPECT_EQ(rows("filter_images"), 0);
}

TEST_F(KRDBCatalogRelationsTest, RemovingAnImageThatIsNotInTheCollectionDoesNothing) {
  const auto trip = collection();
  const auto other = collection();
  const auto member = image();
  const auto outsider = image();
  catalog->addImages({member, outsider}, other, nullptr, true);
  catalog->addImages({member}, trip, nullptr, true);
  counter->changedSinceLastLook();
  catalog->deleteImages({outsider}, trip, nullptr, true);
  EXPECT_FALSE(counter->changedSinceLastLook());
  EXPECT_EQ(rows("filter_images"), 3);
  catalog->deleteImages({member, outsider}, trip, nullptr, true);
  EXPECT_TRUE(catalog->fetchImagesOfFilter(trip).empty());
  EXPECT_EQ(idsOf(catalog->fetchFiltersOfImage(member)), std::vector<int64_t>{dbidOf(other)});
  EXPECT_EQ(idsOf(catalog->fetchFiltersOfImage(outsider)), std::vector<int64_t>{dbidOf(other)});
}

TEST_F(KRDBCatalogRelationsTest, AReferencedFolderHoldsTheImagesAtOrUnderItsPath) {
  const auto photos = folderPath("/Photos");
  const auto folder = referencedFolder(photos);
  const auto inside = imageIn(photos, "a.jpg");
  const auto below = imageIn(folderPath("/Photos/2024"), "b.jpg");
  imageIn(folderPath("/Photosphere"), "c.jpg");
  imageIn(folderPath("/Other"), "d.jpg");
  EXPECT_EQ(idsOf(catalog->fetchImagesOfFilter(folder)),
            (std::vector<int64_t>{dbidOf(inside), dbidOf(below)}));
  // A folder entity without its path entity finds its path by the record's path id.
  const auto bare = KRDBReferencedFolder::initWithDBEntity(folder->dbentity());
  EXPECT_EQ(idsOf(catalog->fetchImagesOfFilter(bare)), (std::vector<int64_t>{dbidOf(inside), dbidOf(below)}));
  const auto elsewhere = image();
  catalog->addImages({inside, elsewhere}, folder, nullptr, true);
  EXPECT_EQ(rows("referenced_folder_images"), 1);
  EXPECT_EQ(counter->integer("SELECT image_id FROM referenced_folder_images"), dbidOf(elsewhere));
}

TEST_F(KRDBCatalogRelationsTest, ASmartFilterHoldsTheImagesThatSatisfyItsConditions) {
  const auto wide = imageIn(folderPath("/A"), "wide.jpg");
  image();
  auto record = std::make_shared<dbcore::DBSmartFilter>();
  record->filter_conditions = L"{\"imageCondition\":\"width > 5000\"}";
  const auto smart = KRDBSmartFilter::initWithDBEntity(record);
  EXPECT_EQ(idsOf(catalog->fetchImagesOfFilter(smart)), std::vector<int64_t>{dbidOf(wide)});
  record->filter_conditions = L"{}";
  EXPECT_EQ(catalog->fetchImagesOfFilter(KRDBSmartFilter::initWithDBEntity(record)).size(), 2u);
  EXPECT_TRUE(catalog->fetchImagesOfFilter(wide).empty());
}

// ---- History states

TEST_F(KRDBCatalogRelationsTest, StatesAreWrittenWithTheirCurrentOneAndReadBackInOrder) {
  const auto picture = image();
  const auto other = image();
  const auto first = state("first");
  const auto second = state("second");
  const auto third = state("third");
  catalog->setStates({first, second, third}, second, picture);
  catalog->setStatesArray({{third}}, {nullptr}, {other});
  drain();
  const KRDBImageStates states = catalog->fetchStatesOfImage(picture);
  ASSERT_EQ(states.size(), 3u);
  EXPECT_EQ(states[0]->guid(), KRString("first"));
  EXPECT_EQ(states[1]->guid(), KRString("second"));
  EXPECT_EQ(states[2]->guid(), KRString("third"));
  ASSERT_TRUE(catalog->fetchCurrentStateForImage(picture));
  EXPECT_EQ(catalog->fetchCurrentStateForImage(picture)->guid(), KRString("second"));
  EXPECT_EQ(catalog->fetchStatesOfImage(other).size(), 1u);
  EXPECT_FALSE(catalog->fetchCurrentStateForImage(other));
  catalog->setCurrentState(third, picture);
  std::optional<KRDBCatalog::ImageStatesByID> current;
  catalog->fetchCurrentStatesForImages(
      {picture, other}, [&](KRDBCatalog::ImageStatesByID found) { current = std::move(found); }, false);
  ASSERT_TRUE(runMainLoopUntil([&] { return current.has_value(); }));
  ASSERT_EQ(current->size(), 1u);
  EXPECT_EQ(current->at(dbidOf(picture))->guid(), KRString("third"));
}

TEST_F(KRDBCatalogRelationsTest, QueuedWritesTheEngineRefusesAreLoggedWithTheirTags) {
  const auto broken = catalogWithoutSchema();
  const auto picture = KRDBImage::initWithDBEntity(std::make_shared<dbcore::DBImage>());
  const auto step = KRDBImageState::initWithDBEntity(std::make_shared<dbcore::DBImgHistoryState>());
  const auto path = KRDBPath::initWithDBEntity(std::make_shared<dbcore::DBPath>());
  const auto volume = KRDBVolume::initWithDBEntity(std::make_shared<dbcore::DBVolume>());
  KRCapturingLogSink sink;
  std::optional<bool> renamed;
  broken->setStates({step}, step, picture);
  broken->setCurrentState(step, picture);
  broken->setVolume(volume, path);
  broken->renamePath("/a", volume, "/b", volume, [&](bool outcome) { renamed = outcome; });
  broken->bindFolderDBPath(path, {picture});
  broken->rebindFolderDBPath(path, {picture});
  bool drained = false;
  broken->waitForAllDataBaseOperationsWithHandler([&] { drained = true; });
  ASSERT_TRUE(runMainLoopUntil([&] { return drained; }));
  for (const char* tag : {"SetStatesByVector", "SetCurrentState", "BindDBPathDBVolume", "RenamePath",
                          "BindDBAttributesDBImageArray", "ReBindDBAttributesDBImageArray"})
    EXPECT_TRUE(loggedTag(sink, tag)) << tag;
  ASSERT_TRUE(renamed);
  EXPECT_FALSE(*renamed);
}

// ---- Favorite aliases

TEST_F(KRDBCatalogRelationsTest, AnEntityWithoutAliasGetsOneOnceAndTheFlagTellsWhenItWasMade) {
  const auto trip = collection();
  bool created = false;
  const auto alias = catalog->fetchFavoriteAliasForEntity(trip, &created);
  ASSERT_TRUE(alias);
  EXPECT_TRUE(created);
  EXPECT_EQ(alias->originalEntityPrimitive(), trip);
  EXPECT_EQ(trip->favoriteAliasPrimitive(), alias);
  EXPECT_EQ(alias->dbalias()->orig_id, dbidOf(trip));
  EXPECT_EQ(alias->dbalias()->orig_type, dbcore::kDBFilterType);
  bool again = false;
  const auto second = catalog->fetchFavoriteAliasForEntity(trip, &again);
  ASSERT_TRUE(second);
  EXPECT_FALSE(again);
  EXPECT_EQ(dbidOf(second), dbidOf(alias));
  EXPECT_EQ(rows("entity_favorite_aliases"), 1);
}

// ---- Folders, volumes and attributes

TEST_F(KRDBCatalogRelationsTest, FoldersVolumesAndAttributesAreFoundBothWays) {
  const auto volume = create<KRDBVolume>(KRDBEntityTypeVolume);
  const auto photos = folderPath("/Photos", volume);
  const auto picture = imageIn(photos, "a.jpg");
  const auto folder = referencedFolder(photos);
  std::shared_ptr<KRDBPath> imageFolder;
  onQueue([&](KRDBCatalog& queue) { imageFolder = queue.fetchDBPathForImageSync(picture); });
  ASSERT_TRUE(imageFolder);
  EXPECT_EQ(dbidOf(imageFolder), dbidOf(photos));
  ASSERT_TRUE(catalog->fetchVolumeForPath(photos));
  EXPECT_EQ(dbidOf(catalog->fetchVolumeForPath(photos)), dbidOf(volume));
  ASSERT_TRUE(catalog->fetchPathForReferencedFolder(folder));
  EXPECT_EQ(dbidOf(catalog->fetchPathForReferencedFolder(folder)), dbidOf(photos));
  EXPECT_FALSE(catalog->fetchPathForReferencedFolder(
      KRDBReferencedFolder::initWithDBEntity(std::make_shared<dbcore::DBRefFolder>())));
  const auto attributes = catalog->fetchAttributesForImage(picture);
  const auto exiv = catalog->fetchExivAttributesForImage(picture);
  ASSERT_TRUE(attributes && exiv);
  EXPECT_EQ(attributes->imagePrimitive(), picture);
  ASSERT_TRUE(catalog->fetchImageForAttributes(attributes));
  EXPECT_EQ(dbidOf(catalog->fetchImageForAttributes(attributes)), dbidOf(picture));
  ASSERT_TRUE(catalog->fetchImageForExivAttributes(exiv));
  EXPECT_EQ(dbidOf(catalog->fetchImageForExivAttributes(exiv)), dbidOf(picture));
  EXPECT_FALSE(catalog->fetchVolumeForPath(folderPath("/Loose")));
}

TEST_F(KRDBCatalogRelationsTest, QueuedFolderWritesBindVolumesRenameAndRebindImages) {
  const auto volume = create<KRDBVolume>(KRDBEntityTypeVolume);
  const auto other = create<KRDBVolume>(KRDBEntityTypeVolume);
  const auto photos = folderPath("/Photos", volume);
  const auto archive = folderPath("/Archive", volume);
  const auto first = image();
  const auto second = image();
  catalog->setVolume(other, archive);
  catalog->bindFolderDBPath(photos, {first, second});
  std::optional<bool> renamed;
  catalog->renamePath("/Photos", volume, "/Pictures", volume, [&](bool outcome) { renamed = outcome; });
  ASSERT_TRUE(runMainLoopUntil([&] { return renamed.has_value(); }));
  EXPECT_TRUE(*renamed);
  EXPECT_EQ(dbidOf(catalog->fetchVolumeForPath(archive)), dbidOf(other));
  EXPECT_EQ(
      counter->text("SELECT path_wide_ch FROM paths WHERE _id_int_64 = " + std::to_string(dbidOf(photos))),
      "/Pictures");
  catalog->rebindFolderDBPath(archive, {second});
  drain();
  std::shared_ptr<KRDBPath> firstFolder;
  std::shared_ptr<KRDBPath> secondFolder;
  onQueue([&](KRDBCatalog& queue) {
    firstFolder = queue.fetchDBPathForImageSync(first);
    secondFolder = queue.fetchDBPathForImageSync(second);
  });
  ASSERT_TRUE(firstFolder && secondFolder);
  EXPECT_EQ(dbidOf(firstFolder), dbidOf(photos));
  EXPECT_EQ(dbidOf(secondFolder), dbidOf(archive));
}

// ---- Delivery

// Calls the asynchronous form of every family and counts the handlers that ran and those off the main thread.
struct HandledCalls {
  static constexpr int kCount = 12;
  int handled = 0;
  int offMain = 0;

  void note() {
    ++handled;
    if (!KRRunLoop::isMainThread()) ++offMain;
  }

  void callAll(KRDBCatalog& catalog, const std::shared_ptr<KRDBCollection>& filter,
               const std::shared_ptr<KRDBImage>& image, bool sync) {
    catalog.fetchChildsOfFilter(
        filter, [this](KRDBEntitySet) { note(); }, sync);
    catalog.fetchDescendantsOfFilter(
        filter, [this](KRDBEntitySet) { note(); }, sync);
    catalog.fetchParentOfFilter(
        filter, [this](KRDBCatalog::FolderPtr) { note(); }, sync);
    catalog.addChilds(
        {}, filter, [this](KRDBEntitySet) { note(); }, sync);
    catalog.fetchImagesOfFilter(
        filter, [this](KRDBEntityArray) { note(); }, sync);
    catalog.addImages(
        {image}, filter, [this](KRDBEntitySet) { note(); }, sync);
    catalog.deleteImages(
        {image}, filter, [this](KRDBEntitySet) { note(); }, sync);
    catalog.fetchFiltersOfImage(
        image, [this](KRDBEntitySet) { note(); }, sync);
    catalog.fetchStatesOfImage(
        image, [this](KRDBImageStates) { note(); }, sync);
    catalog.fetchCurrentStateForImage(
        image, [this](std::shared_ptr<KRDBImageState>) { note(); }, sync);
    catalog.fetchFavoritealiasForEntity(
        image, nullptr, [this](std::shared_ptr<KRDBEntityFavoriteAlias>) { note(); }, sync);
    catalog.fetchAttributesForImage(
        image, [this](std::shared_ptr<KRDBImageAttributes>) { note(); }, sync);
  }
};

TEST_F(KRDBCatalogRelationsTest, AsynchronousFormsDeliverOnTheMainThreadAfterTheQueueRan) {
  const auto trip = collection();
  const auto picture = image();
  HandledCalls calls;
  calls.callAll(*catalog, trip, picture, false);
  EXPECT_EQ(calls.handled, 0);
  ASSERT_TRUE(runMainLoopUntil([&] { return calls.handled == HandledCalls::kCount; }));
  EXPECT_EQ(calls.offMain, 0);
  EXPECT_EQ(rows("filter_images"), 0);
  EXPECT_EQ(rows("entity_favorite_aliases"), 1);
}

TEST_F(KRDBCatalogRelationsTest, SynchronousFormsCallTheirHandlersOnTheQueueBeforeReturning) {
  HandledCalls calls;
  calls.callAll(*catalog, collection(), image(), true);
  EXPECT_EQ(calls.handled, HandledCalls::kCount);
  EXPECT_EQ(calls.offMain, HandledCalls::kCount);
}

TEST_F(KRDBCatalogRelationsTest, AfterClosingNoOperationRunsAndNoHandlerIsCalled) {
  const auto trip = collection();
  const auto picture = image();
  bool closed = false;
  catalog->closeAfterAllDataBaseOperationsWithHandler([&] { closed = true; });
  HandledCalls calls;
  calls.callAll(*catalog, trip, picture, false);
  calls.callAll(*catalog, trip, picture, true);
  bool renameCalled = false;
  catalog->renamePath("/a", nullptr, "/b", nullptr, [&](bool) { renameCalled = true; });
  catalog->setStates({}, nullptr, picture);
  bool created = false;
  EXPECT_FALSE(catalog->fetchFavoriteAliasForEntity(picture, &created));
  EXPECT_TRUE(catalog->fetchChildsOfFilter(trip).empty());
  EXPECT_FALSE(catalog->fetchAttributesForImage(picture));
  ASSERT_TRUE(runMainLoopUntil([&] { return closed; }));
  drain();
  EXPECT_EQ(calls.handled, 0);
  EXPECT_FALSE(renameCalled);
  EXPECT_FALSE(created);
}

}  // namespace
