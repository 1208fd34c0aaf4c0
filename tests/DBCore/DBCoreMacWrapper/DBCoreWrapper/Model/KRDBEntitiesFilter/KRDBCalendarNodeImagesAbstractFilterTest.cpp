#include "Model/KRDBEntitiesFilter/KRDBCalendarNodeImagesAbstractFilter.hpp"

#include <gtest/gtest.h>

#include <memory>

#include "KRFilterObserver.hpp"
#include "KRFoundation/KRException.hpp"
#include "KRServices/KRCapturingLogSink.hpp"
#include "KRSourceFilter.hpp"

namespace {

// A node admitting the images of odd id, leaving the date-sorted images to the abstract class.
class KROddImagesNode : public KRDBCalendarNodeImagesAbstractFilter {
 public:
  static std::shared_ptr<KROddImagesNode> make(const std::shared_ptr<KRDBEntitiesFilter>& base) {
    std::shared_ptr<KROddImagesNode> node(new KROddImagesNode());
    node->initWithBaseFilter(base);
    return node;
  }
  bool isEntitySatisfiesFilterConditions(const EntityPtr& entity) const override {
    return entity->entityID()->dbid() % 2 == 1;
  }

 private:
  KROddImagesNode() = default;
};

}  // namespace

TEST(KRDBCalendarNodeImagesAbstractFilterTest, HoldsTheBaseFiltersImagesItsTestAdmitsAndFollowsTheBase) {
  const auto image1 = KRTestEntities::makeImage(1);
  const auto image2 = KRTestEntities::makeImage(2);
  const auto image3 = KRTestEntities::makeImage(3);
  const auto base = KRSourceFilter::withEntities({image1, image2});
  const auto node = KROddImagesNode::make(base);
  EXPECT_EQ(node->baseFilter(), base);
  EXPECT_TRUE(base->hasListener(node));
  EXPECT_EQ(obtainedNow(node), (KRDBEntitySet{image1}));
  obtainedNow(base);
  base->change({image3}, {image1}, {});
  EXPECT_EQ(*node->entities(), (KRDBEntitySet{image3}));
  const auto observer = std::make_shared<KRFilterObserver>();
  node->addListener(observer);
  base->reset();
  EXPECT_FALSE(node->entities());
  EXPECT_EQ(observer->names().back(), "reset");
}

TEST(KRDBCalendarNodeImagesAbstractFilterTest, TheDateSortedImagesAreTheSubclassesToGive) {
  const auto node = KROddImagesNode::make(KRSourceFilter::withEntities({}));
  KRCapturingLogSink sink;
  EXPECT_THROW(node->obtainSortedByDateImagesWithHandler([](const auto&) {}), KRException);
  ASSERT_EQ(sink.records().size(), 1u);
  EXPECT_EQ(sink.records()[0].level, 1);
  EXPECT_EQ(sink.records()[0].message,
            "Error: obtainSortedByDateImagesWithHandler should be overrided in subclass");
}
