#include "dbselectquery.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "DBClauseTestSupport.hpp"
#include "DBSelectQueryTestSupport.hpp"
#include "dbexception.hpp"
#include "dbimgselectquery.hpp"
#include "dbpathselectquery.hpp"
#include "dbselectplan.hpp"
#include "dbsqlrow.hpp"
#include "support/KRHeapUsage.hpp"

using namespace dbcore;

namespace {

class DBEntitySelectQueryTest : public DBSelectQueryTestBase {
 protected:
  std::shared_ptr<DBImage> imageWithIndex(int32_t index) {
    auto image = std::make_shared<DBImage>();
    image->import_index = index;
    *reactor << image;
    return image;
  }
};

}  // namespace

TEST_F(DBEntitySelectQueryTest, PlainQuerySelectsFromTheTableItRunsFor) {
  const auto a = makePath(L"/a");
  makePath(L"/b");
  auto query = std::make_shared<DBEntitySelectQuery>();
  EXPECT_EQ(query->table(), "");
  query->Where(where<DBPath>("path_wide_ch == '/a'"));
  EXPECT_EQ(selectedIds<DBPath>(query), std::vector<long long>{a->id()});
  // No table, so nothing to evaluate in memory.
  ColumnValues result;
  EXPECT_FALSE(query->Result(result, query->validationRecordForEntity(a)));
}

TEST_F(DBEntitySelectQueryTest, EmptyClauseRestrictsNothing) {
  const auto a = makePath(L"/a");
  const auto b = makePath(L"/b");
  auto query = std::make_shared<DBPathSelectQuery>();
  query->Where(nullptr);
  EXPECT_EQ(selectedIds<DBPath>(query), (std::vector<long long>{a->id(), b->id()}));
  query->Where(std::make_shared<DBClause>());
  EXPECT_EQ(selectedIds<DBPath>(query), (std::vector<long long>{a->id(), b->id()}));
  query->Where(where<DBPath>("lost_bool == true &&"));
  EXPECT_EQ(selectedIds<DBPath>(query), (std::vector<long long>{a->id(), b->id()}));
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBPath>>{a, b}),
            (std::vector<long long>{a->id(), b->id()}));
}

TEST_F(DBEntitySelectQueryTest, UnknownColumnSelectsNothing) {
  const auto a = makePath(L"/a");
  auto query = std::make_shared<DBPathSelectQuery>();
  query->Where(
      clausetest::clause(clausetest::eq(clausetest::source("no_such_column"), clausetest::int32(1))));
  EXPECT_TRUE(selectedIds<DBPath>(query).empty());
  EXPECT_TRUE(satisfyingIds(query, std::vector<std::shared_ptr<DBPath>>{a}).empty());
}

TEST_F(DBEntitySelectQueryTest, ResultFillsTheResultColumn) {
  const auto a = makePath(L"/a");
  auto query = std::make_shared<DBPathSelectQuery>();
  query->Where(where<DBPath>("path_wide_ch == '/a'"));
  ColumnValues result{{"other", TVariant(int32_t{7})}};
  EXPECT_TRUE(query->Result(result, query->validationRecordForEntity(a)));
  EXPECT_EQ(result.at(kSelectResultColumn), TVariant(true));
  EXPECT_EQ(result.at("other"), TVariant(int32_t{7}));
  a->path = L"/b";
  EXPECT_FALSE(query->Result(result, query->validationRecordForEntity(a)));
  EXPECT_EQ(result.at(kSelectResultColumn), TVariant(false));
}

TEST_F(DBEntitySelectQueryTest, RecordsOfOtherTablesAndEmptyRecordsAreNotSatisfying) {
  auto query = std::make_shared<DBPathSelectQuery>();
  ColumnValues result;
  EXPECT_EQ(query->validationRecordForEntity(nullptr), nullptr);
  EXPECT_FALSE(query->Result(result, nullptr));
  EXPECT_FALSE(query->Result(result, query->validationRecordForEntity(makeImage(L"a"))));
  EXPECT_TRUE(query->Result(result, query->validationRecordForEntity(makePath(L"/a"))));
}

TEST_F(DBEntitySelectQueryTest, ValidationRecordsServeEveryQueryOfTheirTable) {
  const auto a = makePath(L"/a");
  DBImgSelectQuery imageQuery;
  const auto record = imageQuery.validationRecordForEntity(a);
  auto query = std::make_shared<DBPathSelectQuery>();
  query->Where(where<DBPath>("path_wide_ch == '/a'"));
  ColumnValues result;
  EXPECT_TRUE(query->Result(result, record));
}

