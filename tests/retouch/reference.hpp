// Straightforward accessor versions of the retouch tools and portrait-like
// test pictures, shared by the retouch tests.
#pragma once

#include "support/reference_check.hpp"

namespace rtest {

using pxtest::chan;
using pxtest::Owned;

// Skin-coloured noise with dark blobs and gaps, so that masks, runs and
// holes of every length occur.
inline Owned skin_picture(int32_t w, int32_t h, int32_t bitCount, uint32_t seed) {
    Owned im = pxtest::make(w, h, bitCount);
    std::mt19937 rng(seed);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t k = rng() % 100, r = k < 2 ? 40 + rng() % 15 : 120 + rng() % 120, b = 40 + rng() % 60;
            const uint32_t g = k < 5 ? std::min<uint32_t>(r + rng() % 10, 255) : 60 + rng() % 60; // greener or skin
            SetPixelColor(im.get(), x, y, k < 8 ? rng() % 60 * 0x010101u : b | g << 8 | r << 16 | rng() << 24);
        }
    return im;
}

// The skin mask, pass by pass with the accessors.
inline Owned ref_mask(const Image *src) {
    const int32_t w = src->width, h = src->height;
    Owned m = pxtest::make(w, h, 8);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = GetPixelColor(src, x, y);
            const int b = chan(c, 0), g = chan(c, 8), r = chan(c, 16);
            SetPixelIndex(m.get(), x, y, r >= g && r >= b && r > 49 ? g : 0);
        }
    for (int32_t y = 0; y < h; ++y) // skin runs of 1 to 19 go; the last column ends a run
        for (int32_t x = 0, run = 0; x < w; ++x, ++run)
            if (GetPixelIndex(m.get(), x, y) == 0 || x == w - 1) {
                for (int32_t i = x - run; i < x && run <= 19; ++i)
                    SetPixelIndex(m.get(), i, y, 0);
                run = -1;
            }
    for (int32_t y = 5; y < h - 6; ++y)
        for (int32_t x = 5; x < w - 6; ++x) {
            int zeros = 0;
            for (int32_t d = 0; d < 121; ++d)
                zeros += GetPixelIndex(m.get(), x + d % 11 - 5, y + d / 11 - 5) == 0;
            if (zeros) SetPixelIndex(m.get(), x, y, 1);
        }
    for (int32_t y = 1; y < h - 1; ++y)
        for (int32_t x = 1; x < w - 1; ++x)
            if (GetPixelIndex(m.get(), x, y) == 1) SetPixelIndex(m.get(), x, y, 0);
    return m;
}

// The window list of a pixel, sorted largest first, with its size.
struct Window {
    int32_t list[1024] = {};
    int32_t n = 0;
};

inline Window window(const Image *im, int32_t x, int32_t y, int32_t size) {
    Window win;
    const int32_t half = size / 2, e = size - half;
    for (int32_t dx = -half; dx < e; ++dx)
        for (int32_t dy = -half; dy < e; ++dy)
            win.list[win.n++] = GetPixelIndex(im, x + dx, y + dy);
    Sort_largelow(win.list, win.n);
    return win;
}

inline uint32_t lift(uint32_t c, int d, double wb, double wg, double wr) {
    auto one = [&](int v, double w) {
        const double r = v + w * d;
        return r > 255.0 ? 255u : static_cast<uint32_t>(r);
    };
    return one(chan(c, 0), wb) | one(chan(c, 8), wg) << 8 | one(chan(c, 16), wr) << 16 | (c & 0xFF000000u);
}

inline Owned ref_smooth_1(const Image *src) {
    const int32_t w = src->width, h = src->height;
    Owned mask = ref_mask(src);
    Owned out = pxtest::make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const int32_t c = GetPixelIndex(mask.get(), x, y);
            int d = 0;
            if (c != 0) {
                const Window win = window(mask.get(), x, y, 5);
                if (getpos(win.list, 25, c) >= 3) d = (win.list[1] - c) & 255;
            }
            const uint32_t col = GetPixelColor(src, x, y);
            SetPixelColor(out.get(), x, y, d != 0 ? lift(col, d, 0.8, 0.8, 0.7) : col);
        }
    return out;
}

// src with blue, green and red of every pixel replaced by fn(value); alpha kept.
template <class Fn> Owned mapped(const Image *src, Fn fn) {
    return pxtest::per_pixel(src, [&](uint32_t c, int, int) {
        return pxtest::rgba(fn(chan(c, 0)), fn(chan(c, 8)), fn(chan(c, 16)), chan(c, 24));
    });
}

inline uint32_t distance(int64_t dx, int64_t dy) {
    return Distance2D(static_cast<int32_t>(std::llabs(dx)), static_cast<int32_t>(std::llabs(dy)));
}

} // namespace rtest
