#include "dbresource.hpp"

#include <gtest/gtest.h>

#include "DBRecordTestSupport.hpp"

namespace {

using dbcore::FieldType;
using dbrecordtest::wideText;

struct DBResourceTraits {
  using Record = dbcore::DBResource;
  static constexpr const char* kTable = "history_resources";
  static constexpr uint8_t kType = 3;

  static auto fields(const Record& record) { return std::tie(record.name); }

  static void fill(Record& record) { record.name = wideText(L"name"); }

  static dbrecordtest::ColumnList ownColumns() {
    return {
        {"name_wide_ch", FieldType::T_WIDE_TEXT},
    };
  }
};

}  // namespace

INSTANTIATE_TYPED_TEST_SUITE_P(DBResource, DBRecordTest, DBResourceTraits);
