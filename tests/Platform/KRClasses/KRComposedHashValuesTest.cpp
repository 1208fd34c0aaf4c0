#include "KRClasses/KRComposedHashValues.hpp"

#include <gtest/gtest.h>

#include <unordered_set>

TEST(KRComposedHashValuesTest, EqualSequencesGiveEqualHashes) {
  const uint64_t a[] = {1, 42};
  const uint64_t b[] = {1, 42};
  EXPECT_EQ(composedHashValues(a, 2), composedHashValues(b, 2));
}

TEST(KRComposedHashValuesTest, OrderAndEveryValueMatter) {
  const uint64_t a[] = {1, 42};
  const uint64_t b[] = {42, 1};
  const uint64_t c[] = {2, 42};
  EXPECT_NE(composedHashValues(a, 2), composedHashValues(b, 2));
  EXPECT_NE(composedHashValues(a, 2), composedHashValues(c, 2));
  EXPECT_NE(composedHashValues(a, 1), composedHashValues(a, 2));
}

TEST(KRComposedHashValuesTest, TypeAndIdPairsDoNotCollide) {
  std::unordered_set<uint64_t> seen;
  for (uint64_t type = 0; type < 14; ++type) {
    for (uint64_t id = 0; id < 2000; ++id) {
      const uint64_t pair[] = {type, id};
      seen.insert(composedHashValues(pair, 2));
    }
  }
  EXPECT_EQ(seen.size(), 14u * 2000u);
}
