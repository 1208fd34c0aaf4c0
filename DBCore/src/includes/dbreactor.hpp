#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "dbchecks.hpp"
#include "dbind.hpp"
#include "dbrecords.hpp"
#include "dbreftree.hpp"

namespace dbcore {

class DBConnection;
class DBEntitySelectQuery;
class DBIdentityStamp;

// The application identity a file is opened for, and the product version stored in the file.
using AppInfo = int32_t;
using ApplicationID = int32_t;

// Results of DBReactor::Open.
enum DBOpenResult : int {
  kDBOpenCurrent = 0,       // opened, schema current
  kDBOpenNeedsUpdate = 1,   // opened; Initialize() must create or migrate the schema
  kDBOpenFailed = 2,        // not opened: unreadable, not a database, corrupt or malformed
  kDBOpenIncompatible = 3,  // another application's file, or a schema newer than this engine
};

// Whether T is one of the listed types. The facade's templates serve only the record types they name: a
// call with another type does not compile ("constraints not satisfied").
template <class T, class... Allowed>
concept DBOneOf = (std::is_same_v<T, Allowed> || ...);

template <class T>
concept DBStoredRecord =
    DBOneOf<T, DBImage, DBPath, DBFilter, DBSmartFilter, DBRefFolder, DBUserImgAttrib, DBExivImgAttrib>;
template <class T>
concept DBTreeRecord = DBOneOf<T, DBFilter, DBRefFolder>;
template <class T>
concept DBOrderedRecord = DBOneOf<T, DBFilter, DBRefFolder, DBSmartFilter>;
template <class T>
concept DBWritableRecord = DBOneOf<T, DBEntity, DBImage, DBImgHistoryState, DBVolume, DBFilter, DBSmartFilter,
                                   DBEntityFavoriteAlias>;
template <class T>
concept DBBatchRecord = DBOneOf<T, DBImage, DBPath, DBUserImgAttrib, DBExivImgAttrib>;
template <class T>
concept DBRemovableRecord =
    DBOneOf<T, DBImage, DBFilter, DBRefFolder, DBUserImgAttrib, DBEntityFavoriteAlias>;
template <class T>
concept DBQueriedRecord = DBOneOf<T, DBImage, DBPath, DBVolume, DBRefFolder, DBUserImgAttrib, DBExivImgAttrib,
                                  DBEntityFavoriteAlias>;
// The record T related to a record U (GetBy<T, U>).
template <class T, class U>
concept DBRelatedRecords = DBOneOf<std::pair<T, U>, std::pair<DBPath, DBImage>, std::pair<DBVolume, DBPath>,
                                   std::pair<DBUserImgAttrib, DBImage>, std::pair<DBExivImgAttrib, DBImage>,
                                   std::pair<DBImage, DBUserImgAttrib>, std::pair<DBImage, DBExivImgAttrib>,
                                   std::pair<DBEntityFavoriteAlias, DBEntity>>;
// The attribute record A of a record T (GetAttributes<A, T>).
template <class A, class T>
concept DBAttributesOf =
    DBOneOf<std::pair<A, T>, std::pair<DBFilterAttrib, DBFilter>, std::pair<DBRefFolderAttrib, DBRefFolder>,
            std::pair<DBSmartFilterAttrib, DBSmartFilter>>;
template <class A, class B>
concept DBBindable = DBOneOf<std::pair<A, B>, std::pair<DBPath, DBVolume>, std::pair<DBRefFolder, DBImage>>;
template <class P, class I>
concept DBFolderOfImages = std::is_same_v<P, DBPath> && std::is_same_v<I, DBImage>;
template <class I, class S>
concept DBImageStates = std::is_same_v<I, DBImage> && std::is_same_v<S, DBImgHistoryState>;

// The engine's facade over one catalog file. Every write is atomic; a failure throws DBException and
// leaves the file as it was. Not thread-safe: all calls come from one queue.
class DBReactor {
 public:
  explicit DBReactor(AppInfo const& appInfo);
  ~DBReactor();
  DBReactor(const DBReactor&) = delete;
  DBReactor& operator=(const DBReactor&) = delete;

  // Life. Open never throws; see DBOpenResult. Inside a Batch it fails and keeps the catalog open. The key
  // is not used.
  int Open(const std::wstring& path, const std::wstring& key);
  void Initialize();
  // Throws DBException inside a Batch.
  void Close();
  bool Backup(const std::wstring& path);

  // Runs the body's facade calls under one commit. Each facade call inside stays atomic on its own (a call
  // that fails leaves nothing of itself); when the body throws, the calls that succeeded before it are
  // committed and the exception passes on unchanged. Nested Batch calls join the outer one. A commit that
  // fails rolls the whole batch back and throws DBException (instead of the body's exception, if any).
  void Batch(const std::function<void()>& body);

  // Versions.
  int DBUserVersion() const;
  ApplicationID GetDBApplicationID() const;
  void SetDBApplicationID(ApplicationID version) const;

