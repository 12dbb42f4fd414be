// Building blocks shared by the deformations: conversion of doubles to
// integer coordinates, and the choice of pixel formats for a copy from one
// record into another.
#pragma once

#include <pxfx/core.h>

#include <cstdint>

#include "core/internal/pixel.hpp"

namespace pxfx {

// Truncation toward zero into 32 bits, saturating at the ends of the range and
// giving 0 for NaN, as the ARM conversion instructions do. Every value whose
// truncation fits in 32 bits converts exactly as a plain cast would.
inline int32_t trunc_i32(double v) {
    if (v != v) return 0;
    if (v >= 2147483648.0) return INT32_MAX;
    if (v <= -2147483649.0) return INT32_MIN;
    return static_cast<int32_t>(v);
}

// Clamps a coordinate to 0 .. n - 1 as the pixel readers do.
inline int32_t clamp_coord(int64_t v, int32_t n) { return v < 0 ? 0 : (v >= n ? n - 1 : static_cast<int32_t>(v)); }

// Calls fn(SrcFormat{}, DstFormat{}). Records of one bit count share their
// direct format; records that differ (a 1- or 4-bit source whose result was
// made with 8 bits, say) both go through the accessors, which convert.
template <class Fn> void with_formats(const Image *src, const Image *dst, Fn &&fn) {
    if (src->bitCount == dst->bitCount)
        with_format(src->bitCount, [&](auto f) { fn(f, f); });
    else
        fn(AnyFormat{}, AnyFormat{});
}

} // namespace pxfx
