#include "KRFoundation/KRMapTable.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace {

struct Key {
  int type;
  int id;
};
using KeyPtr = std::shared_ptr<const Key>;

KRMapTable<KeyPtr, std::string> byTypeAndId() {
  return KRMapTable<KeyPtr, std::string>(
      [](const KeyPtr& k) { return static_cast<uint64_t>(k->type * 1000 + k->id); },
      [](const KeyPtr& a, const KeyPtr& b) { return a->type == b->type && a->id == b->id; });
}

KRMapTable<KeyPtr, std::string> byIdOnly() {
  return KRMapTable<KeyPtr, std::string>([](const KeyPtr& k) { return static_cast<uint64_t>(k->id); },
                                         [](const KeyPtr& a, const KeyPtr& b) { return a->id == b->id; });
}

KeyPtr key(int type, int id) { return std::make_shared<const Key>(Key{type, id}); }

}  // namespace

TEST(KRMapTableTest, UsesTheCallersEqualityNotIdentity) {
  auto table = byTypeAndId();
  table.setObject("image", key(1, 42));
  EXPECT_EQ(table.objectForKey(key(1, 42)), "image");
  EXPECT_TRUE(table.containsKey(key(1, 42)));
  EXPECT_EQ(table.objectForKey(key(2, 42)), "");
  EXPECT_EQ(table.count(), 1u);
}

TEST(KRMapTableTest, SameIdDifferentTypeCollapsesUnderIdOnlyEquality) {
  auto mixed = byTypeAndId();
  auto same = byIdOnly();
  for (auto* table : {&mixed, &same}) {
    table->setObject("a", key(1, 7));
    table->setObject("b", key(2, 7));
  }
  EXPECT_EQ(mixed.count(), 2u);
  EXPECT_EQ(same.count(), 1u);
  EXPECT_EQ(same.objectForKey(key(1, 7)), "b");
}

TEST(KRMapTableTest, RemovalAndEnumeration) {
  auto table = byTypeAndId();
  for (int i = 0; i < 10; ++i) table.setObject(std::to_string(i), key(1, i));
  table.removeObjectForKey(key(1, 3));
  EXPECT_EQ(table.count(), 9u);
  EXPECT_EQ(table.allKeys().size(), 9u);
  int sum = 0;
  table.forEach([&sum](const KeyPtr& k, const std::string&) { sum += k->id; });
  EXPECT_EQ(sum, 45 - 3);
  auto copy = table;
  table.removeAllObjects();
  EXPECT_EQ(table.count(), 0u);
  EXPECT_EQ(copy.count(), 9u);
  EXPECT_EQ(copy.allValues().size(), 9u);
}
