#include "dbexivimgattrib.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBExivImgAttrib, kDBExivImgAttribType>;

const std::vector<DBColumn<DBExivImgAttrib>>& DBExivImgAttrib::columns() {
  static const std::vector<DBColumn<DBExivImgAttrib>> columns{
      DBField<DBExivImgAttrib, &DBExivImgAttrib::image_id>("image_id_int_64"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::iso_speed>("iso_speed"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::shutter_speed>("shutter_speed"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::f_number>("number"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::focal_length>("focal_len"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::focal_length35>("focal_len35mm"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::ev>("ev"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::min_focal_length>("focal_len_min"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::max_focal_length>("focal_len_max"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::min_shutter>("shutter_min"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::max_shutter>("shutter_max"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::aperture>("aperture"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::focus_distance>("focus_distance"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::bps>("bits_per_sample"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::white_balance>("white_balance"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::white_balance_index>("white_balance_index"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::light_source>("light_source"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::metering_mode>("metering_mode"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::camera_maker>("camera_maker_wide_ch"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::camera_name>("camera_name_wide_ch"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::camera_model>("camera_model_wide_ch"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::lens_maker>("lens_maker_wide_ch"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::lens_pretty_name>("lens_pretty_name_wide_ch"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::date>("date_time_int_64"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::raw>("is_raw_bool"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::full_filled>("is_full_filled_bool"),
      DBField<DBExivImgAttrib, &DBExivImgAttrib::version>("version"),
  };
  return columns;
}

}  // namespace dbcore
