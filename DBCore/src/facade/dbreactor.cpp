#include "dbreactor.hpp"

#include <sqlite3.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <filesystem>

#include "dbcleanup.hpp"
#include "dbconnection.hpp"
#include "dbexception.hpp"
#include "dblinks.hpp"
#include "dbrecordio.hpp"
#include "dbrecordvisitor.hpp"
#include "dbschema.hpp"
#include "dbselectqueryrunner.hpp"
#include "dbstates.hpp"
#include "dbstrings.hpp"
#include "dbtree.hpp"

namespace dbcore {

namespace {

int64_t id64(long long id) { return static_cast<int64_t>(id); }

template <class T>
void requireRecord(const std::shared_ptr<T>& record) {
  if (!record) throw DBException("An operation was given an empty record");
}

// Inserts an unsaved tree record under the root (or at the top of a tree without root) and writes it.
template <class T>
void writeTreeRecord(DBConnection& connection, T& record, long long parentId) {
  const bool isNew = !record.is_saved();
  DBRecordIO::write(connection, record);
  if (isNew && record.id() != DBTree::kRootId) DBTree::setParent<T>(connection, record.id(), parentId);
}

// Copies the consistent content of an open database into a new file.
bool copyDatabase(sqlite3* source, const std::string& destination) {
  sqlite3* target = nullptr;
  bool copied = sqlite3_open_v2(destination.c_str(), &target, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE,
                                nullptr) == SQLITE_OK;
  if (copied) {
    sqlite3_backup* backup = sqlite3_backup_init(target, "main", source, "main");
    copied = backup && sqlite3_backup_step(backup, -1) == SQLITE_DONE;
    copied = sqlite3_backup_finish(backup) == SQLITE_OK && copied;
  }
  return sqlite3_close_v2(target) == SQLITE_OK && copied;
}

std::string temporaryPathBeside(const std::string& path) {
  static std::atomic<unsigned> counter{0};
  return path + ".backup-" + std::to_string(getpid()) + "-" + std::to_string(counter++);
}

}  // namespace

DBReactor::DBReactor(AppInfo const& appInfo) : appInfo_(appInfo) {}

DBReactor::~DBReactor() = default;

DBConnection& DBReactor::connection() const {
  if (!connection_) throw DBException("The catalog is not open");
  return *connection_;
}

// ---- Life

int DBReactor::Open(const std::wstring& path, const std::wstring&) {
  Close();
  const std::string file = ws2s(path);
  std::error_code error;
  if (file.empty() || std::filesystem::is_directory(file, error)) return kDBOpenFailed;
  try {
    connection_ = std::make_unique<DBConnection>(file);
    const int result = classifyOpenedFile();
    if (result != kDBOpenCurrent && result != kDBOpenNeedsUpdate) connection_.reset();
    return result;
  } catch (const std::exception&) {
    connection_.reset();
    return kDBOpenFailed;
  }
}

int DBReactor::classifyOpenedFile() {
  DBConnection& db = *connection_;
  const int64_t applicationId = db.queryInt64("PRAGMA application_id");
  const int64_t version = db.queryInt64("PRAGMA user_version");
  const int64_t objects = db.queryInt64("SELECT count(*) FROM sqlite_schema");
  if (applicationId == 0 && version == 0 && objects == 0) return useWriteAheadLog(kDBOpenNeedsUpdate);
  if (applicationId != DBSchema::applicationIdFor(appInfo_)) return kDBOpenIncompatible;
  if (version > DBSchema::kCurrentVersion || version < DBSchema::kOldestVersion) return kDBOpenIncompatible;
  if (version < DBSchema::kCurrentVersion) return useWriteAheadLog(kDBOpenNeedsUpdate);
  return DBSchema::isWellFormed(db) ? useWriteAheadLog(kDBOpenCurrent) : kDBOpenFailed;
}

int DBReactor::useWriteAheadLog(int result) {
  // A read-only file keeps its journal mode; its writes fail later with a DBException.
  try {
    connection_->exec("PRAGMA journal_mode = WAL");
  } catch (const DBException&) {
  }
  return result;
}

void DBReactor::Initialize() {
  DBConnection& db = connection();
  db.transaction([&] {
    const int64_t version = db.queryInt64("PRAGMA user_version");
    DBSchema::migrate(db, static_cast<int>(version));
    db.exec("PRAGMA application_id = " + std::to_string(DBSchema::applicationIdFor(appInfo_)));
    DBSchema::createRootRecords(db);
  });
}

void DBReactor::Close() { connection_.reset(); }

bool DBReactor::Backup(const std::wstring& path) {
  DBConnection& db = connection();
  const std::string destination = ws2s(path);
  if (destination.empty()) return false;
  const std::string temporary = temporaryPathBeside(destination);
  if (!copyDatabase(db.handle(), temporary) || std::rename(temporary.c_str(), destination.c_str()) != 0) {
    std::remove(temporary.c_str());
    return false;
  }
  return true;
}

// ---- Versions

int DBReactor::DBUserVersion() const {
  return static_cast<int>(connection().queryInt64("PRAGMA user_version"));
}

ApplicationID DBReactor::GetDBApplicationID() const {
  return static_cast<ApplicationID>(
      connection().queryInt64("SELECT value FROM catalog_info WHERE key = 'product_version'"));
}

void DBReactor::SetDBApplicationID(ApplicationID version) const {
  DBConnection& db = connection();
  db.transaction([&] {
    db.prepare("INSERT OR REPLACE INTO catalog_info(key, value) VALUES ('product_version', ?)")
        .bind(1, static_cast<int64_t>(version))
        .execute();
  });
}

// ---- Reads

template <class T>
std::shared_ptr<T> DBReactor::Get(long long id) const {
  return DBRecordIO::get<T>(connection(), id64(id));
}

template std::shared_ptr<DBImage> DBReactor::Get<DBImage>(long long) const;
template std::shared_ptr<DBPath> DBReactor::Get<DBPath>(long long) const;
template std::shared_ptr<DBFilter> DBReactor::Get<DBFilter>(long long) const;
template std::shared_ptr<DBSmartFilter> DBReactor::Get<DBSmartFilter>(long long) const;
template std::shared_ptr<DBRefFolder> DBReactor::Get<DBRefFolder>(long long) const;
template std::shared_ptr<DBUserImgAttrib> DBReactor::Get<DBUserImgAttrib>(long long) const;
template std::shared_ptr<DBExivImgAttrib> DBReactor::Get<DBExivImgAttrib>(long long) const;

template <class T>
std::shared_ptr<T> DBReactor::recordWhere(const std::string& condition, int64_t value) const {
  DBStatement& statement = connection().prepare(DBRecordIO::selectSql<T>() + " WHERE " + condition);
  statement.bind(1, value);
  return DBRecordIO::readOne<T>(statement);
}

// An image's attribute record; when the image has none yet, a new unsaved one linked to it.
template <class A>
std::shared_ptr<A> DBReactor::attributesOfImage(const std::shared_ptr<DBImage>& image) const {
  if (!image) return nullptr;
  if (auto found = recordWhere<A>("image_id_int_64 = ?", image->id())) return found;
  if (!image->is_saved()) return nullptr;
  auto created = std::make_shared<A>();
  created->image_id = image->id();
  return created;
}

template <>
std::shared_ptr<DBPath> DBReactor::GetBy<DBPath, DBImage>(std::shared_ptr<DBImage> const& image) const {
  if (!image) return nullptr;
  return recordWhere<DBPath>("_id_int_64 = (SELECT folder_path_id FROM images WHERE _id_int_64 = ?)",
                             image->id());
}

template <>
std::shared_ptr<DBVolume> DBReactor::GetBy<DBVolume, DBPath>(std::shared_ptr<DBPath> const& path) const {
  if (!path || path->volume_id == 0) return nullptr;
  return Get<DBVolume>(path->volume_id);
}

template <>
std::shared_ptr<DBUserImgAttrib> DBReactor::GetBy<DBUserImgAttrib, DBImage>(
    std::shared_ptr<DBImage> const& image) const {
  return attributesOfImage<DBUserImgAttrib>(image);
}

template <>
std::shared_ptr<DBExivImgAttrib> DBReactor::GetBy<DBExivImgAttrib, DBImage>(
    std::shared_ptr<DBImage> const& image) const {
  return attributesOfImage<DBExivImgAttrib>(image);
}

template <>
std::shared_ptr<DBImage> DBReactor::GetBy<DBImage, DBUserImgAttrib>(
    std::shared_ptr<DBUserImgAttrib> const& attributes) const {
  return attributes ? Get<DBImage>(attributes->image_id) : nullptr;
}

template <>
std::shared_ptr<DBImage> DBReactor::GetBy<DBImage, DBExivImgAttrib>(
    std::shared_ptr<DBExivImgAttrib> const& attributes) const {
  return attributes ? Get<DBImage>(attributes->image_id) : nullptr;
}

template <>
std::shared_ptr<DBEntityFavoriteAlias> DBReactor::GetBy<DBEntityFavoriteAlias, DBEntity>(
    std::shared_ptr<DBEntity> const& record) const {
  if (!record) return nullptr;
  DBStatement& statement = connection().prepare(DBRecordIO::selectSql<DBEntityFavoriteAlias>() +
                                                " WHERE orig_entity_type = ? AND orig_entity_id_int_64 = ?");
  statement.bind(1, static_cast<int64_t>(record->type())).bind(2, record->id());
  return DBRecordIO::readOne<DBEntityFavoriteAlias>(statement);
}

template <>
std::shared_ptr<DBFilterAttrib> DBReactor::GetAttributes<DBFilterAttrib, DBFilter>(
    std::shared_ptr<DBFilter> const& filter) const {
  return filter ? recordWhere<DBFilterAttrib>("filter_id_int_64 = ?", filter->id()) : nullptr;
}

template <>
std::shared_ptr<DBRefFolderAttrib> DBReactor::GetAttributes<DBRefFolderAttrib, DBRefFolder>(
    std::shared_ptr<DBRefFolder> const& folder) const {
  return folder ? recordWhere<DBRefFolderAttrib>("ref_folder_id_int_64 = ?", folder->id()) : nullptr;
}

template <>
std::shared_ptr<DBSmartFilterAttrib> DBReactor::GetAttributes<DBSmartFilterAttrib, DBSmartFilter>(
    std::shared_ptr<DBSmartFilter> const& filter) const {
  return filter ? recordWhere<DBSmartFilterAttrib>("smart_filter_id_int_64 = ?", filter->id()) : nullptr;
}

// ---- Trees

template <class T>
std::shared_ptr<T> DBReactor::GetRoot() const {
  return Get<T>(DBTree::kRootId);
}

template std::shared_ptr<DBFilter> DBReactor::GetRoot<DBFilter>() const;
template std::shared_ptr<DBRefFolder> DBReactor::GetRoot<DBRefFolder>() const;

template <class T>
std::vector<std::shared_ptr<T>> DBReactor::Children(std::shared_ptr<T> const& parent) const {
  if (!parent) return {};
  return DBTree::children<T>(connection(), parent->id());
}

template std::vector<std::shared_ptr<DBFilter>> DBReactor::Children(std::shared_ptr<DBFilter> const&) const;
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::Children(
    std::shared_ptr<DBRefFolder> const&) const;
template std::vector<std::shared_ptr<DBSmartFilter>> DBReactor::Children(
    std::shared_ptr<DBSmartFilter> const&) const;

template <class T>
std::vector<std::shared_ptr<T>> DBReactor::Descendants(std::shared_ptr<T> const& parent) {
  if (!parent) return {};
  return DBTree::descendants<T>(connection(), parent->id());
}

template std::vector<std::shared_ptr<DBFilter>> DBReactor::Descendants(std::shared_ptr<DBFilter> const&);
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::Descendants(
    std::shared_ptr<DBRefFolder> const&);

template <class T>
std::shared_ptr<T> DBReactor::GetParent(std::shared_ptr<T> const& item) const {
  if (!item) return nullptr;
  const long long parentId = DBTree::parentId<T>(connection(), item->id());
  return parentId > 0 ? Get<T>(parentId) : nullptr;
}

template std::shared_ptr<DBFilter> DBReactor::GetParent(std::shared_ptr<DBFilter> const&) const;
template std::shared_ptr<DBRefFolder> DBReactor::GetParent(std::shared_ptr<DBRefFolder> const&) const;

// Moving the root, or a record below itself, is refused (false).
template <class T>
bool DBReactor::Move(std::shared_ptr<T> const& item, std::shared_ptr<T> const& newParent) {
  requireRecord(item);
  requireRecord(newParent);
  DBConnection& db = connection();
  if (item->id() == DBTree::kRootId || !Get<T>(item->id()) || !Get<T>(newParent->id())) return false;
  if (DBTree::isAncestorOrSelf<T>(db, item->id(), newParent->id())) return false;
  db.transaction([&] { DBTree::setParent<T>(db, item->id(), newParent->id()); });
  return true;
}

template bool DBReactor::Move(std::shared_ptr<DBFilter> const&, std::shared_ptr<DBFilter> const&);
template bool DBReactor::Move(std::shared_ptr<DBRefFolder> const&, std::shared_ptr<DBRefFolder> const&);

}  // namespace dbcore

