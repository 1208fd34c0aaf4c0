#include "KRFoundation/KRException.hpp"

#include <gtest/gtest.h>

TEST(KRExceptionTest, CarriesNameReasonAndUserInfo) {
  const KRException exception("DBCore(code #5)", "X", KRDictionary{{"DBCoreExceptionCode", 5}});
  EXPECT_EQ(exception.name(), KRString("DBCore(code #5)"));
  EXPECT_EQ(exception.reason(), KRString("X"));
  EXPECT_EQ(exception.userInfo().objectForKey("DBCoreExceptionCode"), KRValue(5));
  EXPECT_STREQ(exception.what(), "DBCore(code #5): X");
}

TEST(KRExceptionTest, DescriptionWithoutReasonIsTheName) {
  const KRException exception("DBCore", KRString());
  EXPECT_EQ(exception.description(), "DBCore");
  EXPECT_TRUE(exception.userInfo().isNil());
}

TEST(KRExceptionTest, RaiseThrowsByValue) {
  try {
    KRException::raise(KRException::NSInvalidArgumentException, "bad");
    FAIL() << "no exception";
  } catch (const std::exception& exception) {
    EXPECT_STREQ(exception.what(), "NSInvalidArgumentException: bad");
  }
}
