#include "dbimghistorystate.hpp"

#include "dbrecordcolumns.hpp"

namespace dbcore {

template class DBRecord<DBImgHistoryState, kDBImgHistoryStateType>;

const std::vector<DBColumn<DBImgHistoryState>>& DBImgHistoryState::columns() {
  static const std::vector<DBColumn<DBImgHistoryState>> columns{
      DBField<DBImgHistoryState, &DBImgHistoryState::action_name>("action_name_wide_ch"),
      DBField<DBImgHistoryState, &DBImgHistoryState::additional_info>("additional_info_wide_ch"),
      DBField<DBImgHistoryState, &DBImgHistoryState::guid>("guid_wide_ch"),
      DBField<DBImgHistoryState, &DBImgHistoryState::crop_description>("crop_description_wide_ch"),
      DBField<DBImgHistoryState, &DBImgHistoryState::image_orientation>("image_orientation_int_64"),
      DBField<DBImgHistoryState, &DBImgHistoryState::state_hash>("state_hash_wide_ch"),
      DBField<DBImgHistoryState, &DBImgHistoryState::original>("original_bool"),
  };
  return columns;
}

}  // namespace dbcore
