// A live filter over 1,000,000 images sorted by capture date, kept up to date incrementally, against a
// plain sorted std::vector of pointers with an std::unordered_map from pointer to position to which the
// same changes are applied by binary search, rotation and re-indexing of the moved range only. Then, end
// to end over a catalog of 10,000 images, the time from a rating edit until three live filters (all
// images, a subfilter of them, and the intersection of both) have announced the change.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "KRBenchCatalog.hpp"
#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRPredicate.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRFoundation/KRSortDescriptor.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesChangesStorage.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBIntersectEntitiesFilter.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "dbimage.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

constexpr int kImages = 1000000;
constexpr int kInPlaceUpdates = 2000;
constexpr int kReorders = 20;
constexpr int kBulkUpdated = 10000;
constexpr int kBulkReordered = kBulkUpdated / 100;

void require(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "check failed: %s\n", what);
  std::abort();
}

// Capture dates by image id, which the test changes; both sides order by them (ties by id).
std::vector<double> dates;

int64_t idOf(const KRDBEntity& entity) { return entity.entityID()->dbid(); }
bool before(int64_t a, int64_t b) { return dates[a] < dates[b] || (dates[a] == dates[b] && a < b); }

// Every image belongs; the array is ordered by the capture dates.
class KRDateSortedFilter : public KRDBEntitiesFilter {
 public:
  explicit KRDateSortedFilter(KRDBEntitySet images) : images_(std::move(images)) {
    setComparator(std::make_shared<const Comparator>([](const EntityPtr& a, const EntityPtr& b) {
      const int64_t left = idOf(*a);
      const int64_t right = idOf(*b);
      return before(left, right) ? -1 : before(right, left) ? 1 : 0;
    }));
    // The descriptors order new and moved images among themselves: the same order, by id.
    setSortDescriptors(
        std::make_shared<const KRSortDescriptors>(KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey(
            "entityID.dbid", true, [](const KRValue& a, const KRValue& b) {
              const int64_t left = a.number().longLongValue();
              const int64_t right = b.number().longLongValue();
              return before(left, right)   ? KROrderedAscending
                     : before(right, left) ? KROrderedDescending
                                           : KROrderedSame;
            })}));
  }
  bool isEntitySatisfiesFilterConditions(const EntityPtr& /*entity*/) const override { return true; }
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override {
    completion(std::make_shared<KRDBEntitySet>(images_));
  }

 private:
  KRDBEntitySet images_;
};

// ---- The raw side

struct RawList {
  std::vector<const KRDBEntity*> sorted;
  std::unordered_map<const KRDBEntity*, size_t> positions;

  void index(size_t first, size_t last) {
    for (size_t position = first; position < last; ++position) positions[sorted[position]] = position;
  }
  // Moves the entity to the place its (changed) date gives it.
  void move(const KRDBEntity* entity) {
    const size_t from = positions.at(entity);
    const auto less = [](const KRDBEntity* a, const KRDBEntity* b) { return before(idOf(*a), idOf(*b)); };
    const auto begin = sorted.begin();
    auto target = std::upper_bound(begin, sorted.end(), entity, less);
    size_t to = static_cast<size_t>(target - begin);
    if (to > from) {
      std::rotate(begin + static_cast<long>(from), begin + static_cast<long>(from) + 1, target);
      index(from, to);
    } else {
      target = std::upper_bound(begin, begin + static_cast<long>(from), entity, less);
      to = static_cast<size_t>(target - begin);
      std::rotate(target, begin + static_cast<long>(from), begin + static_cast<long>(from) + 1);
      index(to, from + 1);
    }
  }
};

// ---- Setup

std::vector<std::shared_ptr<KRDBEntity>> makeImages() {
  KRDBEntityClasses::registerAll();
  std::vector<std::shared_ptr<KRDBEntity>> images;
  images.reserve(kImages);
  dates.assign(kImages + 1, 0);
  for (int id = 1; id <= kImages; ++id) {
    auto record = std::make_shared<dbcore::DBImage>();
    record->set_id(id);
    images.push_back(KRDBImage::initWithDBEntity(record));
    dates[id] = static_cast<double>((id * 7919LL) % kImages);
  }
  return images;
}

