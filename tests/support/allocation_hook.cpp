// The PX_malloc wrapper of tests and benchmarks (see allocation_hook.hpp).
#include "support/allocation_hook.hpp"

#include <atomic>
#include <cstddef>

extern "C" void *__real_PX_malloc(size_t size);

namespace pxfx::alloc {

namespace {
std::atomic<uint64_t> g_calls{0};
std::atomic<uint64_t> g_bytes{0};
std::atomic<int64_t> g_remaining{-1};
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

extern "C" void *__wrap_PX_malloc(size_t size) {
    using namespace pxfx::alloc;
    int64_t left = g_remaining.load();
    while (left >= 0) {
        if (left == 0) return nullptr;
        if (g_remaining.compare_exchange_weak(left, left - 1)) break;
    }
    void *p = __real_PX_malloc(size);
    if (p != nullptr) {
        g_calls.fetch_add(1, std::memory_order_relaxed);
        g_bytes.fetch_add(size, std::memory_order_relaxed);
    }
    return p;
}
