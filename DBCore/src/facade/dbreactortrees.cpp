#include "dbreactor.hpp"

#include "dbreactorsupport.hpp"

// The trees of collections, referenced folders and smart filters.

namespace dbcore {

template <DBTreeRecord T>
std::shared_ptr<T> DBReactor::GetRoot() const {
  return Get<T>(DBTree::kRootId);
}

template std::shared_ptr<DBFilter> DBReactor::GetRoot<DBFilter>() const;
template std::shared_ptr<DBRefFolder> DBReactor::GetRoot<DBRefFolder>() const;

template <DBOrderedRecord T>
std::vector<std::shared_ptr<T>> DBReactor::Children(std::shared_ptr<T> const& parent) const {
  if (!parent) return {};
  return DBTree::children<T>(connection(), parent->id());
}

template std::vector<std::shared_ptr<DBFilter>> DBReactor::Children(std::shared_ptr<DBFilter> const&) const;
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::Children(
    std::shared_ptr<DBRefFolder> const&) const;
template std::vector<std::shared_ptr<DBSmartFilter>> DBReactor::Children(
    std::shared_ptr<DBSmartFilter> const&) const;

template <DBTreeRecord T>
std::vector<std::shared_ptr<T>> DBReactor::Descendants(std::shared_ptr<T> const& parent) {
  if (!parent) return {};
  return DBTree::descendants<T>(connection(), parent->id());
}

template std::vector<std::shared_ptr<DBFilter>> DBReactor::Descendants(std::shared_ptr<DBFilter> const&);
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::Descendants(
    std::shared_ptr<DBRefFolder> const&);

template <DBTreeRecord T>
std::shared_ptr<T> DBReactor::GetParent(std::shared_ptr<T> const& item) const {
  if (!item) return nullptr;
  const long long parentId = DBTree::parentId<T>(connection(), item->id());
  return parentId > 0 ? Get<T>(parentId) : nullptr;
}

template std::shared_ptr<DBFilter> DBReactor::GetParent(std::shared_ptr<DBFilter> const&) const;
template std::shared_ptr<DBRefFolder> DBReactor::GetParent(std::shared_ptr<DBRefFolder> const&) const;

// Moving the root, or a record below itself, is refused (false).
template <DBTreeRecord T>
bool DBReactor::Move(std::shared_ptr<T> const& item, std::shared_ptr<T> const& newParent) {
  DBReactorSupport::requireRecord(item);
  DBReactorSupport::requireRecord(newParent);
  DBConnection& db = connection();
  if (item->id() == DBTree::kRootId || !Get<T>(item->id()) || !Get<T>(newParent->id())) return false;
  if (DBTree::isAncestorOrSelf<T>(db, item->id(), newParent->id())) return false;
  db.transaction([&] { DBTree::setParent<T>(db, item->id(), newParent->id()); });
  return true;
}

template bool DBReactor::Move(std::shared_ptr<DBFilter> const&, std::shared_ptr<DBFilter> const&);
template bool DBReactor::Move(std::shared_ptr<DBRefFolder> const&, std::shared_ptr<DBRefFolder> const&);

}  // namespace dbcore
