#include "Model/KRDBEntitiesFilter/KRDBUnionEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRFilterObserver.hpp"
#include "KRSourceFilter.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;

class KRDBUnionEntitiesFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    obtainedNow(left);
    obtainedNow(right);
    obtainedNow(united);
    united->addListener(observer);
  }

  EntityPtr image1 = KRTestEntities::makeImage(1);
  EntityPtr image2 = KRTestEntities::makeImage(2);
  EntityPtr image3 = KRTestEntities::makeImage(3);
  std::shared_ptr<KRSourceFilter> left = KRSourceFilter::withEntities({image1, image2});
  std::shared_ptr<KRSourceFilter> right = KRSourceFilter::withEntities({image2, image3});
  std::shared_ptr<KRDBUnionEntitiesFilter> united =
      KRDBUnionEntitiesFilter::initWithEntitiesFilters({left, right});
  std::shared_ptr<KRFilterObserver> observer = std::make_shared<KRFilterObserver>();
};

}  // namespace

TEST_F(KRDBUnionEntitiesFilterTest, HoldsTheEntitiesOfEveryMember) {
  EXPECT_EQ(*united->entities(), (KRDBEntitySet{image1, image2, image3}));
  EXPECT_TRUE(united->isEntitySatisfiesFilterConditions(image3));
  EXPECT_FALSE(united->isEntitySatisfiesFilterConditions(KRTestEntities::makeImage(9)));
}

TEST_F(KRDBUnionEntitiesFilterTest, WithoutMembersItIsEmpty) {
  EXPECT_TRUE(obtainedNow(KRDBUnionEntitiesFilter::initWithEntitiesFilters({})).empty());
}

TEST_F(KRDBUnionEntitiesFilterTest, AnEntityOneMemberDeletesStaysWhileAnotherHoldsIt) {
  left->change({}, {image2}, {});
  EXPECT_TRUE(united->containsEntity(image2));
  EXPECT_TRUE(observer->events.empty());
  right->change({}, {image2}, {});
  EXPECT_FALSE(united->containsEntity(image2));
  EXPECT_EQ(*setUnder(observer->events.front().info, KRDBEntitiesFilterDeletedEntities),
            (KRDBEntitySet{image2}));
}

TEST_F(KRDBUnionEntitiesFilterTest, AnEntityAMemberAddsEnters) {
  const auto image4 = KRTestEntities::makeImage(4);
  right->change({image4}, {}, {});
  EXPECT_TRUE(united->containsEntity(image4));
}

TEST_F(KRDBUnionEntitiesFilterTest, TheSameMembersAgainChangeNothingOthersResetAndMoveTheListening) {
  united->setEntitiesFilters({left, right});
  EXPECT_TRUE(observer->events.empty());
  const auto other = KRSourceFilter::withEntities({image3});
  united->setEntitiesFilters({other});
  EXPECT_EQ(observer->names().back(), "reset");
  EXPECT_FALSE(left->hasListener(united));
  EXPECT_TRUE(other->hasListener(united));
  EXPECT_EQ(obtainedNow(united), (KRDBEntitySet{image3}));
}

TEST_F(KRDBUnionEntitiesFilterTest, AMembersResetResetsTheUnion) {
  left->reset();
  EXPECT_FALSE(united->entities());
  EXPECT_EQ(observer->names().back(), "reset");
}
