#include "dbvolume.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBVolumeTraits {
  using Record = dbcore::DBVolume;
  static constexpr const char* kTable = "volumes";
  static constexpr uint8_t kType = 15;

  static auto fields(const Record& record) { return std::tie(record.uuid, record.info); }

  static void fill(Record& record) {
    record.uuid = wideText(L"uuid");
    record.info = wideText(L"info");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"uuid_wide_ch", FieldType::T_WIDE_TEXT},
        {"info_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBVolume, DBRecordTest, DBVolumeTraits);
