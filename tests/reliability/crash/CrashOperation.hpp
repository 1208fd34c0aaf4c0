#pragma once

#include <optional>
#include <string>

namespace reliability {

// The facade calls a crash-trial writer makes.
enum class CrashOperationKind {
  kOpen,                 // Open a new file and Initialize it
  kWriteImages,          // write a group of new images: one record alone, more as one batch
  kWriteUserAttributes,  // one batch of user attributes, one per image of a group
  kWriteExifAttributes,  // one batch of exif attributes, one per image of a group
  kUpdateImage,          // rewrite the first image of a group with a new width
  kRemoveImages,         // remove the images of a group: one record alone, more as one batch
  kReopen,               // Close, then Open again
  kBackup,               // Backup to a file of its own
};

// One call of a crash-trial writer. The records a call writes carry the marker of their group, so that a
// checker finds them in the file.
struct CrashOperation {
  long long number = 0;
  CrashOperationKind kind = CrashOperationKind::kOpen;
  // The number of the call that wrote the group's images.
  long long group = 0;
  // The group's number of images.
  int count = 0;
  // The width an update writes.
  long long value = 0;

  // The text the group's records carry: in the images' guid, the user attributes' origin name and the
  // exif attributes' camera model; the first image's path is the marker followed by "/0".
  static std::string marker(long long group);
  // The group a marker names, if the text is a marker.
  static std::optional<long long> groupOfMarker(const std::string& text);
  // The file name a backup call writes.
  std::string backupName() const;

  std::string encode() const;
  static std::optional<CrashOperation> decode(const std::string& text);
};

}  // namespace reliability
