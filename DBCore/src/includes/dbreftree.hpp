#pragma once

#include <memory>
#include <utility>
#include <vector>

#include "dbpath.hpp"
#include "dbreffolder.hpp"

namespace dbcore {

using DBRefFolderPathPair = std::pair<std::shared_ptr<DBRefFolder>, std::shared_ptr<DBPath>>;

// One node of a referenced-folder tree: a folder, its path and its child nodes.
class DBRefFolderNode {
 public:
  explicit DBRefFolderNode(DBRefFolderPathPair pair) : pair_(std::move(pair)) {}

  const std::shared_ptr<DBRefFolder>& folder() const { return pair_.first; }
  const std::shared_ptr<DBPath>& path() const { return pair_.second; }
  const std::vector<std::shared_ptr<DBRefFolderNode>>& children() const { return children_; }
  void add_child(std::shared_ptr<DBRefFolderNode> child) { children_.push_back(std::move(child)); }

 private:
  DBRefFolderPathPair pair_;
  std::vector<std::shared_ptr<DBRefFolderNode>> children_;
};

// A tree of referenced folders with their paths, written in one step. The root goes under the folder
// `parent_id` (the hidden root, 1, unless set).
class DBRefFolderTree {
 public:
  explicit DBRefFolderTree(DBRefFolderPathPair root, long long parent_id = 1)
      : root_(std::make_shared<DBRefFolderNode>(std::move(root))), parent_id_(parent_id) {}

  const std::shared_ptr<DBRefFolderNode>& root() const { return root_; }
  long long parent_id() const { return parent_id_; }
  // Adds a node under the given one and returns it.
  std::shared_ptr<DBRefFolderNode> add_node(const std::shared_ptr<DBRefFolderNode>& parent,
                                            DBRefFolderPathPair pair) {
    auto node = std::make_shared<DBRefFolderNode>(std::move(pair));
    parent->add_child(node);
    return node;
  }

 private:
  std::shared_ptr<DBRefFolderNode> root_;
  long long parent_id_;
};

}  // namespace dbcore
