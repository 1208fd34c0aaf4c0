#pragma once

#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// One image of the catalog. Dates are whole seconds since 1970 (UTC).
class DBImage : public DBRecord<DBImage, kDBImageType> {
 public:
  static constexpr const char* kTableName = "images";
  static const std::vector<DBColumn<DBImage>>& columns();

  std::wstring guid;
  std::wstring path;
  int32_t width = 0;
  int32_t height = 0;
  int64_t file_size = 0;
  int64_t modification_date = 0;
  int64_t import_date = 0;
  int32_t import_index = 0;
  int64_t creation_date = 0;
};

extern template class DBRecord<DBImage, kDBImageType>;

}  // namespace dbcore
