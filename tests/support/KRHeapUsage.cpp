#include "support/KRHeapUsage.hpp"

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
#define KR_SANITIZER_HEAP 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
#define KR_SANITIZER_HEAP 1
#endif
#endif

#ifdef KR_SANITIZER_HEAP
// The sanitizers' allocators count for themselves; their runtimes export this (GCC ships no header for it).
extern "C" std::size_t __sanitizer_get_current_allocated_bytes();

std::size_t KRHeapUsage::allocatedBytes() { return __sanitizer_get_current_allocated_bytes(); }
#else
#include <malloc.h>

std::size_t KRHeapUsage::allocatedBytes() { return mallinfo2().uordblks; }
#endif
