#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "KRFilterObserver.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRTestEntities.hpp"
#include "Model/KRDBEntitiesFilter/KRDBValueBox.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;
using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;
using EntityArrayPtr = KRDBEntitiesFilter::EntityArrayPtr;

const char* const kSource =
    "DBCore/DBCoreMacWrapper/DBCoreWrapper/Model/KRDBEntitiesFilter/KRDBEntitiesFilter";

using KRTestEntities::makeImage;
using KRTestEntities::makePath;

EntitySetPtr setOf(std::initializer_list<EntityPtr> entities) {
  return std::make_shared<KRDBEntitySet>(entities);
}

int64_t dbidOf(const EntityPtr& entity) { return entity->entityID()->dbid(); }

// Completions kept outside the filter, so that they outlive it.
using Completions = std::vector<KRDBEntitiesFilter::EntitiesHandler>;

// A filter that keeps its initial obtain's completion for the test to call, and whose change processing
// answers what the test scripts (or what the base answers when nothing is scripted).
class KRTestEntitiesFilter : public KRDBEntitiesFilter {
 public:
  explicit KRTestEntitiesFilter(std::shared_ptr<Completions> completions)
      : completions_(std::move(completions)) {}

  using KRDBEntitiesFilter::compareEntity;
  using KRDBEntitiesFilter::completeObtainEntitiesHandlers;
  using KRDBEntitiesFilter::completeObtainSortedEntitiesHandlers;
  using KRDBEntitiesFilter::emptyEntitiesChangesMapTable;
  using KRDBEntitiesFilter::processReset;
  using KRDBEntitiesFilter::publishChanges;
  using KRDBEntitiesFilter::resetSortedEntities;
  using KRDBEntitiesFilter::setEntities;
  using KRDBEntitiesFilter::setSortedEntities;

  bool isEntitySatisfiesFilterConditions(const EntityPtr& /*entity*/) const override { return true; }
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override {
    completions_->push_back(std::move(completion));
  }

  EntitySetPtr processAddedEntities() override {
    ++addedCalls;
    return scripted ? addedResult : KRDBEntitiesFilter::processAddedEntities();
  }
  EntitySetPtr processDeleteEntities() override {
    ++deletedCalls;
    return scripted ? deletedResult : KRDBEntitiesFilter::processDeleteEntities();
  }
  ProcessedUpdates processUpdateEntities() override {
    ++updatedCalls;
    return scripted ? updatedResult : KRDBEntitiesFilter::processUpdateEntities();
  }

  bool scripted = false;
  EntitySetPtr addedResult;
  EntitySetPtr deletedResult;
  ProcessedUpdates updatedResult;
  int addedCalls = 0;
  int deletedCalls = 0;
  int updatedCalls = 0;

 private:
  std::shared_ptr<Completions> completions_;
};

// A filter that overrides nothing.
class KRUnfinishedEntitiesFilter : public KRDBEntitiesFilter {
 public:
  KRUnfinishedEntitiesFilter() = default;
};

std::shared_ptr<KRDBEntityIDMapTable> changesUnder(const KRDictionary& info) {
  return KRDBValueBox<KRDBEntityIDMapTable>::heldBy(
      info.objectForKey(KRValue(KRDBEntitiesFilterEntitiesChanges)));
}

class KRDBEntitiesFilterTest : public testing::Test {
 protected:
  void SetUp() override { filter->addListener(observer); }

  // Obtains the set and completes the obtain with it.
  void obtain(const EntitySetPtr& entities) {
    filter->obtainEntities(nullptr);
    completeObtain(entities);
  }
  void completeObtain(const EntitySetPtr& entities) {
    ASSERT_FALSE(completions->empty());
    const auto completion = completions->front();
    completions->erase(completions->begin());
    completion(entities);
  }
  EntityArrayPtr obtainSorted() {
    EntityArrayPtr sorted;
    filter->obtainSortedEntities([&sorted](const EntityArrayPtr& array) { sorted = array; });
    return sorted;
  }
  std::shared_ptr<KRDBEntitiesChangesStorage> changesWithAdded(const EntitySetPtr& added) {
    return KRDBEntitiesChangesStorage::initWithAddedEntities(added, nullptr, nullptr, nullptr);
  }
  static KRDBEntitiesFilter::ComparatorPtr byDbidDescending() {
    return std::make_shared<const KRDBEntitiesFilter::Comparator>([](const EntityPtr& a, const EntityPtr& b) {
      return dbidOf(a) > dbidOf(b) ? -1 : dbidOf(a) < dbidOf(b) ? 1 : 0;
    });
  }
  static KRDBEntitiesFilter::SortDescriptorsPtr descriptors(
      std::initializer_list<std::shared_ptr<KRSortDescriptor>> list) {
    return std::make_shared<const KRSortDescriptors>(list);
  }

