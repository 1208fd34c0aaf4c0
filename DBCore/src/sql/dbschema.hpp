#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace dbcore {

class DBConnection;

// The catalog file format: its identity, its versions and the ordered steps that build and migrate it.
class DBSchema {
 public:
  // user_version of the oldest file this engine can migrate and of the files it writes.
  static constexpr int kOldestVersion = 119;
  static constexpr int kCurrentVersion = 121;

  // SQLite application_id of a catalog written for the given application identity.
  static int32_t applicationIdFor(int32_t appInfo);

  // The versions the migration steps make, oldest first; the last is kCurrentVersion.
  static const std::vector<int>& stepVersions();
  // Each step is a list of parts (one table, one index, ...); a part whose change is already in the file
  // leaves it as it is. Throws DBException for a version no step makes.
  static std::size_t stepPartCount(int version);
  // Runs the first `count` parts of the step that makes the version and leaves the file's version alone:
  // the shape of a file that holds some of a step's objects without its version.
  static void runStepParts(DBConnection& connection, int version, std::size_t count);

  // Runs every migration step above the file's version, then sets the version; inside the caller's
  // transaction. A new file starts at version 0.
  static void migrate(DBConnection& connection, int fromVersion);
  // Creates the hidden root records every catalog has, when they are missing.
  static void createRootRecords(DBConnection& connection);
  // True when every table and column of the current format is there (cheap: no table is scanned).
  static bool isWellFormed(DBConnection& connection);
};

}  // namespace dbcore
