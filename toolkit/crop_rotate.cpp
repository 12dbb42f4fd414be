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

bool geometry_bits(const PXImage *src) { return src->bitcount == 8 || src->bitcount == 16 || src->bitcount == 24; }

// The turns refuse a null record, null data and other bit counts.
bool turn_input_ok(const PXImage *src) {
    return src != nullptr && src->data != nullptr && geometry_bits(src) && px_rows_inside(src);
}

// v held to 0 .. n - 1 with the crop's rule: below 0 gives 0, n or above gives
// n - 1 (so for n <= 0 every value gives 0 or n - 1).
constexpr int64_t hold(int64_t v, int64_t n) { return v < 0 ? 0 : (v >= n ? n - 1 : v); }

constexpr int32_t kTile = 32;

// Quarter turn of a w x h picture into the rows of dst (as many as the
// source has columns), result rows i0 .. i1 - 1 and columns j0 .. j1 - 1.
// With `clockwise` false result pixel (i, j) is source (j, w - 1 - i); with
// true it is source (h - 1 - j, i).
template <int32_t B>
void quarter_turn_pixels(const View &src, const View &dst, bool clockwise, int32_t i0, int32_t i1, int32_t j0,
                         int32_t j1) {
    // Local copies: the byte copies below cannot then change the views, so
    // their fields stay in registers.
    const View in = src, out = dst;
    const int32_t w = in.width, h = in.height;
    for (int32_t ib = i0; ib < i1; ib += kTile) {
        const int32_t iEnd = std::min(i1, ib + kTile);
        for (int32_t jb = j0; jb < j1; jb += kTile) {
            const int32_t jEnd = std::min(j1, jb + kTile);
            for (int32_t i = ib; i < iEnd; ++i) {
                uint8_t *row = out.row(i);
                for (int32_t j = jb; j < jEnd; ++j) {
                    const int32_t sy = clockwise ? h - 1 - j : j;
                    const int32_t sx = clockwise ? i : w - 1 - i;
                    std::memcpy(row + static_cast<size_t>(j) * B, in.row(sy) + static_cast<size_t>(sx) * B, B);
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
template <bool Clockwise> void quarter_turn_blocks(const View &src, const View &dst) {
    // Local copies, as in quarter_turn_pixels.
    const View in = src, out = dst;
    const int32_t w = in.width, h = in.height;
    const int32_t w8 = w / 8 * 8, h8 = h / 8 * 8;
    for (int32_t ib = 0; ib < w8; ib += kTile)
        for (int32_t jb = 0; jb < h8; jb += kTile)
            for (int32_t i0 = ib; i0 < std::min(w8, ib + kTile); i0 += 8)
                for (int32_t j0 = jb; j0 < std::min(h8, jb + kTile); j0 += 8) {
                    uint64_t r[8];
                    for (int b = 0; b < 8; ++b) {
                        const int32_t sy = Clockwise ? h - 1 - j0 - b : j0 + b;
                        const int32_t sx = Clockwise ? i0 : w - 8 - i0;
                        std::memcpy(&r[b], in.row(sy) + sx, 8);
                    }
                    transpose8(r);
                    for (int a = 0; a < 8; ++a)
                        std::memcpy(out.row(i0 + a) + j0, &r[Clockwise ? a : 7 - a], 8);
                }
}

// The turn of src into dst, whose rows of dst.width pixels are at least as
// wide as src is high; the columns right of that are cleared.
template <int32_t B> void quarter_turn(const View &src, const View &dst, bool clockwise) {
    const int32_t w = src.width, h = src.height;
    if constexpr (B == 1 && std::endian::native == std::endian::little) {
        if (clockwise)
            quarter_turn_blocks<true>(src, dst);
        else
            quarter_turn_blocks<false>(src, dst);
        // Result columns h8.. of every row and rows w8.. of the first h8 columns.
        const int32_t w8 = w / 8 * 8, h8 = h / 8 * 8;
        quarter_turn_pixels<1>(src, dst, clockwise, 0, w, h8, h);
        quarter_turn_pixels<1>(src, dst, clockwise, w8, w, 0, h8);
    } else {
        quarter_turn_pixels<B>(src, dst, clockwise, 0, w, 0, h);
    }
    if (dst.width > h)
        for (int32_t i = 0; i < w; ++i)
            std::memset(dst.row(i) + static_cast<size_t>(h) * B, 0, static_cast<size_t>(dst.width - h) * B);
}

PXImage *rotate_quarter(const PXImage *src, bool clockwise) {
    if (!turn_input_ok(src)) return nullptr;
    PXImage *out = px_new(floor8(int64_t{src->height} + 7), src->width, src->bitcount);
    // None made, or both sizes negative: no rows to turn, the block stays
    // cleared. A result with rows has them because the source has.
    const std::optional<View> to = view_of(out), from = view_of(src);
    if (!to || !from) return out;
    switch (from->bitCount) {
    case 8: quarter_turn<1>(*from, *to, clockwise); break;
    case 16: quarter_turn<2>(*from, *to, clockwise); break;
    default: quarter_turn<3>(*from, *to, clockwise); break;
    }
    return out;
}

// The 2-byte units of a word in reverse order, and then also the bytes of
// each unit (compilers turn the second into one byte-swap instruction).
constexpr uint64_t reverse_units(uint64_t v) {
    v = v >> 32 | v << 32;
    return (v >> 16 & 0x0000FFFF0000FFFFu) | (v & 0x0000FFFF0000FFFFu) << 16;
}
constexpr uint64_t reverse_bytes(uint64_t v) {
    v = reverse_units(v);
    return (v >> 8 & 0x00FF00FF00FF00FFu) | (v & 0x00FF00FF00FF00FFu) << 8;
}

template <int32_t B> void half_turn(const View &src, const View &dst) {
    const int32_t w = src.width, h = src.height;
    for (int32_t i = 0; i < h; ++i) {
        const uint8_t *in = src.row(h - 1 - i);
        uint8_t *out = dst.row(i);
        int32_t j = 0;
        if constexpr (B == 1 || B == 2) {
            // Eight bytes at a time: the pixels of a word in reverse order.
            constexpr int32_t kPerWord = 8 / B;
            for (; j + kPerWord <= w; j += kPerWord) {
                uint64_t v;
                std::memcpy(&v, in + static_cast<size_t>(w - j - kPerWord) * B, 8);
                v = B == 1 ? reverse_bytes(v) : reverse_units(v);
                std::memcpy(out + static_cast<size_t>(j) * B, &v, 8);
            }
        }
        for (; j < w; ++j)
            std::memcpy(out + static_cast<size_t>(j) * B, in + static_cast<size_t>(w - 1 - j) * B, B);
    }
}

} // namespace

extern "C" {

PXImage *PXImage_Crop(const PXImage *src, const PXRect *rect) {
    if (rect == nullptr || src == nullptr || !geometry_bits(src) || !px_rows_inside(src)) return nullptr;
    const int64_t w = src->width, h = src->height;
    const int32_t bpp = px_bytes(src->bitcount);
    const int64_t L = hold(rect->left, w), R = hold(rect->right, w);
    const int64_t T = hold(rect->top, h), B = hold(rect->bottom, h);
    int64_t W = floor8(R - L + 8);
    if (W > w) W = w;
    if (W < 0) W = 0;
    const int64_t H = T - B + 1;
    const int64_t bytes = block_size(W, H, bpp);
    if (bytes == kNoSize) return nullptr;
    // An empty width or a height of 0 or below asks for no block (data null)
    // and copies nothing.
    PXImage *out = px_record(W, H, src->bitcount, bytes);
    const std::optional<View> to = view_of(out);
    if (!to) return out;
    // Each row copy is W pixels from column L of the packed block; past the
    // row end it continues on the next source row. Bytes outside the block
    // read as 0: past its end, and all of them for a source without data or
    // pixel rows (whose held rows can lie before the block).
    const std::optional<View> from = view_of(src);
    const size_t block = from ? from->block_bytes() : 0, rowBytes = to->pitch;
    for (int64_t r = B; r <= T; ++r) {
        uint8_t *row = to->row(static_cast<int32_t>(r - B));
        size_t n = 0;
        if (block != 0) {
            const size_t start = static_cast<size_t>(r * w + L) * bpp;
            n = std::min(rowBytes, block - start);
            std::memcpy(row, from->bits + start, n);
        }
        std::memset(row + n, 0, rowBytes - n);
    }
    return out;
}

PXImage *PXImage_Rotate90(const PXImage *src) { return rotate_quarter(src, false); }

PXImage *PXImage_Rotate270(const PXImage *src) { return rotate_quarter(src, true); }

PXImage *PXImage_Rotate180(const PXImage *src) {
    if (!turn_input_ok(src)) return nullptr;
    PXImage *out = px_new(src->width, src->height, src->bitcount);
    // None made, or both sizes negative: no rows to turn, the block stays
    // cleared. A result with rows has them because the source has.
    const std::optional<View> to = view_of(out), from = view_of(src);
    if (!to || !from) return out;
    switch (from->bitCount) {
    case 8: half_turn<1>(*from, *to); break;
    case 16: half_turn<2>(*from, *to); break;
    default: half_turn<3>(*from, *to); break;
    }
    return out;
}

} // extern "C"
