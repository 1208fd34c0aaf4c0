#pragma once

#include <memory>
#include <string>

#include "KRClasses/KRMountTable.hpp"
#include "KRClasses/KRVolume.hpp"
#include "KRClasses/KRVolumeObserver.hpp"
#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "dbvolume.hpp"

// The change keys of the volume's record fields.
extern const char* const kKRDBVolumeDidChangeUuid;
extern const char* const kKRDBVolumeDidChangeInfo;

// One disk volume known to the catalog, over a dbcore::DBVolume record: its uuid and the serialised
// description of the volume (a KRVolumeInfo as a dictionary, kept as JSON in the record). After a fetch it
// follows the live KRVolume made from that description and tells its listeners (KRDBVolumeObserver, the paths
// on it) when the volume is mounted elsewhere, comes or goes. Used on the main thread, where the live volume
// reports.
class KRDBVolume
    : public KRDBConcreteEntity<KRDBVolume, KRDBEntity, KRDBEntityTypeVolume, dbcore::kDBVolumeType>,
      public KRVolumeObserver {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  // The held record as a volume record; empty for a record of another class.
  std::shared_ptr<dbcore::DBVolume> dbvolume() const;

  // A volume without uuid gets a new random one on first read, written into the record and posted as a
  // change.
  KRString uuid();
  const KRDictionary& info() const { return info_; }
  // Compares by identity.
  void setInfo(const KRDictionary& info);

  std::shared_ptr<KRVolume> volume() const { return volume_; }
  void setVolume(std::shared_ptr<KRVolume> volume) { volume_ = std::move(volume); }
  // The mount point of the live volume's latest info; nil without a live volume.
  KRString mountPoint() const;
  bool isAvailable() const;

  // Makes the live volume from the info over the system's mount table and listens to it.
  void awakeFromFetch() override;
  // The same over the given mount table; nothing for an info that describes no volume.
  void awakeFromFetch(const std::shared_ptr<KRMountTable>& mountTable);

  void volumeInfoDidChange(std::shared_ptr<KRVolume> volume) override;
  void volumeAppearedStatusDidChange(std::shared_ptr<KRVolume> volume) override;

  // Key-value reads answer what is stored: a missing uuid is not made by reading it by key.
  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBVolume(const std::shared_ptr<dbcore::DBVolume>& volume);

 private:
  std::shared_ptr<KRDBVolume> volumeSelf() { return std::static_pointer_cast<KRDBVolume>(self()); }

  KRString uuid_;
  KRDictionary info_;
  std::shared_ptr<KRVolume> volume_;
};
