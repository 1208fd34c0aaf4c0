#include "dbsmartfilter.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBSmartFilterTraits {
  using Record = dbcore::DBSmartFilter;
  static constexpr const char* kTable = "smart_filters";
  static constexpr uint8_t kType = 12;

  static auto fields(const Record& record) {
    return std::tie(record.identifier, record.filter_conditions, record.applying_conditions, record.name);
  }

  static void fill(Record& record) {
    record.identifier = wideText(L"identifier");
    record.filter_conditions = wideText(L"filter_conditions");
    record.applying_conditions = wideText(L"applying_conditions");
    record.name = wideText(L"name");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"identifier_wide_ch", FieldType::T_WIDE_TEXT},
        {"filter_conditions_wide_ch", FieldType::T_WIDE_TEXT},
        {"applying_conditions_wide_ch", FieldType::T_WIDE_TEXT},
        {"name_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBSmartFilter, DBRecordTest, DBSmartFilterTraits);
