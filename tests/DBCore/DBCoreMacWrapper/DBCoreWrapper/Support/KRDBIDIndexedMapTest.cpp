#include "Support/KRDBIDIndexedMap.hpp"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <vector>

namespace {

using Map = KRDBIDIndexedMap<std::string>;

// The value under the id, or "-" when there is none.
std::string valueAt(const Map& map, int64_t id) {
  const auto* found = map.find(id);
  return found ? *found : "-";
}

}  // namespace

TEST(KRDBIDIndexedMapTest, AnEmptyMapFindsNothing) {
  const Map map;
  EXPECT_TRUE(map.empty());
  EXPECT_EQ(map.size(), 0u);
  EXPECT_EQ(map.find(0), nullptr);
  EXPECT_TRUE(Map(std::vector<Map::Entry>{}).empty());
}

TEST(KRDBIDIndexedMapTest, IdsFillingTheirRangeAreHeldByIndex) {
  const Map map({{3, "c"}, {1, "a"}, {2, "b"}, {5, "e"}});
  EXPECT_TRUE(map.isDense());
  EXPECT_EQ(map.size(), 4u);
  EXPECT_EQ(valueAt(map, 1), "a");
  EXPECT_EQ(valueAt(map, 3), "c");
  EXPECT_EQ(valueAt(map, 5), "e");
  // A gap inside the range, and ids on either side of it.
  EXPECT_EQ(valueAt(map, 4), "-");
  EXPECT_EQ(valueAt(map, 0), "-");
  EXPECT_EQ(valueAt(map, 6), "-");
  EXPECT_EQ(valueAt(map, -1), "-");
}

TEST(KRDBIDIndexedMapTest, ScatteredIdsAreHashed) {
  const Map map({{7, "x"}, {1'000'000, "y"}});
  EXPECT_FALSE(map.isDense());
  EXPECT_EQ(map.size(), 2u);
  EXPECT_EQ(valueAt(map, 7), "x");
  EXPECT_EQ(valueAt(map, 1'000'000), "y");
  EXPECT_EQ(valueAt(map, 8), "-");
}

TEST(KRDBIDIndexedMapTest, TheLastEntryOfAnIdWins) {
  const Map dense({{1, "first"}, {2, "b"}, {1, "last"}});
  EXPECT_EQ(dense.size(), 2u);
  EXPECT_EQ(valueAt(dense, 1), "last");
  const Map sparse({{1, "first"}, {900, "b"}, {1, "last"}});
  EXPECT_FALSE(sparse.isDense());
  EXPECT_EQ(sparse.size(), 2u);
  EXPECT_EQ(valueAt(sparse, 1), "last");
}

TEST(KRDBIDIndexedMapTest, ExtremeIdsDoNotOverflowTheRange) {
  constexpr int64_t lowest = std::numeric_limits<int64_t>::min();
  constexpr int64_t highest = std::numeric_limits<int64_t>::max();
  const Map map({{lowest, "low"}, {highest, "high"}, {0, "zero"}});
  EXPECT_FALSE(map.isDense());
  EXPECT_EQ(valueAt(map, lowest), "low");
  EXPECT_EQ(valueAt(map, highest), "high");
  EXPECT_EQ(valueAt(map, 0), "zero");
  const Map negative({{-3, "a"}, {-2, "b"}});
  EXPECT_TRUE(negative.isDense());
  EXPECT_EQ(valueAt(negative, -3), "a");
  EXPECT_EQ(valueAt(negative, -2), "b");
  EXPECT_EQ(valueAt(negative, highest), "-");
}

TEST(KRDBIDIndexedMapTest, ValuesAreMovedIn) {
  auto shared = std::make_shared<int>(42);
  const std::weak_ptr<int> watched = shared;
  KRDBIDIndexedMap<std::shared_ptr<int>> map({{1, std::move(shared)}});
  EXPECT_EQ(watched.use_count(), 1);
  EXPECT_EQ(**map.find(1), 42);
}
