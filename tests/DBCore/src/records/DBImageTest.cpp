#include "dbimage.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBImageTraits {
  using Record = dbcore::DBImage;
  static constexpr const char* kTable = "images";
  static constexpr uint8_t kType = 1;

  static auto fields(const Record& record) {
    return std::tie(record.guid, record.path, record.width, record.height, record.file_size,
                    record.modification_date, record.import_date, record.import_index, record.creation_date);
  }

  static void fill(Record& record) {
    record.guid = wideText(L"guid");
    record.path = wideText(L"path");
    record.width = 103;
    record.height = 104;
    record.file_size = 5000000005;
    record.modification_date = 5000000006;
    record.import_date = 5000000007;
    record.import_index = 108;
    record.creation_date = 5000000009;
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"guid_wide_ch", FieldType::T_WIDE_TEXT},
        {"path_wide_ch", FieldType::T_WIDE_TEXT},
        {"width", FieldType::T_INT},
        {"height", FieldType::T_INT},
        {"file_size_int_64", FieldType::T_INT_64},
        {"modification_date_int_64", FieldType::T_INT_64},
        {"import_date_int_64", FieldType::T_INT_64},
        {"import_index", FieldType::T_INT},
        {"creation_date_int_64", FieldType::T_INT_64},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBImage, DBRecordTest, DBImageTraits);
