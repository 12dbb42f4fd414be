// Picks a kernel's vector copy for the target chosen in core/cpu.cpp. A kernel
// file compiles its vector code for every target through hwy/foreach_target.h,
// lists it with HWY_EXPORT(name) and asks PXFX_VECTOR_COPY(name) for the copy
// to run: null when the plain loops run, or when this file lacks the target.
// Highway's own dispatch is not used: its chosen target is shared by every
// library of the process, while PXFX_CPU concerns this one.
#pragma once

#include <hwy/highway.h>

#include <cstddef>

#include "core/internal/cpu.hpp"

namespace pxfx::cpu {

template <class Fn, size_t N> Fn vector_copy(Fn const (&table)[N]) {
    const int64_t t = target();
    if (t == 0) return nullptr;
    if constexpr (N == 1) {
        return t == HWY_STATIC_TARGET ? table[0] : nullptr;
    } else {
        // The table's order: first its initialiser, then the targets by
        // their bits, as Highway lays it out.
        const auto shifted = static_cast<uint64_t>(HWY_CHOSEN_TARGET_SHIFT(t));
        return shifted == 0 ? nullptr : table[hwy::Num0BitsBelowLS1Bit_Nonzero64(shifted)];
    }
}

} // namespace pxfx::cpu

#define PXFX_VECTOR_COPY(FUNC) ::pxfx::cpu::vector_copy(HWY_DISPATCH_TABLE(FUNC))
