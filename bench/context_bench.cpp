// Loading every image of a catalog of 1,000,000 images through a context (catalog opened, context built,
// the all-images filter obtained with every image's folder, attributes, exif attributes and current state
// attached) against hand-written SQL reading the same rows into plain structs joined by image id; the
// resident memory the loaded images take; and the context's fetch of one uncached image by identifier once
// its whole-catalog maps are in place.
#include <malloc.h>
#include <sqlite3.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <string>
#include <unordered_map>
#include <vector>

#include "KRBenchCatalog.hpp"
#include "KRBenchRecords.hpp"
#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRDate.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBContext/KRDBContext.hpp"
#include "Model/KRDBEntitiesFilter/KRDBEntitiesFilter.hpp"
#include "Model/KRDBEntity/KRDBEntityClasses.hpp"
#include "Model/KRDBEntity/KRDBEntityID.hpp"
#include "Model/KRDBEntity/KRDBEntityType.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "dbstrings.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const KRTemporaryDirectory scratch;

constexpr int kImages = 1000000;
constexpr int kFolders = 1000;
constexpr int kVolumes = 2;
constexpr int kRuns = 3;
constexpr int kLookups = 10000;

// Ends the run, naming the check, when a result is not what the catalog holds.
void require(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "check failed: %s\n", what);
  std::abort();
}

// ---- Raw

struct RawVolume {
  int64_t id = 0;
  bool markedToDelete = false;
  std::wstring uuid;
  std::wstring info;
};

struct RawPath {
  int64_t id = 0;
  bool markedToDelete = false;
  int64_t volumeId = 0;
  std::wstring path;
  const RawVolume* volume = nullptr;
};

struct RawUserAttributes {
  int64_t id = 0;
  bool markedToDelete = false;
  int64_t imageId = 0;
  bool trashed = false;
  int32_t marker = 0;
  int32_t color = 0;
  int32_t rating = 0;
  int64_t editDate = 0;
  bool opened = false;
  int64_t trashedDate = 0;
  std::wstring originName;
  bool lost = false;
  int32_t tutorial = 0;
};

struct RawExivAttributes {
  int64_t id = 0;
  bool markedToDelete = false;
  int64_t imageId = 0;
  double reals[12] = {};
  int32_t integers[5] = {};
  std::wstring texts[5];
  int64_t date = 0;
  bool raw = false;
  bool fullFilled = false;
  int32_t version = 0;
};

struct RawState {
  int64_t id = 0;
  bool markedToDelete = false;
  int64_t imageId = 0;
  std::wstring actionName;
  std::wstring additionalInfo;
  std::wstring guid;
  std::wstring cropDescription;
  int64_t imageOrientation = 0;
  std::wstring stateHash;
  bool original = false;
};

struct RawImage : KRBenchRecords::RawImage {
  const RawPath* folder = nullptr;
  const RawUserAttributes* attributes = nullptr;
  const RawExivAttributes* exivAttributes = nullptr;
  const RawState* currentState = nullptr;
};

// Everything the loaded images hold, joined by id.
struct RawCatalog {
  std::vector<RawVolume> volumes;
  std::vector<RawPath> paths;
  std::vector<RawUserAttributes> attributes;
  std::vector<RawExivAttributes> exivAttributes;
  std::vector<RawState> states;
  std::vector<RawImage> images;
};

// Reads the statement's columns in order.
class RawRow {
 public:
  explicit RawRow(sqlite3_stmt* statement) : statement_(statement) {}
  int64_t int64() { return sqlite3_column_int64(statement_, column_++); }
  int32_t int32() { return sqlite3_column_int(statement_, column_++); }
  bool boolean() { return sqlite3_column_int(statement_, column_++) != 0; }
  double real() { return sqlite3_column_double(statement_, column_++); }
  std::wstring text() {
    return dbcore::s2ws(reinterpret_cast<const char*>(sqlite3_column_text(statement_, column_++)));
  }

 private:
  sqlite3_stmt* statement_;
  int column_ = 0;
};

// Every row of the query, each read by `read(row, RawRow)`.
template <class Row, class Read>
std::vector<Row> rawRows(sqlite3* db, const char* sql, Read&& read) {
  std::vector<Row> rows;
  sqlite3_stmt* select = KRBenchSqlite::prepare(db, sql);
  int step = SQLITE_ROW;
  while ((step = sqlite3_step(select)) == SQLITE_ROW) {
    RawRow columns(select);
    read(rows.emplace_back(), columns);
  }
  require(step == SQLITE_DONE, sql);
  sqlite3_finalize(select);
  return rows;
}

void readVolume(RawVolume& row, RawRow& in) {
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.uuid = in.text();
  row.info = in.text();
}

void readPath(RawPath& row, RawRow& in) {
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.volumeId = in.int64();
  row.path = in.text();
}

