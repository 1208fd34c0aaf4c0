// Select queries with conditions on a catalog of 1,000,000 images with user and exif attributes:
// GetBySelectQuery against the same join written by hand over raw SQLite, both building DBImage records,
// and the in-memory evaluation of the same condition on 1,000,000 validation records on 2 threads (wall
// time per record, and the slowest thread's CPU time per record, which is the wall time on idle cores).
#include <benchmark/benchmark.h>
#include <sqlite3.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <memory>
#include <string>
#include <vector>

#include "KRBenchSqlite.hpp"
#include "KRFoundation/KRConcurrentQueue.hpp"
#include "dbclause.hpp"
#include "dbexivimgattribselectquery.hpp"
#include "dbimgselectquery.hpp"
#include "dbreactor.hpp"
#include "dbstrings.hpp"
#include "dbuserimgattribselectquery.hpp"
#include "support/KRTemporaryDirectory.hpp"

namespace {

const KRTemporaryDirectory scratch;

constexpr int kImages = 1000000;
constexpr const char* kModel = "X-T2";
constexpr int kEvaluationThreads = 2;
constexpr int kEvaluationRounds = 5;

std::string catalogPath() { return scratch.file("condition.krcatalog"); }

// The catalog: made by the engine, filled with raw inserts in one transaction. Image i has rating i % 6
// and camera model "X-T" + i % 5, so that one image in ten passes the condition.
void buildCatalog() {
  dbcore::DBReactor reactor(5);
  if (reactor.Open(dbcore::s2ws(catalogPath()), L"") != dbcore::kDBOpenNeedsUpdate) std::abort();
  reactor.Initialize();
  reactor.Close();
  sqlite3* db = nullptr;
  sqlite3_open(catalogPath().c_str(), &db);
  sqlite3_exec(db, "PRAGMA journal_mode = WAL; PRAGMA synchronous = OFF; BEGIN", nullptr, nullptr, nullptr);
  sqlite3_stmt* image = KRBenchSqlite::prepare(
      db, "INSERT INTO images(guid_wide_ch, path_wide_ch, import_index) VALUES (?, ?, ?)");
  sqlite3_stmt* user =
      KRBenchSqlite::prepare(db, "INSERT INTO image_user_attributes(image_id_int_64, rating) VALUES (?, ?)");
  sqlite3_stmt* exif = KRBenchSqlite::prepare(
      db, "INSERT INTO image_exiv_attributes(image_id_int_64, camera_model_wide_ch) VALUES (?, ?)");
  for (int i = 0; i < kImages; ++i) {
    KRBenchSqlite::bindText(image, 1, "guid-" + std::to_string(i));
    KRBenchSqlite::bindText(image, 2, "IMG_" + std::to_string(i) + ".CR3");
    sqlite3_bind_int(image, 3, i);
    KRBenchSqlite::execute(image);
    KRBenchSqlite::insertAttributes(user, exif, sqlite3_last_insert_rowid(db), i);
  }
  for (sqlite3_stmt* statement : {image, user, exif}) sqlite3_finalize(statement);
  sqlite3_exec(db, "COMMIT; PRAGMA wal_checkpoint(TRUNCATE)", nullptr, nullptr, nullptr);
  sqlite3_close(db);
}

std::shared_ptr<dbcore::DBImgSelectQuery> conditionQuery() {
  using namespace dbcore;
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Join<DBUserImgAttrib>(
      std::make_shared<DBClause>(clauseWithCondition<DBUserImgAttrib>("rating >= 3", true)));
  query->Join<DBExivImgAttrib>(std::make_shared<DBClause>(
      clauseWithCondition<DBExivImgAttrib>(std::string("camera_model_wide_ch == '") + kModel + "'", true)));
  return query;
}

// The same join by hand, every image column read straight into a new record.
constexpr const char* kRawSql =
    "SELECT images._id_int_64, images.marked_to_delete_bool, images.guid_wide_ch, images.path_wide_ch, "
    "images.width, images.height, images.file_size_int_64, images.modification_date_int_64, "
    "images.import_date_int_64, images.import_index, images.creation_date_int_64 FROM images "
    "JOIN image_user_attributes u ON u.image_id_int_64 = images._id_int_64 "
    "JOIN image_exiv_attributes e ON e.image_id_int_64 = images._id_int_64 "
    "WHERE u.rating >= ? AND e.camera_model_wide_ch = ? ORDER BY images._id_int_64";

std::wstring wideColumn(sqlite3_stmt* statement, int column) {
  const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement, column));
  return dbcore::s2ws(std::string(text, static_cast<size_t>(sqlite3_column_bytes(statement, column))));
}