namespace dbcore {

// ---- Writes

// New collections go under the root; new referenced folders too (a binding or tree names their parent);
// new smart filters start at the top of their own tree.
template <class T>
void DBReactor::writeOne(T& record) {
  DBConnection& db = connection();
  if constexpr (std::is_same_v<T, DBFilter> || std::is_same_v<T, DBRefFolder>) {
    writeTreeRecord(db, record, DBTree::kRootId);
  } else if constexpr (std::is_same_v<T, DBSmartFilter>) {
    writeTreeRecord(db, record, 0);
  } else {
    DBRecordIO::write(db, record);
  }
}

template <class T>
DBReactor& DBReactor::operator<<(std::shared_ptr<T> const& record) {
  requireRecord(record);
  connection().transaction([&] { writeOne(*record); });
  return *this;
}

template <>
DBReactor& DBReactor::operator<< <DBEntity>(std::shared_ptr<DBEntity> const& record) {
  requireRecord(record);
  connection().transaction(
      [&] { DBRecordVisitor::visit(*record, [this](auto& concrete) { writeOne(concrete); }); });
  return *this;
}

template DBReactor& DBReactor::operator<<(std::shared_ptr<DBImage> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBImgHistoryState> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBVolume> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBFilter> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBSmartFilter> const&);
template DBReactor& DBReactor::operator<<(std::shared_ptr<DBEntityFavoriteAlias> const&);

template <class T, class Check>
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
    requireRecord(image);
    if (!image->is_saved() || (path && !path->is_saved()))
      throw DBException("A folder link names an unsaved record");
  }
  db.transaction([&] {
    for (const auto& [path, image] : pairs) DBLinks::setFolder(db, image->id(), path ? path->id() : 0);
  });
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
  requireRecord(binding.record);
  connection().transaction(
      [&] { writeBinding(*binding.record, std::get<0>(binding.bound), std::get<1>(binding.bound)); });
  return *this;
}

