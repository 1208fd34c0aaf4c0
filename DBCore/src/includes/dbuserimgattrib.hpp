#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// The user's own marks on one image. Dates are whole seconds since 1970 (UTC).
class DBUserImgAttrib : public DBRecord<DBUserImgAttrib, kDBUserImgAttribType> {
 public:
  static constexpr const char* kTableName = "image_user_attributes";
  static const std::vector<DBColumn<DBUserImgAttrib>>& columns();

  // Id of the owning DBImage record.
  int64_t image_id = 0;
  bool trashed = false;
  int32_t marker = 0;
  int32_t color = 0;
  int32_t rating = 0;
  int64_t edit_date = 0;
  bool opened = false;
  int64_t trashed_date = 0;
  std::wstring origin_name;
  bool lost = false;
  int32_t tutorial = 0;
};

extern template class DBRecord<DBUserImgAttrib, kDBUserImgAttribType>;

}  // namespace dbcore
