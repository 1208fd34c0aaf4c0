#include "dbreffolderattrib.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBRefFolderAttribTraits {
  using Record = dbcore::DBRefFolderAttrib;
  static constexpr const char* kTable = "referenced_folder_attributes";
  static constexpr uint8_t kType = 9;

  static auto fields(const Record& record) {
    return std::tie(record.ref_folder_id, record.favorite, record.selected_filter_types);
  }

  static void fill(Record& record) {
    record.ref_folder_id = 5000000001;
    record.favorite = true;
    record.selected_filter_types = wideText(L"selected_filter_types");
  }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"ref_folder_id_int_64", FieldType::T_INT_64},
        {"favorite_bool", FieldType::T_BOOL},
        {"selected_filter_types_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBRefFolderAttrib, DBRecordTest, DBRefFolderAttribTraits);
