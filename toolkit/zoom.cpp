// 2x zoom in (rounded averages) and out (decimation), and the zoom of a
// rectangle of one 32-bit image into another, byte plane by byte plane.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cmath>
#include <cstring>

#include "core/internal/memory.hpp"
#include "toolkit/pximage_check.hpp"
#include "toolkit/resize_internal.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

// Sample traits: 8-bit and 24-bit pictures average single bytes (three per
// pixel for 24), 16-bit pictures average whole little-endian words.
struct ByteSamples {
    using T = uint8_t;
    static uint32_t get(const uint8_t *row, size_t i) { return row[i]; }
    static void put(uint8_t *row, size_t i, uint32_t v) { row[i] = static_cast<uint8_t>(v); }
};
struct WordSamples {
    using T = uint16_t;
    static uint32_t get(const uint8_t *row, size_t i) { return load16(row + 2 * i); }
    static void put(uint8_t *row, size_t i, uint32_t v) { store16(row + 2 * i, v); }
};

// Doubles one source row horizontally: even columns copy X0, odd columns
// average X0 and X0 + 1 (held at the last pixel), per sample of C channels.
// The samples keep their type: an average of two fits it.
template <class S, int32_t C> void widen_row(const uint8_t *in, int32_t w, typename S::T *out) {
    using T = typename S::T;
    for (int32_t x = 0; x < w; ++x) {
        const int32_t x1 = x + 1 < w ? x + 1 : w - 1;
        for (int32_t c = 0; c < C; ++c) {
            const uint32_t a = S::get(in, static_cast<size_t>(x) * C + c);
            const uint32_t b = S::get(in, static_cast<size_t>(x1) * C + c);
            out[static_cast<size_t>(2 * x) * C + c] = static_cast<T>(a);
            out[static_cast<size_t>(2 * x + 1) * C + c] = static_cast<T>((a + b + 1) >> 1);
        }
    }
}

template <class S, int32_t C> bool zoom_in(const View &src, const View &dst) {
    using T = typename S::T;
    const int32_t w = src.width, h = src.height;
    const size_t n = static_cast<size_t>(2 * static_cast<int64_t>(w)) * C;
    Buffer<T> rows = alloc_buffer<T>(2 * n);
    if (!rows) return false;
    T *top = rows.get(), *bottom = top + n;
    widen_row<S, C>(src.row(0), w, top);
    for (int32_t a = 0; a < h; ++a) {
        const int32_t b = a + 1 < h ? a + 1 : a;
        widen_row<S, C>(src.row(b), w, bottom);
        uint8_t *even = dst.row(2 * a);
        uint8_t *odd = dst.row(2 * a + 1);
        for (size_t i = 0; i < n; ++i) {
            S::put(even, i, top[i]);
            S::put(odd, i, (static_cast<uint32_t>(top[i]) + bottom[i] + 1) >> 1);
        }
        std::swap(top, bottom);
    }
    return true;
}

template <int32_t B> void zoom_out(const View &src, const View &dst) {
    const int32_t w = src.width, dw = dst.width;
    for (int32_t y = 0; y < dst.height; ++y) {
        const uint8_t *in = src.row(2 * y);
        uint8_t *out = dst.row(y);
        for (int32_t x = 0; x < dw; ++x) {
            const int64_t sx = std::min<int64_t>(2 * int64_t{x}, w - 1);
            std::memcpy(out + static_cast<size_t>(x) * B, in + static_cast<size_t>(sx) * B, B);
        }
    }
}

bool zoom_bits(const PXImage *src) { return src->bitcount == 8 || src->bitcount == 16 || src->bitcount == 24; }

// Rectangle zoom: byte b of the source, gathered from row `startRow`, column
// x on, w' bytes a row for as many rows as the source has, in a plane that
// the interpolation reads as source width x source height. Positions outside
// the source block, and plane bytes the gather does not reach (all of them
// for w' below 1), read as 0.
void gather_plane(const View &src, int64_t startRow, int64_t x, int64_t gatherWidth, int32_t b, uint8_t *plane) {
    const int64_t sw = src.width, sh = src.height, pixels = sw * sh;
    const uint8_t *block = src.bits;
    const int64_t size = sw * sh, filled = gatherWidth > 0 ? std::min(size, gatherWidth * sh) : 0;
    for (int64_t i = 0; i < filled; ++i) {
        const int64_t r = i / gatherWidth, k = i % gatherWidth;
        const int64_t p = (startRow + r) * sw + x + k;
        plane[i] = p >= 0 && p < pixels ? block[p * 4 + b] : 0;
    }
    std::memset(plane + filled, 0, static_cast<size_t>(size - filled));
}

// The four byte planes of the rectangle, rw x rh bytes each, one after the
// other. A source without data or pixel rows gives the interpolation nothing
// it reads (it refuses an empty or negative source), so the planes stay 0.
bool zoom_planes(const PXImage *src, int64_t startRow, int64_t x, int64_t gatherWidth, int32_t rw, int32_t rh,
                 uint8_t *out) {
    const size_t outSize = static_cast<size_t>(rw) * static_cast<size_t>(rh);
    const std::optional<View> v = view_of(src);
    if (!v) {
        std::memset(out, 0, outSize * 4);
        return true;
    }
    Buffer<uint8_t> plane = alloc_buffer<uint8_t>(v->block_bytes() / 4);
    if (!plane) return false;
    const float ry = static_cast<float>(v->height) / static_cast<float>(rh);
    const float rx = static_cast<float>(v->width) / static_cast<float>(rw);
    for (int32_t b = 0; b < 4; ++b) {
        gather_plane(*v, startRow, x, gatherWidth, b, plane.get());
        if (!interpolate_plane(plane.get(), v->width, v->height, out + outSize * b, rw, rh, 1, ry, rx)) return false;
    }
    return true;
}

} // namespace

