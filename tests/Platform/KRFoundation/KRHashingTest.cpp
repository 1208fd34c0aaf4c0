#include "KRFoundation/KRHashing.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <unordered_set>

TEST(KRHashingTest, MixIsDeterministicAndSpreadsNeighbours) {
  EXPECT_EQ(KRHashing::mix(1), KRHashing::mix(1));
  std::unordered_set<uint64_t> seen;
  for (uint64_t i = 0; i < 10000; ++i) seen.insert(KRHashing::mix(i));
  EXPECT_EQ(seen.size(), 10000u);
  // Neighbouring inputs differ in about half of their output bits.
  const int bits = std::popcount(KRHashing::mix(1000) ^ KRHashing::mix(1001));
  EXPECT_GT(bits, 16);
  EXPECT_LT(bits, 48);
}

TEST(KRHashingTest, CombineDependsOnOrder) {
  EXPECT_NE(KRHashing::combine(KRHashing::combine(0, 1), 2), KRHashing::combine(KRHashing::combine(0, 2), 1));
}
