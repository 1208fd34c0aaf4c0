#pragma once

#include <cstdint>
#include <string>

// One mounted file system as a mount table lists it. Empty strings stand for what is unknown (virtual
// file systems have no volume UUID; reading a label may need privileges).
struct KRMountEntry {
  std::string mountPoint{};
  std::string device{};
  std::string fileSystemType{};
  std::string volumeUUID{};
  std::string label{};
  // Capacity in bytes; 0 when unknown.
  uint64_t totalSize = 0;

  bool operator==(const KRMountEntry&) const = default;
};
