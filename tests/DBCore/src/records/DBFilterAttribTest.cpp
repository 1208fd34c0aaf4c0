#include "dbfilterattrib.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBFilterAttribTraits {
  using Record = dbcore::DBFilterAttrib;
  static constexpr const char* kTable = "filter_attributes";
  static constexpr uint8_t kType = 10;

  static auto fields(const Record& record) {
    return std::tie(record.filter_id, record.favorite, record.selected_filter_types);
  }

  static void fill(Record& record) {
    record.filter_id = 5000000001;
    record.favorite = true;
    record.selected_filter_types = wideText(L"selected_filter_types");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"filter_id_int_64", FieldType::T_INT_64},
        {"favorite_bool", FieldType::T_BOOL},
        {"selected_filter_types_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBFilterAttrib, DBRecordTest, DBFilterAttribTraits);