void DBReactor::writeTreeNode(const DBRefFolderNode& node, long long parentId) {
  requireRecord(node.folder());
  writeBinding(*node.folder(), parentId, node.path());
  for (const auto& child : node.children()) writeTreeNode(*child, node.folder()->id());
}

DBReactor& DBReactor::operator<<(std::shared_ptr<DBRefFolderTree> const& tree) {
  requireRecord(tree);
  connection().transaction([&] { writeTreeNode(*tree->root(), tree->parent_id()); });
  return *this;
}

// ---- Links

template <>
bool DBReactor::Bind<DBPath, DBVolume, PairCheckDefault<DBPath, DBVolume>>(
    std::shared_ptr<DBPath> const& path, std::shared_ptr<DBVolume> const& volume) {
  PairCheckDefault<DBPath, DBVolume>::check(path, volume);
  DBConnection& db = connection();
  path->volume_id = volume->id();
  db.transaction([&] { DBRecordIO::write(db, *path); });
  return true;
}

template <>
bool DBReactor::Bind<DBRefFolder, DBImage, PairCheckDefault<DBRefFolder, DBImage>>(
    std::shared_ptr<DBRefFolder> const& folder, std::shared_ptr<DBImage> const& image) {
  PairCheckDefault<DBRefFolder, DBImage>::check(folder, image);
  DBConnection& db = connection();
  db.transaction(
      [&] { DBLinks::addMember(db, DBLinks::kReferencedFolderImages, folder->id(), image->id()); });
  return true;
}

