#pragma once

#include <cstdint>

namespace dbcore {

class DBConnection;

// The catalog file format: its identity, its versions and the ordered steps that build and migrate it.
class DBSchema {
 public:
  // user_version of the oldest file this engine can migrate and of the files it writes.
  static constexpr int kOldestVersion = 119;
  static constexpr int kCurrentVersion = 120;

  // SQLite application_id of a catalog written for the given application identity.
  static int32_t applicationIdFor(int32_t appInfo);

  // Runs every migration step above the file's version, then sets the version; inside the caller's
  // transaction. A new file starts at version 0.
  static void migrate(DBConnection& connection, int fromVersion);
  // Creates the hidden root records every catalog has, when they are missing.
  static void createRootRecords(DBConnection& connection);
  // True when every table and column of the current format is there (cheap: no table is scanned).
  static bool isWellFormed(DBConnection& connection);
};

}  // namespace dbcore
