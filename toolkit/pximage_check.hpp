// Validity of PXImage records, their byte sizes, and creation of result
// records, shared by the toolkit sources.
#pragma once

#include <pxfx/toolkit.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"

namespace pxfx::packed {

// Bytes per pixel of a bit count the toolkit stores (8, 16, 24, 32), else 0.
constexpr int32_t px_bytes(int32_t bitcount) {
    switch (bitcount) {
    case 8: return 1;
    case 16: return 2;
    case 24: return 3;
    case 32: return 4;
    default: return 0;
    }
}

// A record is usable when it has data and positive sizes, and its pixel block
// (width x height x bytes per pixel, one byte per pixel for bit counts the
// toolkit does not store) stays within kMaxBlockBytes.
inline bool px_usable(const PXImage *im) {
    if (im == nullptr || im->data == nullptr || im->width <= 0 || im->height <= 0) return false;
    const int32_t bpp = px_bytes(im->bitcount);
    return checked_size(static_cast<uint64_t>(im->width), static_cast<uint64_t>(im->height),
                        static_cast<uint64_t>(bpp > 0 ? bpp : 1)) != 0;
}

// Bytes of the pixel block of a usable record of a stored bit count.
inline size_t px_block(const PXImage *im) {
    return static_cast<size_t>(im->width) * static_cast<size_t>(im->height) *
           static_cast<size_t>(px_bytes(im->bitcount));
}

// A new record with an uninitialised pixel block of width x height pixels,
// or null when a size is not positive, the block is too large, or an
// allocation fails (nothing is left allocated then).
inline PXImage *px_new(int64_t width, int64_t height, int32_t bitcount) {
    const int32_t bpp = px_bytes(bitcount);
    if (width <= 0 || height <= 0 || bpp == 0) return nullptr;
    const size_t bytes =
        checked_size(static_cast<uint64_t>(width), static_cast<uint64_t>(height), static_cast<uint64_t>(bpp));
    if (bytes == 0) return nullptr;
    auto *im = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    if (im == nullptr) return nullptr;
    im->data = static_cast<uint8_t *>(PX_malloc(bytes));
    if (im->data == nullptr) {
        PX_free(im);
        return nullptr;
    }
    im->width = static_cast<int32_t>(width);
    im->height = static_cast<int32_t>(height);
    im->bitcount = bitcount;
    return im;
}

// 16-bit samples are little-endian words.
inline uint32_t load16(const uint8_t *p) { return p[0] | static_cast<uint32_t>(p[1]) << 8; }
inline void store16(uint8_t *p, uint32_t v) {
    p[0] = static_cast<uint8_t>(v);
    p[1] = static_cast<uint8_t>(v >> 8);
}

} // namespace pxfx::packed
