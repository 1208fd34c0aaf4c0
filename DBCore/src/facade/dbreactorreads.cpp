#include "dbreactor.hpp"

#include "dbreactorsupport.hpp"

// Reads of single records and of related records.

namespace dbcore {

template <DBStoredRecord T>
std::shared_ptr<T> DBReactor::Get(long long id) const {
  return DBRecordIO::get<T>(connection(), DBReactorSupport::id64(id));
}

template std::shared_ptr<DBImage> DBReactor::Get<DBImage>(long long) const;
template std::shared_ptr<DBPath> DBReactor::Get<DBPath>(long long) const;
template std::shared_ptr<DBFilter> DBReactor::Get<DBFilter>(long long) const;
template std::shared_ptr<DBSmartFilter> DBReactor::Get<DBSmartFilter>(long long) const;
template std::shared_ptr<DBRefFolder> DBReactor::Get<DBRefFolder>(long long) const;
template std::shared_ptr<DBUserImgAttrib> DBReactor::Get<DBUserImgAttrib>(long long) const;
template std::shared_ptr<DBExivImgAttrib> DBReactor::Get<DBExivImgAttrib>(long long) const;

// An image's attribute record; when the image has none yet, a new unsaved one linked to it.
template <class A>
std::shared_ptr<A> DBReactor::attributesOfImage(const std::shared_ptr<DBImage>& image) const {
  if (!image) return nullptr;
  static const DBStaticSql kSql(DBRecordIO::selectSql<A>() + " WHERE image_id_int_64 = ?");
  if (auto found = DBRecordIO::getWhere<A>(connection(), kSql, image->id())) return found;
  if (!image->is_saved()) return nullptr;
  auto created = std::make_shared<A>();
  created->image_id = image->id();
  return created;
}

template <>
std::shared_ptr<DBPath> DBReactor::GetBy<DBPath, DBImage>(std::shared_ptr<DBImage> const& image) const {
  if (!image) return nullptr;
  static const DBStaticSql kSql(
      DBRecordIO::selectSql<DBPath>() +
      " WHERE _id_int_64 = (SELECT folder_path_id FROM images WHERE _id_int_64 = ?)");
  return DBRecordIO::getWhere<DBPath>(connection(), kSql, image->id());
}

template <>
std::shared_ptr<DBVolume> DBReactor::GetBy<DBVolume, DBPath>(std::shared_ptr<DBPath> const& path) const {
  if (!path || path->volume_id == 0) return nullptr;
  return DBRecordIO::get<DBVolume>(connection(), path->volume_id);
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
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBEntityFavoriteAlias>() +
                                " WHERE orig_entity_type = ? AND orig_entity_id_int_64 = ?");
  const DBStatementLease statement = connection().prepare(kSql);
  statement->bind(1, static_cast<int64_t>(record->type())).bind(2, record->id());
  return DBRecordIO::readOne<DBEntityFavoriteAlias>(*statement);
}

template <>
std::shared_ptr<DBFilterAttrib> DBReactor::GetAttributes<DBFilterAttrib, DBFilter>(
    std::shared_ptr<DBFilter> const& filter) const {
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBFilterAttrib>() + " WHERE filter_id_int_64 = ?");
  return filter ? DBRecordIO::getWhere<DBFilterAttrib>(connection(), kSql, filter->id()) : nullptr;
}

template <>
std::shared_ptr<DBRefFolderAttrib> DBReactor::GetAttributes<DBRefFolderAttrib, DBRefFolder>(
    std::shared_ptr<DBRefFolder> const& folder) const {
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBRefFolderAttrib>() +
                                " WHERE ref_folder_id_int_64 = ?");
  return folder ? DBRecordIO::getWhere<DBRefFolderAttrib>(connection(), kSql, folder->id()) : nullptr;
}

template <>
std::shared_ptr<DBSmartFilterAttrib> DBReactor::GetAttributes<DBSmartFilterAttrib, DBSmartFilter>(
    std::shared_ptr<DBSmartFilter> const& filter) const {
  static const DBStaticSql kSql(DBRecordIO::selectSql<DBSmartFilterAttrib>() +
                                " WHERE smart_filter_id_int_64 = ?");
  return filter ? DBRecordIO::getWhere<DBSmartFilterAttrib>(connection(), kSql, filter->id()) : nullptr;
}

}  // namespace dbcore
