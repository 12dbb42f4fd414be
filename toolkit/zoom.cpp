// 2x zoom in (rounded averages) and out (decimation), and the zoom of a
// rectangle of one 32-bit image into another, byte plane by byte plane.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cmath>
#include <cstring>

#include "core/internal/memory.hpp"
#include "core/internal/vector_kernels.hpp"
#include "toolkit/pximage_check.hpp"
#include "toolkit/resize_internal.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

// Sample traits: 8-bit and 24-bit pictures average single bytes (three per
// pixel for 24), 16-bit pictures average whole little-endian words.
struct ByteSamples {
    static uint32_t get(const uint8_t *row, size_t i) { return row[i]; }
    static void put(uint8_t *row, size_t i, uint32_t v) { row[i] = static_cast<uint8_t>(v); }
};
struct WordSamples {
    static uint32_t get(const uint8_t *row, size_t i) { return load16(row + 2 * i); }
    static void put(uint8_t *row, size_t i, uint32_t v) { store16(row + 2 * i, v); }
};

constexpr uint32_t rounded_mean(uint32_t a, uint32_t b) { return (a + b + 1) >> 1; }

// Result rows 2y and 2y + 1 come from source rows y and y + 1 (y again at
// the bottom): even columns take pixel X0, odd ones the mean of X0 and X0 + 1
// (held at the last pixel), per sample of C channels; the odd row is the mean
// of both rows' values. The target's vectors do each row but its last pixels.
template <class S, int32_t C> void zoom_in(const View &src, const View &dst) {
    const int32_t w = src.width, h = src.height;
    const vec::ZoomRows vector = vec::zoom_rows(src.bitCount / 8);
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *a = src.row(y), *b = src.row(y + 1 < h ? y + 1 : y);
        uint8_t *even = dst.row(2 * y), *odd = dst.row(2 * y + 1);
        size_t x = vector != nullptr ? vector(a, b, static_cast<size_t>(w), even, odd) : 0;
        for (; x < static_cast<size_t>(w); ++x) {
            const size_t x1 = x + 1 < static_cast<size_t>(w) ? x + 1 : x;
            for (int32_t c = 0; c < C; ++c) {
                const uint32_t a0 = S::get(a, x * C + c), a1 = S::get(a, x1 * C + c);
                const uint32_t b0 = S::get(b, x * C + c), b1 = S::get(b, x1 * C + c);
                const uint32_t ma = rounded_mean(a0, a1), mb = rounded_mean(b0, b1);
                S::put(even, 2 * x * C + c, a0);
                S::put(even, (2 * x + 1) * C + c, ma);
                S::put(odd, 2 * x * C + c, rounded_mean(a0, b0));
                S::put(odd, (2 * x + 1) * C + c, rounded_mean(ma, mb));
            }
        }
    }
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
    switch (from->bitCount) {
    case 8: zoom_in<ByteSamples, 1>(*from, *to); break;
    case 16: zoom_in<WordSamples, 1>(*from, *to); break;
    default: zoom_in<ByteSamples, 3>(*from, *to); break;
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
