// Pencil sketch: colour dodge of the gray picture with its blurred negative,
// optionally darkened along edges; and the byte-plane kernel sum temp_ex.
#include <pxfx/effects.h>

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

const int32_t kLeftMinusRight[9] = {1, 1, 1, 0, 0, 0, -1, -1, -1};
const int32_t kUpperMinusLower[9] = {1, 0, -1, 1, 0, -1, 1, 0, -1};

// Largest value of the blurred negative: trunc(9 * 255 / 9.3).
constexpr int32_t kMaxBlur = 246;

// Dodge and cube law of the composed value v = a + a b / (256 - b):
// trunc((float)v * (float)(v v / 255.0 / 255.0)), capped at 255.
struct SketchTables {
    uint8_t blur[9 * 255 + 1];
    uint8_t cube[255 + 255 * kMaxBlur / (256 - kMaxBlur) + 1];
    SketchTables() {
        for (int32_t s = 0; s <= 9 * 255; ++s)
            blur[s] = static_cast<uint8_t>(static_cast<int32_t>(s / 9.3));
        for (int32_t v = 0; v < static_cast<int32_t>(sizeof cube); ++v) {
            const float q = static_cast<float>(static_cast<double>(v * v) / 255.0 / 255.0);
            const int32_t t = static_cast<int32_t>(static_cast<float>(v) * q);
            cube[v] = static_cast<uint8_t>(t > 255 ? 255 : t);
        }
    }
};

const SketchTables &tables() {
    static const SketchTables t;
    return t;
}

template <class F> void gray_plane(const View &src, uint8_t *g) {
    const int32_t w = src.width;
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow row = F::crow(src, y);
        uint8_t *out = g + static_cast<size_t>(y) * w;
        for (int32_t x = 0; x < w; ++x)
            out[x] = static_cast<uint8_t>(drawing_gray(F::load(row, x)));
    }
}

// Blurred negative: 0 on the outer rows and columns, else the 3 x 3 sum of
// the negative divided by 9.3.
void blur_negative(const uint8_t *n, uint8_t *b, int32_t w, int32_t h) {
    const SketchTables &t = tables();
    std::memset(b, 0, static_cast<size_t>(w) * h);
    for (int32_t y = 1; y + 1 < h; ++y) {
        const uint8_t *r0 = n + static_cast<size_t>(y - 1) * w;
        const uint8_t *r1 = r0 + w;
        const uint8_t *r2 = r1 + w;
        uint8_t *out = b + static_cast<size_t>(y) * w;
        for (int32_t x = 1; x + 1 < w; ++x) {
            const int32_t s =
                r0[x - 1] + r0[x] + r0[x + 1] + r1[x - 1] + r1[x] + r1[x + 1] + r2[x - 1] + r2[x] + r2[x + 1];
            out[x] = t.blur[s];
        }
    }
}

// Edge plane E = low byte of ~max(|left - right|, |upper - lower|) and the
// negative N = 255 - G. Border pixels take temp_ex itself, whose reads of
// column `width` reach the next row (or, on the last row, E's first byte).
void edges_and_negative(const uint8_t *g, uint8_t *e, uint8_t *n, int32_t w, int32_t h) {
    for (int32_t y = 0; y < h; ++y) {
        const bool borderRow = y == 0 || y == h - 1;
        const uint8_t *r0 = g + static_cast<size_t>(y - (borderRow ? 0 : 1)) * w;
        const uint8_t *r1 = g + static_cast<size_t>(y) * w;
        const uint8_t *r2 = g + static_cast<size_t>(y + (borderRow ? 0 : 1)) * w;
        uint8_t *eo = e + static_cast<size_t>(y) * w;
        uint8_t *no = n + static_cast<size_t>(y) * w;
        for (int32_t x = 0; x < w; ++x) {
            int32_t g1, g2;
            if (borderRow || x == 0 || x == w - 1) {
                g1 = temp_ex(g, w, h, kLeftMinusRight, 3, y, x);
                g2 = temp_ex(g, w, h, kUpperMinusLower, 3, y, x);
            } else {
                g1 = (r0[x - 1] + r1[x - 1] + r2[x - 1]) - (r0[x + 1] + r1[x + 1] + r2[x + 1]);
                g2 = (r0[x - 1] + r0[x] + r0[x + 1]) - (r2[x - 1] + r2[x] + r2[x + 1]);
            }
            const int32_t a1 = g1 < 0 ? -g1 : g1, a2 = g2 < 0 ? -g2 : g2;
            eo[x] = static_cast<uint8_t>(~(a1 > a2 ? a1 : a2));
            no[x] = static_cast<uint8_t>(255 - r1[x]);
        }
    }
}

