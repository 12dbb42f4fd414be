// The target the vector kernels run, chosen once from what the processor has
// (Highway's detection) and the path PXFX_CPU asks for.
#include "core/internal/cpu.hpp"

#include <atomic>
#include <cstdlib>
#include <string_view>

#ifndef PXFX_PORTABLE_ONLY
#include <hwy/highway.h>
#include <hwy/targets.h>
#endif

namespace pxfx::cpu {

namespace {

#ifndef PXFX_PORTABLE_ONLY
// Targets whose vectors are 16 bytes.
constexpr int64_t k128Bit = HWY_SSSE3 | HWY_SSE4 | HWY_NEON;

// The best target among `allowed` that this build compiled and the processor
// runs; emulated vectors count as none. The build's baseline target runs
// wherever the build does, also where Highway's detection does not see it
// (NEON on 32-bit ARM builds made for it).
int64_t best_of(int64_t allowed) {
    const int64_t runs = hwy::SupportedTargets() | HWY_STATIC_TARGET;
    const int64_t usable = runs & HWY_TARGETS & allowed & ~(HWY_EMU128 | HWY_SCALAR);
    return usable & -usable; // lower bits are better targets
}

// The target of each path, detected once.
const int64_t *targets() {
    static const int64_t of[3] = {0, best_of(k128Bit), best_of(~int64_t{0})};
    return of;
}
#endif

std::atomic<Path> &state() {
    static std::atomic<Path> path{[] {
        const char *env = std::getenv("PXFX_CPU");
        const std::string_view v = env != nullptr ? env : "";
        return v == "scalar" ? Path::kPlain : (v == "128" ? Path::k128 : Path::kBest);
    }()};
    return path;
}

} // namespace

Path set_path(Path path) { return state().exchange(path, std::memory_order_relaxed); }

int64_t target() {
#ifdef PXFX_PORTABLE_ONLY
    return 0;
#else
    return targets()[static_cast<int>(state().load(std::memory_order_relaxed))];
#endif
}

const char *target_name() {
#ifdef PXFX_PORTABLE_ONLY
    return "scalar";
#else
    const int64_t t = target();
    return t == 0 ? "scalar" : hwy::TargetName(t);
#endif
}

} // namespace pxfx::cpu
