#pragma once

#include <cstdint>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "HostileCase.hpp"
#include "HostileSources.hpp"

namespace reliability {

// Damaged copies of the valid catalog: bytes flipped in each field of the header and in random pages, and
// the file cut at many sizes.
class DamageCases {
 public:
  static std::vector<HostileCase> make(const HostileSources& sources, uint64_t seed);

 private:
  static std::vector<HostileCase> headerFlips(const HostileSources& sources);
  static std::vector<HostileCase> pageFlips(const HostileSources& sources, std::mt19937_64& random);
  static std::vector<HostileCase> truncations(const HostileSources& sources);
  // The catalog with `length` bytes from `offset` inverted.
  static HostileCase flipped(const HostileSources& sources, const std::string& name, size_t offset,
                             size_t length, const std::set<int>& answers);
  static HostileCase truncated(const HostileSources& sources, size_t size);
};

}  // namespace reliability
