#include "dbpath.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBPathTraits {
  using Record = dbcore::DBPath;
  static constexpr const char* kTable = "paths";
  static constexpr uint8_t kType = 8;

  static auto fields(const Record& record) { return std::tie(record.volume_id, record.path); }

  static void fill(Record& record) {
    record.volume_id = 5000000001;
    record.path = wideText(L"path");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"volume_id_int_64", FieldType::T_INT_64},
        {"path_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBPath, DBRecordTest, DBPathTraits);
