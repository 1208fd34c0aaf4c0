#include "DBCoreWrapper.hpp"

#include <gtest/gtest.h>

#include <string>

namespace {

TEST(DBCoreWrapperTest, TheVersionExportsNameTheLibrary) {
  EXPECT_GE(DBCoreWrapperVersionNumber, 1.0);
  const std::string version(reinterpret_cast<const char*>(DBCoreWrapperVersionString));
  EXPECT_NE(version.find("DBCoreWrapper"), std::string::npos);
  EXPECT_NE(version.find(std::to_string(static_cast<int>(DBCoreWrapperVersionNumber))), std::string::npos);
}

TEST(DBCoreWrapperTest, TheBundleIdentifierIsAReverseDomainName) {
  const std::string identifier(KRDBCoreWrapperBundleIdentifier);
  EXPECT_EQ(identifier.rfind("com.", 0), 0u);
  EXPECT_EQ(identifier.substr(identifier.rfind('.') + 1), "DBCoreWrapper");
}

}  // namespace