// Colour dodge of gray a with blurred negative b, then the cube law; with an
// edge plane, the edge value wins where it is darker and the gray is below 170.
template <class F>
void compose(const View &dst, const uint8_t *g, const uint8_t *b, const uint8_t *e, int32_t w, int32_t h) {
    const SketchTables &t = tables();
    for (int32_t y = 0; y < h; ++y) {
        const size_t o = static_cast<size_t>(y) * w;
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < w; ++x) {
            const int32_t a = g[o + x], bb = b[o + x];
            uint32_t v = t.cube[a + a * bb / (256 - bb)];
            if (e != nullptr && e[o + x] < v && a < 170) v = e[o + x];
            F::store(out, x, pack(v, v, v, 0));
        }
    }
}

uint32_t sketch(Image *src, Image **dst, bool withEdges) {
    if (src == nullptr) return 0;
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const int32_t w = src->width, h = src->height;
    if (w <= 0 || h <= 0) {
        // Nothing to draw, but the work buffer of planes x width x height
        // bytes is still needed: a size of 0 or below cannot be had (0, the
        // prepared result kept), a positive one (both sizes negative) can.
        return buffer_size_ok(block_size(w, h, withEdges ? 4 : 3)) ? 1 : 0;
    }
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    const size_t plane = static_cast<size_t>(w) * h;
    // The planes share one allocation so that temp_ex's read past the gray
    // plane lands in the edge plane; it starts zeroed for a defined first read.
    Buffer<uint8_t> buf =
        alloc_zeroed<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h), withEdges ? 4 : 3));
    if (!buf) return 0;
    uint8_t *g = buf.get();
    with_format(from.bitCount, [&](auto f) { gray_plane<decltype(f)>(from, g); });
    if (withEdges) {
        uint8_t *e = g + plane, *b = g + 2 * plane, *n = g + 3 * plane;
        edges_and_negative(g, e, n, w, h);
        blur_negative(n, b, w, h);
        with_format(to->bitCount, [&](auto f) { compose<decltype(f)>(*to, g, b, e, w, h); });
    } else {
        uint8_t *n = g + plane, *b = g + 2 * plane;
        for (size_t i = 0; i < plane; ++i)
            n[i] = static_cast<uint8_t>(255 - g[i]);
        blur_negative(n, b, w, h);
        with_format(to->bitCount, [&](auto f) { compose<decltype(f)>(*to, g, b, nullptr, w, h); });
    }
    return 1;
}

} // namespace

extern "C" {

int32_t temp_ex(const uint8_t *plane, int32_t width, int32_t height, const int32_t *kernel, int32_t size, int32_t row,
                int32_t col) {
    if (plane == nullptr || kernel == nullptr || size <= 0) return 0;
    // Only the taps whose sample lies in rows 0..height-1 and columns
    // 0..width are visited; the others are skipped anyway.
    const int64_t half = size / 2;
    const int64_t c0 = static_cast<int64_t>(col) - half, r0 = static_cast<int64_t>(row) - half;
    const int64_t aLo = c0 < 0 ? -c0 : 0, aHi = std::min<int64_t>(size - 1, static_cast<int64_t>(width) - c0);
    const int64_t bLo = r0 < 0 ? -r0 : 0, bHi = std::min<int64_t>(size - 1, static_cast<int64_t>(height) - 1 - r0);
    uint32_t sum = 0;
    for (int64_t a = aLo; a <= aHi; ++a) {
        for (int64_t b = bLo; b <= bHi; ++b) {
            const uint32_t v = plane[(r0 + b) * width + (c0 + a)];
            sum += v * static_cast<uint32_t>(kernel[a * size + b]);
        }
    }
    return static_cast<int32_t>(sum);
}

uint32_t PX_IMG_Sketch(Image *src, Image **dst) { return sketch(src, dst, true); }

uint32_t PX_IMG_Sketch_1(Image *src, Image **dst) { return sketch(src, dst, false); }

} // extern "C"
