#pragma once

#include <vector>

#include "HostileCase.hpp"
#include "HostileSources.hpp"

namespace reliability {

// Whole files and odd paths: the valid catalog, another application's database, a text file, a missing
// file, a folder, and paths with an embedded NUL character.
class OpeningCases {
 public:
  static std::vector<HostileCase> make(const HostileSources& sources);

 private:
  static HostileCase withFile(const std::string& name, const std::string& bytes,
                              const std::set<int>& answers);
  // The valid catalog in the folder, opened by a path with a NUL character.
  static HostileCase nulInPath(const HostileSources& sources, const std::string& name,
                               const HostileCase::OpenPath& path);
};

}  // namespace reliability
