#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "KRFilterObserver.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRTestEntities.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;
using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;
using Ranks = std::unordered_map<const KRDBEntity*, int>;

const char* const kSource =
    "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBEntitiesFilter/KRDBEntitiesFilter";

// A filter whose members are the entities of non-negative rank. The test sets the ranks; the comparator
// orders by rank and the sort descriptors by database id. The initial obtain waits for the test.
class KRRankedFilter : public KRDBEntitiesFilter {
 public:
  explicit KRRankedFilter(const Ranks& ranks) : ranks_(ranks) {}

  using KRDBEntitiesFilter::processUpdateEntities;
  using KRDBEntitiesFilter::resetSortedEntities;
  using KRDBEntitiesFilter::setSortedEntities;

  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override {
    ++tests;
    const auto found = ranks_.find(entity.get());
    return found != ranks_.end() && found->second >= 0;
  }
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override {
    pending.push_back(std::move(completion));
  }

  mutable std::atomic<int> tests = 0;
  std::vector<EntitiesHandler> pending;

 private:
  const Ranks& ranks_;
};

class KRDBEntitiesFilterChangesTest : public testing::Test {
 protected:
  void SetUp() override {
    for (int64_t id = 1; id <= 6; ++id) images.push_back(KRTestEntities::makeImage(id));
    for (size_t index = 0; index < images.size(); ++index) rank(index + 1, 10 * static_cast<int>(index + 1));
    filter->setComparator(std::make_shared<const KRDBEntitiesFilter::Comparator>(
        [this](const EntityPtr& a, const EntityPtr& b) {
          const int left = ranks.at(a.get());
          const int right = ranks.at(b.get());
          return left < right ? -1 : left > right ? 1 : 0;
        }));
    filter->setSortDescriptors(std::make_shared<const KRSortDescriptors>(
        KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)}));
  }

  // Image n (1 to 6) gets the rank; a negative rank keeps it out of the filter.
  void rank(size_t n, int value) { ranks[images[n - 1].get()] = value; }
  EntityPtr image(size_t n) const { return images[n - 1]; }
  EntitySetPtr setOf(std::initializer_list<size_t> numbers) const {
    auto set = std::make_shared<KRDBEntitySet>();
    for (const size_t n : numbers) set->insert(image(n));
    return set;
  }
  // Obtains the sorted array over images 1 to 3 and starts observing.
  void obtainFirstThree() {
    filter->obtainSortedEntities(nullptr);
    ASSERT_EQ(filter->pending.size(), 1u);
    filter->pending.front()(setOf({1, 2, 3}));
    filter->addListener(observer);
  }
  void process(const EntitySetPtr& added, const EntitySetPtr& deleted, const EntitySetPtr& updated) {
    filter->processChanges(
        KRDBEntitiesChangesStorage::initWithAddedEntities(added, deleted, updated, nullptr));
  }
  // The database ids of the sorted array, in order, after checking that the index matches it.
  std::vector<int64_t> order() const {
    std::vector<int64_t> ids;
    const auto& array = *filter->sortedEntities();
    EXPECT_EQ(filter->entitiesIndexes().size(), array.size());
    for (size_t position = 0; position < array.size(); ++position) {
      EXPECT_EQ(filter->indexOfEntity(array[position]), position);
      ids.push_back(array[position]->entityID()->dbid());
    }
    EXPECT_EQ(filter->entities()->size(), array.size());
    return ids;
  }
  EntitySetPtr published(size_t event, const KRString& key) const {
    return setUnder(observer->events.at(event).info, key);
  }

  std::vector<EntityPtr> images;
  Ranks ranks;
  std::shared_ptr<KRRankedFilter> filter = std::make_shared<KRRankedFilter>(ranks);
  std::shared_ptr<KRFilterObserver> observer = std::make_shared<KRFilterObserver>();
};

using Names = std::vector<std::string>;

}  // namespace

// ---- Updated entities