void DBReactor::FilterAddImage(long long filterId, std::shared_ptr<DBImage> const& image) {
  requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBLinks::addMember(db, DBLinks::kFilterImages, filterId, image->id()); });
}

void DBReactor::FilterDelImage(long long filterId, std::shared_ptr<DBImage> const& image) {
  requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBLinks::removeMember(db, DBLinks::kFilterImages, filterId, image->id()); });
}

std::vector<std::shared_ptr<DBFilter>> DBReactor::GetFiltersByImage(long long imageId, int limit,
                                                                    int offset) {
  DBStatement& statement = connection().prepare(
      DBRecordIO::selectSql<DBFilter>() +
      " JOIN filter_images ON filter_images.filter_id = filters._id_int_64 WHERE filter_images.image_id = ?"
      " ORDER BY filters._id_int_64 LIMIT ? OFFSET ?");
  statement.bind(1, id64(imageId)).bind(2, static_cast<int64_t>(limit < 0 ? -1 : limit));
  statement.bind(3, static_cast<int64_t>(offset < 0 ? 0 : offset));
  return DBRecordIO::readAll<DBFilter>(statement);
}

template <>
std::map<long long, std::set<long long>> DBReactor::Connections<DBPath, DBImage>(bool byImage) const {
  return DBLinks::folderConnections(connection(), byImage);
}

