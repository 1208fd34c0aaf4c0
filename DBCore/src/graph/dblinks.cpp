#include "dblinks.hpp"

#include "dbstrings.hpp"

namespace dbcore {

namespace {

// The membership tables name their owner column after the owner.
std::string ownerColumn(const std::string& table) {
  return table == DBLinks::kFilterImages ? "filter_id" : "ref_folder_id";
}

// A folder path without its trailing separators, so "/a/b/" and "/a/b" name one folder.
std::wstring withoutTrailingSeparator(std::wstring path) {
  while (path.size() > 1 && path.back() == L'/') path.pop_back();
  return path;
}

}  // namespace

void DBLinks::setFolder(DBConnection& connection, int64_t imageId, int64_t pathId) {
  DBStatement& statement = connection.prepare("UPDATE images SET folder_path_id = ? WHERE _id_int_64 = ?");
  if (pathId > 0) {
    statement.bind(1, pathId);
  } else {
    statement.bindNull(1);
  }
  statement.bind(2, imageId).execute();
}

void DBLinks::addMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId) {
  connection
      .prepare(std::string("INSERT OR IGNORE INTO ") + table + "(" + ownerColumn(table) +
               ", image_id) VALUES (?, ?)")
      .bind(1, ownerId)
      .bind(2, imageId)
      .execute();
}

void DBLinks::removeMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId) {
  connection
      .prepare(std::string("DELETE FROM ") + table + " WHERE " + ownerColumn(table) + " = ? AND image_id = ?")
      .bind(1, ownerId)
      .bind(2, imageId)
      .execute();
}

std::map<long long, std::set<long long>> DBLinks::folderConnections(DBConnection& connection, bool byImage) {
  DBStatement& statement =
      connection.prepare("SELECT folder_path_id, _id_int_64 FROM images WHERE folder_path_id IS NOT NULL");
  std::map<long long, std::set<long long>> connections;
  while (statement.step()) {
    const long long folder = statement.columnInt64(0);
    const long long image = statement.columnInt64(1);
    if (byImage) {
      connections[image].insert(folder);
    } else {
      connections[folder].insert(image);
    }
  }
  statement.reset();
  return connections;
}

bool DBLinks::renamePaths(DBConnection& connection, const std::wstring& oldPath, const std::wstring& newPath,
                          int64_t oldVolumeId, int64_t newVolumeId) {
  const std::wstring from = withoutTrailingSeparator(oldPath);
  const std::wstring to = withoutTrailingSeparator(newPath);
  if (from.empty()) return false;
  // substr counts characters, and a wide string holds one character per element.
  DBStatement& statement = connection.prepare(
      "UPDATE paths SET path_wide_ch = ? || substr(path_wide_ch, ?), volume_id_int_64 = ? "
      "WHERE volume_id_int_64 = ? AND (path_wide_ch = ? OR substr(path_wide_ch, 1, ?) = ?)");
  statement.bind(1, ws2s(to)).bind(2, static_cast<int64_t>(from.size() + 1)).bind(3, newVolumeId);
  statement.bind(4, oldVolumeId).bind(5, ws2s(from)).bind(6, static_cast<int64_t>(from.size() + 1));
  statement.bind(7, ws2s(from + L"/")).execute();
  return connection.changes() > 0;
}

void DBLinks::removeFavoriteAlias(DBConnection& connection, const DBEntity& original) {
  connection
      .prepare("DELETE FROM entity_favorite_aliases WHERE orig_entity_type = ? AND orig_entity_id_int_64 = ?")
      .bind(1, static_cast<int64_t>(original.type()))
      .bind(2, original.id())
      .execute();
}

}  // namespace dbcore
