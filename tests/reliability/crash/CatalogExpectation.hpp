#pragma once

#include <map>

#include "CrashOperation.hpp"
#include "GroupState.hpp"

namespace reliability {

// The groups a catalog holds after a sequence of calls, each call applied whole.
class CatalogExpectation {
 public:
  void apply(const CrashOperation& operation);

  // Every group ever written, removed ones included (with an empty state).
  const std::map<long long, GroupState>& groups() const { return groups_; }
  // The state of a group; empty for a group never written.
  GroupState group(long long id) const;
  // The number of images the group was written with.
  int size(long long id) const;

 private:
  std::map<long long, GroupState> groups_;
  std::map<long long, int> sizes_;
};

}  // namespace reliability