bool DBReactor::RenamePath(std::wstring const& oldPath, std::wstring const& newPath,
                           std::shared_ptr<DBVolume> const& oldVolume,
                           std::shared_ptr<DBVolume> const& newVolume) {
  DBConnection& db = connection();
  bool renamed = false;
  db.transaction([&] {
    renamed = DBLinks::renamePaths(db, oldPath, newPath, oldVolume ? oldVolume->id() : 0,
                                   newVolume ? newVolume->id() : 0);
  });
  return renamed;
}

void DBReactor::RebindPathImages(std::vector<std::pair<long long, std::shared_ptr<DBImage>>> const& pairs) {
  for (const auto& pair : pairs) requireRecord(pair.second);
  DBConnection& db = connection();
  db.transaction([&] {
    for (const auto& [pathId, image] : pairs) DBLinks::setFolder(db, image->id(), pathId);
  });
}

// ---- Removal

// Removing a record also removes its favorite alias; tree records take their subtree with them, and
// the hidden roots are never removed (false).
template <class T>
bool DBReactor::Remove(std::shared_ptr<T> const& record) {
  requireRecord(record);
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

template <class T>
void DBReactor::Remove(std::vector<std::shared_ptr<T>> const& records) {
  for (const auto& record : records) requireRecord(record);
  connection().transaction([&] {
    for (const auto& record : records) removeOne(*record);
  });
}

template void DBReactor::Remove(std::vector<std::shared_ptr<DBImage>> const&);

// ---- History states

template <>
std::vector<std::shared_ptr<DBImgHistoryState>> DBReactor::GetStates<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image) {
  return image ? DBStates::states(connection(), image->id())
               : std::vector<std::shared_ptr<DBImgHistoryState>>{};
}