TEST_F(KRDBEntitiesFilterChangesTest, AnUpdateLeavingTheEntityInPlaceReportsItUpdatedOnly) {
  obtainFirstThree();
  rank(2, 25);
  process(nullptr, nullptr, setOf({2}));
  EXPECT_EQ(observer->names(), Names{"change"});
  EXPECT_EQ(*published(0, KRDBEntitiesFilterUpdatedEntities), *setOf({2}));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnUpdatedEntityThatNowFailsIsDeletedFromBothListsAndTheIndex) {
  obtainFirstThree();
  rank(2, -1);
  process(nullptr, nullptr, setOf({2}));
  EXPECT_EQ(observer->names(), (Names{"entitiesList", "sortedList", "change"}));
  EXPECT_EQ(*published(2, KRDBEntitiesFilterDeletedEntities), *setOf({2}));
  EXPECT_FALSE(published(2, KRDBEntitiesFilterUpdatedEntities));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 3}));
  EXPECT_EQ(filter->indexOfEntity(image(2)), KRNotFound);
  EXPECT_FALSE(filter->containsEntity(image(2)));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnUpdatedEntityThatNowSatisfiesIsAddedAndUpdated) {
  rank(4, -1);
  obtainFirstThree();
  rank(4, 15);
  process(nullptr, nullptr, setOf({4}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterAddedEntities), *setOf({4}));
  EXPECT_EQ(*published(2, KRDBEntitiesFilterAddedEntities), *setOf({4}));
  EXPECT_EQ(*published(2, KRDBEntitiesFilterUpdatedEntities), *setOf({4}));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 4, 2, 3}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AMovedEntityIsReorderedToItsNewPlace) {
  obtainFirstThree();
  rank(1, 25);
  process(nullptr, nullptr, setOf({1}));
  EXPECT_EQ(observer->names(), (Names{"sortedList", "change"}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterReorderedEntities), *setOf({1}));
  EXPECT_EQ(order(), (std::vector<int64_t>{2, 1, 3}));
}

TEST_F(KRDBEntitiesFilterChangesTest, OneUpdateInsertsRemovesAndReordersTogether) {
  for (const size_t n : {4, 5, 6}) rank(n, -1);
  obtainFirstThree();
  rank(1, 35);  // moves behind 3
  rank(2, -1);  // leaves
  rank(4, 30);  // enters, equal to 3: the one already there stays first
  rank(5, 40);  // enters at the end, behind the moved one
  process(nullptr, nullptr, setOf({1, 2, 4, 5, 6}));
  EXPECT_EQ(order(), (std::vector<int64_t>{3, 4, 1, 5}));
  EXPECT_EQ(observer->names(), (Names{"entitiesList", "sortedList", "change"}));
  const auto& change = observer->events.back().info;
  EXPECT_EQ(*setUnder(change, KRDBEntitiesFilterAddedEntities), *setOf({4, 5}));
  EXPECT_EQ(*setUnder(change, KRDBEntitiesFilterDeletedEntities), *setOf({2}));
  EXPECT_EQ(*setUnder(change, KRDBEntitiesFilterUpdatedEntities), *setOf({1, 4, 5}));
  EXPECT_EQ(*published(1, KRDBEntitiesFilterReorderedEntities), *setOf({1}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnEntityMovedToATieWithAnotherGoesAfterIt) {
  obtainFirstThree();
  rank(1, 30);
  process(nullptr, nullptr, setOf({1}));
  EXPECT_EQ(order(), (std::vector<int64_t>{2, 3, 1}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnEntityMovedForwardPassesOnlyTheEntitiesBetween) {
  rank(4, 40);
  rank(5, 50);
  filter->obtainSortedEntities(nullptr);
  filter->pending.front()(setOf({1, 2, 3, 4, 5}));
  filter->addListener(observer);
  rank(4, 15);
  process(nullptr, nullptr, setOf({4}));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 4, 2, 3, 5}));
  rank(1, 30);
  process(nullptr, nullptr, setOf({1}));
  EXPECT_EQ(order(), (std::vector<int64_t>{4, 2, 3, 1, 5}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterReorderedEntities), *setOf({4}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnEntityTiedWithItsNeighbourIsNotReordered) {
  obtainFirstThree();
  rank(1, 20);
  process(nullptr, nullptr, setOf({1}));
  EXPECT_EQ(observer->names(), Names{"change"});
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3}));
}

