#pragma once

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "HostileCase.hpp"
#include "HostileSources.hpp"

namespace reliability {

// The valid catalog with sidecars that are not its own: another database's committed -wal or hot journal,
// garbage -wal and -shm files.
class SidecarCases {
 public:
  static std::vector<HostileCase> make(const HostileSources& sources, uint64_t seed);

 private:
  using Sidecars = std::map<std::string, std::string>;

  // The catalog, in rollback-journal mode when asked, with the sidecars (suffix to bytes) beside it.
  static HostileCase beside(const HostileSources& sources, const std::string& name, const Sidecars& sidecars,
                            const std::set<int>& answers, bool rollbackJournal = false);
};

}  // namespace reliability
