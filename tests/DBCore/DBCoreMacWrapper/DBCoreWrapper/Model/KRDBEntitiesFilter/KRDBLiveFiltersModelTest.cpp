#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "KRContextCatalog.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBIntersectEntitiesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBUnionEntitiesFilter.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"

namespace {

using FilterPtr = std::shared_ptr<KRDBEntitiesFilter>;

constexpr int kImages = 40;
constexpr int kOperations = 5000;

int32_t ratingOf(const KRDBEntitiesFilter::EntityPtr& entity) {
  const auto& attributes = std::static_pointer_cast<KRDBImage>(entity)->attributesPrimitive();
  return attributes ? attributes->rating() : 0;
}

// Five filters over one context: the images (by rating, then id, through a comparator), those rated 3 or
// more (a subfilter, by id), the images of a collection, the union of the last two and the intersection of
// the first and the collection's.
struct KRFilterSet {
  FilterPtr images, rated, collected, either, both;

  std::vector<FilterPtr> all() const { return {images, rated, collected, either, both}; }

  static KRFilterSet make(const std::shared_ptr<KRDBContext>& context,
                          const std::shared_ptr<KRDBCollection>& album) {
    KRFilterSet set;
    const auto byID = std::make_shared<const KRSortDescriptors>(
        KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)});
    auto request = KRDBFilteredImagesFetchRequest::init();
    request->setFilterConditions({{"imageCondition", "import_index >= 0"}});
    set.images = KRDBImagesFilter::initWithContext(context, request);
    set.images->setComparator(
        std::make_shared<const KRDBEntitiesFilter::Comparator>([](const auto& a, const auto& b) {
          const auto key = [](const auto& entity) {
            return std::make_pair(ratingOf(entity), entity->entityID()->dbid());
          };
          return key(a) < key(b) ? -1 : key(b) < key(a) ? 1 : 0;
        }));
    const auto rated = KRDBEntitiesSubfilter::initWithEntitiesFilter(set.images);
    rated->setPredicate(KRPredicate::predicateWithBlock([](const KRValue& object, const KRDictionary&) {
      return ratingOf(object.objectAs<KRDBEntity>()) >= 3;
    }));
    rated->setSortDescriptors(byID);
    set.rated = rated;
    auto inAlbum = KRDBFilteredImagesFetchRequest::init();
    inAlbum->setFilters(std::make_shared<const KRDBEntitySet>(KRDBEntitySet{album}));
    // With an image condition the in-memory test, like the engine's query, leaves out marked images.
    inAlbum->setFilterConditions({{"imageCondition", "import_index >= 0"}});
    set.collected = KRDBImagesFilter::initWithContext(context, inAlbum);
    set.collected->setSortDescriptors(byID);
    set.either = KRDBUnionEntitiesFilter::initWithEntitiesFilters({set.rated, set.collected});
    set.either->setSortDescriptors(byID);
    set.both = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({set.images, set.collected});
    set.both->setSortDescriptors(byID);
    for (const auto& filter : set.all()) {
      bool done = false;
      filter->obtainSortedEntities([&done](const auto&) { done = true; });
      EXPECT_TRUE(KRContextCatalog::runUntil([&done] { return done; }));
    }
    return set;
  }
};

// The filter's sorted ids and whether its set and index agree with its array.
std::vector<int64_t> sortedIDs(const FilterPtr& filter) {
  std::vector<int64_t> ids;
  const auto& array = filter->sortedEntities();
  if (!array) return ids;
  EXPECT_EQ(filter->entities()->size(), array->size());
  for (size_t position = 0; position < array->size(); ++position) {
    EXPECT_EQ(filter->indexOfEntity((*array)[position]), position);
    EXPECT_TRUE(filter->containsEntity((*array)[position]));
    ids.push_back((*array)[position]->entityID()->dbid());
  }
  return ids;
}

class KRDBLiveFiltersModelTest : public testing::Test {
 protected:
  void SetUp() override {
    const auto folders = std::vector{store.folder("/photos/a")};
    const auto written = store.images(kImages, folders);
    const auto created = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    store.onQueue([&](KRDBCatalog& queue) {
      queue.addImagesSync({written[0], written[1], written[2]}, created);
    });
    context = KRDBContext::initWithCatalog(store.catalog());
    context->setUndoManager(undoManager);
    album = std::static_pointer_cast<KRDBCollection>(context->entityWithID(created->entityID()));
    for (const auto& image : written) {
      images.push_back(std::static_pointer_cast<KRDBImage>(context->entityWithID(image->entityID())));
      images.back()->filters();
    }
    album->images();
  }

  // One random edit, as one undo step.
  void edit(std::mt19937& random) {
    const auto image = images[random() % images.size()];
    undoManager->beginUndoGrouping();
    switch (random() % 4) {
      case 0:
        image->attributesPrimitive()->setRating(static_cast<int32_t>(random() % 6));
        break;
      case 1:
        image->setMarkedToDelete(!image->isMarkedToDelete());
        break;
      case 2:
        context->addImages(KRDBEntitySet{image}, std::static_pointer_cast<KRDBAbstractBaseFolder>(album));
        break;
      default:
        context->deleteImages(KRDBEntitySet{image}, std::static_pointer_cast<KRDBAbstractBaseFolder>(album));
        break;
    }
    undoManager->endUndoGrouping();
  }
  void finishTurn() {
    ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
    store.waitForQueue();
  }

  KRContextCatalog store;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<KRUndoManager> undoManager = KRUndoManager::undoManager();
  std::shared_ptr<KRDBCollection> album;
  std::vector<std::shared_ptr<KRDBImage>> images;
};

}  // namespace

TEST_F(KRDBLiveFiltersModelTest, LiveFiltersEqualFreshOnesAfterEveryPass) {
  const KRFilterSet live = KRFilterSet::make(context, album);
  std::mt19937 random(20261124);
  for (int operation = 0; operation < kOperations; ++operation) {
    const unsigned choice = random() % 10;
    if (choice < 7) {
      edit(random);
    } else if (choice < 9 && undoManager->canUndo()) {
      undoManager->undo();
    } else if (undoManager->canRedo()) {
      undoManager->redo();
    }
    finishTurn();
    const KRFilterSet fresh = KRFilterSet::make(context, album);
    const auto liveFilters = live.all();
    const auto freshFilters = fresh.all();
    for (size_t index = 0; index < liveFilters.size(); ++index) {
      ASSERT_EQ(sortedIDs(liveFilters[index]), sortedIDs(freshFilters[index]))
          << "filter " << index << " after operation " << operation;
    }
  }
}