  std::shared_ptr<Completions> completions = std::make_shared<Completions>();
  std::shared_ptr<KRTestEntitiesFilter> filter = std::make_shared<KRTestEntitiesFilter>(completions);
  std::shared_ptr<KRFilterObserver> observer = std::make_shared<KRFilterObserver>();
  EntityPtr image1 = makeImage(1);
  EntityPtr image2 = makeImage(2);
  EntityPtr image3 = makeImage(3);
  EntityPtr path1 = makePath(1);
};

// ---- Construction and obtaining

TEST_F(KRDBEntitiesFilterTest, StartsWithoutListsFlagsOrHandlers) {
  EXPECT_FALSE(filter->invalid());
  EXPECT_FALSE(filter->sortingDisabled());
  EXPECT_FALSE(filter->waitingForEntities());
  EXPECT_FALSE(filter->waitingForSortedEntities());
  EXPECT_FALSE(filter->shouldReset());
  EXPECT_EQ(filter->entities(), nullptr);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_EQ(filter->sortDescriptors(), nullptr);
  EXPECT_EQ(filter->comparator(), nullptr);
  EXPECT_TRUE(filter->entitiesIndexes().empty());
  EXPECT_TRUE(filter->obtainEntitiesHandlers().empty());
  EXPECT_TRUE(filter->obtainSortedEntitiesHandlers().empty());
  EXPECT_EQ(filter->addedEntities(), nullptr);
  EXPECT_EQ(filter->deletedEntities(), nullptr);
  EXPECT_EQ(filter->updatedEntities(), nullptr);
}

TEST_F(KRDBEntitiesFilterTest, TwoObtainsBeforeTheFirstCompletesStartOneObtainAndServeBothInOrder) {
  std::vector<std::pair<int, EntitySetPtr>> calls;
  filter->obtainEntities([&calls](const EntitySetPtr& set) { calls.emplace_back(1, set); });
  filter->obtainEntities([&calls](const EntitySetPtr& set) { calls.emplace_back(2, set); });
  EXPECT_TRUE(filter->waitingForEntities());
  EXPECT_EQ(filter->obtainEntitiesHandlers().size(), 2u);
  ASSERT_EQ(completions->size(), 1u);
  const auto obtained = setOf({image1, image2});
  completeObtain(obtained);
  ASSERT_EQ(calls.size(), 2u);
  EXPECT_EQ(calls[0].first, 1);
  EXPECT_EQ(calls[1].first, 2);
  EXPECT_EQ(calls[0].second, obtained);
  EXPECT_EQ(calls[1].second, obtained);
  EXPECT_EQ(filter->entities(), obtained);
  EXPECT_FALSE(filter->waitingForEntities());
  EXPECT_TRUE(filter->obtainEntitiesHandlers().empty());
}

TEST_F(KRDBEntitiesFilterTest, StoringTheObtainedSetDoesNotNotify) {
  obtain(setOf({image1}));
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, AnObtainedSetIsGivenAtOnceWithoutObtainingAgain) {
  const auto obtained = setOf({image1});
  obtain(obtained);
  EntitySetPtr given;
  filter->obtainEntities([&given](const EntitySetPtr& set) { given = set; });
  EXPECT_EQ(given, obtained);
  EXPECT_TRUE(completions->empty());
}

TEST_F(KRDBEntitiesFilterTest, TheInitialObtainCompletionHoldsTheFilterWeakly) {
  filter->obtainEntities(nullptr);
  std::weak_ptr<KRDBEntitiesFilter> weakFilter = filter;
  filter.reset();
  EXPECT_TRUE(weakFilter.expired());
  ASSERT_EQ(completions->size(), 1u);
  completions->front()(setOf({image1}));
}

