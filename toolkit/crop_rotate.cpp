// Crop of a bottom-up rectangle and rotation by quarter turns. Pixels move
// whole (1, 2 or 3 bytes); crops are row copies and the quarter turns walk
// the picture in square tiles so both sides stay in cache, 8-bit pictures
// in 8 x 8 blocks transposed in registers.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <bit>
#include <cstring>

#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

bool geometry_input_ok(const PXImage *src) {
    return px_usable(src) && (src->bitcount == 8 || src->bitcount == 16 || src->bitcount == 24);
}

constexpr int32_t kTile = 32;

// Quarter turn of a w x h picture into rows of `outWidth` pixels, result rows
// i0 .. i1 - 1 and columns j0 .. j1 - 1. With `clockwise` false result pixel
// (i, j) is source (j, w - 1 - i); with true it is source (h - 1 - j, i).
template <int32_t B>
void quarter_turn_pixels(const uint8_t *src, int32_t w, int32_t h, uint8_t *dst, int32_t outWidth, bool clockwise,
                         int32_t i0, int32_t i1, int32_t j0, int32_t j1) {
    const size_t srcRow = static_cast<size_t>(w) * B, dstRow = static_cast<size_t>(outWidth) * B;
    for (int32_t ib = i0; ib < i1; ib += kTile) {
        const int32_t iEnd = std::min(i1, ib + kTile);
        for (int32_t jb = j0; jb < j1; jb += kTile) {
            const int32_t jEnd = std::min(j1, jb + kTile);
            for (int32_t i = ib; i < iEnd; ++i) {
                uint8_t *out = dst + static_cast<size_t>(i) * dstRow;
                for (int32_t j = jb; j < jEnd; ++j) {
                    const int32_t sy = clockwise ? h - 1 - j : j;
                    const int32_t sx = clockwise ? i : w - 1 - i;
                    std::memcpy(out + static_cast<size_t>(j) * B, src + sy * srcRow + static_cast<size_t>(sx) * B, B);
                }
            }
        }
    }
}

// Transposes the 8 x 8 bytes held in eight little-endian words (byte k of
// word r is column k of row r) by swapping ever smaller off-diagonal blocks.
inline void transpose8(uint64_t (&r)[8]) {
    for (int i = 0; i < 4; ++i) {
        const uint64_t t = ((r[i] >> 32) ^ r[i + 4]) & 0x00000000FFFFFFFFu;
        r[i + 4] ^= t;
        r[i] ^= t << 32;
    }
    for (int i : {0, 1, 4, 5}) {
        const uint64_t t = ((r[i] >> 16) ^ r[i + 2]) & 0x0000FFFF0000FFFFu;
        r[i + 2] ^= t;
        r[i] ^= t << 16;
    }
    for (int i = 0; i < 8; i += 2) {
        const uint64_t t = ((r[i] >> 8) ^ r[i + 1]) & 0x00FF00FF00FF00FFu;
        r[i + 1] ^= t;
        r[i] ^= t << 8;
    }
}

// The 8-bit quarter turns on whole 8 x 8 blocks: eight source rows read as
// words, transposed, written as eight result rows. Returns how many result
// rows (a multiple of 8) and columns were done; the rest is left to the
// pixel loop.
template <bool Clockwise>
void quarter_turn_blocks(const uint8_t *src, int32_t w, int32_t h, uint8_t *dst, int32_t outWidth) {
    const int32_t w8 = w / 8 * 8, h8 = h / 8 * 8;
    for (int32_t ib = 0; ib < w8; ib += kTile)
        for (int32_t jb = 0; jb < h8; jb += kTile)
            for (int32_t i0 = ib; i0 < std::min(w8, ib + kTile); i0 += 8)
                for (int32_t j0 = jb; j0 < std::min(h8, jb + kTile); j0 += 8) {
                    uint64_t r[8];
                    for (int b = 0; b < 8; ++b) {
                        const int32_t sy = Clockwise ? h - 1 - j0 - b : j0 + b;
                        const int32_t sx = Clockwise ? i0 : w - 8 - i0;
                        std::memcpy(&r[b], src + static_cast<size_t>(sy) * w + sx, 8);
                    }
                    transpose8(r);
                    for (int a = 0; a < 8; ++a)
                        std::memcpy(dst + static_cast<size_t>(i0 + a) * outWidth + j0, &r[Clockwise ? a : 7 - a], 8);
                }
}

