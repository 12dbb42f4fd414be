// The one place where kernels choose between their plain code and a vector
// copy of it. Detection runs once per process; the environment variable
// PXFX_CPU=scalar (read once) or force_plain() makes every kernel run its
// plain code. Both copies of a kernel give the same bytes.
//
// Two kinds of copies exist:
//   Wide::kAvx512       a kernel's own plain C++ compiled again with PXFX_WIDE
//                       for AVX-512 (x86-64 with GCC or Clang only);
//   Wide::kBytePermute  the byte-table lookups of core/byte_map.cpp, written
//                       with AVX-512 VBMI permutes (x86-64) or NEON table
//                       lookups (arm64).
// PXFX_X86_DISPATCH and PXFX_ARM_NEON tell code written with intrinsics which
// copies to compile. Builds configured with PXFX_SIMD=OFF (PXFX_PORTABLE_ONLY)
// carry neither kind, and cpu::pick then folds to the plain code at compile
// time, as it does for the AVX-512 copies on ARM.
#pragma once

#include <cstdint>

#if !defined(PXFX_PORTABLE_ONLY) && defined(__x86_64__) && (defined(__GNUC__) || defined(__clang__))
#define PXFX_X86_DISPATCH 1
#define PXFX_ARM_NEON 0
// A wide copy: the function and everything it calls compiled for AVX-512.
// The code is the same plain C++, so its results are the same (the build
// never contracts multiply-add).
#define PXFX_WIDE __attribute__((target("avx512f,avx512bw,avx512dq"), flatten))
#elif !defined(PXFX_PORTABLE_ONLY) && defined(__aarch64__)
#define PXFX_X86_DISPATCH 0
#define PXFX_ARM_NEON 1
#define PXFX_WIDE
#else
#define PXFX_X86_DISPATCH 0
#define PXFX_ARM_NEON 0
#define PXFX_WIDE
#endif

namespace pxfx::cpu {

enum class Wide : uint32_t {
    kAvx512 = 1,      // AVX-512 foundation, byte/word and dword/qword
    kBytePermute = 2, // the above and VBMI; on arm64 NEON, always present
};

// Whether this build carries copies of the kind at all.
constexpr bool built(Wide w) {
    return w == Wide::kAvx512 ? PXFX_X86_DISPATCH != 0 : (PXFX_X86_DISPATCH != 0 || PXFX_ARM_NEON != 0);
}

// The kinds (Wide bits) that may run now: the processor's, or none while the
// plain code is forced.
uint32_t enabled();

// Forces the plain code in every kernel (true) or lets each run the best copy
// the processor has (false), for the whole process; returns whether the plain
// code was forced before. Starts as PXFX_CPU says.
bool force_plain(bool on);

// The copy of a kernel to run: `wide` when this build has copies of kind
// `Needs` and they may run now, else `plain`.
template <Wide Needs = Wide::kAvx512, class Fn> Fn pick(Fn plain, Fn wide) {
    return built(Needs) && (enabled() & static_cast<uint32_t>(Needs)) != 0 ? wide : plain;
}

} // namespace pxfx::cpu
