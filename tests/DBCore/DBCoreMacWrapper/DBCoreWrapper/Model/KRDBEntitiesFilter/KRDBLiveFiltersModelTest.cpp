#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "KRContextCatalog.hpp"
#include "KRFilterObserver.hpp"
#include "KRFoundation/KRUndoManager.hpp"
#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBCalendarRootNodeImagesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBImagesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBIntersectEntitiesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBUnionEntitiesFilter.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

namespace {

using FilterPtr = std::shared_ptr<KRDBEntitiesFilter>;
using Ids = std::vector<int64_t>;

constexpr int kImages = 2000;
constexpr int kOperations = 5000;
// Passes of many edits keep the test short (each pass reopens the catalog) and make neighbours change
// together; passes of one edit are as likely as any other size.
constexpr unsigned kEditsPerPass = 40;
// Capture dates lie in [kFirstDate, kFirstDate + kDateSpan); the calendar node takes the middle half.
constexpr double kFirstDate = 1500000000;
constexpr int64_t kDateSpan = 40000000;

const std::shared_ptr<KRDBImageAttributes>& attributesOf(const KRDBEntitiesFilter::EntityPtr& entity) {
  return std::static_pointer_cast<KRDBImage>(entity)->attributesPrimitive();
}
int32_t ratingOf(const KRDBEntitiesFilter::EntityPtr& entity) {
  const auto& attributes = attributesOf(entity);
  return attributes ? attributes->rating() : 0;
}

std::shared_ptr<KRDBFilteredImagesFetchRequest> request(const char* userCondition) {
  auto request = KRDBFilteredImagesFetchRequest::init();
  // With an image condition the in-memory test, like the engine's query, leaves out marked images.
  request->setFilterConditions(
      {{KRImagesConditionType, "import_index >= 0"}, {KRUserAttributesConditionType, userCondition}});
  return request;
}

std::shared_ptr<const KRSortDescriptors> sortedBy(const std::vector<std::string>& keys) {
  KRSortDescriptors descriptors;
  for (const auto& key : keys) descriptors.push_back(KRSortDescriptor::sortDescriptorWithKey(key, true));
  return std::make_shared<const KRSortDescriptors>(std::move(descriptors));
}

// The live filters of one context: the rated, untrashed images by capture date (a request); all images
// by rating then id (a comparator); the picked ones among those (a subfilter); the album's images; the
// picked or album images (a union); the rated album images (an intersection); and a calendar over all
// images with a node for the middle of the dates.
struct KRFilterSet {
  FilterPtr dated, ranked, picked, collected, either, both, calendar, node;

  std::vector<FilterPtr> all() const {
    return {dated, ranked, picked, collected, either, both, calendar, node};
  }

