#include "dbexivimgattrib.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBExivImgAttribTraits {
  using Record = dbcore::DBExivImgAttrib;
  static constexpr const char* kTable = "image_exiv_attributes";
  static constexpr uint8_t kType = 5;

  static auto fields(const Record& record) {
    return std::tie(record.image_id, record.iso_speed, record.shutter_speed, record.f_number,
                    record.focal_length, record.focal_length35, record.ev, record.min_focal_length,
                    record.max_focal_length, record.min_shutter, record.max_shutter, record.aperture,
                    record.focus_distance, record.bps, record.white_balance, record.white_balance_index,
                    record.light_source, record.metering_mode, record.camera_maker, record.camera_name,
                    record.camera_model, record.lens_maker, record.lens_pretty_name, record.date, record.raw,
                    record.full_filled, record.version);
  }

  static void fill(Record& record) {
    record.image_id = 5000000001;
    record.iso_speed = 2.25f;
    record.shutter_speed = 3.25f;
    record.f_number = 4.25f;
    record.focal_length = 5.25f;
    record.focal_length35 = 6.25f;
    record.ev = 7.25f;
    record.min_focal_length = 8.25f;
    record.max_focal_length = 9.25f;
    record.min_shutter = 10.25f;
    record.max_shutter = 11.25f;
    record.aperture = 12.25f;
    record.focus_distance = 13.25f;
    record.bps = 114;
    record.white_balance = 115;
    record.white_balance_index = 116;
    record.light_source = 117;
    record.metering_mode = 118;
    record.camera_maker = wideText(L"camera_maker");
    record.camera_name = wideText(L"camera_name");
    record.camera_model = wideText(L"camera_model");
    record.lens_maker = wideText(L"lens_maker");
    record.lens_pretty_name = wideText(L"lens_pretty_name");
    record.date = 5000000024;
    record.raw = true;
    record.full_filled = true;
    record.version = 127;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"image_id_int_64", FieldType::T_INT_64},
        {"iso_speed", FieldType::T_FLOAT},
        {"shutter_speed", FieldType::T_FLOAT},
        {"number", FieldType::T_FLOAT},
        {"focal_len", FieldType::T_FLOAT},
        {"focal_len35mm", FieldType::T_FLOAT},
        {"ev", FieldType::T_FLOAT},
        {"focal_len_min", FieldType::T_FLOAT},
        {"focal_len_max", FieldType::T_FLOAT},
        {"shutter_min", FieldType::T_FLOAT},
        {"shutter_max", FieldType::T_FLOAT},
        {"aperture", FieldType::T_FLOAT},
        {"focus_distance", FieldType::T_FLOAT},
        {"bits_per_sample", FieldType::T_INT},
        {"white_balance", FieldType::T_INT},
        {"white_balance_index", FieldType::T_INT},
        {"light_source", FieldType::T_INT},
        {"metering_mode", FieldType::T_INT},
        {"camera_maker_wide_ch", FieldType::T_WIDE_TEXT},
        {"camera_name_wide_ch", FieldType::T_WIDE_TEXT},
        {"camera_model_wide_ch", FieldType::T_WIDE_TEXT},
        {"lens_maker_wide_ch", FieldType::T_WIDE_TEXT},
        {"lens_pretty_name_wide_ch", FieldType::T_WIDE_TEXT},
        {"date_time_int_64", FieldType::T_INT_64},
        {"is_raw_bool", FieldType::T_BOOL},
        {"is_full_filled_bool", FieldType::T_BOOL},
        {"version", FieldType::T_INT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBExivImgAttrib, DBRecordTest, DBExivImgAttribTraits);
