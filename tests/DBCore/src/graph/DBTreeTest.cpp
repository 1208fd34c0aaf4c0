#include "dbtree.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "DBConnectionTestSupport.hpp"
#include "dbexception.hpp"

using namespace dbcore;

namespace {

class DBTreeTest : public DBCatalogTestBase {
 protected:
  // A collection under the given parent.
  long long filter(float order, long long parentId = DBTree::kRootId) {
    DBFilter record;
    record.order = order;
    const long long id = saved(record)->id();
    DBTree::setParent<DBFilter>(*connection, id, parentId);
    return id;
  }

  long long smartFilter(long long parentId) {
    const long long id = saved(DBSmartFilter())->id();
    DBTree::setParent<DBSmartFilter>(*connection, id, parentId);
    return id;
  }

  std::vector<long long> children(long long parentId) {
    return ids(DBTree::children<DBFilter>(*connection, parentId));
  }

  std::vector<long long> descendants(long long parentId) {
    return ids(DBTree::descendants<DBFilter>(*connection, parentId));
  }

  // Three collections whose parents form a ring, written past the engine as a damaged file would hold it.
  std::vector<long long> ring() {
    const long long a = filter(1);
    const long long b = filter(1, a);
    const long long c = filter(1, b);
    connection->prepare("UPDATE filters SET parent_id = ? WHERE _id_int_64 = ?")
        ->bind(1, c)
        .bind(2, a)
        .execute();
    return {a, b, c};
  }
};

}  // namespace

TEST_F(DBTreeTest, ChildrenAreOrderedByOrderThenId) {
  const long long second = filter(2);
  const long long first = filter(1);
  const long long tied = filter(2);
  EXPECT_EQ(children(DBTree::kRootId), (std::vector<long long>{first, second, tied}));
}

TEST_F(DBTreeTest, ChildrenOfATreeWithoutOrderComeInIdOrder) {
  const long long top = smartFilter(0);
  const long long a = smartFilter(top);
  const long long b = smartFilter(top);
  EXPECT_EQ(ids(DBTree::children<DBSmartFilter>(*connection, top)), (std::vector<long long>{a, b}));
}

TEST_F(DBTreeTest, DescendantsAreDepthFirstInSiblingOrder) {
  const long long b = filter(2);
  const long long a = filter(1);
  const long long a2 = filter(2, a);
  const long long a1 = filter(1, a);
  const long long b1 = filter(1, b);
  const long long a1x = filter(1, a1);
  EXPECT_EQ(descendants(DBTree::kRootId), (std::vector<long long>{a, a1, a1x, a2, b, b1}));
  EXPECT_EQ(descendants(a1x), std::vector<long long>{});
}

TEST_F(DBTreeTest, CycleIsWalkedOnceByDescendants) {
  const std::vector<long long> members = ring();
  EXPECT_EQ(descendants(members[0]), (std::vector<long long>{members[1], members[2]}));
}

TEST_F(DBTreeTest, CycleMakesTheAncestorWalkThrow) {
  const std::vector<long long> members = ring();
  EXPECT_TRUE(DBTree::isAncestorOrSelf<DBFilter>(*connection, members[1], members[2]));
  EXPECT_THROW(DBTree::isAncestorOrSelf<DBFilter>(*connection, DBTree::kRootId, members[2]), DBException);
}

TEST_F(DBTreeTest, AncestorOrSelfFollowsTheParents) {
  const long long a = filter(1);
  const long long b = filter(1, a);
  const long long sibling = filter(2);
  EXPECT_TRUE(DBTree::isAncestorOrSelf<DBFilter>(*connection, b, b));
  EXPECT_TRUE(DBTree::isAncestorOrSelf<DBFilter>(*connection, a, b));
  EXPECT_TRUE(DBTree::isAncestorOrSelf<DBFilter>(*connection, DBTree::kRootId, b));
  EXPECT_FALSE(DBTree::isAncestorOrSelf<DBFilter>(*connection, b, a));
  EXPECT_FALSE(DBTree::isAncestorOrSelf<DBFilter>(*connection, sibling, b));
}

TEST_F(DBTreeTest, ParentIdIsZeroForTheRootAndForAMissingRecord) {
  const long long a = filter(1);
  EXPECT_EQ(DBTree::parentId<DBFilter>(*connection, a), DBTree::kRootId);
  EXPECT_EQ(DBTree::parentId<DBFilter>(*connection, DBTree::kRootId), 0);
  EXPECT_EQ(DBTree::parentId<DBFilter>(*connection, 9999), 0);
}

TEST_F(DBTreeTest, SetParentToZeroWritesNull) {
  const long long a = filter(1);
  const long long b = filter(1, a);
  DBTree::setParent<DBFilter>(*connection, b, 0);
  EXPECT_EQ(queryIds("SELECT _id_int_64 FROM filters WHERE parent_id IS NULL"),
            (std::set<long long>{DBTree::kRootId, b}));
  DBTree::setParent<DBFilter>(*connection, b, a);
  EXPECT_EQ(DBTree::parentId<DBFilter>(*connection, b), a);
}
