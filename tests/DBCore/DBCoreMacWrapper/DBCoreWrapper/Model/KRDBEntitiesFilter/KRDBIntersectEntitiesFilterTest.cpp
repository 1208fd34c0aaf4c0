#include "Model/KRDBEntitiesFilter/KRDBIntersectEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRSourceFilter.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;

class KRDBIntersectEntitiesFilterTest : public testing::Test {
 protected:
  EntityPtr image1 = KRTestEntities::makeImage(1);
  EntityPtr image2 = KRTestEntities::makeImage(2);
  EntityPtr image3 = KRTestEntities::makeImage(3);
  std::shared_ptr<KRSourceFilter> wide = KRSourceFilter::withEntities({image1, image2, image3});
  std::shared_ptr<KRSourceFilter> narrow = KRSourceFilter::withEntities({image2, image3});
};

}  // namespace

TEST_F(KRDBIntersectEntitiesFilterTest, HoldsTheEntitiesEveryMemberHolds) {
  const auto both = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({wide, narrow});
  EXPECT_EQ(obtainedNow(both), (KRDBEntitySet{image2, image3}));
  EXPECT_FALSE(both->isEntitySatisfiesFilterConditions(image1));
}

TEST_F(KRDBIntersectEntitiesFilterTest, AnEmptyMemberMakesItEmpty) {
  const auto empty = KRSourceFilter::withEntities({});
  EXPECT_TRUE(
      obtainedNow(KRDBIntersectEntitiesFilter::initWithEntitiesFilters({wide, empty, narrow})).empty());
}

TEST_F(KRDBIntersectEntitiesFilterTest, WithoutMembersItIsEmptyYetAdmitsEverything) {
  const auto none = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({});
  EXPECT_TRUE(obtainedNow(none).empty());
  EXPECT_TRUE(none->isEntitySatisfiesFilterConditions(image1));
}

TEST_F(KRDBIntersectEntitiesFilterTest, AnEntityEntersOnlyOnceEveryMemberHoldsIt) {
  const auto both = KRDBIntersectEntitiesFilter::initWithEntitiesFilters({wide, narrow});
  obtainedNow(wide);
  obtainedNow(narrow);
  obtainedNow(both);
  const auto image4 = KRTestEntities::makeImage(4);
  wide->change({image4}, {}, {});
  EXPECT_FALSE(both->containsEntity(image4));
  narrow->change({image4}, {}, {});
  EXPECT_TRUE(both->containsEntity(image4));
  narrow->change({}, {image3}, {});
  EXPECT_FALSE(both->containsEntity(image3));
}
