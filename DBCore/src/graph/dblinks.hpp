#pragma once

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "dbconnection.hpp"
#include "dbentity.hpp"

namespace dbcore {

// The links between records that are not fields of the records: the folder of each image, the images
// of collections and referenced folders, favorite aliases of any record.
class DBLinks {
 public:
  // Membership tables: (owner id, image id) pairs.
  static constexpr const char* kFilterImages = "filter_images";
  static constexpr const char* kReferencedFolderImages = "referenced_folder_images";

  // Sets the folder of an image; 0 unbinds it.
  static void setFolder(DBConnection& connection, int64_t imageId, int64_t pathId);
  // Sets the folders of many images, (image id, folder id) pairs, a later pair of an image winning. Few
  // statements: inside a savepoint each statement that checks a foreign key costs a statement journal.
  static void setFolders(DBConnection& connection,
                         const std::vector<std::pair<int64_t, int64_t>>& imageFolders);
  static void addMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId);
  static void removeMember(DBConnection& connection, const char* table, int64_t ownerId, int64_t imageId);
  // Folder id -> image ids, or image id -> folder ids when byImage is true.
  static std::map<long long, std::set<long long>> folderConnections(DBConnection& connection, bool byImage);
  // Renames the folder path on the old volume and every path below it, moving them to the new volume.
  // True when at least one path was renamed.
  static bool renamePaths(DBConnection& connection, const std::wstring& oldPath, const std::wstring& newPath,
                          int64_t oldVolumeId, int64_t newVolumeId);
  static void removeFavoriteAlias(DBConnection& connection, const DBEntity& original);
};

}  // namespace dbcore
