#pragma once

#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBAbstractBaseFolder/KRDBAbstractBaseFolder.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBPath/KRDBPathObserver.hpp"
#include "dbreffolder.hpp"

class KRDBPath;

// The change key posted when a referenced folder makes its uuid on first read.
extern const char* const kKRDBReferencedFolderDidChangeUuid;

// A folder on disk whose images are in the catalog, over a dbcore::DBRefFolder record (uuid, path id,
// order). Its name, location, existence and availability are those of its KRDBPath, which it listens to and
// whose changes it passes on to its own observers (KRDBReferencedFolderObserver). Used on its context's
// thread.
class KRDBReferencedFolder
    : public KRDBConcreteEntity<KRDBReferencedFolder, KRDBAbstractBaseFolder, KRDBEntityTypeReferencedFolder,
                                dbcore::kDBRefFolderType>,
      public KRDBPathObserver {
 public:
  // The base's keys followed by "dbPath".
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();

  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBRefFolder> dbfilter() const;

  // ---- The folder on disk, a necessary linked entity
  std::shared_ptr<KRDBPath> dbPath() const { return dbPath_; }
  // Moves this folder's listener registration from the old path to the new one.
  void setDbPath(const std::shared_ptr<KRDBPath>& dbPath);
  int64_t idPath() const { return idPath_; }
  // The last component of the path's absolute location (nil without a path); the record's name is unused.
  const KRString& name() override;
  // The path's absolute location, or nil without a path.
  KRString path();
  bool isAvailable();
  bool isExists();
  // A different value is set on the path and then on every child folder, so a whole subtree changes.
  void setExists(bool exists);

  // Setter protocol: compared by value; the record gets a 32-bit float, this object keeps the full value.
  void setOrder(double order) override;
  // Made, stored and posted (kKRDBReferencedFolderDidChangeUuid) on the first read while empty, then kept.
  KRString uuid();

  // The context's addImages:toReferencedFolder: for a non-empty set.
  void addImages(const KRDBEntitySet& images) override;
  // "<entity type>-<path>", or nil without a path.
  KRString markedToDeleteHashKey() const override;
  // Resets this folder, then every child folder.
  void resetToDefaultState() override;

  // Passed on to this folder's observers as refFolderPathDidChange and refFolderVolumeDidUpdate.
  void pathDidChange(const std::shared_ptr<KRDBPath>& path) override;
  void volumeDidUpdate(const std::shared_ptr<KRDBPath>& path) override;

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBReferencedFolder(const std::shared_ptr<dbcore::DBRefFolder>& folder);

 private:
  std::shared_ptr<KRDBReferencedFolder> folderSelf() {
    return std::static_pointer_cast<KRDBReferencedFolder>(self());
  }
  // The path's absolute location read through the held path entity; nil without one.
  KRString absolutePathOfDbPath() const;
  // Its last component (the name is kept in name_, whose reference name() answers).
  KRString nameOfDbPath() const;
  // Calls `action` on every child that is a referenced folder.
  template <class Action>
  void forEachChildFolder(Action&& action);

  std::shared_ptr<KRDBPath> dbPath_;
  int64_t idPath_ = 0;
  KRString uuid_;
};
