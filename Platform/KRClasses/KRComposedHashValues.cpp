#include "KRClasses/KRComposedHashValues.hpp"

#include "KRFoundation/KRHashing.hpp"

uint64_t composedHashValues(const uint64_t* values, size_t count) {
  uint64_t result = KRHashing::mix(count);
  for (size_t i = 0; i < count; ++i) result = KRHashing::combine(result, values[i]);
  return result;
}
