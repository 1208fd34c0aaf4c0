#include "Model/KRDBFilteredImagesFetchRequest/KRPrepareCondtionsHelper.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <ctime>

#include "KRFoundation/KRException.hpp"

namespace {

using Helper = KRPrepareCondtionsHelper;

// Seconds since 1970 of the start of today in the local time zone.
double startOfToday() {
  const std::time_t now = std::time(nullptr);
  std::tm local{};
  localtime_r(&now, &local);
  local.tm_hour = 0;
  local.tm_min = 0;
  local.tm_sec = 0;
  local.tm_isdst = -1;
  return static_cast<double>(std::mktime(&local));
}

TEST(KRPrepareCondtionsHelperTest, TheMarkersAreExported) {
  EXPECT_STREQ(KRPrepareConditionsStartMatFormula, "$MAT_FUNCTION[");
  EXPECT_STREQ(KRPrepareConditionsEndMatFormula, "]");
  EXPECT_EQ(Helper::dayInterval(), 86400.0);
}

TEST(KRPrepareCondtionsHelperTest, TheMarkerIsFoundInAnyCase) {
  const auto range = Helper::matRangeForString("a > $mat_Function[1]");
  EXPECT_EQ(range.location, 4u);
  EXPECT_EQ(range.length, 14u);
  EXPECT_FALSE(Helper::matRangeForString("a > MAT_FUNCTION[1]").found());
  EXPECT_FALSE(Helper::matRangeForString(KRString()).found());
}

TEST(KRPrepareCondtionsHelperTest, AConditionWithoutMarkerIsReturnedAsItIs) {
  const KRString condition = "import_index > 3";
  EXPECT_TRUE(identical(Helper::prepareCondition(condition), condition));
  const KRString empty = "";
  EXPECT_TRUE(identical(Helper::prepareCondition(empty), empty));
  EXPECT_TRUE(Helper::prepareCondition(KRString()).isNil());
}

TEST(KRPrepareCondtionsHelperTest, EverySubExpressionIsReplacedLeftToRight) {
  EXPECT_EQ(Helper::prepareCondition("a == $MAT_FUNCTION[2 + 3]"), KRString("a == 5"));
  EXPECT_EQ(Helper::prepareCondition("a >= $MAT_FUNCTION[1 + 1] && b < $mat_function[10 / 4]]"),
            KRString("a >= 2 && b < 2]"));
}

TEST(KRPrepareCondtionsHelperTest, AMarkerWithoutEndOrAFormulaThatDoesNotParseDropsTheCondition) {
  EXPECT_TRUE(Helper::prepareCondition("a == $MAT_FUNCTION[2 + 3").isNil());
  EXPECT_TRUE(Helper::prepareCondition("a == $MAT_FUNCTION[1] && b == $MAT_FUNCTION[2").isNil());
  EXPECT_TRUE(Helper::prepareCondition("a == $MAT_FUNCTION[2 +]").isNil());
  EXPECT_THROW(Helper::calculateFormula("2 +"), KRException);
}

TEST(KRPrepareCondtionsHelperTest, FormulasGiveIntegersWithTheFractionCut) {
  EXPECT_EQ(Helper::calculateFormula("7.9"), KRString("7"));
  EXPECT_EQ(Helper::calculateFormula("-7.9"), KRString("-7"));
  EXPECT_EQ(Helper::calculateFormula("'text'"), KRString("0"));
  EXPECT_EQ(Helper::calculateFormula("1e300"), KRString("0"));
  EXPECT_EQ(Helper::calculateFormula("FUNCTION(SELF, 'dayInterval') * 2"), KRString("172800"));
}

TEST(KRPrepareCondtionsHelperTest, FormulasReachTheClock) {
  const double before = static_cast<double>(std::time(nullptr));
  const double now = Helper::currentDate();
  EXPECT_GE(now, before);
  EXPECT_LT(now, before + 5);
  const double dayInterval = Helper::currentDayInterval();
  EXPECT_GE(dayInterval, 0);
  EXPECT_LT(dayInterval, 90000);
  EXPECT_NEAR(now - dayInterval, startOfToday(), 5);
  const long formulaNow = std::stol(Helper::calculateFormula("FUNCTION(SELF, 'currentDate')").str());
  EXPECT_NEAR(static_cast<double>(formulaNow), now, 5);
  const long today = std::stol(
      Helper::calculateFormula("FUNCTION(SELF, 'currentDate') - FUNCTION(SELF, 'currentDayInterval')").str());
  EXPECT_NEAR(static_cast<double>(today), startOfToday(), 5);
  // The functions answer only the helper: another receiver gives no number.
  EXPECT_EQ(Helper::calculateFormula("FUNCTION('other', 'dayInterval')"), KRString("0"));
}

}  // namespace
