#include "dbopenclassifier.hpp"

#include <filesystem>
#include <utility>

#include "dbcatalogidentity.hpp"
#include "dbexception.hpp"
#include "dbreactor.hpp"
#include "dbreadonlydatabase.hpp"
#include "dbschema.hpp"
#include "dbschemalayout.hpp"

namespace dbcore {

namespace {

// SQLite reads a file shorter than its 100-byte header as an empty database, which it would overwrite.
constexpr std::uintmax_t kHeaderSize = 100;

// The size of a file; 0 when it is missing or cannot be read.
std::uintmax_t sizeOf(const std::string& path) {
  std::error_code error;
  const std::uintmax_t size = std::filesystem::file_size(path, error);
  return error ? 0 : size;
}

bool accepted(int result) { return result == kDBOpenCurrent || result == kDBOpenNeedsUpdate; }

}  // namespace

DBOpenClassifier::DBOpenClassifier(std::string path, int32_t applicationId)
    : path_(std::move(path)), applicationId_(applicationId) {}

int DBOpenClassifier::classify() const {
  if (path_.empty()) return kDBOpenFailed;
  std::error_code error;
  const std::filesystem::file_type type = std::filesystem::status(path_, error).type();
  if (type == std::filesystem::file_type::not_found) return newCatalog();
  if (type != std::filesystem::file_type::regular) return kDBOpenFailed;
  const std::uintmax_t size = sizeOf(path_);
  if (size == 0) return newCatalog();
  if (size < kHeaderSize) return kDBOpenFailed;
  try {
    return classifyExisting();
  } catch (const std::exception&) {
    return kDBOpenFailed;
  }
}

// A log beside a missing or empty file is some other file's: SQLite would delete it.
int DBOpenClassifier::newCatalog() const { return hasLog() ? kDBOpenFailed : kDBOpenNeedsUpdate; }

bool DBOpenClassifier::hasLog() const {
  return sizeOf(sidecar("-wal")) > 0 || sizeOf(sidecar("-journal")) > 0;
}

int DBOpenClassifier::classifyExisting() const {
  if (hasLog()) return classifyWithLog();
  // Nothing to replay: the main file's bytes are the whole content, read without creating any sidecar.
  return classifyView(DBReadOnlyDatabase(path_, DBReadOnlyDatabase::View::kMainFile));
}

// A read-only connection cannot roll a hot journal back (it fails) and reads a write-ahead log through its
// index, -shm: an existing one is read without being written, a missing one is created and removed again
// when the file is refused.
int DBOpenClassifier::classifyWithLog() const {
  const std::string index = sidecar("-shm");
  const bool hadIndex = std::filesystem::exists(index);
  int result = kDBOpenFailed;
  try {
    const DBReadOnlyDatabase committed(path_, hadIndex ? DBReadOnlyDatabase::View::kCommittedWithReadOnlyIndex
                                                       : DBReadOnlyDatabase::View::kCommitted);
    result = logBelongsToFile(committed) ? classifyView(committed) : kDBOpenFailed;
    if (accepted(result) && committed.text("PRAGMA quick_check(1)") != "ok") result = kDBOpenFailed;
  } catch (const DBException&) {
    result = kDBOpenFailed;
  }
  std::error_code error;
  if (!hadIndex && !accepted(result)) std::filesystem::remove(index, error);
  return result;
}

// A file being created may hold its first transactions in its log only; any other file must show the same
// identity with and without its log.
bool DBOpenClassifier::logBelongsToFile(const DBReadOnlyDatabase& committed) const {
  DBCatalogIdentity main = DBCatalogIdentity::unreadable();
  try {
    main = DBCatalogIdentity::of(DBReadOnlyDatabase(path_, DBReadOnlyDatabase::View::kMainFile));
  } catch (const DBException&) {
  }
  const DBCatalogIdentity withLog = DBCatalogIdentity::of(committed);
  return main.blank() ? withLog.readable() : main.sameCatalog(withLog);
}

int DBOpenClassifier::classifyView(const DBReadOnlyDatabase& view) const {
  const int64_t applicationId = view.integer("PRAGMA application_id");
  const int64_t version = view.integer("PRAGMA user_version");
  const int64_t objects = view.integer("SELECT count(*) FROM sqlite_schema");
  if (applicationId == 0 && version == 0 && objects == 0) return kDBOpenNeedsUpdate;
  if (applicationId != applicationId_) return kDBOpenIncompatible;
  if (version > DBSchema::kCurrentVersion || version < DBSchema::kOldestVersion) return kDBOpenIncompatible;
  if (!(DBSchemaLayout::of(view.handle()) == DBSchemaLayout::ofVersion(static_cast<int>(version))))
    return kDBOpenFailed;
  return version < DBSchema::kCurrentVersion ? kDBOpenNeedsUpdate : kDBOpenCurrent;
}

}  // namespace dbcore
