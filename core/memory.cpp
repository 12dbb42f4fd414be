// Memory wrappers: every allocation of the library goes through PX_malloc.
// PX_malloc keeps no counters: tests and benchmarks count and fail
// allocations by wrapping PX_malloc at link time (tests/support/allocation_hook.hpp).
#include <pxfx/core.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>

#if defined(__linux__)
#include <sys/mman.h>
#endif

namespace {

// Picture-sized blocks ask for 2 MiB pages. Operations that write a fresh
// result or working plane of tens of megabytes otherwise spend most of their
// time in page faults, one per 4 KiB written for the first time.
constexpr size_t kHugeBlock = size_t{4} << 20;
constexpr uintptr_t kHugePage = uintptr_t{2} << 20;

void advise_huge_pages(void *block, size_t size) {
#if defined(__linux__) && defined(MADV_HUGEPAGE)
    if (block == nullptr || size < kHugeBlock) return;
    const auto start = reinterpret_cast<uintptr_t>(block);
    const uintptr_t begin = (start + kHugePage - 1) & ~(kHugePage - 1);
    const uintptr_t end = (start + size) & ~(kHugePage - 1);
    // Advice only: a kernel without transparent huge pages refuses it, and
    // the block is as usable either way.
    if (end > begin) madvise(reinterpret_cast<void *>(begin), end - begin, MADV_HUGEPAGE);
#else
    (void)block, (void)size;
#endif
}

} // namespace

extern "C" {

void *PX_malloc(size_t size) {
    if (size == 0) return nullptr;
    void *block = std::malloc(size);
    advise_huge_pages(block, size);
    return block;
}

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