void readUserAttributes(RawUserAttributes& row, RawRow& in) {
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.imageId = in.int64();
  row.trashed = in.boolean();
  row.marker = in.int32();
  row.color = in.int32();
  row.rating = in.int32();
  row.editDate = in.int64();
  row.opened = in.boolean();
  row.trashedDate = in.int64();
  row.originName = in.text();
  row.lost = in.boolean();
  row.tutorial = in.int32();
}

void readExivAttributes(RawExivAttributes& row, RawRow& in) {
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.imageId = in.int64();
  for (double& real : row.reals) real = in.real();
  for (int32_t& integer : row.integers) integer = in.int32();
  for (std::wstring& text : row.texts) text = in.text();
  row.date = in.int64();
  row.raw = in.boolean();
  row.fullFilled = in.boolean();
  row.version = in.int32();
}

void readState(RawState& row, RawRow& in) {
  row.imageId = in.int64();
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.actionName = in.text();
  row.additionalInfo = in.text();
  row.guid = in.text();
  row.cropDescription = in.text();
  row.imageOrientation = in.int64();
  row.stateHash = in.text();
  row.original = in.boolean();
}

void readImage(RawImage& row, RawRow& in) {
  row.id = in.int64();
  row.markedToDelete = in.boolean();
  row.guid = in.text();
  row.path = in.text();
  row.width = in.int32();
  row.height = in.int32();
  row.fileSize = in.int64();
  row.modificationDate = in.int64();
  row.importDate = in.int64();
  row.importIndex = in.int32();
  row.creationDate = in.int64();
  row.folderPathId = in.int64();
}

// Pointers to the rows by the id `key` picks.
template <class Row, class Key>
std::unordered_map<int64_t, const Row*> byId(const std::vector<Row>& rows, Key&& key) {
  std::unordered_map<int64_t, const Row*> index;
  index.reserve(rows.size());
  for (const Row& row : rows) index.emplace(key(row), &row);
  return index;
}

template <class Row>
const Row* found(const std::unordered_map<int64_t, const Row*>& index, int64_t id) {
  const auto at = index.find(id);
  return at == index.end() ? nullptr : at->second;
}

void joinRaw(RawCatalog& raw) {
  const auto volumes = byId(raw.volumes, [](const RawVolume& row) { return row.id; });
  for (RawPath& path : raw.paths) path.volume = found(volumes, path.volumeId);
  const auto paths = byId(raw.paths, [](const RawPath& row) { return row.id; });
  const auto users = byId(raw.attributes, [](const RawUserAttributes& row) { return row.imageId; });
  const auto exifs = byId(raw.exivAttributes, [](const RawExivAttributes& row) { return row.imageId; });
  const auto states = byId(raw.states, [](const RawState& row) { return row.imageId; });
  for (RawImage& image : raw.images) {
    image.folder = found(paths, image.folderPathId);
    image.attributes = found(users, image.id);
    image.exivAttributes = found(exifs, image.id);
    image.currentState = found(states, image.id);
  }
}

RawCatalog rawLoad(sqlite3* db) {
  RawCatalog raw;
  raw.volumes = rawRows<RawVolume>(db, "SELECT * FROM volumes", readVolume);
  raw.paths = rawRows<RawPath>(db, "SELECT * FROM paths", readPath);
  raw.attributes = rawRows<RawUserAttributes>(db, "SELECT * FROM image_user_attributes", readUserAttributes);
  raw.exivAttributes =
      rawRows<RawExivAttributes>(db, "SELECT * FROM image_exiv_attributes", readExivAttributes);
  raw.states = rawRows<RawState>(db,
                                 "SELECT s.image_id, h.* FROM image_states s JOIN image_history_states h "
                                 "ON h._id_int_64 = s.state_id WHERE s.is_current = 1",
                                 readState);
  raw.images = rawRows<RawImage>(db, "SELECT * FROM images WHERE marked_to_delete_bool = 0", readImage);
  joinRaw(raw);
  return raw;
}

void verifyRaw(const RawCatalog& raw) {
  require(raw.images.size() == kImages, "raw image count");
  for (const RawImage& image : raw.images) {
    require(image.folder && image.folder->volume && image.attributes && image.exivAttributes &&
                image.currentState,
            "raw image links");
  }
}

double rawSeconds(const std::string& path) {
  sqlite3* db = nullptr;
  require(sqlite3_open(path.c_str(), &db) == SQLITE_OK, "raw open");
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    RawCatalog raw;
    best = std::min(best, KRBenchSqlite::timed([&] { raw = rawLoad(db); }));
    verifyRaw(raw);
  }
  sqlite3_close(db);
  return best;
}

// ---- Ours

