#pragma once

#include <string>

namespace reliability {

// What a catalog holds of one group: the records carrying the group's marker, and the width of its first
// image (0 when there is none).
struct GroupState {
  int images = 0;
  int userAttributes = 0;
  int exifAttributes = 0;
  long long width = 0;

  bool operator==(const GroupState&) const = default;
  // Whether some records of a group of `size` images are there and others not: a call applied in part.
  bool isPartial(int size) const;
  std::string describe() const;
};

}  // namespace reliability
