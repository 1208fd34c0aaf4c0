#include "dbrecordio.hpp"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <memory>
#include <string>
#include <vector>

#include "DBConnectionTestSupport.hpp"
#include "DBNonFiniteFloatTestSupport.hpp"
#include "dbrecords.hpp"

using namespace dbcore;

namespace {

class DBRecordIOTest : public DBCatalogTestBase {
 protected:
  DBPath path(const std::wstring& text, int64_t volumeId = 3) {
    DBPath record;
    record.path = text;
    record.volume_id = volumeId;
    return record;
  }

  int64_t pathCount() { return connection->queryInt64("SELECT count(*) FROM paths"); }

  // Writes the record with every float field at NaN, the infinities and a number in turn (an insert,
  // then updates), and checks what each write reads back.
  template <class Record>
  void expectNonFiniteFloatsSurvive(Record record) {
    std::vector<float> values = nonfinite::kValues;
    values.push_back(2.5f);
    values.push_back(values.front());
    for (float value : values) {
      SCOPED_TRACE(std::string(Record::kTableName) + " " + std::to_string(value));
      nonfinite::setEveryFloat(record, value);
      DBRecordIO::write(*connection, record);
      const auto read = DBRecordIO::get<Record>(*connection, record.id());
      ASSERT_TRUE(read);
      EXPECT_TRUE(nonfinite::everyFloatIs(*read, value));
    }
  }

  DBStatementLease pathsInIdOrder() {
    return connection->prepare(DBRecordIO::selectSql<DBPath>() + " ORDER BY _id_int_64");
  }
};

}  // namespace

TEST_F(DBRecordIOTest, SelectSqlListsEveryColumnOfTheTable) {
  EXPECT_EQ(DBRecordIO::selectSql<DBPath>(),
            "SELECT paths._id_int_64,paths.marked_to_delete_bool,paths.volume_id_int_64,paths.path_wide_ch "
            "FROM paths");
}

TEST_F(DBRecordIOTest, WriteInsertsThenUpdates) {
  DBPath record = path(L"Photos");
  DBRecordIO::write(*connection, record);
  ASSERT_TRUE(record.is_saved());
  const int64_t id = record.id();
  record.path = L"Pictures";
  record.set_marked_to_delete(true);
  DBRecordIO::write(*connection, record);
  EXPECT_EQ(record.id(), id);
  EXPECT_EQ(pathCount(), 1);
  const auto read = DBRecordIO::get<DBPath>(*connection, id);
  ASSERT_TRUE(read);
  EXPECT_EQ(read->column_values(), record.column_values());
}

TEST_F(DBRecordIOTest, WriteWithThePresetIdOfAMissingRowInsertsWithThatId) {
  DBPath record = path(L"Photos");
  record.set_id(42);
  DBRecordIO::write(*connection, record);
  EXPECT_EQ(record.id(), 42);
  const auto read = DBRecordIO::get<DBPath>(*connection, 42);
  ASSERT_TRUE(read);
  EXPECT_EQ(read->path, L"Photos");
  EXPECT_EQ(pathCount(), 1);
}

TEST_F(DBRecordIOTest, EveryFieldSurvivesTheFile) {
  DBImage image;
  image.guid = L"5D0C";
  image.path = L"\u00c9t\u00e9 \u65e5\u672c \U0001F600.heic";
  image.width = 6000;
  image.height = -1;
  image.file_size = int64_t{1} << 40;
  image.modification_date = -86400;
  image.import_date = 1700000000;
  image.import_index = 12;
  image.creation_date = 1600000000;
  DBRecordIO::write(*connection, image);
  const auto read = DBRecordIO::get<DBImage>(*connection, image.id());
  ASSERT_TRUE(read);
  EXPECT_EQ(read->column_values(), image.column_values());
}

TEST_F(DBRecordIOTest, FloatFieldsKeepNaNAndInfinities) {
  DBExivImgAttrib exif;
  exif.image_id = saved(DBImage())->id();
  expectNonFiniteFloatsSurvive(exif);
  expectNonFiniteFloatsSurvive(DBFilter());
  expectNonFiniteFloatsSurvive(DBRefFolder());
  expectNonFiniteFloatsSurvive(DBEntityFavoriteAlias());
}