template <int32_t B>
void quarter_turn(const uint8_t *src, int32_t w, int32_t h, uint8_t *dst, int32_t outWidth, bool clockwise) {
    if constexpr (B == 1 && std::endian::native == std::endian::little) {
        if (clockwise)
            quarter_turn_blocks<true>(src, w, h, dst, outWidth);
        else
            quarter_turn_blocks<false>(src, w, h, dst, outWidth);
        // Result columns h8.. of every row and rows w8.. of the first h8 columns.
        const int32_t w8 = w / 8 * 8, h8 = h / 8 * 8;
        quarter_turn_pixels<1>(src, w, h, dst, outWidth, clockwise, 0, w, h8, h);
        quarter_turn_pixels<1>(src, w, h, dst, outWidth, clockwise, w8, w, 0, h8);
    } else {
        quarter_turn_pixels<B>(src, w, h, dst, outWidth, clockwise, 0, w, 0, h);
    }
    if (outWidth > h)
        for (int32_t i = 0; i < w; ++i)
            std::memset(dst + i * static_cast<size_t>(outWidth) * B + static_cast<size_t>(h) * B, 0,
                        static_cast<size_t>(outWidth - h) * B);
}

PXImage *rotate_quarter(const PXImage *src, bool clockwise) {
    if (!geometry_input_ok(src)) return nullptr;
    const int32_t w = src->width, h = src->height;
    const int64_t outWidth = (int64_t{h} + 7) / 8 * 8;
    PXImage *out = px_new(outWidth, w, src->bitcount);
    if (out == nullptr) return nullptr;
    const auto ow = static_cast<int32_t>(outWidth);
    switch (src->bitcount) {
    case 8: quarter_turn<1>(src->data, w, h, out->data, ow, clockwise); break;
    case 16: quarter_turn<2>(src->data, w, h, out->data, ow, clockwise); break;
    default: quarter_turn<3>(src->data, w, h, out->data, ow, clockwise); break;
    }
    return out;
}

template <int32_t B> void half_turn(const uint8_t *src, int32_t w, int32_t h, uint8_t *dst) {
    const size_t row = static_cast<size_t>(w) * B;
    for (int32_t i = 0; i < h; ++i) {
        const uint8_t *in = src + static_cast<size_t>(h - 1 - i) * row;
        uint8_t *out = dst + static_cast<size_t>(i) * row;
        for (int32_t j = 0; j < w; ++j)
            std::memcpy(out + static_cast<size_t>(j) * B, in + static_cast<size_t>(w - 1 - j) * B, B);
    }
}

} // namespace

extern "C" {

PXImage *PXImage_Crop(const PXImage *src, const PXRect *rect) {
    if (rect == nullptr || !geometry_input_ok(src)) return nullptr;
    const int32_t w = src->width, h = src->height, bpp = px_bytes(src->bitcount);
    const int32_t L = clamp_coord(rect->left, w), R = clamp_coord(rect->right, w);
    const int32_t T = clamp_coord(rect->top, h), B = clamp_coord(rect->bottom, h);
    int32_t W = (R - L + 8) / 8 * 8;
    if (W > w) W = w;
    const int32_t H = T - B + 1;
    if (W <= 0 || H <= 0) return nullptr;
    PXImage *out = px_new(W, H, src->bitcount);
    if (out == nullptr) return nullptr;
    // Each row copy is W pixels from column L of the packed block; past the
    // row end it continues on the next source row, and past the block end
    // the result is cleared.
    const size_t block = px_block(src), rowBytes = static_cast<size_t>(W) * bpp;
    for (int32_t r = B; r <= T; ++r) {
        const size_t from = (static_cast<size_t>(r) * w + L) * bpp;
        const size_t n = std::min(rowBytes, block - from);
        uint8_t *to = out->data + static_cast<size_t>(r - B) * rowBytes;
        std::memcpy(to, src->data + from, n);
        std::memset(to + n, 0, rowBytes - n);
    }
    return out;
}

PXImage *PXImage_Rotate90(const PXImage *src) { return rotate_quarter(src, false); }

PXImage *PXImage_Rotate270(const PXImage *src) { return rotate_quarter(src, true); }

PXImage *PXImage_Rotate180(const PXImage *src) {
    if (!geometry_input_ok(src)) return nullptr;
    PXImage *out = px_new(src->width, src->height, src->bitcount);
    if (out == nullptr) return nullptr;
    switch (src->bitcount) {
    case 8: half_turn<1>(src->data, src->width, src->height, out->data); break;
    case 16: half_turn<2>(src->data, src->width, src->height, out->data); break;
    default: half_turn<3>(src->data, src->width, src->height, out->data); break;
    }
    return out;
}

} // extern "C"
