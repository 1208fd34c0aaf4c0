// The image fetch request over a catalog of 1,000,000 images: the catalog's fetch of the images whose
// user attributes and exif attributes match (joined conditions, entities built) against hand-written SQL
// reading the same rows into plain structs in the same process, and the request's in-memory test over
// every image of the catalog from two threads.
#include <sqlite3.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <map>
#include <string>
#include <thread>
#include <vector>

#include "KRBenchRecords.hpp"
#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRRunLoop.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "Model/KRDBFilteredImageAttributesFetchRequest/KRDBFilteredImageAttributesFetchRequest.hpp"
#include "Model/KRDBFilteredImageExivAttributesFetchRequest/KRDBFilteredImageExivAttributesFetchRequest.hpp"
#include "Model/KRDBFilteredImagesFetchRequest/KRDBFilteredImagesFetchRequest.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbpath.hpp"
#include "dbreactor.hpp"
#include "dbstrings.hpp"
#include "dbuserimgattrib.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const KRTemporaryDirectory scratch;

constexpr int kImages = 1000000;
constexpr int kFolders = 1000;
constexpr int kRuns = 3;
constexpr int kThreads = 2;

// Image i has rating i % 6 and camera model "X-T" + i % 5: half of the ratings are at least 3 and one
// camera in five is the X-T0, so the request selects one image in ten.
const char* const kUserCondition = "rating >= 3";
const char* const kExifCondition = "camera_model_wide_ch == 'X-T0'";

// ---- The catalog

using KRBenchRecords::records;

void fill(dbcore::DBReactor& reactor) {
  using namespace dbcore;
  const auto folders = records<DBPath>(
      kFolders, [](DBPath& folder, int f) { folder.path = L"/Photos/Folder " + std::to_wstring(f); });
  reactor << folders;
  const auto images = records<DBImage>(kImages, [](DBImage& image, int i) {
    image.path = L"IMG_" + std::to_wstring(i) + L".CR3";
    image.file_size = 20'000'000 + i;
    image.import_index = i;
  });
  reactor << images;
  reactor << records<DBUserImgAttrib>(kImages, [&images](DBUserImgAttrib& attributes, int i) {
    attributes.image_id = images[i]->id();
    attributes.rating = i % 6;
  });
  reactor << records<DBExivImgAttrib>(kImages, [&images](DBExivImgAttrib& exif, int i) {
    exif.image_id = images[i]->id();
    exif.camera_model = L"X-T" + std::to_wstring(i % 5);
  });
  std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>> pairs;
  pairs.reserve(kImages);
  for (int i = 0; i < kImages; ++i) pairs.emplace_back(folders[i % kFolders], images[i]);
  reactor << pairs;
}

std::shared_ptr<KRDBCatalog> largeCatalog(const std::string& path) {
  for (const char* suffix : {"", "-wal", "-shm"}) std::filesystem::remove(path + suffix);
  auto catalog = KRDBCatalog::initWithContentsOfFile(path, nullptr);
  if (!catalog) std::abort();
  catalog->initializeAndUpdateIfNeaded();
  catalog->performSynchronously(true, [&] { fill(*catalog->dbReactor()); });
  return catalog;
}

KRDBFilteredImagesFetchRequestPtr joinedRequest() {
  auto request = KRDBFilteredImagesFetchRequest::init();
  request->setFilterConditions(
      {{KRUserAttributesConditionType, kUserCondition}, {KRExivAttributesConditionType, kExifCondition}});
  return request;
}

KRDBEntitySet fetch(KRDBCatalog& catalog, const KRDBCatalog::FetchRequestPtr& request) {
  KRDBEntitySet entities;
  catalog.performSynchronously(true, [&] { entities = catalog.fetchEntitiesUsingFetchRequestSync(request); });
  return entities;
}

// ---- Fetch

using KRBenchRecords::RawImage;

const char* const kRawSelect =
    "SELECT i._id_int_64, i.marked_to_delete_bool, i.guid_wide_ch, i.path_wide_ch, i.width, i.height, "
    "i.file_size_int_64, i.modification_date_int_64, i.import_date_int_64, i.import_index, "
    "i.creation_date_int_64, i.folder_path_id FROM images i "
    "JOIN image_user_attributes u ON u.image_id_int_64 = i._id_int_64 "
    "JOIN image_exiv_attributes e ON e.image_id_int_64 = i._id_int_64 "
    "WHERE i.marked_to_delete_bool = 0 AND u.rating >= 3 AND e.camera_model_wide_ch = 'X-T0'";

std::wstring wideColumn(sqlite3_stmt* statement, int column) {
  return dbcore::s2ws(reinterpret_cast<const char*>(sqlite3_column_text(statement, column)));
}