extern "C" {

PXImage *PXImage_ZoomIn(const PXImage *src) {
    if (src == nullptr || src->data == nullptr || !zoom_bits(src) || !px_rows_inside(src)) return nullptr;
    PXImage *out = px_new(2 * int64_t{src->width}, 2 * int64_t{src->height}, src->bitcount);
    // None made, or both sizes negative: no rows to fill, the block stays
    // cleared. A result with rows has them because the source has.
    const std::optional<View> to = view_of(out), from = view_of(src);
    if (!to || !from) return out;
    bool ok;
    switch (from->bitCount) {
    case 8: ok = zoom_in<ByteSamples, 1>(*from, *to); break;
    case 16: ok = zoom_in<WordSamples, 1>(*from, *to); break;
    default: ok = zoom_in<ByteSamples, 3>(*from, *to); break;
    }
    if (!ok) {
        PXImage_Free(out);
        return nullptr;
    }
    return out;
}

PXImage *PXImage_ZoomOut(const PXImage *src) {
    if (src == nullptr || !zoom_bits(src) || !px_rows_inside(src)) return nullptr;
    PXImage *out = px_new(floor8(src->width / 2 + 7), src->height / 2, src->bitcount);
    // None made, or both result sizes negative: no rows to fill, the block
    // stays cleared.
    const std::optional<View> to = view_of(out);
    if (!to) return out;
    // A source without data has no pixels to take: the result is cleared.
    // One with data has rows, as the result has.
    const std::optional<View> from = view_of(src);
    if (!from) {
        std::memset(to->bits, 0, to->block_bytes());
        return out;
    }
    switch (from->bitCount) {
    case 8: zoom_out<1>(*from, *to); break;
    case 16: zoom_out<2>(*from, *to); break;
    default: zoom_out<3>(*from, *to); break;
    }
    return out;
}

int32_t PXImage_ROI_Zoom(const PXImage *src, PXImage *dst, const PXRect *rect, double scale, int32_t x, int32_t y) {
    if (dst == nullptr || src == nullptr || rect == nullptr || x < 0 || y < 0) return 0;
    const int64_t rectWidth = int64_t{rect->right} - rect->left, rectHeight = int64_t{rect->top} - rect->bottom;
    if (rectWidth == 0 || rectHeight == 0 || src->bitcount != 32 || dst->bitcount != 32) return 0;
    if (!(std::fabs(scale) >= 1e-13) || !px_rows_inside(src) || !px_rows_inside(dst)) return 0;
    // The gather plane of w' x h' and the output plane of the rectangle's
    // size: a count of 0 or below gets no block from PX_malloc, so the call
    // fails; counts beyond 32 bits are refused.
    const auto gatherWidth = trunc_sat<int32_t>(static_cast<double>(rectWidth) / scale + 0.5);
    const auto gatherHeight = trunc_sat<int32_t>(static_cast<double>(rectHeight) / scale + 0.5);
    const int64_t outBytes = block_size(rectWidth, rectHeight, 1);
    if (!buffer_size_ok(block_size(gatherWidth, gatherHeight, 1)) || !buffer_size_ok(outBytes)) return 0;
    // Both rectangle sizes negative: the interpolation and the writes have
    // empty loops. A target without data or pixel rows takes no writes.
    // Either way nothing gathered would be seen.
    const std::optional<View> to = view_of(dst);
    if (rectWidth < 0 || !to) return 1;
    const int64_t startRow = trunc_sat<int32_t>(static_cast<double>(y) / scale + 0.5);
    // All four planes are interpolated before the target is written, so a
    // failure leaves it unchanged. Plane b of the gather reads source byte b
    // only, so a target sharing the source's block gives the same result.
    const auto rw = static_cast<int32_t>(rectWidth), rh = static_cast<int32_t>(rectHeight);
    const size_t outSize = static_cast<size_t>(outBytes);
    if (checked_size(outSize, 4) == 0) return 0;
    Buffer<uint8_t> out = alloc_buffer<uint8_t>(outSize * 4);
    if (!out || !zoom_planes(src, startRow, x, gatherWidth, rw, rh, out.get())) return 0;
    // Rows of the target run on into the next row past the row end, as in
    // the packed block; pixels past the block end are not written.
    const int64_t dw = to->width, dstPixels = static_cast<int64_t>(to->block_bytes() / 4);
    uint8_t *block = to->bits;
    for (int32_t b = 0; b < 4; ++b)
        for (int64_t r = 0; r < rh; ++r)
            for (int64_t c = 0; c < rw; ++c) {
                const int64_t p = (y + r) * dw + x + c;
                if (p >= dstPixels) break;
                block[p * 4 + b] = out[outSize * b + static_cast<size_t>(r * rw + c)];
            }
    return 1;
}

} // extern "C"
