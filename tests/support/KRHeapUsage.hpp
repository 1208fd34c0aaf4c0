#pragma once

#include <cstddef>

// The bytes the process has allocated on the heap and not freed yet, as the allocator in use (the C
// library's, or a sanitizer's) counts them. For tests that check that memory stays bounded.
class KRHeapUsage {
 public:
  static std::size_t allocatedBytes();
};