std::shared_ptr<dbcore::DBImage> rawImage(sqlite3_stmt* statement) {
  auto image = std::make_shared<dbcore::DBImage>();
  image->set_id(sqlite3_column_int64(statement, 0));
  image->set_marked_to_delete(sqlite3_column_int64(statement, 1) != 0);
  image->guid = wideColumn(statement, 2);
  image->path = wideColumn(statement, 3);
  image->width = sqlite3_column_int(statement, 4);
  image->height = sqlite3_column_int(statement, 5);
  image->file_size = sqlite3_column_int64(statement, 6);
  image->modification_date = sqlite3_column_int64(statement, 7);
  image->import_date = sqlite3_column_int64(statement, 8);
  image->import_index = sqlite3_column_int(statement, 9);
  image->creation_date = sqlite3_column_int64(statement, 10);
  return image;
}

std::vector<std::shared_ptr<dbcore::DBImage>> rawQuery(sqlite3_stmt* statement) {
  sqlite3_bind_int(statement, 1, 3);
  KRBenchSqlite::bindText(statement, 2, kModel);
  std::vector<std::shared_ptr<dbcore::DBImage>> images;
  while (sqlite3_step(statement) == SQLITE_ROW) images.push_back(rawImage(statement));
  sqlite3_reset(statement);
  return images;
}

double engineSeconds = 0;
double rawSeconds = 0;
size_t selectedCount = 0;

void keepBest(double& best, double seconds) { best = best == 0 ? seconds : std::min(best, seconds); }

// The engine's query and the raw one, alternately, each keeping its best time, so that a change in the
// machine's load affects both alike.
void BM_ConditionQueryEngineVsRaw(benchmark::State& state) {
  dbcore::DBReactor reactor(5);
  reactor.Open(dbcore::s2ws(catalogPath()), L"");
  const auto query = conditionQuery();
  sqlite3* db = nullptr;
  sqlite3_open(catalogPath().c_str(), &db);
  sqlite3_stmt* statement = KRBenchSqlite::prepare(db, kRawSql);
  for (auto _ : state) {
    size_t rawCount = 0;
    keepBest(engineSeconds, KRBenchSqlite::timed([&] {
               selectedCount = reactor.GetBySelectQuery<dbcore::DBImage>(query).size();
             }));
    keepBest(rawSeconds, KRBenchSqlite::timed([&] { rawCount = rawQuery(statement).size(); }));
    if (rawCount != selectedCount) std::abort();
  }
  state.counters["images"] = static_cast<double>(selectedCount);
  state.counters["engine_ms"] = engineSeconds * 1000;
  state.counters["raw_ms"] = rawSeconds * 1000;
  sqlite3_finalize(statement);
  sqlite3_close(db);
}
BENCHMARK(BM_ConditionQueryEngineVsRaw)->Iterations(7)->Unit(benchmark::kMillisecond);

// Every record of a type, through a select query without condition.
template <class T, class Query>
std::vector<std::shared_ptr<T>> allRecords(dbcore::DBReactor& reactor) {
  return reactor.GetBySelectQuery<T>(std::make_shared<Query>());
}

