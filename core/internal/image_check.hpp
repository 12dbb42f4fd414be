// Validity of caller records and overflow-checked sizes.
//
// Every function that touches pixels first asks `has_pixels`: a record counts
// as having pixels only when it is non-null, has a pixel block, positive width
// and height, a pitch that holds one row of its pixels, and a block of at most
// kMaxBlockBytes. Records filled in by
// hand that fail this are treated like records without pixels.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>

namespace pxfx {

// Largest pixel block the library creates or accepts, in bytes. Keeping blocks
// below 2^31 keeps every pixel count and byte offset in signed 32-bit range.
inline constexpr uint64_t kMaxBlockBytes = 0x7FFFFFFFu;

// Bytes that one row of `width` pixels needs at `bitCount` bits per pixel. Bit
// counts that the accessors never read from memory need none.
constexpr uint64_t min_row_bytes(uint32_t bitCount, int32_t width) {
    const uint64_t w = width > 0 ? static_cast<uint64_t>(width) : 0;
    switch (bitCount) {
    case 1: return (w + 7) / 8;
    case 4: return (w * 4 + 7) / 8;
    case 8: return w;
    case 16: return w * 2;
    case 24: return w * 3;
    case 32: return w * 4;
    default: return 0;
    }
}

// The bit count malloc_Image stores for a requested one, and the pitch it
// gives a row of `width` pixels (width > 0).
constexpr uint32_t stored_bit_count(int64_t bitCount) {
    return bitCount == 16 || bitCount == 24 || bitCount == 32 ? static_cast<uint32_t>(bitCount) : 8;
}
constexpr uint64_t fresh_pitch(int32_t width, int64_t bitCount) {
    return ((static_cast<uint64_t>(width) * stored_bit_count(bitCount) + 31) / 32) * 4;
}

// True when the record's geometry is usable (pixels may still be null).
// Blocks above kMaxBlockBytes are refused, so for a valid record every pixel
// count and byte offset fits in 31 bits, on 32-bit targets too.
inline bool geometry_ok(const Image *im) {
    return im->width > 0 && im->height > 0 && im->pitch >= min_row_bytes(im->bitCount, im->width) &&
           static_cast<uint64_t>(im->pitch) * static_cast<uint64_t>(im->height) <= kMaxBlockBytes;
}

inline bool has_pixels(const Image *im) { return im != nullptr && im->bits != nullptr && geometry_ok(im); }

// True when the block the record claims, pitch x height bytes (none for a
// height below 1), is one the library handles (at most kMaxBlockBytes).
inline bool block_claim_ok(const Image *im) {
    return im->height <= 0 || static_cast<uint64_t>(im->pitch) * static_cast<uint64_t>(im->height) <= kMaxBlockBytes;
}

// True when a loop over the record's width and height stays inside its block:
// there is no block to touch (null pixels, which the accessors read as 0 and
// the writers skip), no row or column to visit, or a valid geometry. A record
// failing this claims rows its block cannot hold.
inline bool rows_inside(const Image *im) {
    return im->bits == nullptr || im->width <= 0 || im->height <= 0 || geometry_ok(im);
}

// Bytes of the pixel block of a valid record.
inline size_t block_bytes(const Image *im) { return static_cast<size_t>(im->pitch) * static_cast<size_t>(im->height); }

// a * b * c as size_t, or 0 when the product overflows or exceeds kMaxBlockBytes.
constexpr size_t checked_size(uint64_t a, uint64_t b, uint64_t c = 1) {
    if (a == 0 || b == 0 || c == 0) return 0;
    if (a > kMaxBlockBytes || b > kMaxBlockBytes / a) return 0;
    const uint64_t ab = a * b;
    if (c > kMaxBlockBytes / ab) return 0;
    return static_cast<size_t>(ab * c);
}

// Marks a size that does not fit signed 32-bit arithmetic.
inline constexpr int64_t kNoSize = INT64_MIN;

// width x height x unit as signed 32-bit size arithmetic gives it for sizes
// that may be 0 or negative: 0 for an empty size, negative when exactly one
// size is negative, positive when both are. kNoSize when a size, the pixel
// count or the product lies outside the signed 32-bit range (such sizes are
// refused instead of left to wrap).
constexpr int64_t block_size(int64_t width, int64_t height, int32_t unit) {
    constexpr int64_t lo = INT32_MIN, hi = INT32_MAX;
    if (width < lo || width > hi || height < lo || height > hi) return kNoSize;
    const int64_t pixels = width * height;
    if (pixels < -hi || pixels > hi) return kNoSize;
    const int64_t bytes = pixels * unit;
    return bytes < -hi || bytes > hi ? kNoSize : bytes;
}

// True when a work buffer of `bytes` bytes, a count computed in signed
// arithmetic from sizes that may be 0 or negative (or kNoSize), can be had:
// the count is positive (no block is allocated for 0 or below) and at most
// kMaxBlockBytes.
constexpr bool buffer_size_ok(int64_t bytes) { return bytes > 0 && bytes <= static_cast<int64_t>(kMaxBlockBytes); }

} // namespace pxfx
