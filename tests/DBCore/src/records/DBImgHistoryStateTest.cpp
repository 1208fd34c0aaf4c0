#include "dbimghistorystate.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBImgHistoryStateTraits {
  using Record = dbcore::DBImgHistoryState;
  static constexpr const char* kTable = "image_history_states";
  static constexpr uint8_t kType = 6;

  static auto fields(const Record& record) {
    return std::tie(record.action_name, record.additional_info, record.guid, record.crop_description,
                    record.image_orientation, record.state_hash, record.original);
  }

  static void fill(Record& record) {
    record.action_name = wideText(L"action_name");
    record.additional_info = wideText(L"additional_info");
    record.guid = wideText(L"guid");
    record.crop_description = wideText(L"crop_description");
    record.image_orientation = uint64_t{18000000000000000005u};
    record.state_hash = wideText(L"state_hash");
    record.original = true;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"action_name_wide_ch", FieldType::T_WIDE_TEXT},
        {"additional_info_wide_ch", FieldType::T_WIDE_TEXT},
        {"guid_wide_ch", FieldType::T_WIDE_TEXT},
        {"crop_description_wide_ch", FieldType::T_WIDE_TEXT},
        {"image_orientation_int_64", FieldType::T_INT_64},
        {"state_hash_wide_ch", FieldType::T_WIDE_TEXT},
        {"original_bool", FieldType::T_BOOL},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBImgHistoryState, DBRecordTest, DBImgHistoryStateTraits);

TEST(DBImgHistoryStateTest, ImageOrientationIsKeptBitForBitInItsColumn) {
  dbcore::DBImgHistoryState state;
  state.image_orientation = UINT64_MAX;
  const auto values = state.column_values();
  EXPECT_EQ(values.at("image_orientation_int_64").asInt64(), -1);

  dbcore::DBImgHistoryState loaded;
  loaded.set_column_values(values);
  EXPECT_EQ(loaded.image_orientation, UINT64_MAX);
}