  static KRFilterSet make(const std::shared_ptr<KRDBContext>& context,
                          const std::shared_ptr<KRDBCollection>& album) {
    KRFilterSet set;
    const auto byID = sortedBy({"entityID.dbid"});
    const auto byDate = sortedBy({"exivAttributes.date.timeIntervalSince1970", "entityID.dbid"});
    set.dated = KRDBImagesFilter::initWithContext(context, request("rating >= 2 && trash_bool == false"));
    set.dated->setSortDescriptors(byDate);
    set.ranked = KRDBImagesFilter::initWithContext(context, request("rating >= 0"));
    set.ranked->setComparator(
        std::make_shared<const KRDBEntitiesFilter::Comparator>([](const auto& a, const auto& b) {
          const auto key = [](const auto& entity) {
            return std::make_pair(ratingOf(entity), entity->entityID()->dbid());
          };
          return key(a) < key(b) ? -1 : key(b) < key(a) ? 1 : 0;
        }));
    // The descriptors order the images that enter or move in one pass among themselves: the same order.
    set.ranked->setSortDescriptors(sortedBy({"attributes.rating", "entityID.dbid"}));
    const auto picked = KRDBEntitiesSubfilter::initWithEntitiesFilter(set.ranked);
    picked->setPredicate(KRPredicate::predicateWithBlock([](const KRValue& object, const KRDictionary&) {
      const auto& attributes = attributesOf(object.objectAs<KRDBEntity>());
      return attributes && (attributes->color() == 2 || attributes->rating() >= 4);
    }));
    picked->setSortDescriptors(byID);
    set.picked = picked;
    auto inAlbum = request("rating >= 0");
    inAlbum->setFilters(std::make_shared<const KRDBEntitySet>(KRDBEntitySet{album}));
    set.collected = KRDBImagesFilter::initWithContext(context, inAlbum);
    set.collected->setSortDescriptors(byID);
    set.either = KRDBUnionEntitiesFilter::initWithEntitiesFilters({set.picked, set.collected});
    set.either->setSortDescriptors(byID);
    set.both = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({set.dated, set.collected});
    set.both->setSortDescriptors(byID);
    const auto calendar = KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(set.ranked);
    set.calendar = calendar;
    set.calendar->setSortDescriptors(byDate);
    set.node = KRDBCalendarNodeImagesFilter::initWithParentFilter(calendar, kFirstDate + kDateSpan / 4,
                                                                  kFirstDate + kDateSpan * 3 / 4);
    set.node->setSortDescriptors(byDate);
    for (const auto& filter : set.all()) {
      bool done = false;
      filter->obtainSortedEntities([&done](const auto&) { done = true; });
      EXPECT_TRUE(KRContextCatalog::runUntil([&done] { return done; }));
    }
    return set;
  }
};

// The filter's sorted ids, checking that its set and index agree with its array.
Ids sortedIDs(const FilterPtr& filter) {
  Ids ids;
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

// Where two id lists part: the ids only one holds, else the first position where they differ.
std::string differences(const Ids& live, const Ids& fresh) {
  const std::set<int64_t> liveSet(live.begin(), live.end()), freshSet(fresh.begin(), fresh.end());
  std::string text;
  for (const int64_t id : liveSet) {
    if (!freshSet.count(id)) text += " only live " + std::to_string(id);
  }
  for (const int64_t id : freshSet) {
    if (!liveSet.count(id)) text += " only fresh " + std::to_string(id);
  }
  const auto parting = std::mismatch(live.begin(), live.end(), fresh.begin(), fresh.end());
  if (text.empty() && parting.first != live.end()) {
    text = "first difference at " + std::to_string(parting.first - live.begin()) + ": " +
           std::to_string(*parting.first) + " against " + std::to_string(*parting.second);
  }
  return text;
}

std::set<int64_t> idsUnder(const KRDictionary& info, const char* key) {
  std::set<int64_t> ids;
  if (const auto entities = setUnder(info, key)) {
    for (const auto& entity : *entities) ids.insert(entity->entityID()->dbid());
  }
  return ids;
}

// Replays the list notifications a filter sent since its last state: the entities added and deleted
// turn the old set into the new one, and the entities neither added nor reordered keep their order.
void expectNotificationsAccountFor(const Ids& before, const Ids& after, const KRFilterObserver& observer) {
  std::set<int64_t> members(before.begin(), before.end());
  std::set<int64_t> moved;
  for (const auto& event : observer.events) {
    ASSERT_NE(event.name, "reset");
    if (event.name == "change") continue;
    for (const int64_t id : idsUnder(event.info, "KRDBEntitiesFilterDeletedEntities")) members.erase(id);
    for (const int64_t id : idsUnder(event.info, "KRDBEntitiesFilterAddedEntities")) {
      members.insert(id);
      moved.insert(id);
    }
    if (event.name == "sortedList") {
      const auto reordered = idsUnder(event.info, "KRDBEntitiesFilterReorderedEntities");
      moved.insert(reordered.begin(), reordered.end());
    }
  }
  EXPECT_EQ(members, std::set<int64_t>(after.begin(), after.end()));
  const auto unmoved = [&moved, &members](const Ids& ids) {
    Ids kept;
    std::copy_if(ids.begin(), ids.end(), std::back_inserter(kept),
                 [&](int64_t id) { return members.count(id) && !moved.count(id); });
    return kept;
  };
  EXPECT_EQ(unmoved(before), unmoved(after));
}

// The catalog file opened again, with a context of its own.
struct KRReopenedCatalog {
  explicit KRReopenedCatalog(const std::string& file)
      : catalog(KRDBCatalog::initWithContentsOfFile(file, nullptr)) {
    catalog->initializeAndUpdateIfNeaded();
    context = KRDBContext::initWithCatalog(catalog);
  }
  ~KRReopenedCatalog() {
    bool closed = false;
    context->closeAfterAllDataBaseOperationsWithHandler([&closed] { closed = true; });
    EXPECT_TRUE(KRContextCatalog::runUntil([&closed] { return closed; }));
  }
  // The context's instance of an entity of the first context.
  template <class T>
  std::shared_ptr<T> entityLike(const std::shared_ptr<T>& entity) const {
    return std::static_pointer_cast<T>(context->entityWithID(entity->entityID()));
  }

  std::shared_ptr<KRDBCatalog> catalog;
  std::shared_ptr<KRDBContext> context;
};

class KRDBLiveFiltersModelTest : public testing::Test {
 protected:
  void SetUp() override {
    folders = {store.folder("/photos/a"), store.folder("/photos/b")};
    const auto written = store.images(kImages, folders, takenAt);
    const auto createdAlbum = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    const auto createdOther = store.create<KRDBCollection>(KRDBEntityTypeCollection);
    context = KRDBContext::initWithCatalog(store.catalog());
    context->setUndoManager(undoManager);
    album = collection(createdAlbum);
    other = collection(createdOther);
    for (const auto& image : written) {
      images.push_back(std::static_pointer_cast<KRDBImage>(context->entityWithID(image->entityID())));
      images.back()->filters();
    }
  }

  // The context's instance of a collection, with its images loaded.
  std::shared_ptr<KRDBCollection> collection(const std::shared_ptr<KRDBCollection>& written) {
    auto found = std::static_pointer_cast<KRDBCollection>(context->entityWithID(written->entityID()));
    found->images();
    return found;
  }
  static double takenAt(int index) { return kFirstDate + static_cast<double>((index * 7919) % kDateSpan); }

  // An image still in the context (one whose creation was undone is not).
  std::shared_ptr<KRDBImage> anyImage(std::mt19937& random) {
    for (;;) {
      const auto& image = images[random() % images.size()];
      if (image->context()) return image;
    }
  }
  std::shared_ptr<KRDBAbstractBaseFolder> anyAlbum(std::mt19937& random) {
    return std::static_pointer_cast<KRDBAbstractBaseFolder>(random() % 3 ? album : other);
  }
  void createImage(std::mt19937& random) {
    const int index = static_cast<int>(images.size());
    const std::string name = "NEW_" + std::to_string(index) + ".JPG";
    const double taken = kFirstDate + static_cast<double>(random() % kDateSpan);
    const KRDictionary info{
        {"DBImageInfoExifReader", KRContextCatalog::exifReader(name, index, [taken](int) { return taken; })},
        {"DBImageInfoImageName", name},
        {"DBImageInfoFolderDBPath", folders[random() % folders.size()]}};
    images.push_back(
        std::static_pointer_cast<KRDBImage>(context->createEntityWithType(KRDBEntityTypeImage, info)));
  }
  // One random edit.
  void edit(std::mt19937& random) {
    const auto image = anyImage(random);
    const auto& attributes = image->attributesPrimitive();
    switch (random() % 9) {
      case 0:
        createImage(random);
        break;
      case 1:
      case 2:
        attributes->setRating(static_cast<int32_t>(random() % 6));
        break;
      case 3:
        attributes->setColor(static_cast<int32_t>(random() % 4));
        break;
      case 4:
        image->exivAttributesPrimitive()->setDate(
            KRDate::dateWithTimeIntervalSince1970(kFirstDate + static_cast<double>(random() % kDateSpan)));
        break;
      case 5:
        attributes->setTrashed(!attributes->isTrashed());
        break;
      case 6:
        image->setMarkedToDelete(!image->isMarkedToDelete());
        break;
      case 7:
        context->addImages(KRDBEntitySet{image}, anyAlbum(random));
        break;
      default:
        context->deleteImages(KRDBEntitySet{image}, anyAlbum(random));
        break;
    }
  }
  // Up to kEditsPerPass edits, an undo or a redo; returns the number of operations.
  int operate(std::mt19937& random) {
    const unsigned choice = random() % 10;
    if (choice == 8 && undoManager->canUndo()) {
      undoManager->undo();
      return 1;
    }
    if (choice == 9 && undoManager->canRedo()) {
      undoManager->redo();
      return 1;
    }
    const int edits = 1 + static_cast<int>(random() % kEditsPerPass);
    for (int count = 0; count < edits; ++count) edit(random);
    return edits;
  }
  void finishPass() {
    ASSERT_TRUE(KRContextCatalog::runUntil([&] { return !context->isWaitingForProcessChanges(); }));
    store.waitForQueue();
  }

  KRContextCatalog store;
  std::vector<std::shared_ptr<KRDBPath>> folders;
  std::shared_ptr<KRDBContext> context;
  std::shared_ptr<KRUndoManager> undoManager = KRUndoManager::undoManager();
  std::shared_ptr<KRDBCollection> album;
  std::shared_ptr<KRDBCollection> other;
  std::vector<std::shared_ptr<KRDBImage>> images;
};

}  // namespace

TEST_F(KRDBLiveFiltersModelTest, LiveFiltersEqualFreshOnesOverTheReopenedCatalogAfterEveryPass) {
  const auto live = KRFilterSet::make(context, album).all();
  std::vector<std::shared_ptr<KRFilterObserver>> observers;
  std::vector<Ids> before;
  for (const auto& filter : live) {
    observers.push_back(std::make_shared<KRFilterObserver>());
    filter->addListener(observers.back());
    before.push_back(sortedIDs(filter));
  }
  std::mt19937 random(20261125);
  for (int operations = 0, pass = 0; operations < kOperations; ++pass) {
    operations += operate(random);
    finishPass();
    const KRReopenedCatalog reopened(store.file("catalog.krcatalog"));
    const auto fresh = KRFilterSet::make(reopened.context, reopened.entityLike(album)).all();
    for (size_t index = 0; index < live.size(); ++index) {
      const Ids now = sortedIDs(live[index]);
      const Ids expected = sortedIDs(fresh[index]);
      ASSERT_EQ(now, expected) << "filter " << index << " after pass " << pass << ": "
                               << differences(now, expected);
      expectNotificationsAccountFor(before[index], now, *observers[index]);
      before[index] = now;
      observers[index]->events.clear();
    }
  }
}
