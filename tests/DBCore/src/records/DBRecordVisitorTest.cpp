#include "dbrecordvisitor.hpp"

#include <gtest/gtest.h>

#include <string>
#include <tuple>
#include <type_traits>
#include <vector>

#include "dbexception.hpp"
#include "dbrecordcolumns.hpp"
#include "dbrecords.hpp"

using namespace dbcore;

namespace {

// A record type the engine does not know.
class DBUnknownRecord : public DBRecord<DBUnknownRecord, 200> {
 public:
  static constexpr const char* kTableName = "unknown_records";
  static const std::vector<DBColumn<DBUnknownRecord>>& columns() {
    static const std::vector<DBColumn<DBUnknownRecord>> none;
    return none;
  }
};

// Visits a record of the given type through its base and checks that the function saw that type.
template <class Record>
void expectVisitedAs() {
  Record record;
  DBEntity& base = record;
  int calls = 0;
  DBRecordVisitor::visit(base, [&](auto& concrete) {
    ++calls;
    EXPECT_TRUE((std::is_same_v<std::remove_cvref_t<decltype(concrete)>, Record>)) << Record::kTableName;
    concrete.set_id(31);
  });
  EXPECT_EQ(calls, 1) << Record::kTableName;
  EXPECT_EQ(record.id(), 31) << Record::kTableName;
}

template <class... Records>
void expectEachVisitedAs(std::tuple<Records...>*) {
  (expectVisitedAs<Records>(), ...);
}

}  // namespace

TEST(DBRecordVisitorTest, VisitsEveryRecordTypeAsItsConcreteType) {
  expectEachVisitedAs(static_cast<DBRecordTypes*>(nullptr));
}

TEST(DBRecordVisitorTest, UnknownRecordTypeThrows) {
  DBUnknownRecord record;
  bool called = false;
  try {
    DBRecordVisitor::visit(record, [&](auto&) { called = true; });
    FAIL() << "no exception";
  } catch (const DBException& exception) {
    EXPECT_STREQ(exception.what(), "A record of unknown type 200");
  }
  EXPECT_FALSE(called);
}
