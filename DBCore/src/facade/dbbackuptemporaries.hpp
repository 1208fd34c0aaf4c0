#pragma once

#include <sys/types.h>

#include <string>

namespace dbcore {

// The temporary files a backup writes beside its destination before renaming the copy into place:
// `<destination>.backup-<pid>-<n>`, with SQLite's `-journal`, `-wal` or `-shm` beside it. A backup killed
// midway leaves them; the next backup to the same destination removes those whose process is gone.
class DBBackupTemporaries {
 public:
  explicit DBBackupTemporaries(std::string destination);

  // A new temporary path for this process.
  std::string next() const;
  // Removes the temporaries of this destination written by processes that no longer exist.
  void removeStale() const;
  // Removes a temporary of this process with its sidecars.
  static void remove(const std::string& temporary);

  static bool processExists(pid_t pid);

 private:
  std::string prefix() const;
  // The writer's process id when the name is one of this destination's temporaries, or 0.
  pid_t writerOf(const std::string& name) const;

  std::string destination_;
};

}  // namespace dbcore
