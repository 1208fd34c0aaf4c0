#include "dblinks.hpp"

#include <algorithm>
#include <unordered_map>

#include "dbstrings.hpp"

namespace dbcore {

namespace {

bool isFilterTable(const std::string& table) { return table == DBLinks::kFilterImages; }

// The membership tables name their owner column after the owner.
std::string ownerColumn(const std::string& table) {
  return isFilterTable(table) ? "filter_id" : "ref_folder_id";
}

std::string insertMemberSql(const std::string& table) {
  return "INSERT OR IGNORE INTO " + table + "(" + ownerColumn(table) + ", image_id) VALUES (?, ?)";
}

std::string deleteMemberSql(const std::string& table) {
  return "DELETE FROM " + table + " WHERE " + ownerColumn(table) + " = ? AND image_id = ?";
}

// A folder path without its trailing separators, so "/a/b/" and "/a/b" name one folder.
std::wstring withoutTrailingSeparator(std::wstring path) {
  while (path.size() > 1 && path.back() == L'/') path.pop_back();
  return path;
}

// Runs a statement of a membership table whose parameters are the owner and the image.
void runForMember(DBConnection& connection, const DBStaticSql& sql, int64_t ownerId, int64_t imageId) {
  connection.prepare(sql)->bind(1, ownerId).bind(2, imageId).execute();
}

// The folder links of one statement: at most this many images.
constexpr size_t kFoldersPerStatement = 256;

// "UPDATE images SET folder_path_id = CASE _id_int_64 WHEN ?1 THEN ?2 ... END WHERE _id_int_64 IN (?1, ...)"
// for `count` (image, folder) parameter pairs.
std::string setFoldersSql(size_t count) {
  std::string cases;
  std::string images;
  for (size_t index = 0; index < count; ++index) {
    const std::string image = "?" + std::to_string(2 * index + 1);
    cases += " WHEN " + image + " THEN ?" + std::to_string(2 * index + 2);
    images += (index == 0 ? "" : ",") + image;
  }
  return "UPDATE images SET folder_path_id = CASE _id_int_64" + cases + " END WHERE _id_int_64 IN (" +
         images + ")";
}

// The pairs with one pair per image, the image's last one, in the order of those last pairs.
std::vector<std::pair<int64_t, int64_t>> lastFolderOfEachImage(
    const std::vector<std::pair<int64_t, int64_t>>& pairs) {
  std::unordered_map<int64_t, size_t> last;
  for (size_t index = 0; index < pairs.size(); ++index) last[pairs[index].first] = index;
  std::vector<std::pair<int64_t, int64_t>> unique;
  unique.reserve(last.size());
  for (size_t index = 0; index < pairs.size(); ++index) {
    if (last[pairs[index].first] == index) unique.push_back(pairs[index]);
  }
  return unique;
}

}  // namespace

void DBLinks::setFolder(DBConnection& connection, int64_t imageId, int64_t pathId) {
  setFolders(connection, {{imageId, pathId}});
}

void DBLinks::setFolders(DBConnection& connection,
                         const std::vector<std::pair<int64_t, int64_t>>& imageFolders) {
  const std::vector<std::pair<int64_t, int64_t>> links = lastFolderOfEachImage(imageFolders);
  for (size_t start = 0; start < links.size(); start += kFoldersPerStatement) {
    const size_t count = std::min(kFoldersPerStatement, links.size() - start);
    const DBStatementLease statement = connection.prepare(setFoldersSql(count));
    for (size_t index = 0; index < count; ++index) {
      const auto [imageId, pathId] = links[start + index];
      const int parameter = static_cast<int>(2 * index + 1);
      statement->bind(parameter, imageId);
      if (pathId > 0) {
        statement->bind(parameter + 1, pathId);
      } else {
        statement->bindNull(parameter + 1);
      }
    }
    statement->execute();
  }
}

void DBLinks::addMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId) {
  static const DBStaticSql kFilterSql(insertMemberSql(DBLinks::kFilterImages));
  static const DBStaticSql kFolderSql(insertMemberSql(DBLinks::kReferencedFolderImages));
  runForMember(connection, isFilterTable(table) ? kFilterSql : kFolderSql, ownerId, imageId);
}

void DBLinks::removeMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId) {
  static const DBStaticSql kFilterSql(deleteMemberSql(DBLinks::kFilterImages));
  static const DBStaticSql kFolderSql(deleteMemberSql(DBLinks::kReferencedFolderImages));
  runForMember(connection, isFilterTable(table) ? kFilterSql : kFolderSql, ownerId, imageId);
}

std::map<long long, std::set<long long>> DBLinks::folderConnections(DBConnection& connection, bool byImage) {
  static const DBStaticSql kSql(
      "SELECT folder_path_id, _id_int_64 FROM images WHERE folder_path_id IS NOT NULL");
  const DBStatementLease statement = connection.prepare(kSql);
  std::map<long long, std::set<long long>> connections;
  while (statement->step()) {
    const long long folder = statement->columnInt64(0);
    const long long image = statement->columnInt64(1);
    if (byImage) {
      connections[image].insert(folder);
    } else {
      connections[folder].insert(image);
    }
  }
  return connections;
}

bool DBLinks::renamePaths(DBConnection& connection, const std::wstring& oldPath, const std::wstring& newPath,
                          int64_t oldVolumeId, int64_t newVolumeId) {
  const std::wstring from = withoutTrailingSeparator(oldPath);
  const std::wstring to = withoutTrailingSeparator(newPath);
  if (from.empty()) return false;
  // substr counts characters, and a wide string holds one character per element.
  static const DBStaticSql kSql(
      "UPDATE paths SET path_wide_ch = ? || substr(path_wide_ch, ?), volume_id_int_64 = ? "
      "WHERE volume_id_int_64 = ? AND (path_wide_ch = ? OR substr(path_wide_ch, 1, ?) = ?)");
  const DBStatementLease statement = connection.prepare(kSql);
  statement->bind(1, ws2s(to)).bind(2, static_cast<int64_t>(from.size() + 1)).bind(3, newVolumeId);
  statement->bind(4, oldVolumeId).bind(5, ws2s(from)).bind(6, static_cast<int64_t>(from.size() + 1));
  statement->bind(7, ws2s(from + L"/")).execute();
  return connection.changes() > 0;
}

void DBLinks::removeFavoriteAlias(DBConnection& connection, const DBEntity& original) {
  static const DBStaticSql kSql(
      "DELETE FROM entity_favorite_aliases WHERE orig_entity_type = ? AND orig_entity_id_int_64 = ?");
  connection.prepare(kSql)->bind(1, static_cast<int64_t>(original.type())).bind(2, original.id()).execute();
}

}  // namespace dbcore
