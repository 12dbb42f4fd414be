// What the processor offers beyond the baseline the library is compiled for,
// for the few kernels that also carry a wider-vector version of themselves.
// PXFX_X86_DISPATCH is 1 where such versions are built (x86-64 with GCC or
// Clang, unless the build forces the plain code with PXFX_SIMD=OFF).
#pragma once

#if !defined(PXFX_PORTABLE_ONLY) && defined(__x86_64__) && (defined(__GNUC__) || defined(__clang__))
#define PXFX_X86_DISPATCH 1
#else
#define PXFX_X86_DISPATCH 0
#endif

namespace pxfx::cpu {

#if PXFX_X86_DISPATCH
// AVX-512 foundation and byte/word instructions.
bool has_avx512bw();
// The above and the byte permutes of VBMI.
bool has_avx512vbmi();
#endif

} // namespace pxfx::cpu