TEST_F(KRDBEntitiesFilterTest, ContainsTheEntitiesOfTheSetOnly) {
  EXPECT_FALSE(filter->containsEntity(image1));
  obtain(setOf({image1}));
  EXPECT_TRUE(filter->containsEntity(image1));
  EXPECT_FALSE(filter->containsEntity(image2));
  EXPECT_FALSE(filter->containsEntity(makeImage(1)));
}

// ---- Sorting and indexes

TEST_F(KRDBEntitiesFilterTest, WithoutComparatorOrDescriptorsTheSortedArrayIsAbsent) {
  obtain(setOf({image1, image2}));
  bool called = false;
  filter->obtainSortedEntities([&called](const EntityArrayPtr& array) {
    called = true;
    EXPECT_EQ(array, nullptr);
  });
  EXPECT_TRUE(called);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_FALSE(filter->waitingForSortedEntities());
  EXPECT_TRUE(filter->entitiesIndexes().empty());
}

TEST_F(KRDBEntitiesFilterTest, SortsByTheComparatorAndIndexesEveryPosition) {
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1, image3, image2}));
  const auto sorted = obtainSorted();
  ASSERT_NE(sorted, nullptr);
  EXPECT_EQ(*sorted, (KRDBEntitiesFilter::EntityArray{image3, image2, image1}));
  EXPECT_EQ(filter->sortedEntities(), sorted);
  EXPECT_EQ(filter->indexOfEntity(image3), 0u);
  EXPECT_EQ(filter->indexOfEntity(image2), 1u);
  EXPECT_EQ(filter->indexOfEntity(image1), 2u);
  EXPECT_EQ(filter->entitiesIndexes().size(), 3u);
}

TEST_F(KRDBEntitiesFilterTest, SortsByTheDescriptorsTheFirstDecidingAndLaterOnesBreakingTies) {
  filter->setSortDescriptors(
      descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.entityType", false),
                   KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)}));
  obtain(setOf({image2, path1, image1}));
  const auto sorted = obtainSorted();
  ASSERT_NE(sorted, nullptr);
  EXPECT_EQ(*sorted, (KRDBEntitiesFilter::EntityArray{path1, image1, image2}));
  EXPECT_EQ(filter->indexOfEntity(path1), 0u);
  EXPECT_EQ(filter->indexOfEntity(image1), 1u);
  EXPECT_EQ(filter->indexOfEntity(image2), 2u);
}

TEST_F(KRDBEntitiesFilterTest, TheComparatorTakesPrecedenceOverTheDescriptors) {
  filter->setSortDescriptors(descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)}));
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1, image2}));
  EXPECT_EQ(*obtainSorted(), (KRDBEntitiesFilter::EntityArray{image2, image1}));
}

TEST_F(KRDBEntitiesFilterTest, SortedObtainsBeforeTheSetArrivesSortOnceAndServeAllInOrder) {
  filter->setComparator(byDbidDescending());
  std::vector<std::pair<int, EntityArrayPtr>> calls;
  filter->obtainSortedEntities([&calls](const EntityArrayPtr& array) { calls.emplace_back(1, array); });
  filter->obtainSortedEntities([&calls](const EntityArrayPtr& array) { calls.emplace_back(2, array); });
  EXPECT_TRUE(filter->waitingForSortedEntities());
  EXPECT_EQ(filter->obtainSortedEntitiesHandlers().size(), 2u);
  ASSERT_EQ(completions->size(), 1u);
  completeObtain(setOf({image1, image2}));
  ASSERT_EQ(calls.size(), 2u);
  EXPECT_EQ(calls[0].first, 1);
  EXPECT_EQ(calls[1].first, 2);
  ASSERT_NE(calls[0].second, nullptr);
  EXPECT_EQ(calls[0].second, calls[1].second);
  EXPECT_FALSE(filter->waitingForSortedEntities());
  EXPECT_EQ(obtainSorted(), calls[0].second);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, TheIndexOfAnEntityOutsideTheSortedArrayIsNotFound) {
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1}));
  obtainSorted();
  EXPECT_EQ(filter->indexOfEntity(image2), 0x7fffffffffffffffULL);
  EXPECT_EQ(filter->indexOfEntity(image2), KRNotFound);
  EXPECT_EQ(filter->indexOfEntity(nullptr), KRNotFound);
}

