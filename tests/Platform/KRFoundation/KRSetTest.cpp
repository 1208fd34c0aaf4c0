#include "KRFoundation/KRSet.hpp"

#include <gtest/gtest.h>

namespace {
class Thing : public KRObject {};
}  // namespace

TEST(KRSetTest, EqualValuesCollapse) {
  const KRSet set{1, 1.0, true, "a", KRString("a")};
  EXPECT_EQ(set.count(), 2u);
  EXPECT_TRUE(set.containsObject(1));
  EXPECT_TRUE(set.containsObject("a"));
  EXPECT_FALSE(set.containsObject(2));
}

TEST(KRSetTest, ObjectsAreMembersByIdentity) {
  auto a = std::make_shared<Thing>();
  auto b = std::make_shared<Thing>();
  const KRSet set{a};
  EXPECT_TRUE(set.containsObject(a));
  EXPECT_FALSE(set.containsObject(b));
  EXPECT_EQ(set.setByAddingObject(b).count(), 2u);
  EXPECT_EQ(set.setByAddingObject(a).count(), 1u);
}

TEST(KRSetTest, EqualityIgnoresOrder) {
  EXPECT_EQ((KRSet{1, 2, 3}), (KRSet{3, 2, 1}));
  EXPECT_EQ((KRSet{1, 2, 3}).hash(), (KRSet{3, 2, 1}).hash());
  EXPECT_FALSE((KRSet{1, 2}) == (KRSet{1, 3}));
  EXPECT_FALSE(KRSet() == KRSet::set());
}

TEST(KRSetTest, IteratesInInsertionOrder) {
  const KRSet set{"c", "a", "b", "a"};
  ASSERT_EQ(set.allObjects().size(), 3u);
  EXPECT_EQ(set.allObjects()[0], KRValue("c"));
  EXPECT_EQ(set.allObjects()[2], KRValue("b"));
}