std::shared_ptr<KRDateSortedFilter> sortedFilter(const std::vector<std::shared_ptr<KRDBEntity>>& images) {
  auto filter = std::make_shared<KRDateSortedFilter>(KRDBEntitySet(images.begin(), images.end()));
  bool sorted = false;
  filter->obtainSortedEntities(
      [&sorted](const KRDBEntitiesFilter::EntityArrayPtr& array) { sorted = array != nullptr; });
  require(sorted, "sorted array");
  return filter;
}

RawList rawList(const KRDBEntitiesFilter& filter) {
  RawList raw;
  for (const auto& entity : *filter.sortedEntities()) raw.sorted.push_back(entity.get());
  raw.positions.reserve(raw.sorted.size());
  raw.index(0, raw.sorted.size());
  return raw;
}

void update(KRDBEntitiesFilter& filter, const KRDBEntitySet& updated) {
  filter.processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(
      nullptr, nullptr, std::make_shared<KRDBEntitySet>(updated), nullptr));
}

// The filter and the raw list agree, position by position.
void verify(const KRDBEntitiesFilter& filter, const RawList& raw) {
  const auto& array = *filter.sortedEntities();
  require(array.size() == raw.sorted.size(), "sizes");
  for (size_t position = 0; position < array.size(); ++position) {
    require(array[position].get() == raw.sorted[position], "same order");
    require(filter.indexOfEntity(array[position]) == position, "index");
  }
}

// ---- Measures

double inPlaceMicroseconds(KRDBEntitiesFilter& filter,
                           const std::vector<std::shared_ptr<KRDBEntity>>& images) {
  const double seconds = KRBenchSqlite::timed([&] {
    for (int i = 0; i < kInPlaceUpdates; ++i)
      update(filter, {images[static_cast<size_t>(i * 389 % kImages)]});
  });
  return seconds * 1e6 / kInPlaceUpdates;
}

// Images moved across half the array, each in its own pass; the seconds of ours and of raw.
std::pair<double, double> reorderSeconds(KRDBEntitiesFilter& filter, RawList& raw) {
  double ours = 0;
  double rawSeconds = 0;
  for (int i = 0; i < kReorders; ++i) {
    const auto& array = *filter.sortedEntities();
    const auto entity = array[static_cast<size_t>(kImages / 4 + i)];
    dates[idOf(*entity)] += kImages / 2;
    ours += KRBenchSqlite::timed([&] { update(filter, {entity}); });
    rawSeconds += KRBenchSqlite::timed([&] { raw.move(entity.get()); });
  }
  return {ours, rawSeconds};
}

// One pass of 10,000 updated images of which 1% move; the seconds of ours and of raw. The raw side takes
// the moves one at a time, each date changed just before its move, so that only one image is out of place.
std::pair<double, double> bulkSeconds(KRDBEntitiesFilter& filter, RawList& raw) {
  const auto array = *filter.sortedEntities();
  KRDBEntitySet updated;
  std::vector<std::pair<const KRDBEntity*, double>> moves;
  for (int i = 0; i < kBulkUpdated; ++i) {
    const auto& entity = array[static_cast<size_t>(i) * (kImages / kBulkUpdated)];
    updated.insert(entity);
    if (i % (kBulkUpdated / kBulkReordered) == 0)
      moves.emplace_back(entity.get(), dates[idOf(*entity)] + kImages / 3);
  }
  const auto oldDates = dates;
  for (const auto& [entity, date] : moves) dates[idOf(*entity)] = date;
  const double ours = KRBenchSqlite::timed([&] { update(filter, updated); });
  dates = oldDates;
  const double rawSeconds = KRBenchSqlite::timed([&] {
    for (const auto& [entity, date] : moves) {
      dates[idOf(*entity)] = date;
      raw.move(entity);
    }
  });
  return {ours, rawSeconds};
}

// ---- End to end: an edit until three live filters over a context have heard of it