TEST_F(KRDBEntitiesFilterTest, SettingTheSameDescriptorArrayObjectAgainDoesNothing) {
  const auto sortDescriptors = descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)});
  filter->setSortDescriptors(sortDescriptors);
  obtain(setOf({image1, image2}));
  const auto sorted = obtainSorted();
  filter->setSortDescriptors(sortDescriptors);
  EXPECT_EQ(filter->sortedEntities(), sorted);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, OtherDescriptorsDropTheSortedArrayAndItsIndexes) {
  filter->setSortDescriptors(descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)}));
  obtain(setOf({image1, image2}));
  obtainSorted();
  const auto equalButDistinct = descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)});
  filter->setSortDescriptors(equalButDistinct);
  EXPECT_EQ(filter->sortDescriptors(), equalButDistinct);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_TRUE(filter->entitiesIndexes().empty());
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"sortedList"}));
  EXPECT_TRUE(observer->events[0].info.isNil());
  EXPECT_EQ(observer->senders[0], filter);
}

TEST_F(KRDBEntitiesFilterTest, DescriptorsSetWhileAComparatorIsSetKeepTheSortedArray) {
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1, image2}));
  const auto sorted = obtainSorted();
  const auto sortDescriptors = descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)});
  filter->setSortDescriptors(sortDescriptors);
  EXPECT_EQ(filter->sortDescriptors(), sortDescriptors);
  EXPECT_EQ(filter->sortedEntities(), sorted);
  EXPECT_EQ(filter->indexOfEntity(image2), 0u);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, TheSameComparatorObjectKeepsTheSortedArrayAnotherDropsIt) {
  const auto comparator = byDbidDescending();
  filter->setComparator(comparator);
  obtain(setOf({image1, image2}));
  const auto sorted = obtainSorted();
  filter->setComparator(comparator);
  EXPECT_EQ(filter->sortedEntities(), sorted);
  EXPECT_TRUE(observer->events.empty());
  const auto other = byDbidDescending();
  filter->setComparator(other);
  EXPECT_EQ(filter->comparator(), other);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_EQ(filter->indexOfEntity(image1), KRNotFound);
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"sortedList"}));
  EXPECT_EQ(*obtainSorted(), (KRDBEntitiesFilter::EntityArray{image2, image1}));
}

TEST_F(KRDBEntitiesFilterTest, TurningSortingBackOnDropsTheSortedArray) {
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1, image2}));
  const auto sorted = obtainSorted();
  filter->setSortingDisabled(false);
  EXPECT_EQ(filter->sortedEntities(), sorted);
  filter->setSortingDisabled(true);
  EXPECT_TRUE(filter->sortingDisabled());
  EXPECT_EQ(filter->sortedEntities(), sorted);
  filter->setSortingDisabled(true);
  EXPECT_TRUE(observer->events.empty());
  filter->setSortingDisabled(false);
  EXPECT_FALSE(filter->sortingDisabled());
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"sortedList"}));
}

