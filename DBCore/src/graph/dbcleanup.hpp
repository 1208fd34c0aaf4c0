#pragma once

#include <string>

namespace dbcore {

// What "dangling" means for the records that only exist for others: a path that no image lies in and no
// referenced folder uses, a state that no image lists, a resource that no state uses.
class DBCleanup {
 public:
  static constexpr const char* kDanglingPathsCondition =
      "_id_int_64 NOT IN (SELECT folder_path_id FROM images WHERE folder_path_id IS NOT NULL) "
      "AND _id_int_64 NOT IN (SELECT path_id_int_64 FROM reffolders)";
  static constexpr const char* kDanglingStatesCondition =
      "_id_int_64 NOT IN (SELECT state_id FROM image_states)";
  static constexpr const char* kDanglingResourcesCondition =
      "_id_int_64 NOT IN (SELECT resource_id FROM state_resources)";

  // "DELETE FROM <table> WHERE <condition>" for one of the conditions above.
  static std::string deleteWhere(const char* table, const char* condition) {
    return std::string("DELETE FROM ") + table + " WHERE " + condition;
  }
};

}  // namespace dbcore
