// The validated view of a caller's record: what a kernel reads and writes.
//
// Entry points check each record once, at the top of the call, with
// `view_of`; a record that passes gives a View, and from then on kernels take
// the View (rows through `bits` and `pitch`, sizes as plain values) instead of
// reading record fields. A View exists only for a record whose pixel block
// holds `height` rows of `pitch` bytes, each holding `width` pixels of
// `bitCount` bits, so row loops over it stay inside the block.
//
// PXImage records are viewed the same way, their rows packed one after the
// other (pitch = width x bytes per pixel); see toolkit/pximage_check.hpp.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>
#include <optional>

#include "core/internal/image_check.hpp"

namespace pxfx {

struct View {
    uint8_t *bits;
    size_t pitch;
    int32_t width;
    int32_t height;
    uint32_t bitCount;
    // The record viewed, for bit counts read and written through the pixel
    // accessors (1, 4 and unknown counts); null for packed records.
    Image *record;

    uint8_t *row(int32_t y) const { return bits + static_cast<size_t>(y) * pitch; }
    size_t block_bytes() const { return pitch * static_cast<size_t>(height); }
};

// Whether two views' pixel blocks share no byte, so that a kernel may write
// one in any order while it reads the other.
inline bool blocks_apart(const View &a, const View &b) {
    const auto pa = reinterpret_cast<uintptr_t>(a.bits), pb = reinterpret_cast<uintptr_t>(b.bits);
    return pa + a.block_bytes() <= pb || pb + b.block_bytes() <= pa;
}

// The view of a record with pixels (has_pixels), else nothing. The view may
// write: a caller's const record still points at writable pixels, and the
// functions that write through a view of it are those that own the result.
inline std::optional<View> view_of(const Image *im) {
    if (!has_pixels(im)) return std::nullopt;
    return View{im->bits, im->pitch, im->width, im->height, im->bitCount, const_cast<Image *>(im)};
}

// view_of for a record that must be 8 bits.
inline std::optional<View> plane_view_of(const Image *im) {
    if (im == nullptr || im->bitCount != 8) return std::nullopt;
    return view_of(im);
}

} // namespace pxfx