TEST_F(KRDBEntitiesFilterChangesTest, NeighboursMovedTogetherAreReorderedThoughInOrderAgainstEachOther) {
  filter->obtainSortedEntities(nullptr);
  filter->pending.front()(setOf({1, 2, 3, 4, 5, 6}));
  filter->addListener(observer);
  // 3 and 4 both move to the front: each still orders rightly against the other.
  rank(3, 1);
  rank(4, 2);
  process(nullptr, nullptr, setOf({3, 4}));
  EXPECT_EQ(order(), (std::vector<int64_t>{3, 4, 1, 2, 5, 6}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterReorderedEntities), *setOf({3, 4}));
}

TEST_F(KRDBEntitiesFilterChangesTest, ARunOfUpdatedNeighboursOutOfOrderInsideIsSortedAgain) {
  // The descriptors order by rank too, so that the moved entities are merged in rank order.
  filter->setSortDescriptors(
      std::make_shared<const KRSortDescriptors>(KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey(
          "entityID.dbid", true, [this](const KRValue& a, const KRValue& b) {
            const int left = ranks.at(image(static_cast<size_t>(a.number().longLongValue())).get());
            const int right = ranks.at(image(static_cast<size_t>(b.number().longLongValue())).get());
            return left < right ? KROrderedAscending : left > right ? KROrderedDescending : KROrderedSame;
          })}));
  filter->obtainSortedEntities(nullptr);
  filter->pending.front()(setOf({1, 2, 3, 4, 5, 6}));
  filter->addListener(observer);
  // Between 1 (10) and 6 (60): 2, 3, 4, 5 become 50, 55, 20, 30; the immediate neighbours of 2 and of 5
  // order rightly, but the run does not.
  rank(2, 50);
  rank(3, 55);
  rank(4, 20);
  rank(5, 30);
  process(nullptr, nullptr, setOf({2, 3, 4, 5}));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 4, 5, 2, 3, 6}));
}

TEST_F(KRDBEntitiesFilterChangesTest, UpdatedNeighboursStillInOrderAreNotReordered) {
  filter->obtainSortedEntities(nullptr);
  filter->pending.front()(setOf({1, 2, 3, 4, 5, 6}));
  filter->addListener(observer);
  rank(3, 31);
  rank(4, 39);
  process(nullptr, nullptr, setOf({3, 4}));
  EXPECT_EQ(observer->names(), Names{"change"});
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3, 4, 5, 6}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnEmptyUpdatedSetGivesNoOutcomeAndNoNotification) {
  obtainFirstThree();
  process(nullptr, nullptr, std::make_shared<KRDBEntitySet>());
  EXPECT_TRUE(observer->events.empty());
  const auto outcome = filter->processUpdateEntities();
  EXPECT_FALSE(outcome.added || outcome.deleted || outcome.reordered || outcome.updated);
}

TEST_F(KRDBEntitiesFilterChangesTest, EveryUpdatedEntityIsTestedOnceWhateverTheRemainder) {
  for (const size_t n : {4, 5, 6}) rank(n, -1);
  obtainFirstThree();
  for (size_t count = 1; count <= images.size(); ++count) {
    filter->tests = 0;
    auto updated = std::make_shared<KRDBEntitySet>(images.begin(), images.begin() + static_cast<long>(count));
    process(nullptr, nullptr, updated);
    EXPECT_EQ(filter->tests, static_cast<int>(count));
  }
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3}));
}

