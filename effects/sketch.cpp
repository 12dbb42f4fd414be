// Pencil sketch: colour dodge of the gray picture with its blurred negative,
// optionally darkened along edges; and the byte-plane kernel sum temp_ex.
// One pass over the rows after the gray plane: each row's edges and blurred
// negative are worked out from the gray rows around it as it is drawn.
#include <pxfx/effects.h>

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"
#include "effects/drawing_gray.hpp"

using namespace pxfx;

namespace {

const int32_t kLeftMinusRight[9] = {1, 1, 1, 0, 0, 0, -1, -1, -1};
const int32_t kUpperMinusLower[9] = {1, 0, -1, 1, 0, -1, 1, 0, -1};

// Largest value of the blurred negative: trunc(9 * 255 / 9.3).
constexpr int32_t kMaxBlur = 246;

// The tone of gray a over blurred negative b: the colour dodge
// v = a + a b / (256 - b), then the cube law
// trunc((float)v * (float)(v v / 255.0 / 255.0)), capped at 255; looked up
// at b * 256 + a. And the blurred negative of a 3 x 3 sum s of the negative,
// trunc(s / 9.3), at s.
struct SketchTables {
    uint8_t tone[(kMaxBlur + 1) * 256];
    uint8_t blur[9 * 255 + 1];
    SketchTables() {
        for (int32_t s = 0; s <= 9 * 255; ++s)
            blur[s] = static_cast<uint8_t>(static_cast<int32_t>(s / 9.3));
        for (int32_t b = 0; b <= kMaxBlur; ++b)
            for (int32_t a = 0; a < 256; ++a) {
                const int32_t v = a + a * b / (256 - b);
                const float q = static_cast<float>(static_cast<double>(v * v) / 255.0 / 255.0);
                const int32_t t = static_cast<int32_t>(static_cast<float>(v) * q);
                tone[b * 256 + a] = static_cast<uint8_t>(t > 255 ? 255 : t);
            }
    }
};

const SketchTables &tables() {
    static const SketchTables t;
    return t;
}

// Edge row y: E = low byte of ~max(|left - right|, |upper - lower|) of the
// gray plane g. Border pixels take temp_ex itself, whose reads of column
// `width` reach the next row (or, on the last row, the byte after the plane,
// which holds E of the first pixel once it is known, and 0 before).
void edge_row(uint8_t *g, int32_t w, int32_t h, int32_t y, uint8_t *e) {
    auto border = [&](int32_t x) {
        const int32_t g1 = temp_ex(g, w, h, kLeftMinusRight, 3, y, x);
        const int32_t g2 = temp_ex(g, w, h, kUpperMinusLower, 3, y, x);
        const int32_t a1 = g1 < 0 ? -g1 : g1, a2 = g2 < 0 ? -g2 : g2;
        e[x] = static_cast<uint8_t>(~(a1 > a2 ? a1 : a2));
    };
    if (y == 0 || y == h - 1) {
        for (int32_t x = 0; x < w; ++x) {
            border(x);
            if (y == 0 && x == 0) g[static_cast<size_t>(w) * h] = e[0];
        }
        return;
    }
    const uint8_t *r0 = g + static_cast<size_t>(y - 1) * w;
    const uint8_t *r1 = r0 + w;
    const uint8_t *r2 = r1 + w;
    border(0);
    for (int32_t x = 1; x + 1 < w; ++x) {
        const int32_t g1 = (r0[x - 1] + r1[x - 1] + r2[x - 1]) - (r0[x + 1] + r1[x + 1] + r2[x + 1]);
        const int32_t g2 = (r0[x - 1] + r0[x] + r0[x + 1]) - (r2[x - 1] + r2[x] + r2[x + 1]);
        const int32_t a1 = g1 < 0 ? -g1 : g1, a2 = g2 < 0 ? -g2 : g2;
        e[x] = static_cast<uint8_t>(~(a1 > a2 ? a1 : a2));
    }
    if (w > 1) border(w - 1);
}

// Blurred negative of row y: 0 on the outer rows and columns, else the 3 x 3
// sum of the negative 255 - g, 9 * 255 - the sum of g, divided by 9.3.
void blur_row(const uint8_t *g, int32_t w, int32_t h, int32_t y, uint8_t *b) {
    const SketchTables &t = tables();
    std::memset(b, 0, static_cast<size_t>(w));
    if (y == 0 || y == h - 1) return;
    const uint8_t *r0 = g + static_cast<size_t>(y - 1) * w;
    const uint8_t *r1 = r0 + w;
    const uint8_t *r2 = r1 + w;
    for (int32_t x = 1; x + 1 < w; ++x) {
        const int32_t s = r0[x - 1] + r0[x] + r0[x + 1] + r1[x - 1] + r1[x] + r1[x + 1] + r2[x - 1] + r2[x] + r2[x + 1];
        b[x] = t.blur[9 * 255 - s];
    }
}

// Row by row: the tone of the gray over its blurred negative; with edges,
// the edge value wins where it is darker and the gray is below 170.
template <class F> void compose(const View &dst, uint8_t *g, int32_t w, int32_t h, uint8_t *b, uint8_t *e) {
    const SketchTables &t = tables();
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *a = g + static_cast<size_t>(y) * w;
        blur_row(g, w, h, y, b);
        if (e != nullptr) edge_row(g, w, h, y, e);
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < w; ++x) {
            uint32_t v = t.tone[b[x] * 256 + a[x]];
            if (e != nullptr && e[x] < v && a[x] < 170) v = e[x];
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
        // Nothing to draw, but the call still stands or falls with a work
        // buffer of planes x width x height bytes: a size of 0 or below
        // cannot be had (0, the prepared result kept), a positive one (both
        // sizes negative) can.
        return buffer_size_ok(block_size(w, h, withEdges ? 4 : 3)) ? 1 : 0;
    }
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    // The gray plane, the byte temp_ex reads past it, and two rows: within
    // width x (height + 3) bytes.
    const size_t plane = static_cast<size_t>(w) * static_cast<size_t>(h);
    Buffer<uint8_t> buf = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h) + 3));
    if (!buf) return 0;
    uint8_t *g = buf.get();
    g[plane] = 0;
    drawing_gray_plane(from, g);
    uint8_t *b = g + plane + 1, *e = withEdges ? b + w : nullptr;
    with_format(to->bitCount, [&](auto f) { compose<decltype(f)>(*to, g, w, h, b, e); });
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
