#include "KRFoundation/KRUUID.hpp"

#include <gtest/gtest.h>

#include <string>
#include <unordered_set>

namespace {

bool isUpperHexDigit(char c) { return (c >= '0' && c <= '9') || (c >= 'A' && c <= 'F'); }

TEST(KRUUIDTest, StringIsCanonicalUpperCase) {
  const std::string uuid = KRUUID::UUIDString().str();
  ASSERT_EQ(uuid.size(), 36u);
  for (size_t i = 0; i < uuid.size(); ++i) {
    if (i == 8 || i == 13 || i == 18 || i == 23) {
      EXPECT_EQ(uuid[i], '-') << uuid << " at " << i;
    } else {
      EXPECT_TRUE(isUpperHexDigit(uuid[i])) << uuid << " at " << i;
    }
  }
}

TEST(KRUUIDTest, StringIsARandomVersion4Uuid) {
  const std::string uuid = KRUUID::UUIDString().str();
  ASSERT_EQ(uuid.size(), 36u);
  EXPECT_EQ(uuid[14], '4') << uuid;
  EXPECT_NE(std::string("89AB").find(uuid[19]), std::string::npos) << uuid;
}

TEST(KRUUIDTest, ThousandStringsAreDistinct) {
  std::unordered_set<std::string> seen;
  for (int i = 0; i < 1000; ++i) seen.insert(KRUUID::UUIDString().str());
  EXPECT_EQ(seen.size(), 1000u);
}

}  // namespace
