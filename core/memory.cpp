// Memory wrappers: every allocation of the library goes through PX_malloc.
// PX_malloc keeps no counters: tests and benchmarks count and fail
// allocations by wrapping PX_malloc at link time (tests/support/allocation_hook.hpp).
#include <pxfx/core.h>

#include <cstdlib>
#include <cstring>

extern "C" {

void *PX_malloc(size_t size) { return size == 0 ? nullptr : std::malloc(size); }

void PX_free(void *block) {
    if (block != nullptr) std::free(block);
}

void *PX_memcpy(void *dst, const void *src, size_t count) {
    if (dst == nullptr || src == nullptr || count == 0) return dst;
    return std::memcpy(dst, src, count);
}

void *PX_memset(void *dst, int32_t value, size_t count) {
    if (dst == nullptr || count == 0) return dst;
    return std::memset(dst, value, count);
}

} // extern "C"
