#include "dbsmartfilterattrib.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBSmartFilterAttribTraits {
  using Record = dbcore::DBSmartFilterAttrib;
  static constexpr const char* kTable = "smart_filter_attributes";
  static constexpr uint8_t kType = 13;

  static auto fields(const Record& record) {
    return std::tie(record.smart_filter_id, record.selected_filter_types);
  }

  static void fill(Record& record) {
    record.smart_filter_id = 5000000001;
    record.selected_filter_types = wideText(L"selected_filter_types");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"smart_filter_id_int_64", FieldType::T_INT_64},
        {"selected_filter_types_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBSmartFilterAttrib, DBRecordTest, DBSmartFilterAttribTraits);