TEST_F(KRDBEntitiesFilterTest, ComparingAsksTheComparatorFirstThenTheDescriptors) {
  EXPECT_EQ(filter->compareEntity(image1, image2), KROrderedSame);
  filter->setSortDescriptors(
      descriptors({KRSortDescriptor::sortDescriptorWithKey("entityID.entityType", true),
                   KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", true)}));
  EXPECT_EQ(filter->compareEntity(image1, image2), KROrderedAscending);
  EXPECT_EQ(filter->compareEntity(path1, image2), KROrderedDescending);
  EXPECT_EQ(filter->compareEntity(image1, makeImage(1)), KROrderedSame);
  filter->setComparator(std::make_shared<const KRDBEntitiesFilter::Comparator>(
      [](const EntityPtr& a, const EntityPtr& b) { return static_cast<int>(dbidOf(b) - dbidOf(a)) * 5; }));
  EXPECT_EQ(filter->compareEntity(image1, image3), KROrderedDescending);
  EXPECT_EQ(filter->compareEntity(image3, image1), KROrderedAscending);
  EXPECT_EQ(filter->compareEntity(image1, path1), KROrderedSame);
}

// ---- Replacing lists

TEST_F(KRDBEntitiesFilterTest, ReplacingAListNotifiesWithoutInfoUnlessItIsTheSameObject) {
  const auto entities = setOf({image1});
  filter->setEntities(entities);
  filter->setEntities(entities);
  filter->setEntities(setOf({image2}), false);
  const auto sorted =
      std::make_shared<KRDBEntitiesFilter::EntityArray>(KRDBEntitiesFilter::EntityArray{image2});
  filter->setSortedEntities(sorted);
  filter->setSortedEntities(sorted);
  filter->setSortedEntities(nullptr, false);
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList"}));
  EXPECT_TRUE(observer->events[0].info.isNil());
  EXPECT_TRUE(observer->events[1].info.isNil());
  EXPECT_EQ(filter->entities()->count(image2), 1u);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
}

TEST_F(KRDBEntitiesFilterTest, CompletingHandlersCallsThemInOrderAndEmptiesTheQueue) {
  std::vector<int> order;
  filter->obtainEntities([&order](const EntitySetPtr& set) { order.push_back(set ? 1 : -1); });
  filter->obtainEntities([&order](const EntitySetPtr& set) { order.push_back(set ? 2 : -2); });
  filter->completeObtainEntitiesHandlers();
  EXPECT_EQ(order, (std::vector<int>{-1, -2}));
  EXPECT_TRUE(filter->obtainEntitiesHandlers().empty());
  filter->completeObtainSortedEntitiesHandlers();
  EXPECT_TRUE(filter->obtainSortedEntitiesHandlers().empty());
}

// ---- Reset

TEST_F(KRDBEntitiesFilterTest, ResetDropsBothListsAndIndexesNotifyingThenTellsOfTheReset) {
  filter->setComparator(byDbidDescending());
  obtain(setOf({image1, image2}));
  obtainSorted();
  filter->reset();
  EXPECT_EQ(filter->entities(), nullptr);
  EXPECT_EQ(filter->sortedEntities(), nullptr);
  EXPECT_TRUE(filter->entitiesIndexes().empty());
  EXPECT_FALSE(filter->shouldReset());
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList", "reset"}));
  filter->obtainEntities(nullptr);
  EXPECT_EQ(completions->size(), 1u);
}

TEST_F(KRDBEntitiesFilterTest, ResetDuringAnObtainServesQueuedHandlersAtOnceWithAnAbsentSet) {
  std::vector<EntitySetPtr> given;
  filter->obtainEntities([&given](const EntitySetPtr& set) { given.push_back(set); });
  filter->reset();
  ASSERT_EQ(given.size(), 1u);
  EXPECT_EQ(given[0], nullptr);
  EXPECT_TRUE(filter->shouldReset());
  EXPECT_TRUE(filter->obtainEntitiesHandlers().empty());
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"reset"}));
}

TEST_F(KRDBEntitiesFilterTest, SortedHandlersWaitingWhenAResetInterruptsTheObtainReceiveAnAbsentArray) {
  filter->setComparator(byDbidDescending());
  std::vector<EntityArrayPtr> given;
  filter->obtainSortedEntities([&given](const EntityArrayPtr& array) { given.push_back(array); });
  filter->reset();
  ASSERT_EQ(given.size(), 1u);
  EXPECT_EQ(given[0], nullptr);
  EXPECT_FALSE(filter->waitingForSortedEntities());
  EXPECT_TRUE(filter->obtainSortedEntitiesHandlers().empty());
  EXPECT_EQ(filter->sortedEntities(), nullptr);
}

TEST_F(KRDBEntitiesFilterTest, AnObtainEndingAfterAResetAppliesPendingChangesDropsTheListsAndObtainsNoMore) {
  filter->obtainEntities(nullptr);
  filter->reset();
  filter->processChanges(changesWithAdded(setOf({image3})));
  observer->events.clear();
  completeObtain(setOf({image1}));
  EXPECT_EQ(filter->addedCalls, 2);
  EXPECT_EQ(filter->deletedCalls, 1);
  EXPECT_EQ(filter->updatedCalls, 1);
  EXPECT_EQ(filter->entities(), nullptr);
  EXPECT_FALSE(filter->shouldReset());
  EXPECT_FALSE(filter->waitingForEntities());
  EXPECT_TRUE(completions->empty());
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"entitiesList"}));
}

