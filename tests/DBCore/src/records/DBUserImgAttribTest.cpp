#include "dbuserimgattrib.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBUserImgAttribTraits {
  using Record = dbcore::DBUserImgAttrib;
  static constexpr const char* kTable = "image_user_attributes";
  static constexpr uint8_t kType = 4;

  static auto fields(const Record& record) {
    return std::tie(record.image_id, record.trashed, record.marker, record.color, record.rating,
                    record.edit_date, record.opened, record.trashed_date, record.origin_name, record.lost,
                    record.tutorial);
  }

  static void fill(Record& record) {
    record.image_id = 5000000001;
    record.trashed = true;
    record.marker = 103;
    record.color = 104;
    record.rating = 105;
    record.edit_date = 5000000006;
    record.opened = true;
    record.trashed_date = 5000000008;
    record.origin_name = wideText(L"origin_name");
    record.lost = true;
    record.tutorial = 111;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"image_id_int_64", FieldType::T_INT_64},
        {"trash_bool", FieldType::T_BOOL},
        {"marker", FieldType::T_INT},
        {"color", FieldType::T_INT},
        {"rating", FieldType::T_INT},
        {"edit_date_int_64", FieldType::T_INT_64},
        {"opened_bool", FieldType::T_BOOL},
        {"trashed_date_int_64", FieldType::T_INT_64},
        {"origin_path_wide_ch", FieldType::T_WIDE_TEXT},
        {"lost_bool", FieldType::T_BOOL},
        {"tutorial", FieldType::T_INT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBUserImgAttrib, DBRecordTest, DBUserImgAttribTraits);