// Records by image id (ids run from 1).
template <class T>
std::vector<std::shared_ptr<dbcore::DBEntity>> byImageId(const std::vector<std::shared_ptr<T>>& records) {
  std::vector<std::shared_ptr<dbcore::DBEntity>> indexed(kImages + 1);
  for (const auto& record : records) indexed[static_cast<size_t>(record->image_id)] = record;
  return indexed;
}

using Records = std::vector<std::shared_ptr<const dbcore::DBValidationRecord>>;

// Seconds of CPU time the calling thread has used.
double threadSeconds() {
  timespec now{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
  return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

// How many of records[begin, end) satisfy the query, asked the way the object layer asks.
size_t satisfying(const dbcore::DBEntitySelectQuery& query, const Records& records, size_t begin,
                  size_t end) {
  dbcore::ColumnValues result;
  size_t count = 0;
  for (size_t i = begin; i < end; ++i) count += query.Result(result, records[i]);
  return count;
}

// The wall time of a pass, and the CPU time of its slowest thread (what the wall time is when nothing
// else competes for the cores).
struct Timing {
  double wall;
  double cpu;
};

// One pass over the records in seconds, each thread taking one contiguous part.
Timing evaluationPass(const dbcore::DBEntitySelectQuery& query, const Records& records) {
  std::atomic<size_t> passed{0};
  std::vector<double> cpuSeconds(kEvaluationThreads);
  const double wallSeconds = KRBenchSqlite::timed([&] {
    KRConcurrentQueue::globalQueue().apply(kEvaluationThreads, [&](size_t part) {
      const double start = threadSeconds();
      passed += satisfying(query, records, records.size() * part / kEvaluationThreads,
                           records.size() * (part + 1) / kEvaluationThreads);
      cpuSeconds[part] = threadSeconds() - start;
    });
  });
  if (passed != selectedCount) std::abort();
  return {wallSeconds, *std::max_element(cpuSeconds.begin(), cpuSeconds.end())};
}

// Nanoseconds per record for Result over every image's validation record on 2 threads, best of 5: wall
// time and slowest-thread CPU time.
Timing evaluationNanoseconds() {
  using namespace dbcore;
  DBReactor reactor(5);
  reactor.Open(s2ws(catalogPath()), L"");
  const auto images = allRecords<DBImage, DBImgSelectQuery>(reactor);
  const auto user = byImageId(allRecords<DBUserImgAttrib, DBUserImgAttribSelectQuery>(reactor));
  const auto exif = byImageId(allRecords<DBExivImgAttrib, DBExivImgAttribSelectQuery>(reactor));
  const auto query = conditionQuery();
  query->setRelatedRecordResolver([&](const DBEntity& record, const std::string& table) {
    return (table == DBUserImgAttrib::kTableName ? user : exif)[static_cast<size_t>(record.id())];
  });
  Records records;
  records.reserve(images.size());
  for (const auto& image : images) records.push_back(query->validationRecordForEntity(image));
  Timing best{0, 0};
  for (int round = 0; round < kEvaluationRounds; ++round) {
    const Timing pass = evaluationPass(*query, records);
    keepBest(best.wall, pass.wall);
    keepBest(best.cpu, pass.cpu);
  }
  const double perRecord = 1e9 / static_cast<double>(records.size());
  return {best.wall * perRecord, best.cpu * perRecord};
}

}  // namespace

int main(int argc, char** argv) {
  buildCatalog();
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  if (engineSeconds > 0 && rawSeconds > 0) {
    std::printf("ENGINE_CONDITION_QUERY_MS %.1f\nRAW_CONDITION_QUERY_MS %.1f\nSELECTED_IMAGES %zu\n",
                engineSeconds * 1000, rawSeconds * 1000, selectedCount);
    std::printf("RATIO engine_condition_query %.3f\n", rawSeconds / engineSeconds);
    const Timing evaluation = evaluationNanoseconds();
    std::printf("EVAL_NS_PER_RECORD %.1f\nEVAL_CPU_NS_PER_RECORD %.1f\n", evaluation.wall, evaluation.cpu);
  }
  return 0;
}
