// Processor features, read once.
#include "core/internal/cpu.hpp"

namespace pxfx::cpu {

#if PXFX_X86_DISPATCH

bool has_avx512() {
    static const bool yes = [] {
        __builtin_cpu_init();
        return __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
               __builtin_cpu_supports("avx512dq");
    }();
    return yes;
}

bool has_avx512vbmi() {
    static const bool yes = has_avx512() && __builtin_cpu_supports("avx512vbmi");
    return yes;
}

#endif

} // namespace pxfx::cpu