constexpr int kEditedCatalogImages = 10000;
constexpr int kEdits = 500;

// Remembers which filters announced a change since the last clear.
class KRNotifiedFilters : public KRObject, public KRDBEntitesFilterUpdateProtocol {
 public:
  void entitiesFilterDidChange(const std::shared_ptr<KRDBEntitiesFilter>& filter,
                               const KRDictionary&) override {
    notified.insert(filter.get());
  }
  std::set<const KRDBEntitiesFilter*> notified;
};

KRDBEntitySet obtained(const std::shared_ptr<KRDBEntitiesFilter>& filter) {
  KRDBEntitySet entities;
  bool done = false;
  filter->obtainEntities([&](const KRDBEntitiesFilter::EntitySetPtr& set) {
    if (set) entities = *set;
    done = true;
  });
  KRRunLoop::mainRunLoop()->runUntil([&done] { return done; }, KRDate::distantFuture());
  return entities;
}

double editToNotifyMicroseconds(const std::string& path) {
  KRBenchCatalog::build(path, kEditedCatalogImages, 100);
  const auto context = KRDBContext::initWithCatalog(KRDBCatalog::initWithContentsOfFile(path, nullptr));
  require(context != nullptr, "context");
  const auto all = context->allImagesFilter();
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(all);
  subfilter->setPredicate(KRPredicate::predicateWithValue(true));
  const auto both = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({all, subfilter});
  const auto listener = std::make_shared<KRNotifiedFilters>();
  const std::vector<std::shared_ptr<KRDBEntitiesFilter>> filters{all, subfilter, both};
  for (const auto& filter : filters) {
    require(obtained(filter).size() == kEditedCatalogImages, "filter obtained");
    filter->addListener(listener);
  }
  const auto images = obtained(all);
  auto image = images.begin();
  double seconds = 0;
  for (int edit = 0; edit < kEdits; ++edit, ++image) {
    const auto attributes = std::static_pointer_cast<KRDBImage>(*image)->attributesPrimitive();
    listener->notified.clear();
    seconds += KRBenchSqlite::timed([&] {
      attributes->setRating((attributes->rating() + 1) % 6);
      KRRunLoop::mainRunLoop()->runUntil([&] { return listener->notified.size() == filters.size(); },
                                         KRDate::distantFuture());
    });
  }
  bool closed = false;
  context->closeAfterAllDataBaseOperationsWithHandler([&closed] { closed = true; });
  KRRunLoop::mainRunLoop()->runUntil([&closed] { return closed; }, KRDate::distantFuture());
  return seconds * 1e6 / kEdits;
}

}  // namespace

int main() {
  std::setvbuf(stdout, nullptr, _IOLBF, 0);
  KRRunLoop::designateMainThread();
  const auto images = makeImages();
  const auto filter = sortedFilter(images);
  RawList raw = rawList(*filter);
  const double inPlace = inPlaceMicroseconds(*filter, images);
  verify(*filter, raw);
  const auto [reorderOurs, reorderRaw] = reorderSeconds(*filter, raw);
  verify(*filter, raw);
  const auto [bulkOurs, bulkRaw] = bulkSeconds(*filter, raw);
  verify(*filter, raw);
  std::printf("REORDER_OURS_MS %.3f\nREORDER_RAW_MS %.3f\n", reorderOurs * 1000 / kReorders,
              reorderRaw * 1000 / kReorders);
  std::printf("BULK_OURS_MS %.1f\nBULK_RAW_MS %.1f\n", bulkOurs * 1000, bulkRaw * 1000);
  std::printf("FILTER_UPDATE_IN_PLACE_US %.1f\n", inPlace);
  std::printf("RATIO filter_reorder %.3f\n", reorderRaw / reorderOurs);
  std::printf("RATIO filter_bulk_update %.3f\n", bulkRaw / bulkOurs);
  const KRTemporaryDirectory scratch;
  std::printf("EDIT_TO_NOTIFY_US %.1f\n", editToNotifyMicroseconds(scratch.file("edits.krcatalog")));
  return 0;
}
