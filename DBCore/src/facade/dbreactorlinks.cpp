#include "dbreactor.hpp"

#include "dblinks.hpp"
#include "dbreactorsupport.hpp"

// Links between records: folders and volumes, collection and referenced-folder membership.

namespace dbcore {

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
  DBReactorSupport::requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBLinks::addMember(db, DBLinks::kFilterImages, filterId, image->id()); });
}

void DBReactor::FilterDelImage(long long filterId, std::shared_ptr<DBImage> const& image) {
  DBReactorSupport::requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBLinks::removeMember(db, DBLinks::kFilterImages, filterId, image->id()); });
}

std::vector<std::shared_ptr<DBFilter>> DBReactor::GetFiltersByImage(long long imageId, int limit,
                                                                    int offset) {
  static const DBStaticSql kSql(
      DBRecordIO::selectSql<DBFilter>() +
      " JOIN filter_images ON filter_images.filter_id = filters._id_int_64 WHERE filter_images.image_id = ?"
      " ORDER BY filters._id_int_64 LIMIT ? OFFSET ?");
  const DBStatementLease statement = connection().prepare(kSql);
  statement->bind(1, DBReactorSupport::id64(imageId)).bind(2, static_cast<int64_t>(limit < 0 ? -1 : limit));
  statement->bind(3, static_cast<int64_t>(offset < 0 ? 0 : offset));
  return DBRecordIO::readAll<DBFilter>(*statement);
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
  for (const auto& pair : pairs) DBReactorSupport::requireRecord(pair.second);
  DBConnection& db = connection();
  std::vector<std::pair<int64_t, int64_t>> links;
  links.reserve(pairs.size());
  for (const auto& [pathId, image] : pairs) links.emplace_back(image->id(), pathId);
  db.transaction([&] { DBLinks::setFolders(db, links); });
}

}  // namespace dbcore
