#include "KRFoundation/KRDictionary.hpp"

#include <gtest/gtest.h>

TEST(KRDictionaryTest, LooksUpByEqualKeys) {
  const KRDictionary dictionary{{"rating", 3}, {1, "one"}};
  EXPECT_EQ(dictionary.objectForKey("rating"), KRValue(3));
  EXPECT_EQ(dictionary.objectForKey(1.0), KRValue("one"));
  EXPECT_TRUE(dictionary.objectForKey("missing").isNil());
  EXPECT_TRUE(KRDictionary().objectForKey("rating").isNil());
}

TEST(KRDictionaryTest, LaterEntryForEqualKeyWinsAndKeepsPosition) {
  const KRDictionary dictionary{{"a", 1}, {"b", 2}, {"a", 3}};
  ASSERT_EQ(dictionary.count(), 2u);
  EXPECT_EQ(dictionary.entries()[0].first, KRValue("a"));
  EXPECT_EQ(dictionary.entries()[0].second, KRValue(3));
}

TEST(KRDictionaryTest, MergingKeepsEarlierKeysAndLetsLaterValuesWin) {
  const KRDictionary first{{"a", 1}, {"b", 2}};
  const KRDictionary merged = first.dictionaryByAddingEntriesFromDictionary({{"b", 20}, {"c", 30}});
  EXPECT_EQ(merged, (KRDictionary{{"a", 1}, {"b", 20}, {"c", 30}}));
  EXPECT_EQ(first.count(), 2u);
}

TEST(KRDictionaryTest, SettingAndRemovingMakeCopies) {
  const KRDictionary base{{"a", 1}, {"b", 2}, {"c", 3}};
  const auto removed = base.dictionaryByRemovingObjectForKey("b");
  EXPECT_EQ(removed.count(), 2u);
  EXPECT_EQ(removed.objectForKey("c"), KRValue(3));
  EXPECT_EQ(removed.entries()[1].first, KRValue("c"));
  const auto set = KRDictionary().dictionaryBySettingObject(5, "x");
  EXPECT_EQ(set.objectForKey("x"), KRValue(5));
  EXPECT_EQ(base.count(), 3u);
}

TEST(KRDictionaryTest, EqualityIgnoresOrderAndHashFollows) {
  const KRDictionary a{{"a", 1}, {"b", 2}};
  const KRDictionary b{{"b", 2}, {"a", 1.0}};
  EXPECT_EQ(a, b);
  EXPECT_EQ(a.hash(), b.hash());
  EXPECT_FALSE(a == (KRDictionary{{"a", 1}, {"b", 3}}));
  EXPECT_FALSE(identical(a, b));
}

TEST(KRDictionaryTest, KeysAndValuesInOrder) {
  const KRDictionary dictionary{{"x", 1}, {"y", 2}};
  EXPECT_EQ(dictionary.allKeys(), (KRArray{"x", "y"}));
  EXPECT_EQ(dictionary.allValues(), (KRArray{1, 2}));
}
