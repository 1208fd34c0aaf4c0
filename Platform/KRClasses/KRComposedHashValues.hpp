#pragma once

#include <cstddef>
#include <cstdint>

// A well-mixed 64-bit combination of `count` values, order-dependent: equal sequences give equal hashes.
uint64_t composedHashValues(const uint64_t* values, size_t count);