std::vector<RawImage> rawFetch(sqlite3* db) {
  std::vector<RawImage> rows;
  sqlite3_stmt* select = KRBenchSqlite::prepare(db, kRawSelect);
  int step = SQLITE_ROW;
  while ((step = sqlite3_step(select)) == SQLITE_ROW) {
    RawImage& row = rows.emplace_back();
    row.id = sqlite3_column_int64(select, 0);
    row.markedToDelete = sqlite3_column_int(select, 1) != 0;
    row.guid = wideColumn(select, 2);
    row.path = wideColumn(select, 3);
    row.width = sqlite3_column_int(select, 4);
    row.height = sqlite3_column_int(select, 5);
    row.fileSize = sqlite3_column_int64(select, 6);
    row.modificationDate = sqlite3_column_int64(select, 7);
    row.importDate = sqlite3_column_int64(select, 8);
    row.importIndex = sqlite3_column_int(select, 9);
    row.creationDate = sqlite3_column_int64(select, 10);
    row.folderPathId = sqlite3_column_int64(select, 11);
  }
  if (step != SQLITE_DONE) std::abort();
  sqlite3_finalize(select);
  return rows;
}

template <class Work>
double bestOf(Work&& work) {
  double best = 1e9;
  for (int run = 0; run < kRuns; ++run) best = std::min(best, KRBenchSqlite::timed(work));
  return best;
}

double catalogFetch(KRDBCatalog& catalog, size_t& selected) {
  return bestOf([&] { selected = fetch(catalog, joinedRequest()).size(); });
}

double rawFetch(const std::string& path, size_t& selected) {
  sqlite3* db = nullptr;
  if (sqlite3_open(path.c_str(), &db) != SQLITE_OK) std::abort();
  const double seconds = bestOf([&] { selected = rawFetch(db).size(); });
  sqlite3_close(db);
  return seconds;
}

// ---- In-memory test

// Every image of the catalog with its user and exif attributes attached.
std::vector<std::shared_ptr<KRDBEntity>> imagesWithAttributes(KRDBCatalog& catalog) {
  std::map<int64_t, std::shared_ptr<KRDBImageAttributes>> users;
  for (const auto& entity : fetch(catalog, KRDBFilteredImageAttributesFetchRequest::init())) {
    const auto record = std::static_pointer_cast<dbcore::DBUserImgAttrib>(entity->dbentity());
    users[record->image_id] = std::static_pointer_cast<KRDBImageAttributes>(entity);
  }
  std::map<int64_t, std::shared_ptr<KRDBImageExivAttributes>> exifs;
  for (const auto& entity : fetch(catalog, KRDBFilteredImageExivAttributesFetchRequest::init())) {
    const auto record = std::static_pointer_cast<dbcore::DBExivImgAttrib>(entity->dbentity());
    exifs[record->image_id] = std::static_pointer_cast<KRDBImageExivAttributes>(entity);
  }
  std::vector<std::shared_ptr<KRDBEntity>> images;
  for (const auto& entity : fetch(catalog, KRDBFilteredImagesFetchRequest::init())) {
    const auto image = std::static_pointer_cast<KRDBImage>(entity);
    image->setAttributesPrimitive(users.at(image->entityID()->dbid()));
    image->setExivAttributesPrimitive(exifs.at(image->entityID()->dbid()));
    images.push_back(image);
  }
  return images;
}

// Nanoseconds per image of the test over all images, split in equal parts across the threads; the
// number of images that pass is stored in `passed`.
double membershipNanoseconds(const std::vector<std::shared_ptr<KRDBEntity>>& images, size_t& passed) {
  const auto request = joinedRequest();
  std::vector<size_t> counts(kThreads);
  const double seconds = bestOf([&] {
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
      threads.emplace_back([&, t] {
        size_t count = 0;
        for (size_t i = t; i < images.size(); i += kThreads) {
          if (request->isEntitySatisfyingFilterConditions(images[i])) ++count;
        }
        counts[t] = count;
      });
    }
    for (auto& thread : threads) thread.join();
  });
  passed = 0;
  for (size_t count : counts) passed += count;
  return seconds * 1e9 / static_cast<double>(images.size());
}

}  // namespace

int main() {
  KRRunLoop::designateMainThread();
  const std::string path = scratch.file("request.krcatalog");
  const auto catalog = largeCatalog(path);
  size_t oursSelected = 0;
  size_t rawSelected = 0;
  const double ours = catalogFetch(*catalog, oursSelected);
  const double raw = rawFetch(path, rawSelected);
  if (oursSelected != rawSelected || oursSelected != kImages / 10) std::abort();
  std::printf("CATALOG_FETCH_MS %.1f\nRAW_FETCH_MS %.1f\n", ours * 1000, raw * 1000);
  std::printf("RATIO catalog_fetch_request %.3f\n", raw / ours);

  const auto images = imagesWithAttributes(*catalog);
  size_t passed = 0;
  const double nanoseconds = membershipNanoseconds(images, passed);
  if (images.size() != kImages || passed != kImages / 10) std::abort();
  std::printf("MEMBERSHIP_NS_PER_IMAGE %.1f\n", nanoseconds);
  catalog->forceCloseDB();
  return 0;
}
