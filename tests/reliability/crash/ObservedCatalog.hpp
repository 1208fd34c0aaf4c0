#pragma once

#include <functional>
#include <map>
#include <string>

#include "GroupState.hpp"
#include "RawDatabase.hpp"

namespace reliability {

// The groups a catalog file holds, read with plain SQLite from the records' markers.
class ObservedCatalog {
 public:
  static std::map<long long, GroupState> read(RawDatabase& database);

 private:
  using Setter = std::function<void(GroupState&, long long)>;
  // Runs a query of (marker, value) rows and stores each value in the group the marker names.
  static void readColumn(RawDatabase& database, const std::string& sql,
                         std::map<long long, GroupState>& groups, const Setter& set);
};

}  // namespace reliability