bool runMainLoopUntil(const std::function<bool()>& condition) {
  return KRRunLoop::mainRunLoop()->runUntil(condition, KRDate::distantFuture());
}

KRDBContextPtr openContext(const std::string& path) {
  const auto catalog = KRDBCatalog::initWithContentsOfFile(path, nullptr);
  require(catalog != nullptr, "catalog opened");
  const auto context = KRDBContext::initWithCatalog(catalog);
  require(context != nullptr, "context built");
  return context;
}

void close(const KRDBContextPtr& context) {
  bool closed = false;
  context->closeAfterAllDataBaseOperationsWithHandler([&closed] { closed = true; });
  runMainLoopUntil([&closed] { return closed; });
}

void requireLinked(const std::shared_ptr<KRDBEntity>& entity) {
  const auto image = std::dynamic_pointer_cast<KRDBImage>(entity);
  require(image != nullptr, "an image");
  require(image->folderDBPath() != nullptr, "folder path");
  require(image->attributesPrimitive() != nullptr, "attributes");
  require(image->exivAttributesPrimitive() != nullptr, "exif attributes");
  require(image->currentStatePrimitive() != nullptr, "current state");
  require(image->necesserryEntitiesToFetchCount() == 0, "nothing left to fetch");
}

void verifyLoaded(const KRDBEntitySet& images) {
  require(images.size() == kImages, "image count");
  for (const auto& entity : images) requireLinked(entity);
}

// A new catalog object and context on the file and all its images, loaded; the seconds it took.
double load(const std::string& path, KRDBContextPtr& context, KRDBEntitiesFilter::EntitySetPtr& images) {
  bool loaded = false;
  return KRBenchSqlite::timed([&] {
    context = openContext(path);
    context->allImagesFilter()->obtainEntities([&](const KRDBEntitiesFilter::EntitySetPtr& entities) {
      images = entities;
      loaded = true;
    });
    runMainLoopUntil([&loaded] { return loaded; });
  });
}

size_t residentBytes() {
  std::ifstream statm("/proc/self/statm");
  size_t pages = 0;
  size_t resident = 0;
  statm >> pages >> resident;
  return resident * static_cast<size_t>(sysconf(_SC_PAGESIZE));
}

// Best seconds of the runs; `bytesPerImage` gets the resident growth of the last run per image.
double oursSeconds(const std::string& path, double& bytesPerImage) {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    // Freed pages of the previous run go back to the system, so that the growth counts this run alone.
    malloc_trim(0);
    const size_t before = residentBytes();
    KRDBContextPtr context;
    KRDBEntitiesFilter::EntitySetPtr images;
    const double seconds = load(path, context, images);
    const size_t after = residentBytes();
    std::printf("run %d: %.3f s, %zu images\n", run + 1, seconds, images->size());
    best = std::min(best, seconds);
    verifyLoaded(*images);
    bytesPerImage = (static_cast<double>(after) - static_cast<double>(before)) / kImages;
    close(context);
  }
  return best;
}

// ---- Fetch by identifier

KRDBEntityIDPtr imageID(int64_t id) { return KRDBEntityID::initWithEntityType(KRDBEntityTypeImage, id); }

// Microseconds per entityWithID of an uncached image once the context's maps are in place.
double entityWithIDMicroseconds(const std::string& path) {
  const auto context = openContext(path);
  requireLinked(context->entityWithID(imageID(1)));
  std::vector<std::shared_ptr<KRDBEntity>> fetched;
  fetched.reserve(kLookups);
  const double seconds = KRBenchSqlite::timed([&] {
    for (int i = 0; i < kLookups; ++i) fetched.push_back(context->entityWithID(imageID(2 + i * 97)));
  });
  for (const auto& entity : fetched) requireLinked(entity);
  close(context);
  return seconds * 1e6 / kLookups;
}

}  // namespace

int main() {
  std::setvbuf(stdout, nullptr, _IOLBF, 0);
  KRRunLoop::designateMainThread();
  KRDBEntityClasses::registerAll();
  const std::string path = scratch.file("context.krcatalog");
  const double building = KRBenchSqlite::timed([&] { KRBenchCatalog::build(path, kImages, kFolders); });
  std::printf("BUILD_S %.1f\n", building);
  const double raw = rawSeconds(path);
  double bytesPerImage = 0;
  const double ours = oursSeconds(path, bytesPerImage);
  std::printf("RAW_LOAD_MS %.1f\nCONTEXT_LOAD_MS %.1f\n", raw * 1000, ours * 1000);
  const double microseconds = entityWithIDMicroseconds(path);
  std::printf("RATIO context_load %.3f\n", raw / ours);
  std::printf("RSS_BYTES_PER_IMAGE %.0f\n", bytesPerImage);
  std::printf("ENTITY_WITH_ID_US %.1f\n", microseconds);
  return 0;
}
