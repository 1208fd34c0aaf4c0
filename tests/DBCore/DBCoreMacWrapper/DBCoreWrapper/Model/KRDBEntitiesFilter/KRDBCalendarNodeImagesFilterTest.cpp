#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRCalendarImages.hpp"
#include "KRSourceFilter.hpp"
#include "Model/KRDBEntitiesFilter/KRDBCalendarRootNodeImagesFilter.hpp"

namespace {

using KRCalendarImages::imageTakenAt;

class KRDBCalendarNodeImagesFilterTest : public testing::Test {
 protected:
  void SetUp() override { obtainedNow(base); }

  std::shared_ptr<KRDBImage> at100 = imageTakenAt(1, 100);
  std::shared_ptr<KRDBImage> at200 = imageTakenAt(2, 200);
  std::shared_ptr<KRDBImage> at300 = imageTakenAt(3, 300);
  std::shared_ptr<KRDBImage> undated = KRTestEntities::makeImage(4);
  std::shared_ptr<KRSourceFilter> base = KRSourceFilter::withEntities({at300, at100, undated, at200});
  std::shared_ptr<KRDBCalendarRootNodeImagesFilter> root =
      KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(base);
};

}  // namespace

TEST_F(KRDBCalendarNodeImagesFilterTest, TheStartIsInTheRangeAndTheEndIsNot) {
  const auto node = KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 100, 300);
  EXPECT_TRUE(node->isEntitySatisfiesFilterConditions(at100));
  EXPECT_TRUE(node->isEntitySatisfiesFilterConditions(at200));
  EXPECT_FALSE(node->isEntitySatisfiesFilterConditions(at300));
  EXPECT_FALSE(node->isEntitySatisfiesFilterConditions(undated));
  EXPECT_EQ(obtainedNow(node), (KRDBEntitySet{at100, at200}));
}

TEST_F(KRDBCalendarNodeImagesFilterTest, RangesBeforeAfterAndBetweenTheImagesAreEmpty) {
  EXPECT_TRUE(obtainedNow(KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 0, 100)).empty());
  EXPECT_TRUE(obtainedNow(KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 301, 400)).empty());
  EXPECT_TRUE(obtainedNow(KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 101, 200)).empty());
  EXPECT_EQ(obtainedNow(KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 0, 1000)),
            (KRDBEntitySet{at100, at200, at300}));
}

TEST_F(KRDBCalendarNodeImagesFilterTest, NodesBelowNodesShareTheRootsSortedArray) {
  const auto year = KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 0, 250);
  const auto month = KRDBCalendarNodeImagesFilter::initWithParentFilter(year, 150, 250);
  EXPECT_EQ(month->parentFilter(), year);
  EXPECT_EQ(month->baseFilter(), year);
  KRDBEntitiesFilter::EntityArrayPtr fromMonth;
  month->obtainSortedByDateImagesWithHandler([&](const auto& sorted) { fromMonth = sorted; });
  EXPECT_EQ(fromMonth, root->sortedByDateImagesFilter()->sortedEntities());
  EXPECT_EQ(obtainedNow(month), (KRDBEntitySet{at200}));
}

TEST_F(KRDBCalendarNodeImagesFilterTest, ANodeFollowsItsParentsChanges) {
  const auto node = KRDBCalendarNodeImagesFilter::initWithParentFilter(root, 0, 250);
  obtainedNow(root);
  obtainedNow(node);
  const auto at150 = imageTakenAt(5, 150);
  const auto at400 = imageTakenAt(6, 400);
  base->change({at150, at400}, {at100}, {});
  EXPECT_EQ(*node->entities(), (KRDBEntitySet{at150, at200}));
}
