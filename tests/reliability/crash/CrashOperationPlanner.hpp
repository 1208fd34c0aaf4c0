#pragma once

#include <cstdint>
#include <random>
#include <vector>

#include "CatalogExpectation.hpp"
#include "CrashOperation.hpp"

namespace reliability {

// Chooses a writer's calls from a seeded generator: the first opens the catalog, the others are drawn by
// weight among those that fit the groups written so far.
class CrashOperationPlanner {
 public:
  explicit CrashOperationPlanner(uint64_t seed);

  CrashOperation next();

 private:
  CrashOperation choose(long long number);
  CrashOperation imagesCall(long long number);
  CrashOperation groupCall(long long number, CrashOperationKind kind);
  std::vector<long long> candidates(CrashOperationKind kind) const;

  std::mt19937_64 random_;
  long long number_ = 0;
  CatalogExpectation expectation_;
};

}  // namespace reliability
