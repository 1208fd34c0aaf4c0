#include "Model/KRDBCatalog/DBCoreUtils.hpp"

#include <gtest/gtest.h>

#include "dbexception.hpp"

namespace {

using dbcore::DBException;

TEST(DBCoreUtilsTest, CodeTagAndDescriptionMakeTheName) {
  const KRException converted = DBCoreUtils::exceptionFromDBException(DBException("X", 5), "RemoveDBImage");
  EXPECT_EQ(converted.name(), KRString("DBCore(code #5), tag:RemoveDBImage: X"));
  EXPECT_EQ(converted.reason(), KRString("X"));
  EXPECT_EQ(converted.userInfo(),
            KRDictionary({{"DBCoreExceptionCode", 5}, {"KRDBExceptionDescription", "RemoveDBImage"}}));
}

TEST(DBCoreUtilsTest, NoCodeNoTagAndNoDescriptionIsNamedDBCoreAlone) {
  const KRException converted = DBCoreUtils::exceptionFromDBException(DBException(""), KRString());
  EXPECT_EQ(converted.name(), KRString("DBCore"));
  EXPECT_TRUE(converted.reason().isNil());
  EXPECT_EQ(converted.userInfo(), KRDictionary({{"DBCoreExceptionCode", -1}}));
}

TEST(DBCoreUtilsTest, AnEmptyTagIsLeftOutOfTheNameButKeptInTheUserInfo) {
  const KRException converted = DBCoreUtils::exceptionFromDBException(DBException("disk I/O error", 10), "");
  EXPECT_EQ(converted.name(), KRString("DBCore(code #10): disk I/O error"));
  EXPECT_EQ(converted.userInfo().objectForKey(KRDBExceptionDescription), KRValue(""));
}

TEST(DBCoreUtilsTest, ATagWithoutDescriptionOrCode) {
  const KRException converted = DBCoreUtils::exceptionFromDBException(DBException(""), "Close");
  EXPECT_EQ(converted.name(), KRString("DBCore, tag:Close"));
  EXPECT_TRUE(converted.reason().isNil());
}

TEST(DBCoreUtilsTest, ExportedConstants) {
  EXPECT_STREQ(KRDBExceptionDescription, "KRDBExceptionDescription");
  EXPECT_STREQ(DBCoreExceptionCode, "DBCoreExceptionCode");
  EXPECT_EQ(DBExceptionDomainInternal, -1);
}

}  // namespace
