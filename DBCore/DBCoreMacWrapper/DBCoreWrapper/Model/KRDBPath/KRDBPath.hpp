#pragma once

#include <memory>
#include <string>
#include <vector>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBVolume/KRDBVolumeObserver.hpp"
#include "dbpath.hpp"

class KRDBVolume;

// The change key posted when the relative path changes.
extern const char* const kKRDBPathDidChangePath;

// One folder on disk that holds catalog images, over a dbcore::DBPath record: a path relative to the mount
// point of its volume. It listens to its volume and tells its own listeners (KRDBPathObserver) when its
// location or its volume's availability changes. Used on its context's thread.
class KRDBPath : public KRDBConcreteEntity<KRDBPath, KRDBEntity, KRDBEntityTypePath, dbcore::kDBPathType>,
                 public KRDBVolumeObserver {
 public:
  // The base's keys followed by "volumePrimitive".
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();

  bool storeInfoFromDBentity(const Record& record) override;
  // The held record as a path record; empty for a record of another class.
  std::shared_ptr<dbcore::DBPath> dbpath() const;

  // The path relative to the volume's mount point.
  const KRString& path() const { return path_; }
  void setPath(const KRString& path);
  // Compares by identity. With the flag the record takes the path in memory but the entity is not marked
  // changed, for a path that the catalog already changed in the catalog file.
  void setPath(const KRString& path, bool andDoesNotWriteToDatabase);

  // The volume's mount point with the path appended, or the path alone when the volume has no mount point.
  // Cached until the path or the mount point changes.
  KRString absolutePath();
  // Stores the cache without notification.
  void setAbsolutePath(const KRString& absolutePath);

  // Asked from the context on first read (nil without a context); the path then listens to it.
  std::shared_ptr<KRDBVolume> volume();
  std::shared_ptr<KRDBVolume> volumePrimitive() const { return volume_; }
  // Moves the path's listener registration to the new volume and reports a new location.
  void setVolumePrimitive(const std::shared_ptr<KRDBVolume>& volume);
  // setVolumePrimitive, then the new volume's id is written into the record; posted as not changed, since
  // the catalog binds path and volume itself.
  void setVolume(const std::shared_ptr<KRDBVolume>& volume);

  bool isExists() const { return exists_; }
  void setExists(bool exists);
  // The folder exists and its volume is mounted.
  bool isAvailable();

  void volumeDidChangeMountPoint(const std::shared_ptr<KRDBVolume>& volume) override;
  void volumeDidChangeAvailability(const std::shared_ptr<KRDBVolume>& volume) override;

  // Key-value reads answer what is cached: they neither ask the context nor fill a cache.
  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBPath(const std::shared_ptr<dbcore::DBPath>& path);

 private:
  std::shared_ptr<KRDBPath> pathSelf() { return std::static_pointer_cast<KRDBPath>(self()); }
  KRString computedAbsolutePath(const std::shared_ptr<KRDBVolume>& volume) const;
  void notifyPathDidChange();

  bool exists_ = true;
  std::shared_ptr<KRDBVolume> volume_;
  KRString path_;
  KRString absolutePath_;
};
