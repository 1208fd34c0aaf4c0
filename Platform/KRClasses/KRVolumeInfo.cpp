#include "KRClasses/KRVolumeInfo.hpp"

#include <filesystem>
#include <optional>
#include <string_view>

#include "KRFoundation/KRHashing.hpp"

namespace {

// The absolute path with "." and ".." resolved and no trailing slash; empty when not absolute.
std::string normalisedAbsolutePath(const std::string& path) {
  if (!path.starts_with('/')) return {};
  std::string normal = std::filesystem::path(path).lexically_normal().generic_string();
  while (normal.size() > 1 && normal.ends_with('/')) normal.pop_back();
  return normal;
}

bool holdsPath(std::string_view mountPoint, std::string_view path) {
  if (mountPoint == "/") return true;
  return path.starts_with(mountPoint) && (path.size() == mountPoint.size() || path[mountPoint.size()] == '/');
}

// The string under the key: empty when absent, nullopt when of another type.
std::optional<std::string> optionalString(const KRDictionary& dictionary, const char* key) {
  const KRValue& value = dictionary.objectForKey(key);
  if (value.isNil()) return std::string();
  if (!value.isString()) return std::nullopt;
  return value.string().str();
}

// The size under the key: 0 when absent, nullopt unless a non-negative integer.
std::optional<uint64_t> optionalSize(const KRDictionary& dictionary, const char* key) {
  const KRValue& value = dictionary.objectForKey(key);
  if (value.isNil()) return 0;
  const KRNumber number = value.number();
  if (!number) return std::nullopt;
  const bool isUnsigned = number.kind() == KRNumber::Kind::UInt;
  const bool isNonNegativeInteger = number.kind() == KRNumber::Kind::Int && number.longLongValue() >= 0;
  if (!isUnsigned && !isNonNegativeInteger) return std::nullopt;
  return number.unsignedLongLongValue();
}

}  // namespace

std::shared_ptr<KRVolumeInfo> KRVolumeInfo::volumeInfoForPath(
    const KRString& path, const std::shared_ptr<KRMountTable>& mountTable) {
  const std::string normal = normalisedAbsolutePath(path.str());
  if (normal.empty() || !mountTable) return nullptr;
  std::optional<KRMountEntry> holder;
  // ">=": of two mounts on one mount point, the later one is stacked over the earlier and visible.
  for (const auto& entry : mountTable->mounts()) {
    const bool longer = !holder || entry.mountPoint.size() >= holder->mountPoint.size();
    if (longer && holdsPath(entry.mountPoint, normal)) holder = entry;
  }
  return holder ? volumeInfoWithMountEntry(*holder) : nullptr;
}

std::shared_ptr<KRVolumeInfo> KRVolumeInfo::volumeInfoWithMountEntry(const KRMountEntry& entry) {
  return std::shared_ptr<KRVolumeInfo>(new KRVolumeInfo(entry));
}

std::shared_ptr<KRVolumeInfo> KRVolumeInfo::initWithDictionarySerialization(const KRDictionary& dictionary) {
  if (!dictionary) return nullptr;
  const auto mountPoint = optionalString(dictionary, KRVolumeInfoMountPointKey);
  const auto uuid = optionalString(dictionary, KRVolumeInfoUUIDKey);
  const auto name = optionalString(dictionary, KRVolumeInfoNameKey);
  const auto fileSystemType = optionalString(dictionary, KRVolumeInfoFileSystemTypeKey);
  const auto device = optionalString(dictionary, KRVolumeInfoDeviceKey);
  const auto totalSize = optionalSize(dictionary, KRVolumeInfoTotalSizeKey);
  if (!mountPoint || mountPoint->empty() || !uuid || !name || !fileSystemType || !device || !totalSize) {
    return nullptr;
  }
  return volumeInfoWithMountEntry({.mountPoint = *mountPoint,
                                   .device = *device,
                                   .fileSystemType = *fileSystemType,
                                   .volumeUUID = *uuid,
                                   .label = *name,
                                   .totalSize = *totalSize});
}

KRVolumeInfo::KRVolumeInfo(const KRMountEntry& entry)
    : mountPoint_(entry.mountPoint),
      volumeUUID_(entry.volumeUUID),
      label_(entry.label.empty() ? KRString(entry.mountPoint).lastPathComponent() : KRString(entry.label)),
      fileSystemType_(entry.fileSystemType),
      totalSize_(entry.totalSize),
      device_(entry.device) {}

KRDictionary KRVolumeInfo::dictionarySerialization() const {
  return KRDictionary{{KRVolumeInfoMountPointKey, mountPoint_},
                      {KRVolumeInfoUUIDKey, volumeUUID_},
                      {KRVolumeInfoNameKey, label_},
                      {KRVolumeInfoFileSystemTypeKey, fileSystemType_},
                      {KRVolumeInfoTotalSizeKey, totalSize_},
                      {KRVolumeInfoDeviceKey, device_}};
}

bool KRVolumeInfo::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto info = std::dynamic_pointer_cast<const KRVolumeInfo>(other);
  return info && mountPoint_ == info->mountPoint_ && volumeUUID_ == info->volumeUUID_ &&
         label_ == info->label_ && fileSystemType_ == info->fileSystemType_ &&
         totalSize_ == info->totalSize_ && device_ == info->device_;
}

uint64_t KRVolumeInfo::hash() const {
  uint64_t seed = mountPoint_.hash();
  for (const uint64_t value :
       {volumeUUID_.hash(), label_.hash(), fileSystemType_.hash(), totalSize_, device_.hash()}) {
    seed = KRHashing::combine(seed, value);
  }
  return seed;
}

std::string KRVolumeInfo::description() const {
  return defaultDescription() + " {mountPoint: " + mountPoint_.str() + ", uuid: " + volumeUUID_.str() +
         ", name: " + label_.str() + ", fsType: " + fileSystemType_.str() + ", device: " + device_.str() +
         ", totalSize: " + std::to_string(totalSize_) + "}";
}
