#include "dbreffolder.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBRefFolderTraits {
  using Record = dbcore::DBRefFolder;
  static constexpr const char* kTable = "reffolders";
  static constexpr uint8_t kType = 7;

  static auto fields(const Record& record) { return std::tie(record.uuid, record.path_id, record.order); }

  static void fill(Record& record) {
    record.uuid = wideText(L"uuid");
    record.path_id = 5000000002;
    record.order = 3.25f;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"uuid_wide_ch", FieldType::T_WIDE_TEXT},
        {"path_id_int_64", FieldType::T_INT_64},
        {"order_float", FieldType::T_FLOAT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBRefFolder, DBRecordTest, DBRefFolderTraits);
