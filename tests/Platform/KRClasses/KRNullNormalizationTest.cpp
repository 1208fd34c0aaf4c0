#include "KRClasses/KRNullNormalization.hpp"

#include <gtest/gtest.h>

TEST(KRNullNormalizationTest, NilBecomesNullAndBack) {
  EXPECT_TRUE(KRGetNullNormalizedObject(KRValue()).isNull());
  EXPECT_TRUE(KRGetNullDenormalizedObject(KRValue::null()).isNil());
}

TEST(KRNullNormalizationTest, OtherValuesPassUnchanged) {
  const KRValue text("x");
  EXPECT_TRUE(identical(KRGetNullNormalizedObject(text), text));
  EXPECT_TRUE(identical(KRGetNullDenormalizedObject(text), text));
  EXPECT_EQ(KRGetNullDenormalizedObject(KRValue(0)), KRValue(0));
}
