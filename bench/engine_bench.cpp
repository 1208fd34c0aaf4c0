// The storage engine against raw SQLite doing the same work in the same process: a batch import of
// 100,000 images with their attribute records and folders, and opening a catalog of 1,000,000 images.
#include <benchmark/benchmark.h>
#include <sqlite3.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "KRBenchSqlite.hpp"
#include "dbreactor.hpp"
#include "dbstrings.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const KRTemporaryDirectory scratch;

constexpr int kImages = 100000;
constexpr int kFolders = 1000;
constexpr int kLargeCatalogImages = 1000000;

// An initialized, empty catalog at a fresh path.
std::string emptyCatalog(const std::string& name) {
  const std::string path = scratch.file(name);
  std::filesystem::remove(path);
  std::filesystem::remove(path + "-wal");
  std::filesystem::remove(path + "-shm");
  dbcore::DBReactor reactor(5);
  reactor.Open(dbcore::s2ws(path), L"");
  reactor.Initialize();
  return path;
}

std::wstring imageName(int i) { return L"IMG_" + std::to_wstring(i) + L".CR3"; }

void importThroughEngine(const std::string& path) {
  using namespace dbcore;
  DBReactor reactor(5);
  reactor.Open(s2ws(path), L"");
  std::vector<std::shared_ptr<DBPath>> folders;
  for (int f = 0; f < kFolders; ++f) {
    folders.push_back(std::make_shared<DBPath>());
    folders.back()->path = L"/Photos/Folder " + std::to_wstring(f);
  }
  reactor << folders;
  std::vector<std::shared_ptr<DBImage>> images;
  for (int i = 0; i < kImages; ++i) {
    images.push_back(std::make_shared<DBImage>());
    images.back()->path = imageName(i);
    images.back()->import_index = i;
  }
  reactor << images;
  std::vector<std::shared_ptr<DBUserImgAttrib>> attributes;
  std::vector<std::shared_ptr<DBExivImgAttrib>> exif;
  std::vector<std::pair<std::shared_ptr<DBPath>, std::shared_ptr<DBImage>>> pairs;
  for (int i = 0; i < kImages; ++i) {
    attributes.push_back(std::make_shared<DBUserImgAttrib>());
    attributes.back()->image_id = images[i]->id();
    attributes.back()->rating = i % 6;
    exif.push_back(std::make_shared<DBExivImgAttrib>());
    exif.back()->image_id = images[i]->id();
    exif.back()->camera_model = L"X-T" + std::to_wstring(i % 5);
    pairs.emplace_back(folders[i % kFolders], images[i]);
  }
  reactor << attributes << exif << pairs;
}

// Every column of the three record tables, as a hand-written importer would insert them: the values the
// benchmark sets, and zeros or empty texts for the rest.
const std::string kImageInsert = KRBenchSqlite::imagesInsert("0, '', ?1, 0, 0, 0, 0, 0, ?2, 0, ?3");
const std::string kUserInsert = KRBenchSqlite::userAttributesInsert("0, ?1, 0, 0, 0, ?2, 0, 0, 0, '', 0, 0");
const std::string kExifInsert = KRBenchSqlite::exifAttributesInsert(
    "0, ?1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, '', '', ?2, '', '', 0, 0, 0, 0");

// The same rows written with hand-made prepared statements in one transaction.
void importThroughRawSqlite(const std::string& path, int imageCount) {
  sqlite3* db = nullptr;
  sqlite3_open(path.c_str(), &db);
  sqlite3_exec(db, "PRAGMA journal_mode = WAL; BEGIN", nullptr, nullptr, nullptr);
  sqlite3_stmt* folder = KRBenchSqlite::prepare(
      db, "INSERT INTO paths(marked_to_delete_bool, volume_id_int_64, path_wide_ch) VALUES (0, 0, ?)");
  for (int f = 0; f < kFolders; ++f) {
    KRBenchSqlite::bindText(folder, 1, "/Photos/Folder " + std::to_string(f));
    KRBenchSqlite::execute(folder);
  }
  sqlite3_stmt* image = KRBenchSqlite::prepare(db, kImageInsert.c_str());
  sqlite3_stmt* user = KRBenchSqlite::prepare(db, kUserInsert.c_str());
  sqlite3_stmt* exif = KRBenchSqlite::prepare(db, kExifInsert.c_str());
  for (int i = 0; i < imageCount; ++i) {
    KRBenchSqlite::bindText(image, 1, "IMG_" + std::to_string(i) + ".CR3");
    sqlite3_bind_int(image, 2, i);
    sqlite3_bind_int64(image, 3, i % kFolders + 1);
    KRBenchSqlite::execute(image);
    KRBenchSqlite::insertAttributes(user, exif, sqlite3_last_insert_rowid(db), i);
  }
  for (sqlite3_stmt* statement : {folder, image, user, exif}) sqlite3_finalize(statement);
  sqlite3_exec(db, "COMMIT", nullptr, nullptr, nullptr);
  sqlite3_close(db);
}

double engineSeconds = 0;
double rawSeconds = 0;

void BM_EngineBatchImport(benchmark::State& state) {
  for (auto _ : state) {
    state.PauseTiming();
    const std::string path = emptyCatalog("engine.krcatalog");
    state.ResumeTiming();
    const double seconds = KRBenchSqlite::timed([&] { importThroughEngine(path); });
    if (engineSeconds == 0 || seconds < engineSeconds) engineSeconds = seconds;
  }
  state.counters["images_per_s"] = kImages / engineSeconds;
}
BENCHMARK(BM_EngineBatchImport)->Iterations(3)->Unit(benchmark::kMillisecond);

void BM_RawBatchImport(benchmark::State& state) {
  for (auto _ : state) {
    state.PauseTiming();
    const std::string path = emptyCatalog("raw.krcatalog");
    state.ResumeTiming();
    const double seconds = KRBenchSqlite::timed([&] { importThroughRawSqlite(path, kImages); });
    if (rawSeconds == 0 || seconds < rawSeconds) rawSeconds = seconds;
  }
  state.counters["images_per_s"] = kImages / rawSeconds;
}
BENCHMARK(BM_RawBatchImport)->Iterations(3)->Unit(benchmark::kMillisecond);

// Opening must not scan tables: its time does not grow with the catalog.
double openMilliseconds() {
  const std::string path = emptyCatalog("large.krcatalog");
  importThroughRawSqlite(path, kLargeCatalogImages);
  double best = 1e9;
  for (int run = 0; run < 5; ++run) {
    dbcore::DBReactor reactor(5);
    const double seconds = KRBenchSqlite::timed([&] {
      if (reactor.Open(dbcore::s2ws(path), L"") != dbcore::kDBOpenCurrent) std::abort();
    });
    best = std::min(best, seconds * 1000);
  }
  return best;
}

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  if (engineSeconds > 0 && rawSeconds > 0) {
    std::printf("ENGINE_IMAGES_PER_S %.0f\nRAW_IMAGES_PER_S %.0f\n", kImages / engineSeconds,
                kImages / rawSeconds);
    std::printf("RATIO engine_batch_import %.3f\n", rawSeconds / engineSeconds);
  }
  std::printf("OPEN_MS %.2f\n", openMilliseconds());
  return 0;
}
