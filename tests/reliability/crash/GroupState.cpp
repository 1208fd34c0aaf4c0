#include "GroupState.hpp"

namespace reliability {

namespace {

bool between(int count, int size) { return count > 0 && count < size; }

}  // namespace

bool GroupState::isPartial(int size) const {
  return between(images, size) || between(userAttributes, size) || between(exifAttributes, size);
}

std::string GroupState::describe() const {
  return std::to_string(images) + " images, " + std::to_string(userAttributes) + " user attributes, " +
         std::to_string(exifAttributes) + " exif attributes, width " + std::to_string(width);
}

}  // namespace reliability
