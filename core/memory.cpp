// Memory wrappers: every allocation of the library goes through PX_malloc.
// PX_malloc keeps no counters: tests and benchmarks count and fail
// allocations by wrapping PX_malloc at link time (tests/support/allocation_hook.hpp).
#include <pxfx/core.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "core/internal/memory.hpp"

#if defined(__linux__)
#include <sys/mman.h>
#include <unistd.h>
#ifndef MADV_POPULATE_WRITE
#define MADV_POPULATE_WRITE 23 // the kernel's value; older C headers lack it
#endif
#endif

namespace pxfx {

void prefault(void *block, size_t bytes) {
#if defined(__linux__)
    if (block == nullptr || bytes < kPrefaultBytes) return;
    const long page = sysconf(_SC_PAGESIZE);
    if (page <= 0) return;
    // Only the pages wholly inside the block: the ones at its ends may hold
    // other allocations.
    const auto size = static_cast<uintptr_t>(page), start = reinterpret_cast<uintptr_t>(block);
    const uintptr_t first = (start + size - 1) / size * size, end = (start + bytes) / size * size;
    if (end > first) madvise(reinterpret_cast<void *>(first), end - first, MADV_POPULATE_WRITE);
#else
    (void)block;
    (void)bytes;
#endif
}

} // namespace pxfx

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
