#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "dbconnection.hpp"
#include "dbimghistorystate.hpp"

namespace dbcore {

// The history states of images (an ordered list per image with at most one current state) and the
// resources bound to states.
class DBStates {
 public:
  static std::vector<std::shared_ptr<DBImgHistoryState>> states(DBConnection& connection, int64_t imageId);
  static std::shared_ptr<DBImgHistoryState> currentState(DBConnection& connection, int64_t imageId);
  // The current state of every image that has one, by image id, in one query.
  static std::map<long long, std::shared_ptr<DBImgHistoryState>> allCurrentStates(DBConnection& connection);
  // Makes the state current, appending it to the image's list when it is not there yet (an unsaved state
  // is written first); an empty state leaves the image without a current state.
  static void setCurrent(DBConnection& connection, int64_t imageId,
                         const std::shared_ptr<DBImgHistoryState>& state);
  // Replaces the image's list (unsaved states are written); `current` is a position in it, -1 for none.
  static void replace(DBConnection& connection, int64_t imageId,
                      const std::vector<std::shared_ptr<DBImgHistoryState>>& list, long long current);
  // Binds resources by name, making the resource records that do not exist yet.
  static void bindResources(DBConnection& connection, int64_t stateId,
                            const std::vector<std::wstring>& names);
  static void copyResources(DBConnection& connection, int64_t stateId, int64_t baseStateId);

 private:
  static void link(DBConnection& connection, int64_t imageId, int64_t stateId, int64_t position,
                   bool current);
  static int64_t resourceNamed(DBConnection& connection, const std::wstring& name);
};

}  // namespace dbcore
