// What the processor offers beyond the baseline the library is compiled for,
// for the few kernels that also carry a wider-vector version of themselves.
// PXFX_X86_DISPATCH is 1 where such versions are built (x86-64 with GCC or
// Clang, unless the build forces the plain code with PXFX_SIMD=OFF).
#pragma once

#if !defined(PXFX_PORTABLE_ONLY) && defined(__x86_64__) && (defined(__GNUC__) || defined(__clang__))
#define PXFX_X86_DISPATCH 1
// A wide copy: the function and everything it calls compiled for AVX-512, to
// be called only when cpu::has_avx512(). The code is the same plain C++, so
// its results are the same (the build never contracts multiply-add).
#define PXFX_WIDE __attribute__((target("avx512f,avx512bw,avx512dq"), flatten))
#else
#define PXFX_X86_DISPATCH 0
#endif

namespace pxfx::cpu {

#if PXFX_X86_DISPATCH
// AVX-512 foundation, byte/word and dword/qword instructions: the target of
// the wide copies, "avx512f,avx512bw,avx512dq".
bool has_avx512();
// The above and the byte permutes of VBMI.
bool has_avx512vbmi();
#endif

} // namespace pxfx::cpu
