// Memory wrappers: every allocation of the library goes through PX_malloc,
// which also keeps the allocation statistics used by the benchmarks.
#include <pxfx/core.h>

#include <atomic>
#include <cstdlib>
#include <cstring>

#include "core/internal/alloc_hook.hpp"

namespace pxfx::alloc {

namespace {
std::atomic<uint64_t> g_calls{0};
std::atomic<uint64_t> g_bytes{0};
#ifdef PXFX_ALLOCATION_HOOK
std::atomic<int64_t> g_remaining{-1};
#endif
} // namespace

Stats stats() { return {g_calls.load(std::memory_order_relaxed), g_bytes.load(std::memory_order_relaxed)}; }

void reset_stats() {
    g_calls.store(0, std::memory_order_relaxed);
    g_bytes.store(0, std::memory_order_relaxed);
}

#ifdef PXFX_ALLOCATION_HOOK
bool injection_available() { return true; }
void fail_after(int64_t n) { g_remaining.store(n < 0 ? -1 : n); }
#else
bool injection_available() { return false; }
void fail_after(int64_t) {}
#endif

} // namespace pxfx::alloc

extern "C" {

void *PX_malloc(size_t size) {
    using namespace pxfx::alloc;
    if (size == 0) return nullptr;
#ifdef PXFX_ALLOCATION_HOOK
    int64_t left = g_remaining.load();
    while (left >= 0) {
        if (left == 0) return nullptr;
        if (g_remaining.compare_exchange_weak(left, left - 1)) break;
    }
#endif
    void *p = std::malloc(size);
    if (p != nullptr) {
        g_calls.fetch_add(1, std::memory_order_relaxed);
        g_bytes.fetch_add(size, std::memory_order_relaxed);
    }
    return p;
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
