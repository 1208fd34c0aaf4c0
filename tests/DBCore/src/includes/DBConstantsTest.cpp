#include "dbconstants.hpp"

#include <gtest/gtest.h>

namespace {

TEST(DBConstantsTest, ConditionKeysHaveTheirFixedTexts) {
  EXPECT_EQ(dbcore::kImagesConditionKey, L"imageCondition");
  EXPECT_EQ(dbcore::kUserAttributesConditionKey, L"userAttributesCondition");
  EXPECT_EQ(dbcore::kExivAttributesConditionKey, L"exivAttributesCondition");
}

TEST(DBConstantsTest, UserConditionsDelimiterIsTheUnitSeparator) {
  EXPECT_EQ(dbcore::kUserConditionsDelimiter, std::wstring(1, L'\x1F'));
}

}  // namespace
