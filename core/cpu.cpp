// Processor features, read once, and the process-wide switch to the plain code.
#include "core/internal/cpu.hpp"

#include <atomic>
#include <cstdlib>
#include <string_view>

namespace pxfx::cpu {

namespace {

// The kinds of copies the processor can run.
uint32_t detect() {
#if PXFX_X86_DISPATCH
    __builtin_cpu_init();
    if (!__builtin_cpu_supports("avx512f") || !__builtin_cpu_supports("avx512bw") ||
        !__builtin_cpu_supports("avx512dq"))
        return 0;
    const uint32_t wide = static_cast<uint32_t>(Wide::kAvx512);
    return __builtin_cpu_supports("avx512vbmi") ? wide | static_cast<uint32_t>(Wide::kBytePermute) : wide;
#elif PXFX_ARM_NEON
    return static_cast<uint32_t>(Wide::kBytePermute);
#else
    return 0;
#endif
}

uint32_t detected() {
    static const uint32_t kinds = detect();
    return kinds;
}

// The kinds that may run, or kForced alone while the plain code is forced.
constexpr uint32_t kForced = 1u << 31;

std::atomic<uint32_t> &state() {
    static std::atomic<uint32_t> kinds{[] {
        const char *env = std::getenv("PXFX_CPU");
        return env != nullptr && std::string_view(env) == "scalar" ? kForced : detected();
    }()};
    return kinds;
}

} // namespace

uint32_t enabled() {
    const uint32_t kinds = state().load(std::memory_order_relaxed);
    return (kinds & kForced) != 0 ? 0 : kinds;
}

bool force_plain(bool on) {
    return (state().exchange(on ? kForced : detected(), std::memory_order_relaxed) & kForced) != 0;
}

} // namespace pxfx::cpu
