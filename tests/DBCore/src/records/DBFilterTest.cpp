#include "dbfilter.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBFilterTraits {
  using Record = dbcore::DBFilter;
  static constexpr const char* kTable = "filters";
  static constexpr uint8_t kType = 2;

  static auto fields(const Record& record) { return std::tie(record.name, record.order); }

  static void fill(Record& record) {
    record.name = wideText(L"name");
    record.order = 2.25f;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"name_wide_ch", FieldType::T_WIDE_TEXT},
        {"order_float", FieldType::T_FLOAT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBFilter, DBRecordTest, DBFilterTraits);