TEST_F(KRDBEntitiesFilterTest, AnObtainEndingAfterAResetObtainsAgainForHandlersQueuedSinceTheReset) {
  filter->obtainEntities(nullptr);
  filter->reset();
  EntitySetPtr given;
  filter->obtainEntities([&given](const EntitySetPtr& set) { given = set; });
  completeObtain(setOf({image1}));
  EXPECT_EQ(given, nullptr);
  EXPECT_TRUE(filter->waitingForEntities());
  ASSERT_EQ(completions->size(), 1u);
  const auto fresh = setOf({image2});
  completeObtain(fresh);
  EXPECT_EQ(given, fresh);
  EXPECT_EQ(filter->entities(), fresh);
}

TEST_F(KRDBEntitiesFilterTest, ADeferredResetWaitsForTheObtainAndRunsOnce) {
  filter->processReset();
  EXPECT_TRUE(observer->events.empty());
  filter->obtainEntities(nullptr);
  filter->reset();
  filter->processReset();
  EXPECT_TRUE(filter->shouldReset());
  completeObtain(setOf({image1}));
  EXPECT_FALSE(filter->shouldReset());
  observer->events.clear();
  filter->processReset();
  EXPECT_TRUE(observer->events.empty());
}

// ---- Changes

TEST_F(KRDBEntitiesFilterTest, AfterInvalidateChangesAreIgnoredAndNobodyIsNotified) {
  const auto entities = setOf({image1});
  obtain(entities);
  filter->invalidate();
  EXPECT_TRUE(filter->invalid());
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({image2}), setOf({image1}),
                                                                           setOf({image1}), nullptr));
  EXPECT_EQ(filter->entities(), entities);
  EXPECT_EQ(filter->addedEntities(), nullptr);
  EXPECT_EQ(filter->deletedEntities(), nullptr);
  EXPECT_EQ(filter->updatedEntities(), nullptr);
  EXPECT_EQ(filter->addedCalls, 1);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, ChangesThatCannotBeAppliedYetStayPending) {
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({image1}), setOf({image2}),
                                                                           setOf({image3}), nullptr));
  filter->processChanges(changesWithAdded(setOf({path1})));
  EXPECT_EQ(*filter->addedEntities(), (KRDBEntitySet{image1, path1}));
  EXPECT_EQ(*filter->deletedEntities(), (KRDBEntitySet{image2}));
  EXPECT_EQ(*filter->updatedEntities(), (KRDBEntitySet{image3}));
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, OnlyTheNonEmptySetsOfAChangeSetAreProcessed) {
  filter->processChanges(
      KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({}), nullptr, setOf({image1}), nullptr));
  EXPECT_EQ(filter->addedCalls, 0);
  EXPECT_EQ(filter->deletedCalls, 0);
  EXPECT_EQ(filter->updatedCalls, 1);
  filter->processChanges(nullptr);
  EXPECT_EQ(filter->updatedCalls, 1);
}

TEST_F(KRDBEntitiesFilterTest, ChangesReceivedDuringTheObtainAreAppliedWithoutBeingPublished) {
  filter->obtainEntities(nullptr);
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({image2}), setOf({image3}),
                                                                           setOf({image1}), nullptr));
  EXPECT_EQ(filter->addedCalls, 1);
  filter->scripted = true;
  filter->addedResult = setOf({image2});
  filter->deletedResult = setOf({image3});
  filter->updatedResult.updated = setOf({image1});
  completeObtain(setOf({image1, image3}));
  EXPECT_EQ(filter->addedCalls, 2);
  EXPECT_EQ(filter->deletedCalls, 2);
  EXPECT_EQ(filter->updatedCalls, 2);
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, ProcessingUnitesTheOutcomesAndPublishesThem) {
  obtain(setOf({image1}));
  filter->scripted = true;
  filter->addedResult = setOf({image2});
  filter->deletedResult = setOf({});
  filter->updatedResult = {setOf({image3}), setOf({path1}), setOf({image1}), setOf({image1, image3})};
  filter->processChanges(KRDBEntitiesChangesStorage::initWithAddedEntities(setOf({image2}), setOf({path1}),
                                                                           setOf({image1}), nullptr));
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList", "change"}));
  const auto& info = observer->events[2].info;
  EXPECT_EQ(*setUnder(info, KRDBEntitiesFilterAddedEntities), (KRDBEntitySet{image2, image3}));
  EXPECT_EQ(*setUnder(info, KRDBEntitiesFilterDeletedEntities), (KRDBEntitySet{path1}));
  EXPECT_EQ(*setUnder(info, KRDBEntitiesFilterUpdatedEntities), (KRDBEntitySet{image1, image3}));
  EXPECT_EQ(*setUnder(observer->events[1].info, KRDBEntitiesFilterReorderedEntities),
            (KRDBEntitySet{image1}));
}

