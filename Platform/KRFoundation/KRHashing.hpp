#pragma once

#include <cstdint>

// Well-mixed 64-bit hash helpers shared by the value types.
namespace KRHashing {

// A bijective 64-bit finaliser (splitmix64): every input bit affects every output bit.
constexpr uint64_t mix(uint64_t value) {
  value += 0x9e3779b97f4a7c15ULL;
  value = (value ^ (value >> 30)) * 0xbf58476d1ce4e5b9ULL;
  value = (value ^ (value >> 27)) * 0x94d049bb133111ebULL;
  return value ^ (value >> 31);
}

// Order-dependent combination of a running hash with one more value.
constexpr uint64_t combine(uint64_t seed, uint64_t value) {
  return mix(seed ^ (mix(value) + (seed << 6) + (seed >> 2)));
}

}  // namespace KRHashing
