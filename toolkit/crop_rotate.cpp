// Crop of a bottom-up rectangle and rotation by quarter turns. Pixels move
// whole (1, 2 or 3 bytes); crops are row copies and the quarter turns walk
// the picture in square tiles so both sides stay in cache.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cstring>

#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

bool geometry_input_ok(const PXImage *src) {
    return px_usable(src) && (src->bitcount == 8 || src->bitcount == 16 || src->bitcount == 24);
}

constexpr int32_t kTile = 32;

// Quarter turn of a w x h picture into rows of `outWidth` pixels. With
// `clockwise` false result pixel (i, j) is source (j, w - 1 - i); with true it
// is source (h - 1 - j, i). Columns h and beyond are cleared.
template <int32_t B>
void quarter_turn(const uint8_t *src, int32_t w, int32_t h, uint8_t *dst, int32_t outWidth, bool clockwise) {
    const size_t srcRow = static_cast<size_t>(w) * B, dstRow = static_cast<size_t>(outWidth) * B;
    for (int32_t ib = 0; ib < w; ib += kTile) {
        const int32_t iEnd = std::min(w, ib + kTile);
        for (int32_t jb = 0; jb < h; jb += kTile) {
            const int32_t jEnd = std::min(h, jb + kTile);
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
    if (outWidth > h)
        for (int32_t i = 0; i < w; ++i)
            std::memset(dst + i * dstRow + static_cast<size_t>(h) * B, 0, static_cast<size_t>(outWidth - h) * B);
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
