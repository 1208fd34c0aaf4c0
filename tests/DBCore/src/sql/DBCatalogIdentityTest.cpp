#include "dbcatalogidentity.hpp"

#include <gtest/gtest.h>

#include "dbconnection.hpp"
#include "dbreadonlydatabase.hpp"
#include "dbschema.hpp"
#include "support/KRTemporaryDirectory.hpp"

using namespace dbcore;

namespace {

using View = DBReadOnlyDatabase::View;

class DBCatalogIdentityTest : public testing::Test {
 protected:
  std::string catalog(const std::string& name) {
    const std::string path = directory.file(name);
    DBConnection connection(path);
    connection.transaction([&connection] {
      DBSchema::migrate(connection, 0);
      connection.exec("PRAGMA application_id = 7");
    });
    return path;
  }

  static DBCatalogIdentity identityOf(const std::string& path) {
    return DBCatalogIdentity::of(DBReadOnlyDatabase(path, View::kMainFile));
  }

  KRTemporaryDirectory directory;
};

}  // namespace

TEST_F(DBCatalogIdentityTest, AssignsOnceAndKeepsIt) {
  const std::string path = catalog("a.db");
  const DBCatalogIdentity before = identityOf(path);
  DBConnection connection(path);
  EXPECT_TRUE(DBCatalogIdentity::assignIfMissing(connection));
  const DBCatalogIdentity assigned = identityOf(path);
  EXPECT_FALSE(before.sameCatalog(assigned));
  EXPECT_FALSE(DBCatalogIdentity::assignIfMissing(connection));
  EXPECT_TRUE(identityOf(path).sameCatalog(assigned));
}

TEST_F(DBCatalogIdentityTest, TwoCatalogsDiffer) {
  const std::string first = catalog("a.db");
  const std::string second = catalog("b.db");
  DBConnection one(first);
  DBConnection two(second);
  DBCatalogIdentity::assignIfMissing(one);
  DBCatalogIdentity::assignIfMissing(two);
  EXPECT_FALSE(identityOf(first).sameCatalog(identityOf(second)));
  EXPECT_TRUE(identityOf(first).sameCatalog(identityOf(first)));
}

TEST_F(DBCatalogIdentityTest, RenewGivesANewIdentifier) {
  const std::string path = catalog("a.db");
  DBConnection connection(path);
  DBCatalogIdentity::assignIfMissing(connection);
  const DBCatalogIdentity before = identityOf(path);
  EXPECT_TRUE(DBCatalogIdentity::renew(connection.handle()));
  EXPECT_FALSE(before.sameCatalog(identityOf(path)));
  EXPECT_FALSE(DBCatalogIdentity::renew(DBConnection(":memory:").handle()));
}

TEST_F(DBCatalogIdentityTest, ApplicationIdIsPartOfTheIdentity) {
  const std::string path = catalog("a.db");
  const DBCatalogIdentity before = identityOf(path);
  DBConnection(path).exec("PRAGMA application_id = 8");
  EXPECT_FALSE(before.sameCatalog(identityOf(path)));
}

TEST_F(DBCatalogIdentityTest, BlankAndUnreadable) {
  const std::string blank = directory.file("blank.db");
  DBConnection(blank).exec("PRAGMA journal_mode = WAL");
  EXPECT_TRUE(identityOf(blank).blank());
  EXPECT_FALSE(identityOf(catalog("a.db")).blank());
  EXPECT_FALSE(DBCatalogIdentity::unreadable().readable());
  EXPECT_FALSE(DBCatalogIdentity::unreadable().blank());
  EXPECT_FALSE(DBCatalogIdentity::unreadable().sameCatalog(DBCatalogIdentity::unreadable()));
}
