// The catalog's writing operations against raw SQLite writing the same rows in one transaction, in the
// same run: a batch creation of 100,000 images from info dictionaries (name, import date and index, an exif
// reader, a folder), and the write-back of 10,000 changed attribute entities.
#include <sqlite3.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "KRFoundation/KRUUID.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBExifReader.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const KRTemporaryDirectory scratch;

constexpr int kImages = 100000;
constexpr int kFolders = 100;
constexpr int kUpdates = 10000;
constexpr int kRuns = 3;

// An exif reader answering values that vary with the image number.
class BenchExifReader : public KRDBExifReader {
 public:
  explicit BenchExifReader(int i) : i_(i) {}
  KRString url() const override { return KRString("/Photos/IMG_" + std::to_string(i_) + ".CR3"); }
  double width() const override { return 6000 + i_ % 7; }
  double height() const override { return 4000 + i_ % 5; }
  int64_t fileSize() const override { return 20'000'000 + i_; }
  KRDate modificationDate() const override { return KRDate::dateWithTimeIntervalSince1970(1.7e9 + i_); }
  KRDate fileCreationDate() const override { return KRDate::dateWithTimeIntervalSince1970(1.6e9 + i_); }
  float isoSpeed() const override { return static_cast<float>(100 << (i_ % 6)); }
  float fNumber() const override { return 1.4f + static_cast<float>(i_ % 10); }
  float focalLength() const override { return 24.0f + static_cast<float>(i_ % 50); }
  KRString cameraModel() const override { return KRString("X-T" + std::to_string(i_ % 5)); }
  KRDate date() const override { return KRDate::dateWithTimeIntervalSince1970(1.6e9 + i_); }
  bool isRaw() const override { return i_ % 2 == 0; }

 private:
  int i_;
};

std::shared_ptr<KRDBCatalog> emptyCatalog(const std::string& name) {
  const std::string path = scratch.file(name);
  for (const char* suffix : {"", "-wal", "-shm"}) std::filesystem::remove(path + suffix);
  auto catalog = KRDBCatalog::initWithContentsOfFile(path, nullptr);
  if (!catalog) std::abort();
  catalog->initializeAndUpdateIfNeaded();
  return catalog;
}

KRDBEntityArray makeFolders(KRDBCatalog& catalog) {
  std::vector<KRDictionary> infos;
  for (int f = 0; f < kFolders; ++f)
    infos.push_back({{"DBPathInfoPath", "Photos/Folder " + std::to_string(f)}});
  KRDBEntityArray folders;
  catalog.performSynchronously(true, [&] { folders = catalog.createDBPathsWithEntitiesInfo(infos); });
  return folders;
}

std::vector<KRDictionary> imageInfos(const KRDBEntityArray& folders, int count) {
  std::vector<KRDictionary> infos;
  infos.reserve(count);
  for (int i = 0; i < count; ++i) {
    infos.push_back({{"DBImageInfoExifReader", std::make_shared<BenchExifReader>(i)},
                     {"DBImageImportTimeIntervalNumber", 1.75e9 + i},
                     {"DBImageImportIndex", i},
                     {"DBImageInfoImageName", "IMG_" + std::to_string(i) + ".CR3"},
                     {"DBImageInfoFolderDBPath", folders[i % folders.size()]}});
  }
  return infos;
}

// ---- Batch creation

double catalogCreation() {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    const auto catalog = emptyCatalog("create.krcatalog");
    const std::vector<KRDictionary> infos = imageInfos(makeFolders(*catalog), kImages);
    KRDBEntityArray images;
    best = std::min(best, KRBenchSqlite::timed([&] {
                      catalog->performSynchronously(
                          true, [&] { images = catalog->createDBImagesWithEntitiesInfo(infos); });
                    }));
    if (images.size() != kImages) std::abort();
    catalog->forceCloseDB();
  }
  return best;
}

const std::string kImageInsert = KRBenchSqlite::imagesInsert("0, ?1, ?2, ?3, ?4, ?5, ?6, ?7, ?8, ?9, ?10");
const std::string kUserInsert = KRBenchSqlite::userAttributesInsert("0, ?1, 0, 0, 0, 0, 0, 0, 0, '', 0, 0");
const std::string kExifInsert = KRBenchSqlite::exifAttributesInsert(
    "0, ?1, ?2, 0, ?3, ?4, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, '', '', ?5, '', '', ?6, ?7, 0, 0");

void bindImage(sqlite3_stmt* image, int i) {
  const BenchExifReader reader(i);
  KRBenchSqlite::bindText(image, 1, KRUUID::UUIDString().str());
  KRBenchSqlite::bindText(image, 2, "IMG_" + std::to_string(i) + ".CR3");
  sqlite3_bind_int(image, 3, static_cast<int>(reader.width()));
  sqlite3_bind_int(image, 4, static_cast<int>(reader.height()));
  sqlite3_bind_int64(image, 5, reader.fileSize());
  sqlite3_bind_int64(image, 6, static_cast<sqlite3_int64>(reader.modificationDate().timeIntervalSince1970()));
  sqlite3_bind_int64(image, 7, static_cast<sqlite3_int64>(1.75e9 + i));
  sqlite3_bind_int(image, 8, i);
  sqlite3_bind_int64(image, 9, static_cast<sqlite3_int64>(reader.fileCreationDate().timeIntervalSince1970()));
  sqlite3_bind_int64(image, 10, i % kFolders + 1);
}

