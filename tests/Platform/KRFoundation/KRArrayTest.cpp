#include "KRFoundation/KRArray.hpp"

#include <gtest/gtest.h>

#include "KRFoundation/KRException.hpp"

TEST(KRArrayTest, NilAndEmptyDiffer) {
  EXPECT_TRUE(KRArray().isNil());
  EXPECT_FALSE(KRArray::array().isNil());
  EXPECT_EQ(KRArray::array().count(), 0u);
  EXPECT_FALSE(KRArray() == KRArray::array());
}

TEST(KRArrayTest, HoldsValuesInOrder) {
  const KRArray array{1, "two", 3.5};
  ASSERT_EQ(array.count(), 3u);
  EXPECT_EQ(array.objectAtIndex(0), KRValue(1));
  EXPECT_EQ(array.objectAtIndex(1), KRValue("two"));
  EXPECT_EQ(array.values()[2], KRValue(3.5));
}

TEST(KRArrayTest, IndexPastTheEndRaisesRangeException) {
  const KRArray array{1};
  try {
    array.objectAtIndex(1);
    FAIL() << "no exception";
  } catch (const KRException& exception) {
    EXPECT_EQ(exception.name(), KRString(KRException::NSRangeException));
  }
}

TEST(KRArrayTest, EqualityIsElementwise) {
  EXPECT_EQ((KRArray{1, 2}), (KRArray{1.0, 2}));
  EXPECT_FALSE((KRArray{1, 2}) == (KRArray{2, 1}));
  EXPECT_EQ((KRArray{1, 2}).hash(), (KRArray{1.0, 2}).hash());
  EXPECT_NE((KRArray{1, 2}).hash(), (KRArray{2, 1}).hash());
}

TEST(KRArrayTest, AddingMakesANewArray) {
  const KRArray array{1};
  const KRArray longer = array.arrayByAddingObject("x");
  EXPECT_EQ(array.count(), 1u);
  EXPECT_EQ(longer.count(), 2u);
  EXPECT_TRUE(longer.containsObject("x"));
  EXPECT_FALSE(array.containsObject("x"));
}
