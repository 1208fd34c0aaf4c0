#include "Model/KRDBEntitiesFilter/KRDBCalendarRootNodeImagesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRCalendarImages.hpp"
#include "KRSourceFilter.hpp"

namespace {

using KRCalendarImages::imageTakenAt;
using KRCalendarImages::markImage;

class KRDBCalendarRootNodeImagesFilterTest : public testing::Test {
 protected:
  void SetUp() override {
    markImage(trashed, true, false);
    markImage(lost, false, true);
    markImage(at300, false, false);
    deleted->setMarkedToDelete(true);
  }

  std::shared_ptr<KRDBImage> at300 = imageTakenAt(1, 300);
  std::shared_ptr<KRDBImage> at100 = imageTakenAt(2, 100);
  std::shared_ptr<KRDBImage> trashed = imageTakenAt(3, 150);
  std::shared_ptr<KRDBImage> lost = imageTakenAt(4, 160);
  std::shared_ptr<KRDBImage> deleted = imageTakenAt(5, 170);
  std::shared_ptr<KRSourceFilter> base = KRSourceFilter::withEntities({at300, at100, trashed, lost, deleted});
};

}  // namespace

TEST_F(KRDBCalendarRootNodeImagesFilterTest, HoldsTheShownImagesOfTheBaseFilter) {
  const auto root = KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(base);
  EXPECT_EQ(root->baseFilter(), base);
  EXPECT_EQ(obtainedNow(root), (KRDBEntitySet{at300, at100}));
  EXPECT_FALSE(root->isEntitySatisfiesFilterConditions(KRTestEntities::makePath(1)));
}

TEST_F(KRDBCalendarRootNodeImagesFilterTest, SortsTheShownImagesByCaptureDate) {
  const auto root = KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(base);
  const auto& sortedFilter = root->sortedByDateImagesFilter();
  EXPECT_EQ(sortedFilter->entitiesFilter(), base);
  ASSERT_EQ(sortedFilter->sortDescriptors()->size(), 1u);
  EXPECT_EQ(sortedFilter->sortDescriptors()->front()->key(), "exivAttributes.date.timeIntervalSince1970");
  KRDBEntitiesFilter::EntityArrayPtr sorted;
  root->obtainSortedByDateImagesWithHandler([&](const auto& array) { sorted = array; });
  ASSERT_TRUE(sorted);
  EXPECT_EQ(*sorted, (KRDBEntitiesFilter::EntityArray{at100, at300}));
}

TEST_F(KRDBCalendarRootNodeImagesFilterTest, FollowsTheBaseFiltersChanges) {
  const auto root = KRDBCalendarRootNodeImagesFilter::initWithBaseFilter(base);
  obtainedNow(base);
  obtainedNow(root);
  const auto at50 = imageTakenAt(6, 50);
  base->change({at50}, {at300}, {});
  EXPECT_EQ(*root->entities(), (KRDBEntitySet{at100, at50}));
  KRDBEntitiesFilter::EntityArrayPtr sorted;
  root->obtainSortedByDateImagesWithHandler([&](const auto& array) { sorted = array; });
  EXPECT_EQ(*sorted, (KRDBEntitiesFilter::EntityArray{at50, at100}));
}
