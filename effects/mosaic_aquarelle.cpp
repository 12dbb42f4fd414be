// Texture effects: square mosaic blocks and the random watercolour jitter.
#include <pxfx/effects.h>

#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// Sample position of a block whose nominal centre c lies at or beyond the
// edge: halfway between the nominal centre and the edge, (size - half + c) / 2.
int32_t block_sample(int64_t c, int64_t half, int32_t size) {
    return static_cast<int32_t>(c < size ? c : (size - half + c) >> 1);
}

// Blocks of n x n pixels (n >= 1), each the colour of its centre pixel. The
// rows of one band of blocks are identical, so direct formats copy the first.
template <class F> void mosaic(const View &src, const View &dst, int64_t n) {
    const int32_t w = src.width, h = src.height;
    const int64_t half = n / 2;
    const size_t rowBytes = static_cast<size_t>(min_row_bytes(F::kBitCount, w));
    for (int32_t y0 = 0, bandEnd = 0; y0 < h; y0 = bandEnd) {
        bandEnd = n < h - y0 ? static_cast<int32_t>(y0 + n) : h;
        const typename F::CRow sample = F::crow(src, block_sample(y0 + half, half, h));
        for (int32_t y = y0; y < bandEnd; ++y) {
            const typename F::Row out = F::row(dst, y);
            if (F::kDirect && y > y0) {
                std::memcpy(dst.row(y), dst.row(y0), rowBytes);
                continue;
            }
            for (int64_t x0 = 0; x0 < w; x0 += n) {
                const uint32_t c = F::load(sample, block_sample(x0 + half, half, w));
                const int32_t end = n < w - x0 ? static_cast<int32_t>(x0 + n) : w;
                for (int32_t x = static_cast<int32_t>(x0); x < end; ++x)
                    F::store(out, x, c);
            }
        }
    }
}

// A negative n: only a picture one pixel wide gets a row of block colours
// (see PX_IMG_Mosaic), and its pixel lies in block 0 / n = 0. That block is
// refilled every -n rows from y0 with the colour at (n / 2, y0 + n / 2),
// clamped.
template <class F> void mosaic_column(const View &src, const View &dst, int32_t n) {
    const int32_t half = n / 2, x = clamp_coord(half, src.width);
    uint32_t c = 0;
    for (int32_t y = 0; y < src.height; ++y) {
        if (y % n == 0) c = F::load(F::crow(src, clamp_coord(int64_t{y} + half, src.height)), x);
        F::store(F::row(dst, y), 0, c);
    }
}

// Each pixel takes the colour at (x + a, y + b), clamped, for two draws a, b
// of PX_rand(range) in that order; a is reset to 0 when either is negative.
template <class F> void aquarelle(const View &src, const View &dst, int32_t range) {
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y < h; ++y) {
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < w; ++x) {
            int32_t a = PX_rand(range);
            const int32_t b = PX_rand(range);
            if (a < 0 || b < 0) a = 0;
            const typename F::CRow in = F::crow(src, clamp_coord(static_cast<int64_t>(y) + b, h));
            F::store(out, x, F::load(in, clamp_coord(static_cast<int64_t>(x) + a, w)));
        }
    }
}

} // namespace

extern "C" {

uint32_t PX_IMG_Mosaic(Image *src, Image **dst, int32_t n) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    // The row of block colours has (width + n - 1) / n entries: none for
    // n = 0 (no block size), and a row of no entries or fewer cannot be had.
    if (n == 0 || (int64_t{src->width} + n - 1) / n <= 0) return 0;
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    with_format(from.bitCount, [&](auto f) {
        if (n > 0)
            mosaic<decltype(f)>(from, *to, n);
        else
            mosaic_column<decltype(f)>(from, *to, n);
    });
    return 1;
}

uint32_t PX_IMG_Aquarelle(Image *src, Image **dst, int32_t range) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        with_format(from.bitCount, [&](auto f) { aquarelle<decltype(f)>(from, to, range); });
    });
}

} // extern "C"
