// Building block shared by the deformations: the choice of pixel formats for
// a copy from one record into another.
#pragma once

#include <pxfx/core.h>

#include <cstdint>

#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"

namespace pxfx {

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
