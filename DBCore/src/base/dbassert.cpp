#include "dbassert.hpp"

#include <cstdio>
#include <cstdlib>

namespace dbcore {

void assertionFailed(const char* expression, const char* file, int line) {
  std::fprintf(stderr, "dbcore assertion failed: %s (%s:%d)\n", expression, file, line);
  std::abort();
}

}  // namespace dbcore
