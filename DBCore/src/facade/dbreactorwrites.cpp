#include "dbreactor.hpp"

#include "dblinks.hpp"
#include "dbreactorsupport.hpp"
#include "dbrecordvisitor.hpp"

// Writes of records, batches, folder bindings and referenced-folder trees.

namespace dbcore {

// New collections go under the root; new referenced folders too (a binding or tree names their parent);
// new smart filters start at the top of their own tree.
template <class T>
void DBReactor::writeOne(T& record) {
  DBConnection& db = connection();
  if constexpr (std::is_same_v<T, DBFilter> || std::is_same_v<T, DBRefFolder>) {
    DBReactorSupport::writeTreeRecord(db, record, DBTree::kRootId);
  } else if constexpr (std::is_same_v<T, DBSmartFilter>) {
    DBReactorSupport::writeTreeRecord(db, record, 0);
  } else {
    DBRecordIO::write(db, record);
  }
}

// A tree record's write takes several statements and a transaction; any other record's write is one
// statement (DBRecordIO::write), atomic by itself.
template <class T>
void DBReactor::writeAtomically(T& record) {
  if constexpr (std::is_same_v<T, DBFilter> || std::is_same_v<T, DBRefFolder> ||
                std::is_same_v<T, DBSmartFilter>) {
    connection().transaction([&] { writeOne(record); });
  } else {
    connection().singleChange([&] { writeOne(record); });
  }
}

template <DBWritableRecord T>
DBReactor& DBReactor::operator<<(std::shared_ptr<T> const& record) {
  DBReactorSupport::requireRecord(record);
  writeAtomically(*record);
  return *this;
}

template <>
DBReactor& DBReactor::operator<< <DBEntity>(std::shared_ptr<DBEntity> const& record) {
  DBReactorSupport::requireRecord(record);
  DBRecordVisitor::visit(*record, [this](auto& concrete) { writeAtomically(concrete); });
  return *this;
}

template DBReactor& DBReactor::operator<<(std::shared_ptr<DBImage> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBImgHistoryState> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBVolume> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBFilter> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBSmartFilter> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBEntityFavoriteAlias> const&);

template <DBBatchRecord T, class Check>
DBReactor& DBReactor::operator<<(std::vector<std::shared_ptr<T>> const& records) {
  for (const auto& record : records) Check::check(record);
  connection().transaction([&] {
    for (const auto& record : records) writeOne(*record);
  });
  return *this;
}

template DBReactor& DBReactor::operator<< <DBImage, ValueCheckDefault<DBImage>>(
    std::vector<std::shared_ptr<DBImage>> const&);
template DBReactor& DBReactor::operator<< <DBPath, ValueCheckDefault<DBPath>>(
    std::vector<std::shared_ptr<DBPath>> const&);
template DBReactor& DBReactor::operator<< <DBUserImgAttrib, ValueCheckDefault<DBUserImgAttrib>>(
    std::vector<std::shared_ptr<DBUserImgAttrib>> const&);
template DBReactor& DBReactor::operator<< <DBExivImgAttrib, ValueCheckDefault<DBExivImgAttrib>>(
    std::vector<std::shared_ptr<DBExivImgAttrib>> const&);

// Binds each image to its folder; an empty folder unbinds the image.
template <>
DBReactor& DBReactor::operator<< <DBPath, DBImage>(
    std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>> const& pairs) {
  DBConnection& db = connection();
  for (const auto& [path, image] : pairs) {
    DBReactorSupport::requireRecord(image);
    if (!image->is_saved() || (path && !path->is_saved()))
      throw DBException("A folder link names an unsaved record");
  }
  std::vector<std::pair<int64_t, int64_t>> links;
  links.reserve(pairs.size());
  for (const auto& [path, image] : pairs) links.emplace_back(image->id(), path ? path->id() : 0);
  db.transaction([&] { DBLinks::setFolders(db, links); });
  return *this;
}

void DBReactor::writeBinding(DBRefFolder& folder, long long parentId, const std::shared_ptr<DBPath>& path) {
  DBConnection& db = connection();
  if (path) {
    DBRecordIO::write(db, *path);
    folder.path_id = path->id();
  }
  DBRecordIO::write(db, folder);
  DBTree::setParent<DBRefFolder>(db, folder.id(), parentId);
}

DBReactor& DBReactor::operator<<(DBind<DBRefFolder, long long, std::shared_ptr<DBPath>> const& binding) {
  DBReactorSupport::requireRecord(binding.record);
  connection().transaction(
      [&] { writeBinding(*binding.record, std::get<0>(binding.bound), std::get<1>(binding.bound)); });
  return *this;
}

void DBReactor::writeTreeNode(const DBRefFolderNode& node, long long parentId) {
  DBReactorSupport::requireRecord(node.folder());
  writeBinding(*node.folder(), parentId, node.path());
  for (const auto& child : node.children()) writeTreeNode(*child, node.folder()->id());
}

DBReactor& DBReactor::operator<<(std::shared_ptr<DBRefFolderTree> const& tree) {
  DBReactorSupport::requireRecord(tree);
  connection().transaction([&] { writeTreeNode(*tree->root(), tree->parent_id()); });
  return *this;
}

}  // namespace dbcore