// ---- Publishing

TEST_F(KRDBEntitiesFilterTest, PublishingSendsTheThreeNotificationsInOrderWithTheirKeys) {
  const auto added = setOf({image1});
  const auto deleted = setOf({image2});
  const auto reordered = setOf({image3});
  const auto updated = setOf({image3, path1});
  const auto records = filter->emptyEntitiesChangesMapTable();
  const auto record3 = std::static_pointer_cast<KRObject>(makeImage(30));
  records->setObject(record3, KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 3));
  records->setObject(makeImage(40), image2->entityID());
  const auto changes = KRDBEntitiesChangesStorage::initWithAddedEntities(nullptr, nullptr, updated, records);
  filter->publishChanges(added, deleted, reordered, updated, changes);

  ASSERT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList", "change"}));
  for (const auto& sender : observer->senders) EXPECT_EQ(sender, filter);
  const auto& listInfo = observer->events[0].info;
  EXPECT_EQ(listInfo.count(), 2u);
  EXPECT_EQ(setUnder(listInfo, KRDBEntitiesFilterAddedEntities), added);
  EXPECT_EQ(setUnder(listInfo, KRDBEntitiesFilterDeletedEntities), deleted);
  const auto& sortedInfo = observer->events[1].info;
  EXPECT_EQ(sortedInfo.count(), 3u);
  EXPECT_EQ(setUnder(sortedInfo, KRDBEntitiesFilterReorderedEntities), reordered);
  const auto& changeInfo = observer->events[2].info;
  EXPECT_EQ(changeInfo.count(), 4u);
  EXPECT_EQ(setUnder(changeInfo, KRDBEntitiesFilterAddedEntities), added);
  EXPECT_EQ(setUnder(changeInfo, KRDBEntitiesFilterDeletedEntities), deleted);
  EXPECT_EQ(setUnder(changeInfo, KRDBEntitiesFilterUpdatedEntities), updated);
  const auto entitiesChanges = changesUnder(changeInfo);
  ASSERT_NE(entitiesChanges, nullptr);
  EXPECT_NE(entitiesChanges, records);
  EXPECT_EQ(entitiesChanges->count(), 1u);
  EXPECT_EQ(entitiesChanges->objectForKey(image3->entityID()), record3);
}

TEST_F(KRDBEntitiesFilterTest, OnlyReorderedEntitiesNotifyTheSortedListAlone) {
  filter->publishChanges(setOf({}), nullptr, setOf({image1}), setOf({}), nullptr);
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"sortedList"}));
  const auto& info = observer->events[0].info;
  EXPECT_EQ(info.count(), 1u);
  EXPECT_TRUE(info.objectForKey(KRValue(KRDBEntitiesFilterAddedEntities)).isNil());
  EXPECT_EQ(*setUnder(info, KRDBEntitiesFilterReorderedEntities), (KRDBEntitySet{image1}));
}

