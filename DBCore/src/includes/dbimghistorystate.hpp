#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "dbrecord.hpp"

namespace dbcore {

// One step of an image's edit history.
class DBImgHistoryState : public DBRecord<DBImgHistoryState, kDBImgHistoryStateType> {
 public:
  static constexpr const char* kTableName = "image_history_states";
  static const std::vector<DBColumn<DBImgHistoryState>>& columns();

  std::wstring action_name;
  // The editor's own data for the step.
  std::wstring additional_info;
  std::wstring guid;
  // The crop in force, as property-list text; empty for none.
  std::wstring crop_description;
  uint64_t image_orientation = 0;
  std::wstring state_hash;
  bool original = false;
};

extern template class DBRecord<DBImgHistoryState, kDBImgHistoryStateType>;

}  // namespace dbcore