TEST_F(DBEntitySelectQueryTest, SubSelectValuesComeFromTheLastRun) {
  const auto low = imageWithIndex(1);
  const auto high = imageWithIndex(5);
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(where<DBImage>("import_index == max_from_column(import_index)"));
  // Before the first run the sub-select is unknown.
  EXPECT_TRUE(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{low, high}).empty());
  EXPECT_EQ(selectedIds<DBImage>(query), std::vector<long long>{high->id()});
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{low, high}),
            std::vector<long long>{high->id()});
  const auto higher = imageWithIndex(9);
  EXPECT_EQ(selectedIds<DBImage>(query), std::vector<long long>{higher->id()});
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{low, high, higher}),
            std::vector<long long>{higher->id()});
  // A new condition forgets the values read for the old one.
  query->Where(where<DBImage>("import_index == min_from_column(import_index)"));
  EXPECT_TRUE(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{low, high, higher}).empty());
}

TEST_F(DBEntitySelectQueryTest, SubSelectValuesKeepOnlyTheLatestSnapshotOverManyRuns) {
  const auto image = imageWithIndex(11000);
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(where<DBImage>("import_index == max_from_column(import_index)"));
  const auto plan = query->planFor(DBImage::kTableName);
  // What the engine keeps after each run, the sub-select's value changing every time.
  const auto runWithMaximum = [&](int32_t maximum) {
    query->keepAggregates(plan, DBSqlRow(std::vector<TVariant>{TVariant(maximum)}));
  };
  for (int32_t run = 1; run <= 1000; ++run) runWithMaximum(run);
  const std::size_t before = KRHeapUsage::allocatedBytes();
  for (int32_t run = 1001; run <= 11000; ++run) runWithMaximum(run);
  const std::size_t after = KRHeapUsage::allocatedBytes();
  EXPECT_LT(after, before + 16 * 1024) << "grew by " << (after - before) << " bytes over 10,000 runs";
  EXPECT_EQ(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{image}),
            std::vector<long long>{image->id()});
  runWithMaximum(5);
  EXPECT_TRUE(satisfyingIds(query, std::vector<std::shared_ptr<DBImage>>{image}).empty());
}

TEST_F(DBEntitySelectQueryTest, ResultRunsOnManyThreadsWhileTheQueryRuns) {
  std::vector<std::shared_ptr<DBImage>> images;
  for (int i = 0; i < 20; ++i) images.push_back(imageWithIndex(i % 4));
  auto query = std::make_shared<DBImgSelectQuery>();
  query->Where(where<DBImage>("import_index >= 2 && import_index <= max_from_column(import_index)"));
  selectedIds<DBImage>(query);
  std::vector<std::shared_ptr<const DBValidationRecord>> records;
  for (const auto& image : images) records.push_back(query->validationRecordForEntity(image));
  std::atomic<bool> wrong{false};
  std::vector<std::thread> threads;
  for (int t = 0; t < 3; ++t) {
    threads.emplace_back([&] {
      ColumnValues result;
      for (int round = 0; round < 200; ++round) {
        for (size_t i = 0; i < images.size(); ++i) {
          if (query->Result(result, records[i]) != (images[i]->import_index >= 2)) wrong = true;
        }
      }
    });
  }
  for (int run = 0; run < 20; ++run) EXPECT_EQ(selectedIds<DBImage>(query).size(), 10u);
  for (auto& thread : threads) thread.join();
  EXPECT_FALSE(wrong);
}

TEST_F(DBEntitySelectQueryTest, SameShapeGivesTheSameStatementText) {
  auto first = std::make_shared<DBImgSelectQuery>();
  first->Where(where<DBImage>("width > 10 && path_wide_ch == 'a'"));
  auto second = std::make_shared<DBImgSelectQuery>();
  second->Where(where<DBImage>("width > 99999 && path_wide_ch == 'something else'"));
  EXPECT_EQ(first->planFor("images")->tail(), second->planFor("images")->tail());
}

TEST_F(DBEntitySelectQueryTest, QueryOfAnotherTableOrNoQueryThrows) {
  auto query = std::make_shared<DBPathSelectQuery>();
  EXPECT_EQ(query->planFor("images"), nullptr);
  EXPECT_THROW(reactor->GetBySelectQuery<DBImage>(query), DBException);
  EXPECT_THROW(reactor->GetBySelectQuery<DBImage>(nullptr), DBException);
}