TEST_F(KRDBEntitiesFilterTest, OnlyUpdatedEntitiesNotifyTheChangeAloneWithAnEmptyChangeMap) {
  filter->publishChanges(
      nullptr, nullptr, nullptr, setOf({image1}),
      KRDBEntitiesChangesStorage::initWithAddedEntities(nullptr, nullptr, setOf({image1}), nullptr));
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"change"}));
  const auto& info = observer->events[0].info;
  EXPECT_EQ(info.count(), 2u);
  EXPECT_EQ(*setUnder(info, KRDBEntitiesFilterUpdatedEntities), (KRDBEntitySet{image1}));
  const auto entitiesChanges = changesUnder(info);
  ASSERT_NE(entitiesChanges, nullptr);
  EXPECT_EQ(entitiesChanges->count(), 0u);
}

TEST_F(KRDBEntitiesFilterTest, AddedEntitiesNotifyAllThreeWithoutAnUpdatedKey) {
  filter->publishChanges(setOf({image1}), nullptr, nullptr, nullptr, nullptr);
  ASSERT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList", "change"}));
  const auto& info = observer->events[2].info;
  EXPECT_EQ(info.count(), 2u);
  EXPECT_TRUE(info.objectForKey(KRValue(KRDBEntitiesFilterUpdatedEntities)).isNil());
  EXPECT_NE(changesUnder(info), nullptr);
}

TEST_F(KRDBEntitiesFilterTest, EmptyOutcomesNotifyNobody) {
  filter->publishChanges(setOf({}), setOf({}), setOf({}), setOf({}), nullptr);
  filter->publishChanges(nullptr, nullptr, nullptr, nullptr, nullptr);
  obtain(setOf({image1}));
  filter->processChanges(
      KRDBEntitiesChangesStorage::initWithAddedEntities(nullptr, nullptr, setOf({}), nullptr));
  EXPECT_TRUE(observer->events.empty());
}

TEST_F(KRDBEntitiesFilterTest, TheChangeKeysAreTheirOwnNames) {
  EXPECT_EQ(KRDBEntitiesFilterAddedEntities, KRString("KRDBEntitiesFilterAddedEntities"));
  EXPECT_EQ(KRDBEntitiesFilterDeletedEntities, KRString("KRDBEntitiesFilterDeletedEntities"));
  EXPECT_EQ(KRDBEntitiesFilterReorderedEntities, KRString("KRDBEntitiesFilterReorderedEntities"));
  EXPECT_EQ(KRDBEntitiesFilterUpdatedEntities, KRString("KRDBEntitiesFilterUpdatedEntities"));
  EXPECT_EQ(KRDBEntitiesFilterEntitiesChanges, KRString("KRDBEntitiesFilterEntitiesChanges"));
}

TEST_F(KRDBEntitiesFilterTest, TheEmptyChangesMapIsNewEachTimeAndKeyedByIdentifierValue) {
  const auto map = filter->emptyEntitiesChangesMapTable();
  ASSERT_NE(map, nullptr);
  EXPECT_EQ(map->count(), 0u);
  EXPECT_NE(filter->emptyEntitiesChangesMapTable(), map);
  map->setObject(image1, KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, 1));
  EXPECT_EQ(map->objectForKey(image1->entityID()), image1);
  EXPECT_EQ(map->objectForKey(path1->entityID()), nullptr);
}

// ---- Subclass contract

TEST_F(KRDBEntitiesFilterTest, TheAbstractOperationsLogTheMissingOverrideAndRaise) {
  const KRCapturingLogSink sink;
  const auto unfinished = std::make_shared<KRUnfinishedEntitiesFilter>();
  try {
    unfinished->isEntitySatisfiesFilterConditions(image1);
    FAIL() << "isEntitySatisfiesFilterConditions did not raise";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRException::NSInvalidArgumentException);
  }
  EXPECT_THROW(unfinished->obtainEntities(nullptr), KRException);
  const auto records = sink.records();
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(records[0].level, 1);
  EXPECT_EQ(records[0].sourcePath, kSource);
  EXPECT_EQ(records[0].function, "isEntitySatisfiesFilterConditions");
  EXPECT_EQ(records[0].message, "Error: isEntitySatisfiesFilterConditions should be overrided in subclass");
  EXPECT_EQ(records[1].level, 1);
  EXPECT_EQ(records[1].sourcePath, kSource);
  EXPECT_EQ(records[1].function, "initiallyObtainFilteredEntities");
  EXPECT_EQ(records[1].message, "Error: initiallyObtainFilteredEntities should be overrided in subclass");
}

}  // namespace