  // Reads: an empty pointer when there is no such record.
  template <DBStoredRecord T>
  std::shared_ptr<T> Get(long long id) const;
  template <class T, class U>
  requires DBRelatedRecords<T, U> std::shared_ptr<T> GetBy(std::shared_ptr<U> const& record)
  const;
  template <class A, class T>
  requires DBAttributesOf<A, T> std::shared_ptr<A> GetAttributes(std::shared_ptr<T> const& record)
  const;

  // Trees. Children come in (order, id) order; descendants depth first in the same order.
  template <DBTreeRecord T>
  std::shared_ptr<T> GetRoot() const;
  template <DBOrderedRecord T>
  std::vector<std::shared_ptr<T>> Children(std::shared_ptr<T> const& parent) const;
  template <DBTreeRecord T>
  std::vector<std::shared_ptr<T>> Descendants(std::shared_ptr<T> const& parent);
  template <DBTreeRecord T>
  std::shared_ptr<T> GetParent(std::shared_ptr<T> const& item) const;
  template <DBTreeRecord T>
  bool Move(std::shared_ptr<T> const& item, std::shared_ptr<T> const& newParent);

  // Writes: insert an unsaved record (its id is set) or update a saved one.
  template <DBWritableRecord T>
  DBReactor& operator<<(std::shared_ptr<T> const& record);
  template <DBBatchRecord T, class Check = ValueCheckDefault<T>>
  DBReactor& operator<<(std::vector<std::shared_ptr<T>> const& records);
  template <class P, class I>
  requires DBFolderOfImages<P, I> DBReactor& operator<<(
      std::vector<std::pair<std::shared_ptr<P>, std::shared_ptr<I>>> const& pairs);
  DBReactor& operator<<(DBind<DBRefFolder, long long, std::shared_ptr<DBPath>> const& binding);
  DBReactor& operator<<(std::shared_ptr<DBRefFolderTree> const& tree);

  // Links.
  template <class A, class B, class Check = PairCheckDefault<A, B>>
  requires DBBindable<A, B>
  bool Bind(std::shared_ptr<A> const& a, std::shared_ptr<B> const& b);
  void FilterAddImage(long long filterId, std::shared_ptr<DBImage> const& image);
  void FilterDelImage(long long filterId, std::shared_ptr<DBImage> const& image);
  // The collections holding the image, by id; `limit` and `offset` page the list (-1: no limit, no offset).
  std::vector<std::shared_ptr<DBFilter>> GetFiltersByImage(long long imageId, int limit, int offset);
  // Folder-image links: keyed by folder id with the ids of its images, or, with byImage true, keyed by
  // image id with the ids of its folders.
  template <class P, class I>
  requires DBFolderOfImages<P, I> std::map<long long, std::set<long long>> Connections(bool byImage)
  const;
  bool RenamePath(std::wstring const& oldPath, std::wstring const& newPath,
                  std::shared_ptr<DBVolume> const& oldVolume, std::shared_ptr<DBVolume> const& newVolume);
  void RebindPathImages(std::vector<std::pair<long long, std::shared_ptr<DBImage>>> const& pairs);

  // Removal.
  template <DBRemovableRecord T>
  bool Remove(std::shared_ptr<T> const& record);
  template <DBOneOf<DBImage> T>
  void Remove(std::vector<std::shared_ptr<T>> const& records);

  // History states. SetStatesByVector takes, per image, its states in order and the position of the
  // current one in that list (-1: none). GetCurrentStates of no images answers every image's current state.
  template <class I, class S>
  requires DBImageStates<I, S> std::vector<std::shared_ptr<S>> GetStates(std::shared_ptr<I> const& image);
  template <class I, class S>
  requires DBImageStates<I, S> std::shared_ptr<S> GetCurrentState(std::shared_ptr<I> const& image);
  template <class I, class S>
  requires DBImageStates<I, S> std::map<long long, std::shared_ptr<S>> GetCurrentStates(
      std::vector<std::shared_ptr<I>> const& images)
  const;
  template <class I, class S>
  requires DBImageStates<I, S>
  void SetCurrentState(std::shared_ptr<I> const& image, std::shared_ptr<S> const& state);
  template <class I, class S>
  requires DBImageStates<I, S>
  void SetStatesByVector(
      std::map<std::shared_ptr<I>, std::pair<std::vector<std::shared_ptr<S>>, long long>> const& states);
  void BindStateWithResources(std::shared_ptr<DBImgHistoryState> const& state,
                              std::vector<std::wstring> const& resources);
  void BindStateWithResourcesFromBaseStateID(std::shared_ptr<DBImgHistoryState> const& state,
                                             long long baseStateId);

  // Cleanup of records nothing refers to: paths without images (and not used by a referenced folder),
  // states without images, resources without states.
  void ClearDanglingPaths();
  void ClearDanglingHistoryStates();
  template <DBOneOf<DBResource> T>
  void ClearDangling();
  std::vector<std::shared_ptr<DBImgHistoryState>> GetDanglingHistoryStates() const;
  template <DBOneOf<DBResource> T>
  std::vector<std::shared_ptr<T>> GetDangling();

