#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRClasses/KRMountEntry.hpp"
#include "KRClasses/KRMountTable.hpp"
#include "KRFoundation/KRValue.hpp"

// Keys of the dictionary serialisation of a KRVolumeInfo. Every value is a string except the total
// size, a non-negative integer. Only the mount point is required; missing strings read as empty.
inline constexpr const char* KRVolumeInfoMountPointKey = "mountPoint";
inline constexpr const char* KRVolumeInfoUUIDKey = "uuid";
inline constexpr const char* KRVolumeInfoNameKey = "name";
inline constexpr const char* KRVolumeInfoFileSystemTypeKey = "fsType";
inline constexpr const char* KRVolumeInfoTotalSizeKey = "totalSize";
inline constexpr const char* KRVolumeInfoDeviceKey = "device";

// An immutable description of one mounted volume: where it is mounted, what identifies it and what it
// holds. Equal when every field is equal.
class KRVolumeInfo : public KRObject {
 public:
  // The info of the volume that holds an absolute path: the mount whose mount point is the longest
  // prefix of the path on a component boundary ("/mnt/photo" holds "/mnt/photo/a", not "/mnt/photos").
  // The path is normalised lexically ("." and ".." resolved, symbolic links not followed). Nil for a
  // nil, empty or relative path, or when no mount holds it.
  static std::shared_ptr<KRVolumeInfo> volumeInfoForPath(
      const KRString& path,
      const std::shared_ptr<KRMountTable>& mountTable = KRMountTable::defaultMountTable());
  static std::shared_ptr<KRVolumeInfo> volumeInfoWithMountEntry(const KRMountEntry& entry);
  // Nil for a nil dictionary, a missing mount point or a value of the wrong type.
  static std::shared_ptr<KRVolumeInfo> initWithDictionarySerialization(const KRDictionary& dictionary);

  KRDictionary dictionarySerialization() const;

  const KRString& mountPoint() const { return mountPoint_; }
  // Empty when the file system has none or it could not be read.
  const KRString& volumeUUID() const { return volumeUUID_; }
  // The volume's name: its label, else the last component of its mount point ("/" for the root).
  const KRString& label() const { return label_; }
  const KRString& fileSystemType() const { return fileSystemType_; }
  // Bytes; 0 when unknown.
  uint64_t totalSize() const { return totalSize_; }
  const KRString& device() const { return device_; }

  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;
  std::string description() const override;

 private:
  explicit KRVolumeInfo(const KRMountEntry& entry);

  KRString mountPoint_;
  KRString volumeUUID_;
  KRString label_;
  KRString fileSystemType_;
  uint64_t totalSize_;
  KRString device_;
};