TEST_F(KRDBEntitiesFilterChangesTest, AnEntityMissingFromTheIndexIsReportedAndFoundBySearching) {
  obtainFirstThree();
  // An array set again without its index: the entities have no index entries.
  filter->resetSortedEntities();
  filter->setSortedEntities(std::make_shared<KRDBEntitiesFilter::EntityArray>(
                                KRDBEntitiesFilter::EntityArray{image(1), image(2), image(3)}),
                            false);
  observer->events.clear();
  rank(1, 25);
  KRCapturingLogSink sink;
  process(nullptr, nullptr, setOf({1}));
  const auto records = sink.records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].level, 4);
  EXPECT_EQ(records[0].message, "Warning: inconsistence");
  EXPECT_EQ(records[0].sourcePath, kSource);
  EXPECT_EQ(*published(0, KRDBEntitiesFilterReorderedEntities), *setOf({1}));
}

// ---- Added and deleted entities

TEST_F(KRDBEntitiesFilterChangesTest, ANewEntityEqualToAnExistingOneIsPlacedBeforeIt) {
  obtainFirstThree();
  rank(4, 20);
  process(setOf({4}), nullptr, nullptr);
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 4, 2, 3}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterAddedEntities), *setOf({4}));
}

TEST_F(KRDBEntitiesFilterChangesTest, OnlyNewEntitiesThatSatisfyEnterInTheOrderOfTheDescriptors) {
  obtainFirstThree();
  rank(4, 40);
  rank(5, 40);
  rank(6, -1);
  process(setOf({6, 5, 4, 1}), nullptr, nullptr);
  // 4 and 5 tie under the comparator; the descriptors (by id) put 4 first.
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3, 4, 5}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterAddedEntities), *setOf({4, 5}));
}

TEST_F(KRDBEntitiesFilterChangesTest, WithSortingDisabledNewEntitiesGoToTheEnd) {
  obtainFirstThree();
  filter->setSortingDisabled(true);
  rank(4, 1);
  rank(5, 2);
  process(setOf({5, 4}), nullptr, nullptr);
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3, 4, 5}));
  rank(6, 0);
  rank(1, 99);
  process(nullptr, nullptr, setOf({6, 1}));
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 2, 3, 4, 5, 6}));
}

TEST_F(KRDBEntitiesFilterChangesTest, DeletedEntitiesLeaveTheSetTheArrayAndTheIndex) {
  obtainFirstThree();
  process(nullptr, setOf({2, 5}), nullptr);
  EXPECT_EQ(order(), (std::vector<int64_t>{1, 3}));
  EXPECT_EQ(*published(0, KRDBEntitiesFilterDeletedEntities), *setOf({2}));
  EXPECT_EQ(filter->indexOfEntity(image(2)), KRNotFound);
}

TEST_F(KRDBEntitiesFilterChangesTest, ChangesReceivedWhileObtainingApplyToTheObtainedSetUnpublished) {
  filter->addListener(observer);
  filter->obtainSortedEntities(nullptr);
  process(setOf({4}), setOf({1}), nullptr);
  ASSERT_EQ(filter->pending.size(), 1u);
  filter->pending.front()(setOf({1, 2, 3}));
  EXPECT_TRUE(observer->events.empty());
  EXPECT_EQ(order(), (std::vector<int64_t>{2, 3, 4}));
  EXPECT_FALSE(filter->addedEntities());
  EXPECT_FALSE(filter->deletedEntities());
}

TEST_F(KRDBEntitiesFilterChangesTest, ListsHandedOutEarlierKeepWhatTheyHeld) {
  obtainFirstThree();
  const EntitySetPtr handedSet = filter->entities();
  const auto handedArray = filter->sortedEntities();
  rank(4, 5);
  process(setOf({4}), setOf({3}), nullptr);
  EXPECT_EQ(*handedSet, *setOf({1, 2, 3}));
  EXPECT_EQ(handedArray->size(), 3u);
  EXPECT_EQ(*filter->entities(), *setOf({1, 2, 4}));
  EXPECT_EQ(order(), (std::vector<int64_t>{4, 1, 2}));
}
