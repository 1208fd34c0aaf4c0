#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "dbchecks.hpp"
#include "dbind.hpp"
#include "dbrecords.hpp"
#include "dbreftree.hpp"

namespace dbcore {

class DBConnection;
class DBEntitySelectQuery;

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

// The engine's facade over one catalog file. Every write is atomic; a failure throws DBException and
// leaves the file as it was. Not thread-safe: all calls come from one queue.
class DBReactor {
 public:
  explicit DBReactor(AppInfo const& appInfo);
  ~DBReactor();
  DBReactor(const DBReactor&) = delete;
  DBReactor& operator=(const DBReactor&) = delete;

  // Life. Open never throws; see DBOpenResult. The key is not used.
  int Open(const std::wstring& path, const std::wstring& key);
  void Initialize();
  void Close();
  bool Backup(const std::wstring& path);

  // Versions.
  int DBUserVersion() const;
  ApplicationID GetDBApplicationID() const;
  void SetDBApplicationID(ApplicationID version) const;

  // Reads: an empty pointer when there is no such record.
  template <class T>
  std::shared_ptr<T> Get(long long id) const;
  template <class T, class U>
  std::shared_ptr<T> GetBy(std::shared_ptr<U> const& record) const;
  template <class A, class T>
  std::shared_ptr<A> GetAttributes(std::shared_ptr<T> const& record) const;

  // Trees. Children come in (order, id) order; descendants depth first in the same order.
  template <class T>
  std::shared_ptr<T> GetRoot() const;
  template <class T>
  std::vector<std::shared_ptr<T>> Children(std::shared_ptr<T> const& parent) const;
  template <class T>
  std::vector<std::shared_ptr<T>> Descendants(std::shared_ptr<T> const& parent);
  template <class T>
  std::shared_ptr<T> GetParent(std::shared_ptr<T> const& item) const;
  template <class T>
  bool Move(std::shared_ptr<T> const& item, std::shared_ptr<T> const& newParent);

  // Writes: insert an unsaved record (its id is set) or update a saved one.
  template <class T>
  DBReactor& operator<<(std::shared_ptr<T> const& record);
  template <class T, class Check = ValueCheckDefault<T>>
  DBReactor& operator<<(std::vector<std::shared_ptr<T>> const& records);
  template <class P, class I>
  DBReactor& operator<<(std::vector<std::pair<std::shared_ptr<P>, std::shared_ptr<I>>> const& pairs);
  DBReactor& operator<<(DBind<DBRefFolder, long long, std::shared_ptr<DBPath>> const& binding);
  DBReactor& operator<<(std::shared_ptr<DBRefFolderTree> const& tree);

  // Links.
  template <class A, class B, class Check = PairCheckDefault<A, B>>
  bool Bind(std::shared_ptr<A> const& a, std::shared_ptr<B> const& b);
  void FilterAddImage(long long filterId, std::shared_ptr<DBImage> const& image);
  void FilterDelImage(long long filterId, std::shared_ptr<DBImage> const& image);
  // The collections holding the image, by id; `limit` and `offset` page the list (-1: no limit, no offset).
  std::vector<std::shared_ptr<DBFilter>> GetFiltersByImage(long long imageId, int limit, int offset);
  // Folder-image links: keyed by folder id with the ids of its images, or, with byImage true, keyed by
  // image id with the ids of its folders.
  template <class P, class I>
  std::map<long long, std::set<long long>> Connections(bool byImage) const;
  bool RenamePath(std::wstring const& oldPath, std::wstring const& newPath,
                  std::shared_ptr<DBVolume> const& oldVolume, std::shared_ptr<DBVolume> const& newVolume);
  void RebindPathImages(std::vector<std::pair<long long, std::shared_ptr<DBImage>>> const& pairs);

  // Removal.
  template <class T>
  bool Remove(std::shared_ptr<T> const& record);
  template <class T>
  void Remove(std::vector<std::shared_ptr<T>> const& records);

  // History states. SetStatesByVector takes, per image, its states in order and the position of the
  // current one in that list (-1: none).
  template <class I, class S>
  std::vector<std::shared_ptr<S>> GetStates(std::shared_ptr<I> const& image);
  template <class I, class S>
  std::shared_ptr<S> GetCurrentState(std::shared_ptr<I> const& image);
  template <class I, class S>
  std::map<long long, std::shared_ptr<S>> GetCurrentStates(
      std::vector<std::shared_ptr<I>> const& images) const;
  template <class I, class S>
  void SetCurrentState(std::shared_ptr<I> const& image, std::shared_ptr<S> const& state);
  template <class I, class S>
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
  template <class T>
  void ClearDangling();
  std::vector<std::shared_ptr<DBImgHistoryState>> GetDanglingHistoryStates() const;
  template <class T>
  std::vector<std::shared_ptr<T>> GetDangling();

  template <class T>
  unsigned long long Count() const;

  template <class T>
  std::vector<std::shared_ptr<T>> GetBySelectQuery(std::shared_ptr<DBEntitySelectQuery> const& query);

 private:
  DBConnection& connection() const;
  int classifyOpenedFile();
  int useWriteAheadLog(int result);
  template <class T>
  std::shared_ptr<T> recordWhere(const std::string& condition, int64_t value) const;
  template <class A>
  std::shared_ptr<A> attributesOfImage(const std::shared_ptr<DBImage>& image) const;
  template <class T>
  void writeOne(T& record);
  void writeBinding(DBRefFolder& folder, long long parentId, const std::shared_ptr<DBPath>& path);
  void writeTreeNode(const DBRefFolderNode& node, long long parentId);
  template <class T>
  bool removeOne(const T& record);

  AppInfo appInfo_;
  std::unique_ptr<DBConnection> connection_;
};

}  // namespace dbcore
