#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// The camera (exif) data of one image. The capture date is whole seconds since 1970 (UTC).
class DBExivImgAttrib : public DBRecord<DBExivImgAttrib, kDBExivImgAttribType> {
 public:
  static constexpr const char* kTableName = "image_exiv_attributes";
  static const std::vector<DBColumn<DBExivImgAttrib>>& columns();

  // Id of the owning DBImage record.
  int64_t image_id = 0;
  float iso_speed = 0.0f;
  float shutter_speed = 0.0f;
  float f_number = 0.0f;
  float focal_length = 0.0f;
  float focal_length35 = 0.0f;
  float ev = 0.0f;
  float min_focal_length = 0.0f;
  float max_focal_length = 0.0f;
  float min_shutter = 0.0f;
  float max_shutter = 0.0f;
  float aperture = 0.0f;
  float focus_distance = 0.0f;
  // Bits per sample.
  int32_t bps = 0;
  int32_t white_balance = 0;
  int32_t white_balance_index = 0;
  int32_t light_source = 0;
  int32_t metering_mode = 0;
  std::wstring camera_maker;
  std::wstring camera_name;
  std::wstring camera_model;
  std::wstring lens_maker;
  std::wstring lens_pretty_name;
  int64_t date = 0;
  bool raw = false;
  bool full_filled = false;
  int32_t version = 0;
};

extern template class DBRecord<DBExivImgAttrib, kDBExivImgAttribType>;

}  // namespace dbcore
