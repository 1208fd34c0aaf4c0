#include "Model/KRDBEntitiesFilter/KRDBCompoundEntitiesFilter.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "KRFilterObserver.hpp"
#include "KRSourceFilter.hpp"

namespace {

using EntityPtr = KRDBEntitiesFilter::EntityPtr;
using EntitySetPtr = KRDBEntitiesFilter::EntitySetPtr;

// A compound that admits everything and starts from its members' sets as they answered, in order.
class KRPlainCompoundFilter : public KRDBCompoundEntitiesFilter {
 public:
  static std::shared_ptr<KRPlainCompoundFilter> make(const EntitiesFilters& members) {
    std::shared_ptr<KRPlainCompoundFilter> filter(new KRPlainCompoundFilter());
    filter->initWithEntitiesFilters(members);
    return filter;
  }
  bool isEntitySatisfiesFilterConditions(const EntityPtr&) const override { return true; }
  void initiallyObtainFilteredEntities(EntitiesHandler completion) override {
    obtainMembersEntities([this, completion](const std::vector<EntitySetPtr>& sets) {
      answers = sets;
      completion(sets.empty() ? std::make_shared<KRDBEntitySet>() : sets.front());
    });
  }
  std::vector<EntitySetPtr> answers;

 private:
  KRPlainCompoundFilter() = default;
};

}  // namespace

TEST(KRDBCompoundEntitiesFilterTest, ListensToEveryMemberAndHearsTheirSetsInMemberOrder) {
  const auto image1 = KRTestEntities::makeImage(1);
  const auto image2 = KRTestEntities::makeImage(2);
  const auto first = KRSourceFilter::withEntities({image1});
  const auto second = KRSourceFilter::withEntities({image2});
  const auto compound = KRPlainCompoundFilter::make({first, second});
  EXPECT_TRUE(first->hasListener(compound));
  EXPECT_TRUE(second->hasListener(compound));
  obtainedNow(compound);
  ASSERT_EQ(compound->answers.size(), 2u);
  EXPECT_EQ(*compound->answers[0], (KRDBEntitySet{image1}));
  EXPECT_EQ(*compound->answers[1], (KRDBEntitySet{image2}));
}

TEST(KRDBCompoundEntitiesFilterTest, TheBaseTakesAMembersAddedAndDeletedEntitiesAsTheyAre) {
  const auto image1 = KRTestEntities::makeImage(1);
  const auto image2 = KRTestEntities::makeImage(2);
  const auto member = KRSourceFilter::withEntities({image1});
  const auto compound = KRPlainCompoundFilter::make({member});
  const auto added = std::make_shared<KRDBEntitySet>(KRDBEntitySet{image2});
  EXPECT_EQ(compound->filterAddedEntities(added), added);
  EXPECT_EQ(compound->filterDeletedEntities(added), added);
  obtainedNow(member);
  obtainedNow(compound);
  const auto observer = std::make_shared<KRFilterObserver>();
  compound->addListener(observer);
  member->change({image2}, {image1}, {});
  EXPECT_EQ(*compound->entities(), (KRDBEntitySet{image2}));
  EXPECT_EQ(observer->names(), (std::vector<std::string>{"entitiesList", "sortedList", "change"}));
}
