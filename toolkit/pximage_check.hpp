// Validity of PXImage records, their byte sizes, and creation of result
// records, shared by the toolkit sources.
#pragma once

#include <pxfx/toolkit.h>

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/view.hpp"

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

// The view of a usable record (px_usable), else nothing: rows of width pixels
// packed one after the other, pitch = width x bytes per pixel (0 for a bit
// count the toolkit does not store, whose pixels no kernel reads).
inline std::optional<View> view_of(const PXImage *im) {
    if (!px_usable(im)) return std::nullopt;
    const size_t pitch = static_cast<size_t>(im->width) * static_cast<size_t>(px_bytes(im->bitcount));
    return View{im->data, pitch, im->width, im->height, static_cast<uint32_t>(im->bitcount), nullptr};
}

// True when loops over the record stay inside its block: it has no data or
// no rows and columns to visit (a width or height of 0 or below), or it is
// usable. A record failing this claims a block its memory cannot hold.
inline bool px_rows_inside(const PXImage *im) {
    return im->data == nullptr || im->width <= 0 || im->height <= 0 || px_usable(im);
}

// A new record of width x height pixels (sizes from block_size) with a block
// of `bytes` bytes. A count of 0 or below gives data null, as PX_malloc gives
// no block for it. A positive block is left uninitialised. Null when the
// record or a positive block cannot be allocated (nothing is left allocated).
inline PXImage *px_record(int64_t width, int64_t height, int32_t bitcount, int64_t bytes) {
    auto *im = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    if (im == nullptr) return nullptr;
    im->data = nullptr;
    if (bytes > 0) {
        im->data = static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(bytes)));
        if (im->data == nullptr) {
            PX_free(im);
            return nullptr;
        }
        // Results are written whole right after.
        prefault(im->data, static_cast<size_t>(bytes));
    }
    im->width = static_cast<int32_t>(width);
    im->height = static_cast<int32_t>(height);
    im->bitcount = bitcount;
    return im;
}

// A new record of width x height pixels for results whose loops run over its
// rows, its block sized by block_size: uninitialised for positive sizes,
// cleared when both sizes are negative (there are no rows to fill). Null when
// that size is 0 or below (no block can be had, which these results treat as
// a failed allocation) or does not fit, or when an allocation fails.
inline PXImage *px_new(int64_t width, int64_t height, int32_t bitcount) {
    const int64_t bytes = block_size(width, height, px_bytes(bitcount));
    if (!buffer_size_ok(bytes)) return nullptr;
    PXImage *im = px_record(width, height, bitcount, bytes);
    if (im != nullptr && width < 0) std::memset(im->data, 0, static_cast<size_t>(bytes));
    return im;
}

// v rounded down (toward minus infinity) to a multiple of 8.
constexpr int64_t floor8(int64_t v) { return v & ~int64_t{7}; }

// 16-bit samples are little-endian words.
inline uint32_t load16(const uint8_t *p) { return p[0] | static_cast<uint32_t>(p[1]) << 8; }
inline void store16(uint8_t *p, uint32_t v) {
    p[0] = static_cast<uint8_t>(v);
    p[1] = static_cast<uint8_t>(v >> 8);
}

} // namespace pxfx::packed