TEST_F(DBRecordIOTest, RemoveIsTrueOnlyForAStoredRow) {
  auto record = saved(path(L"Photos"));
  EXPECT_TRUE(DBRecordIO::remove(*connection, *record));
  EXPECT_EQ(DBRecordIO::get<DBPath>(*connection, record->id()), nullptr);
  EXPECT_FALSE(DBRecordIO::remove(*connection, *record));
}

TEST_F(DBRecordIOTest, ReadOneReadsTheFirstRowAndANewLeaseStartsAgain) {
  const auto first = saved(path(L"a"));
  saved(path(L"b"));
  const auto once = DBRecordIO::readOne<DBPath>(*pathsInIdOrder());
  // The first lease's end rewound the statement; otherwise it would go on to the second row.
  const auto twice = DBRecordIO::readOne<DBPath>(*pathsInIdOrder());
  ASSERT_TRUE(once && twice);
  EXPECT_EQ(once->id(), first->id());
  EXPECT_EQ(twice->id(), first->id());
}

TEST_F(DBRecordIOTest, ReadAllReadsEveryRowAndANewLeaseStartsAgain) {
  const std::vector<long long> expected{saved(path(L"a"))->id(), saved(path(L"b"))->id()};
  EXPECT_EQ(ids(DBRecordIO::readAll<DBPath>(*pathsInIdOrder())), expected);
  EXPECT_EQ(ids(DBRecordIO::readAll<DBPath>(*pathsInIdOrder())), expected);
}

namespace {

// Collects the text of every statement the connection starts, as SQLite expands it before running it.
int recordStatement(unsigned /*type*/, void* context, void* statement, void* /*unused*/) {
  const char* sql = sqlite3_sql(static_cast<sqlite3_stmt*>(statement));
  if (sql) static_cast<std::vector<std::string>*>(context)->emplace_back(sql);
  return 0;
}

class DBRecordIOUpdateTest : public DBCatalogTestBase {
 protected:
  DBUserImgAttrib savedAttributes() {
    DBImage image;
    DBRecordIO::write(*connection, image);
    DBUserImgAttrib attributes;
    attributes.image_id = image.id();
    DBRecordIO::write(*connection, attributes);
    return attributes;
  }

  // The statements that writing the record runs.
  std::vector<std::string> statementsOfWrite(DBUserImgAttrib& attributes) {
    std::vector<std::string> statements;
    sqlite3_trace_v2(connection->handle(), SQLITE_TRACE_STMT, recordStatement, &statements);
    DBRecordIO::write(*connection, attributes);
    sqlite3_trace_v2(connection->handle(), 0, nullptr, nullptr);
    return statements;
  }
};

}  // namespace

TEST_F(DBRecordIOUpdateTest, AnUnchangedRecordOnlyReadsItsRow) {
  DBUserImgAttrib attributes = savedAttributes();
  const std::vector<std::string> statements = statementsOfWrite(attributes);
  ASSERT_EQ(statements.size(), 1u);
  EXPECT_EQ(statements[0].rfind("SELECT ", 0), 0u);
}

TEST_F(DBRecordIOUpdateTest, OnlyTheChangedColumnsAreAssigned) {
  DBUserImgAttrib attributes = savedAttributes();
  attributes.rating = 4;
  attributes.lost = true;
  const std::vector<std::string> statements = statementsOfWrite(attributes);
  ASSERT_EQ(statements.size(), 2u);
  EXPECT_EQ(statements[1], "UPDATE image_user_attributes SET rating=?7,lost_bool=?12 WHERE _id_int_64=?1");
  const auto read = DBRecordIO::get<DBUserImgAttrib>(*connection, attributes.id());
  ASSERT_TRUE(read);
  EXPECT_EQ(read->column_values(), attributes.column_values());
}

TEST_F(DBRecordIOUpdateTest, AChangedLinkToTheOwnerIsWrittenToo) {
  DBUserImgAttrib attributes = savedAttributes();
  DBImage other;
  DBRecordIO::write(*connection, other);
  attributes.image_id = other.id();
  DBRecordIO::write(*connection, attributes);
  EXPECT_EQ(DBRecordIO::get<DBUserImgAttrib>(*connection, attributes.id())->image_id, other.id());
}