void bindExif(sqlite3_stmt* exif, sqlite3_int64 imageId, int i) {
  const BenchExifReader reader(i);
  sqlite3_bind_int64(exif, 1, imageId);
  sqlite3_bind_double(exif, 2, reader.isoSpeed());
  sqlite3_bind_double(exif, 3, reader.fNumber());
  sqlite3_bind_double(exif, 4, reader.focalLength());
  KRBenchSqlite::bindText(exif, 5, reader.cameraModel().str());
  sqlite3_bind_int64(exif, 6, static_cast<sqlite3_int64>(reader.date().timeIntervalSince1970()));
  sqlite3_bind_int(exif, 7, reader.isRaw() ? 1 : 0);
}

void rawCreate(sqlite3* db) {
  sqlite3_stmt* image = KRBenchSqlite::prepare(db, kImageInsert.c_str());
  sqlite3_stmt* user = KRBenchSqlite::prepare(db, kUserInsert.c_str());
  sqlite3_stmt* exif = KRBenchSqlite::prepare(db, kExifInsert.c_str());
  sqlite3_exec(db, "BEGIN", nullptr, nullptr, nullptr);
  for (int i = 0; i < kImages; ++i) {
    bindImage(image, i);
    KRBenchSqlite::execute(image);
    const sqlite3_int64 imageId = sqlite3_last_insert_rowid(db);
    sqlite3_bind_int64(user, 1, imageId);
    KRBenchSqlite::execute(user);
    bindExif(exif, imageId, i);
    KRBenchSqlite::execute(exif);
  }
  if (sqlite3_exec(db, "COMMIT", nullptr, nullptr, nullptr) != SQLITE_OK) std::abort();
  for (sqlite3_stmt* statement : {image, user, exif}) sqlite3_finalize(statement);
}

sqlite3* openRaw(const std::string& name) {
  const auto catalog = emptyCatalog(name);
  makeFolders(*catalog);
  catalog->forceCloseDB();
  sqlite3* db = nullptr;
  if (sqlite3_open(scratch.file(name).c_str(), &db) != SQLITE_OK) std::abort();
  sqlite3_exec(db, "PRAGMA journal_mode = WAL; PRAGMA foreign_keys = ON", nullptr, nullptr, nullptr);
  return db;
}

double rawCreation() {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    sqlite3* db = openRaw("raw-create.krcatalog");
    best = std::min(best, KRBenchSqlite::timed([&] { rawCreate(db); }));
    sqlite3_close(db);
  }
  return best;
}

// ---- Write-back of changed attributes

KRDBEntityArray changedAttributes(KRDBCatalog& catalog) {
  const std::vector<KRDictionary> infos = imageInfos(makeFolders(catalog), kUpdates);
  KRDBEntityArray attributes;
  catalog.performSynchronously(true, [&] {
    for (const auto& image : catalog.createDBImagesWithEntitiesInfo(infos)) {
      attributes.push_back(catalog.fetchAttributesForImageSync(std::static_pointer_cast<KRDBImage>(image)));
    }
  });
  for (size_t i = 0; i < attributes.size(); ++i) {
    std::static_pointer_cast<KRDBImageAttributes>(attributes[i])->setRating(static_cast<int32_t>(1 + i % 5));
  }
  return attributes;
}

double catalogUpdates() {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    const auto catalog = emptyCatalog("update.krcatalog");
    const KRDBEntityArray attributes = changedAttributes(*catalog);
    best = std::min(best, KRBenchSqlite::timed([&] {
                      catalog->performSynchronously(true, [&] { catalog->updateEntitiesSync(attributes); });
                    }));
    catalog->forceCloseDB();
  }
  return best;
}

// A hand-written updater sets the changed column of each row.
double rawUpdates() {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) {
    const auto catalog = emptyCatalog("raw-update.krcatalog");
    changedAttributes(*catalog);
    catalog->forceCloseDB();
    sqlite3* db = nullptr;
    sqlite3_open(scratch.file("raw-update.krcatalog").c_str(), &db);
    sqlite3_stmt* update =
        KRBenchSqlite::prepare(db, "UPDATE image_user_attributes SET rating = ?1 WHERE _id_int_64 = ?2");
    best = std::min(best, KRBenchSqlite::timed([&] {
                      sqlite3_exec(db, "BEGIN", nullptr, nullptr, nullptr);
                      for (int i = 0; i < kUpdates; ++i) {
                        sqlite3_bind_int(update, 1, 1 + i % 5);
                        sqlite3_bind_int64(update, 2, i + 1);
                        KRBenchSqlite::execute(update);
                      }
                      if (sqlite3_exec(db, "COMMIT", nullptr, nullptr, nullptr) != SQLITE_OK) std::abort();
                    }));
    sqlite3_finalize(update);
    sqlite3_close(db);
  }
  return best;
}

}  // namespace

int main() {
  KRRunLoop::designateMainThread();
  const double oursCreate = catalogCreation();
  const double rawCreate = rawCreation();
  std::printf("CATALOG_CREATE_IMAGES_PER_S %.0f\nRAW_CREATE_IMAGES_PER_S %.0f\n", kImages / oursCreate,
              kImages / rawCreate);
  std::printf("RATIO catalog_batch_create %.3f\n", rawCreate / oursCreate);
  const double oursUpdate = catalogUpdates();
  const double rawUpdate = rawUpdates();
  std::printf("CATALOG_UPDATES_PER_S %.0f\nRAW_UPDATES_PER_S %.0f\n", kUpdates / oursUpdate,
              kUpdates / rawUpdate);
  std::printf("RATIO catalog_update_entities %.3f\n", rawUpdate / oursUpdate);
  return 0;
}
