#include "Model/KRDBEntitiesFilter/KRDBEntitiesSubfilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRFilterObserver.hpp"
#include "KRSourceFilter.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;

// Admits the images of even database id.
std::shared_ptr<KRPredicate> evenIDs() {
  return KRPredicate::predicateWithBlock([](const KRValue& object, const KRDictionary&) {
    return object.objectAs<KRDBEntity>()->entityID()->dbid() % 2 == 0;
  });
}

class KRDBEntitiesSubfilterTest : public testing::Test {
 protected:
  EntityPtr image1 = KRTestEntities::makeImage(1);
  EntityPtr image2 = KRTestEntities::makeImage(2);
  EntityPtr image3 = KRTestEntities::makeImage(3);
  EntityPtr image4 = KRTestEntities::makeImage(4);
  std::shared_ptr<KRSourceFilter> source = KRSourceFilter::withEntities({image1, image2, image3});
  std::shared_ptr<KRFilterObserver> observer = std::make_shared<KRFilterObserver>();
};

}  // namespace

TEST_F(KRDBEntitiesSubfilterTest, StartsWithTheNarrowedFiltersDescriptorsAndListensToIt) {
  const auto descriptors = std::make_shared<const KRSortDescriptors>(
      KRSortDescriptors{KRSortDescriptor::sortDescriptorWithKey("entityID.dbid", false)});
  source->setSortDescriptors(descriptors);
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  EXPECT_EQ(subfilter->sortDescriptors(), descriptors);
  EXPECT_EQ(subfilter->entitiesFilter(), source);
  EXPECT_TRUE(source->hasListener(subfilter));
}

TEST_F(KRDBEntitiesSubfilterTest, HoldsTheNarrowedEntitiesThePredicateAdmits) {
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  subfilter->setPredicate(evenIDs());
  EXPECT_EQ(obtainedNow(subfilter), (KRDBEntitySet{image2}));
  EXPECT_FALSE(subfilter->isEntitySatisfiesFilterConditions(image3));
}

TEST_F(KRDBEntitiesSubfilterTest, WithoutAPredicateNothingIsAdmitted) {
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  EXPECT_TRUE(obtainedNow(subfilter).empty());
}

TEST_F(KRDBEntitiesSubfilterTest, AnotherPredicateResetsTheSameOneDoesNot) {
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  const auto predicate = evenIDs();
  subfilter->setPredicate(predicate);
  obtainedNow(subfilter);
  subfilter->addListener(observer);
  subfilter->setPredicate(predicate);
  EXPECT_TRUE(observer->events.empty());
  subfilter->setPredicate(KRPredicate::predicateWithValue(true));
  EXPECT_EQ(observer->names().back(), "reset");
  EXPECT_EQ(obtainedNow(subfilter), (KRDBEntitySet{image1, image2, image3}));
}

TEST_F(KRDBEntitiesSubfilterTest, TheNarrowedFiltersChangesPassThroughThePredicate) {
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  subfilter->setPredicate(evenIDs());
  obtainedNow(source);
  obtainedNow(subfilter);
  subfilter->addListener(observer);
  source->change({image4}, {image2}, {});
  EXPECT_EQ(*subfilter->entities(), (KRDBEntitySet{image4}));
  EXPECT_EQ(*setUnder(observer->events.front().info, KRDBEntitiesFilterAddedEntities),
            (KRDBEntitySet{image4}));
  EXPECT_EQ(*setUnder(observer->events.front().info, KRDBEntitiesFilterDeletedEntities),
            (KRDBEntitySet{image2}));
}

TEST_F(KRDBEntitiesSubfilterTest, AResetOfTheNarrowedFilterResetsTheSubfilter) {
  const auto subfilter = KRDBEntitiesSubfilter::initWithEntitiesFilter(source);
  subfilter->setPredicate(evenIDs());
  obtainedNow(subfilter);
  subfilter->addListener(observer);
  source->reset();
  EXPECT_FALSE(subfilter->entities());
  EXPECT_EQ(observer->names().back(), "reset");
}
