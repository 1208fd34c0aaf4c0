#include "dbreftree.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <string>

using namespace dbcore;

namespace {

DBRefFolderPathPair folderAt(const std::wstring& text) {
  auto path = std::make_shared<DBPath>();
  path->path = text;
  return {std::make_shared<DBRefFolder>(), path};
}

}  // namespace

TEST(DBRefFolderTreeTest, RootHoldsItsPairAndGoesUnderTheHiddenRootByDefault) {
  const DBRefFolderPathPair pair = folderAt(L"/Photos");
  const DBRefFolderTree tree(pair);
  EXPECT_EQ(tree.root()->folder(), pair.first);
  EXPECT_EQ(tree.root()->path(), pair.second);
  EXPECT_TRUE(tree.root()->children().empty());
  EXPECT_EQ(tree.parent_id(), 1);
  EXPECT_EQ(DBRefFolderTree(folderAt(L"/Other"), 9).parent_id(), 9);
}

TEST(DBRefFolderTreeTest, AddNodeAppendsUnderTheGivenNodeInOrder) {
  DBRefFolderTree tree(folderAt(L"/Photos"));
  const auto first = tree.add_node(tree.root(), folderAt(L"/Photos/a"));
  const auto second = tree.add_node(tree.root(), folderAt(L"/Photos/b"));
  const auto deep = tree.add_node(first, folderAt(L"/Photos/a/deep"));
  ASSERT_EQ(tree.root()->children().size(), 2u);
  EXPECT_EQ(tree.root()->children()[0], first);
  EXPECT_EQ(tree.root()->children()[1], second);
  ASSERT_EQ(first->children().size(), 1u);
  EXPECT_EQ(first->children()[0], deep);
  EXPECT_EQ(deep->path()->path, L"/Photos/a/deep");
  EXPECT_TRUE(second->children().empty());
}
