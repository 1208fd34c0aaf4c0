#pragma once

#include <cstdint>
#include <string>

namespace dbcore {

class DBReadOnlyDatabase;

// Tells what a file is before the engine opens it for writing (DBOpenResult), through connections that
// cannot write: a file it refuses keeps every byte, and so do its -wal, -shm and -journal. A file with a
// write-ahead log or a rollback journal is accepted only when the log belongs to it: the committed view
// passes SQLite's quick check and shows the identity the main file alone shows (DBCatalogIdentity).
class DBOpenClassifier {
 public:
  DBOpenClassifier(std::string path, int32_t applicationId);

  // Never throws.
  int classify() const;

 private:
  int newCatalog() const;
  int classifyExisting() const;
  int classifyWithLog() const;
  int classifyView(const DBReadOnlyDatabase& view) const;
  bool logBelongsToFile(const DBReadOnlyDatabase& committed) const;
  std::string sidecar(const char* suffix) const { return path_ + suffix; }
  bool hasLog() const;

  std::string path_;
  int32_t applicationId_;
};

}  // namespace dbcore
