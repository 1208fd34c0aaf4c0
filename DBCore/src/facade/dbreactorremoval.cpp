#include "dbreactor.hpp"

#include "dbcleanup.hpp"
#include "dblinks.hpp"
#include "dbreactorsupport.hpp"

// Removal of records and clean-up of records nothing refers to.

namespace dbcore {

// Removing a record also removes its favorite alias; tree records take their subtree with them, and
// the hidden roots are never removed (false).
template <DBRemovableRecord T>
bool DBReactor::Remove(std::shared_ptr<T> const& record) {
  DBReactorSupport::requireRecord(record);
  DBConnection& db = connection();
  if constexpr (std::is_same_v<T, DBFilter> || std::is_same_v<T, DBRefFolder>) {
    if (record->id() == DBTree::kRootId) return false;
  }
  bool removed = false;
  db.transaction([&] { removed = removeOne(*record); });
  return removed;
}

template <class T>
bool DBReactor::removeOne(const T& record) {
  DBConnection& db = connection();
  if constexpr (std::is_same_v<T, DBFilter> || std::is_same_v<T, DBRefFolder>) {
    for (const auto& below : DBTree::descendants<T>(db, record.id()))
      DBLinks::removeFavoriteAlias(db, *below);
  }
  if constexpr (!std::is_same_v<T, DBEntityFavoriteAlias>) DBLinks::removeFavoriteAlias(db, record);
  return DBRecordIO::remove(db, record);
}

template bool DBReactor::Remove(std::shared_ptr<DBImage> const&);
template bool DBReactor::Remove(std::shared_ptr<DBFilter> const&);
template bool DBReactor::Remove(std::shared_ptr<DBRefFolder> const&);
template bool DBReactor::Remove(std::shared_ptr<DBUserImgAttrib> const&);
template bool DBReactor::Remove(std::shared_ptr<DBEntityFavoriteAlias> const&);

template <DBOneOf<DBImage> T>
void DBReactor::Remove(std::vector<std::shared_ptr<T>> const& records) {
  for (const auto& record : records) DBReactorSupport::requireRecord(record);
  connection().transaction([&] {
    for (const auto& record : records) removeOne(*record);
  });
}

template void DBReactor::Remove(std::vector<std::shared_ptr<DBImage>> const&);

void DBReactor::ClearDanglingPaths() {
  DBConnection& db = connection();
  db.transaction([&] { db.exec(DBCleanup::deleteWhere("paths", DBCleanup::kDanglingPathsCondition)); });
}

void DBReactor::ClearDanglingHistoryStates() {
  DBConnection& db = connection();
  db.transaction(
      [&] { db.exec(DBCleanup::deleteWhere("image_history_states", DBCleanup::kDanglingStatesCondition)); });
}

template <>
void DBReactor::ClearDangling<DBResource>() {
  DBConnection& db = connection();
  db.transaction(
      [&] { db.exec(DBCleanup::deleteWhere("history_resources", DBCleanup::kDanglingResourcesCondition)); });
}

std::vector<std::shared_ptr<DBImgHistoryState>> DBReactor::GetDanglingHistoryStates() const {
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBImgHistoryState>() + " WHERE " +
                                DBCleanup::kDanglingStatesCondition + " ORDER BY _id_int_64");
  return DBRecordIO::readAll<DBImgHistoryState>(*connection().prepare(kSql));
}

template <>
std::vector<std::shared_ptr<DBResource>> DBReactor::GetDangling<DBResource>() {
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBResource>() + " WHERE " +
                                DBCleanup::kDanglingResourcesCondition + " ORDER BY _id_int_64");
  return DBRecordIO::readAll<DBResource>(*connection().prepare(kSql));
}

}  // namespace dbcore