  template <DBOneOf<DBImage> T>
  unsigned long long Count() const;

  template <DBQueriedRecord T>
  std::vector<std::shared_ptr<T>> GetBySelectQuery(std::shared_ptr<DBEntitySelectQuery> const& query);

 private:
  DBConnection& connection() const;
  void useWriteAheadLog();
  void adoptIdentity();
  template <class A>
  std::shared_ptr<A> attributesOfImage(const std::shared_ptr<DBImage>& image) const;
  template <class T>
  void writeOne(T& record);
  template <class T>
  void writeAtomically(T& record);
  void writeBinding(DBRefFolder& folder, long long parentId, const std::shared_ptr<DBPath>& path);
  void writeTreeNode(const DBRefFolderNode& node, long long parentId);
  template <class T>
  bool removeOne(const T& record);

  AppInfo appInfo_;
  std::unique_ptr<DBConnection> connection_;
  // Declared after the connection, so that it is destroyed first.
  std::unique_ptr<DBIdentityStamp> stamp_;
};

// The operations written for one record type or pair alone.
template <>
std::shared_ptr<DBPath> DBReactor::GetBy<DBPath, DBImage>(std::shared_ptr<DBImage> const& image) const;
template <>
std::shared_ptr<DBVolume> DBReactor::GetBy<DBVolume, DBPath>(std::shared_ptr<DBPath> const& path) const;
template <>
std::shared_ptr<DBUserImgAttrib> DBReactor::GetBy<DBUserImgAttrib, DBImage>(
    std::shared_ptr<DBImage> const& image) const;
template <>
std::shared_ptr<DBExivImgAttrib> DBReactor::GetBy<DBExivImgAttrib, DBImage>(
    std::shared_ptr<DBImage> const& image) const;
template <>
std::shared_ptr<DBImage> DBReactor::GetBy<DBImage, DBUserImgAttrib>(
    std::shared_ptr<DBUserImgAttrib> const& attributes) const;
template <>
std::shared_ptr<DBImage> DBReactor::GetBy<DBImage, DBExivImgAttrib>(
    std::shared_ptr<DBExivImgAttrib> const& attributes) const;
template <>
std::shared_ptr<DBEntityFavoriteAlias> DBReactor::GetBy<DBEntityFavoriteAlias, DBEntity>(
    std::shared_ptr<DBEntity> const& record) const;
template <>
std::shared_ptr<DBFilterAttrib> DBReactor::GetAttributes<DBFilterAttrib, DBFilter>(
    std::shared_ptr<DBFilter> const& filter) const;
template <>
std::shared_ptr<DBRefFolderAttrib> DBReactor::GetAttributes<DBRefFolderAttrib, DBRefFolder>(
    std::shared_ptr<DBRefFolder> const& folder) const;
template <>
std::shared_ptr<DBSmartFilterAttrib> DBReactor::GetAttributes<DBSmartFilterAttrib, DBSmartFilter>(
    std::shared_ptr<DBSmartFilter> const& filter) const;
template <>
DBReactor& DBReactor::operator<< <DBEntity>(std::shared_ptr<DBEntity> const& record);
template <>
DBReactor& DBReactor::operator<< <DBPath, DBImage>(
    std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>> const& pairs);
template <>
bool DBReactor::Bind<DBPath, DBVolume, PairCheckDefault<DBPath, DBVolume>>(
    std::shared_ptr<DBPath> const& path, std::shared_ptr<DBVolume> const& volume);
template <>
bool DBReactor::Bind<DBRefFolder, DBImage, PairCheckDefault<DBRefFolder, DBImage>>(
    std::shared_ptr<DBRefFolder> const& folder, std::shared_ptr<DBImage> const& image);
template <>
std::map<long long, std::set<long long>> DBReactor::Connections<DBPath, DBImage>(bool byImage) const;
template <>
std::vector<std::shared_ptr<DBImgHistoryState>> DBReactor::GetStates<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image);
template <>
std::shared_ptr<DBImgHistoryState> DBReactor::GetCurrentState<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image);
template <>
std::map<long long, std::shared_ptr<DBImgHistoryState>>
DBReactor::GetCurrentStates<DBImage, DBImgHistoryState>(
    std::vector<std::shared_ptr<DBImage>> const& images) const;
template <>
void DBReactor::SetCurrentState<DBImage, DBImgHistoryState>(std::shared_ptr<DBImage> const& image,
                                                            std::shared_ptr<DBImgHistoryState> const& state);
template <>
void DBReactor::SetStatesByVector<DBImage, DBImgHistoryState>(
    std::map<std::shared_ptr<DBImage>,
             std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long>> const& states);
template <>
void DBReactor::ClearDangling<DBResource>();
template <>
std::vector<std::shared_ptr<DBResource>> DBReactor::GetDangling<DBResource>();
template <>
unsigned long long DBReactor::Count<DBImage>() const;

}  // namespace dbcore