template <>
std::shared_ptr<DBImgHistoryState> DBReactor::GetCurrentState<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image) {
  return image ? DBStates::currentState(connection(), image->id()) : nullptr;
}

template <>
std::map<long long, std::shared_ptr<DBImgHistoryState>>
DBReactor::GetCurrentStates<DBImage, DBImgHistoryState>(
    std::vector<std::shared_ptr<DBImage>> const& images) const {
  std::map<long long, std::shared_ptr<DBImgHistoryState>> current;
  for (const auto& image : images) {
    if (!image) continue;
    if (auto state = DBStates::currentState(connection(), image->id()))
      current.emplace(image->id(), std::move(state));
  }
  return current;
}

template <>
void DBReactor::SetCurrentState<DBImage, DBImgHistoryState>(std::shared_ptr<DBImage> const& image,
                                                            std::shared_ptr<DBImgHistoryState> const& state) {
  requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::setCurrent(db, image->id(), state); });
}

template <>
void DBReactor::SetStatesByVector<DBImage, DBImgHistoryState>(
    std::map<std::shared_ptr<DBImage>,
             std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long>> const& states) {
  DBConnection& db = connection();
  for (const auto& [image, list] : states) {
    requireRecord(image);
    for (const auto& state : list.first) requireRecord(state);
  }
  db.transaction([&] {
    for (const auto& [image, list] : states) DBStates::replace(db, image->id(), list.first, list.second);
  });
}

void DBReactor::BindStateWithResources(std::shared_ptr<DBImgHistoryState> const& state,
                                       std::vector<std::wstring> const& resources) {
  requireRecord(state);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::bindResources(db, state->id(), resources); });
}

void DBReactor::BindStateWithResourcesFromBaseStateID(std::shared_ptr<DBImgHistoryState> const& state,
                                                      long long baseStateId) {
  requireRecord(state);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::copyResources(db, state->id(), baseStateId); });
}

// ---- Cleanup and counts

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
  DBStatement& statement = connection().prepare(DBRecordIO::selectSql<DBImgHistoryState>() + " WHERE " +
                                                DBCleanup::kDanglingStatesCondition + " ORDER BY _id_int_64");
  return DBRecordIO::readAll<DBImgHistoryState>(statement);
}

template <>
std::vector<std::shared_ptr<DBResource>> DBReactor::GetDangling<DBResource>() {
  DBStatement& statement =
      connection().prepare(DBRecordIO::selectSql<DBResource>() + " WHERE " +
                           DBCleanup::kDanglingResourcesCondition + " ORDER BY _id_int_64");
  return DBRecordIO::readAll<DBResource>(statement);
}

template <>
unsigned long long DBReactor::Count<DBImage>() const {
  return static_cast<unsigned long long>(connection().queryInt64("SELECT count(*) FROM images"));
}

// ---- Select queries

template <class T>
std::vector<std::shared_ptr<T>> DBReactor::GetBySelectQuery(
    std::shared_ptr<DBEntitySelectQuery> const& query) {
  return DBSelectQueryRunner::run<T>(connection(), query);
}

template std::vector<std::shared_ptr<DBImage>> DBReactor::GetBySelectQuery<DBImage>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBPath>> DBReactor::GetBySelectQuery<DBPath>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBVolume>> DBReactor::GetBySelectQuery<DBVolume>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBRefFolder>> DBReactor::GetBySelectQuery<DBRefFolder>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBUserImgAttrib>> DBReactor::GetBySelectQuery<DBUserImgAttrib>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBExivImgAttrib>> DBReactor::GetBySelectQuery<DBExivImgAttrib>(
    std::shared_ptr<DBEntitySelectQuery> const&);
template std::vector<std::shared_ptr<DBEntityFavoriteAlias>>
DBReactor::GetBySelectQuery<DBEntityFavoriteAlias>(std::shared_ptr<DBEntitySelectQuery> const&);

}  // namespace dbcore
