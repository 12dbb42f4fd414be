// Photocopy: local-contrast thresholding of the gray picture. The ratio of a
// Gaussian-weighted 5 x 5 mean to the plain 5 x 5 mean classes each pixel as
// dark or bright; percentiles of the ratio histogram set the tone mapping.
#include <pxfx/effects.h>

#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kWeights[5] = {1, 2, 4, 2, 1};
constexpr int32_t kBins = 2000;
constexpr int32_t kBrightFrom = 990;

template <class F> void gray_plane(const View &src, uint8_t *g, int32_t stride) {
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow row = F::crow(src, y);
        uint8_t *out = g + static_cast<size_t>(y) * stride;
        for (int32_t x = 0; x < src.width; ++x)
            out[x] = static_cast<uint8_t>(drawing_gray(F::load(row, x)));
    }
}

struct Stats {
    int64_t dark = 0, bright = 0;
    int64_t hist[kBins] = {};
};

// Local means for rows and columns 2 .. n-3: mean M = 5 x 5 sum / 25 and
// weighted U = (1 2 4 2 1)^T (1 2 4 2 1) sum / 100, both separable and exact.
// Stores U and the ratio q = 1000 U / M (low 16 bits) and counts the ratios.
void local_stats(const uint8_t *g, uint8_t *u, uint16_t *q, int32_t w, int32_t h, int32_t s, int32_t *colSum,
                 int32_t *colWeighted, Stats &st) {
    for (int32_t y = 2; y + 2 < h; ++y) {
        for (int32_t x = 0; x < w; ++x) {
            int32_t sum = 0, weighted = 0;
            for (int32_t k = 0; k < 5; ++k) {
                const int32_t v = g[static_cast<size_t>(y - 2 + k) * s + x];
                sum += v;
                weighted += kWeights[k] * v;
            }
            colSum[x] = sum;
            colWeighted[x] = weighted;
        }
        const size_t o = static_cast<size_t>(y) * s;
        for (int32_t x = 2; x + 2 < w; ++x) {
            int32_t sum = 0, weighted = 0;
            for (int32_t k = 0; k < 5; ++k) {
                sum += colSum[x - 2 + k];
                weighted += kWeights[k] * colWeighted[x - 2 + k];
            }
            const int32_t m = sum / 25;
            const int32_t uu = weighted / 100;
            u[o + x] = static_cast<uint8_t>(uu);
            if (m == 0) continue;
            const int32_t ratio = uu * 1000 / m;
            q[o + x] = static_cast<uint16_t>(ratio);
            if (ratio < kBrightFrom) {
                ++st.dark;
                ++st.hist[ratio];
            } else if (ratio < kBins) {
                ++st.bright;
                ++st.hist[ratio];
            }
        }
    }
}

// Dark threshold: 990 - the first ratio below 990 at which more than 20 % of
// the dark pixels are counted; 0 if none.
int32_t dark_threshold(const Stats &st) {
    int64_t cum = 0;
    for (int32_t i = 0; i < kBrightFrom; ++i) {
        cum += st.hist[i];
        if (cum * 1000 > st.dark * 200) return kBrightFrom - i;
    }
    return 0;
}

// Bright threshold: the first ratio from 990 at which more than 80 % of the
// bright pixels are counted, minus 990; 1000 if none.
int32_t bright_threshold(const Stats &st) {
    int64_t cum = 0;
    for (int32_t i = kBrightFrom; i < kBins; ++i) {
        cum += st.hist[i];
        if (cum * 1000 > st.bright * 800) return i - kBrightFrom;
    }
    return 1000;
}

void tone_map(uint8_t *g, const uint8_t *u, const uint16_t *q, int32_t w, int32_t h, int32_t s, int32_t t1,
              int32_t t2) {
    for (int32_t y = 1; y + 1 < h; ++y) {
        const size_t o = static_cast<size_t>(y) * s;
        for (int32_t x = 1; x + 1 < w; ++x) {
            const int32_t ratio = q[o + x];
            if (ratio == 0) continue;
            const int32_t uu = u[o + x];
            int32_t v;
            if (ratio < kBrightFrom) {
                int32_t k = 0;
                if (t1 != 0) {
                    const int32_t d = kBrightFrom - ratio < t1 ? kBrightFrom - ratio : t1;
                    k = (t1 - d) * 1000 / t1;
                }
                v = uu * k / 1000;
            } else {
                int32_t k = 1000;
                if (t2 != 0) {
                    const int32_t d = ratio - kBrightFrom < t2 ? ratio - kBrightFrom : t2;
                    k = d * 1000 / t2;
                }
                v = 255 - (255 - uu) * (1000 - k) / 1000;
            }
            g[o + x] = static_cast<uint8_t>(v < 0 ? 0 : (v > 255 ? 255 : v));
        }
    }
}

template <class F> void write_gray(const View &dst, const uint8_t *g, int32_t s) {
    for (int32_t y = 0; y < dst.height; ++y) {
        const uint8_t *in = g + static_cast<size_t>(y) * s;
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < dst.width; ++x)
            F::store(out, x, pack(in[x], in[x], in[x], 255));
    }
}

} // namespace

extern "C" uint32_t PX_IMG_Photocopy(Image *src, Image **dst) {
    if (src == nullptr) return 0;
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const int32_t w = src->width, h = src->height;
    if (w <= 0 || h <= 0) {
        // Nothing to draw, but the work buffer of 5 x stride x height + 8000
        // bytes (the stride being the width rounded up to a multiple of 4) is
        // still needed; when its size is not positive it cannot be had, and
        // the result is released.
        const int64_t plane = ((int64_t{w} + 3) & ~int64_t{3}) * h;
        if (buffer_size_ok(block_size(plane, 5, 1) + 8000)) return 1;
        free_Image(dst, 0);
        return 0;
    }
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    const int32_t s = static_cast<int32_t>((static_cast<int64_t>(w) + 3) & ~int64_t{3});
    const size_t plane = checked_size(static_cast<uint64_t>(s), static_cast<uint64_t>(h));
    Buffer<uint8_t> g = alloc_zeroed<uint8_t>(plane);
    Buffer<uint8_t> u = alloc_zeroed<uint8_t>(plane);
    Buffer<uint16_t> q = alloc_zeroed<uint16_t>(plane);
    Buffer<int32_t> cols = alloc_buffer<int32_t>(2 * static_cast<size_t>(w));
    if (!g || !u || !q || !cols) {
        free_Image(dst, 0);
        return 0;
    }
    with_format(from.bitCount, [&](auto f) { gray_plane<decltype(f)>(from, g.get(), s); });
    Stats st;
    local_stats(g.get(), u.get(), q.get(), w, h, s, cols.get(), cols.get() + w, st);
    tone_map(g.get(), u.get(), q.get(), w, h, s, dark_threshold(st), bright_threshold(st));
    with_format(to->bitCount, [&](auto f) { write_gray<decltype(f)>(*to, g.get(), s); });
    PX_Img_CopyAlpha(out, src);
    return 1;
}
