// The one place where kernels choose between their plain loops and their
// vector code. The vector code of a kernel is written once against Highway
// and compiled for every target of the architecture (SSSE3, SSE4, AVX2 and
// AVX-512 on x86-64, NEON on ARM); core/internal/simd.hpp picks a kernel's copy
// for the target chosen here. The choice is made once per process from the
// processor and the environment variable PXFX_CPU:
//   PXFX_CPU=scalar   the plain loops;
//   PXFX_CPU=128      the best target with 16-byte vectors (SSE4 or SSSE3 on
//                     x86-64, NEON on ARM: what phones run);
//   unset or other    the best target the processor has.
// Every path gives the same bytes. Builds configured with PXFX_SIMD=OFF, or
// without Highway (PXFX_PORTABLE_ONLY), carry the plain loops only.
#pragma once

#include <cstdint>

namespace pxfx::cpu {

enum class Path : uint8_t {
    kPlain, // the plain loops
    k128,   // the best target with 16-byte vectors
    kBest,  // the best target the processor has
};

// Sets the path of every kernel for the whole process; returns the one before.
Path set_path(Path path);

// The Highway target bit the kernels run now; 0 for the plain loops (also
// where the path asks for vectors that the processor or the build lacks).
int64_t target();

// The name of target(): "scalar" for the plain loops, else Highway's name
// ("SSSE3", "SSE4", "AVX2", "AVX3", "NEON").
const char *target_name();

} // namespace pxfx::cpu
