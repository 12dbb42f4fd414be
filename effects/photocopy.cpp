// Photocopy: local-contrast thresholding of the gray picture. The ratio of a
// Gaussian-weighted 5 x 5 mean to the plain 5 x 5 mean classes each pixel as
// dark or bright; percentiles of the ratio histogram set the tone mapping.
#include <pxfx/effects.h>

#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/vector_kernels.hpp"
#include "core/internal/view.hpp"
#include "effects/drawing_gray.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kWeights[5] = {1, 2, 4, 2, 1};
constexpr int32_t kBins = 2000;
constexpr int32_t kBrightFrom = 990;

// Local means of one row y, 2 <= y < h - 2, of the gray plane: for the
// columns x = 2 .. w - 3, mean M = 5 x 5 sum / 25 and weighted mean
// U = (1 2 4 2 1)^T (1 2 4 2 1) sum / 100, both separable and exact; u[x - 2]
// gets U and ratio[x - 2] the ratio 1000 U / M, or kNoRatio where M is 0.
// The vector copy does the first columns, the plain loop the rest.
class LocalMeans {
  public:
    static constexpr int32_t kNoRatio = vec::kNoRatio;

    explicit LocalMeans(int32_t width)
        : w_(width), cols_(alloc_buffer<int32_t>(2 * static_cast<size_t>(width))),
          vectorCols_(alloc_buffer<uint16_t>(2 * static_cast<size_t>(width))), vector_(vec::photocopy_means()) {}
    bool ok() const { return cols_ && vectorCols_; }

    void row(const uint8_t *g, int32_t y, uint8_t *u, int32_t *ratio) {
        const uint8_t *rows[5];
        for (int32_t k = 0; k < 5; ++k)
            rows[k] = g + static_cast<size_t>(y - 2 + k) * w_;
        const size_t n = static_cast<size_t>(w_ - 4);
        const size_t done = vector_ != nullptr ? vector_(rows, n, vectorCols_.get(), u, ratio) : 0;
        int32_t *colSum = cols_.get(), *colWeighted = colSum + w_;
        for (size_t x = done; x < n + 4; ++x) {
            int32_t sum = 0, weighted = 0;
            for (int32_t k = 0; k < 5; ++k) {
                sum += rows[k][x];
                weighted += kWeights[k] * rows[k][x];
            }
            colSum[x] = sum;
            colWeighted[x] = weighted;
        }
        for (size_t i = done; i < n; ++i) {
            int32_t sum = 0, weighted = 0;
            for (int32_t k = 0; k < 5; ++k) {
                sum += colSum[i + k];
                weighted += kWeights[k] * colWeighted[i + k];
            }
            const int32_t m = sum / 25;
            const int32_t uu = weighted / 100;
            u[i] = static_cast<uint8_t>(uu);
            ratio[i] = m == 0 ? kNoRatio : uu * 1000 / m;
        }
    }

  private:
    int32_t w_;
    Buffer<int32_t> cols_;
    Buffer<uint16_t> vectorCols_;
    vec::PhotocopyMeans vector_;
};

// Counts of the ratios below kBins: dark ones below kBrightFrom, bright ones
// from there. Neighbouring pixels, often of one ratio, count into two
// histograms in turn, so that one count's update need not wait for the last.
struct Stats {
    int64_t hist[2][kBins] = {};
    void count(const int32_t *ratio, int32_t n) {
        for (int32_t i = 0; i < n; ++i) {
            const auto r = static_cast<uint32_t>(ratio[i]);
            if (r < kBins) ++hist[i & 1][r];
        }
    }
    int64_t at(int32_t i) const { return hist[0][i] + hist[1][i]; }
    int64_t total(int32_t first, int32_t end) const {
        int64_t n = 0;
        for (int32_t i = first; i < end; ++i)
            n += at(i);
        return n;
    }
};

// Dark threshold: 990 - the first ratio below 990 at which more than 20 % of
// the dark pixels are counted; 0 if none.
int32_t dark_threshold(const Stats &st) {
    const int64_t dark = st.total(0, kBrightFrom);
    int64_t cum = 0;
    for (int32_t i = 0; i < kBrightFrom; ++i) {
        cum += st.at(i);
        if (cum * 1000 > dark * 200) return kBrightFrom - i;
    }
    return 0;
}

// Bright threshold: the first ratio from 990 at which more than 80 % of the
// bright pixels are counted, minus 990; 1000 if none.
int32_t bright_threshold(const Stats &st) {
    const int64_t bright = st.total(kBrightFrom, kBins);
    int64_t cum = 0;
    for (int32_t i = kBrightFrom; i < kBins; ++i) {
        cum += st.at(i);
        if (cum * 1000 > bright * 800) return i - kBrightFrom;
    }
    return 1000;
}

// Weight k of the tone mapping per ratio, 0 .. 1000: for dark ratios it
// falls from 1000 at 990 to 0 at 990 - t1, for bright ones it rises from 0 at
// 990 to 1000 at 990 + t2. t2 <= 1009, so from kBins - 1 on k is 1000: the
// last entry stands for every larger ratio.
void tone_weights(int32_t t1, int32_t t2, int32_t *weight) {
    for (int32_t ratio = 0; ratio < kBins; ++ratio) {
        int32_t k;
        if (ratio < kBrightFrom) {
            k = 0;
            if (t1 != 0) {
                const int32_t d = kBrightFrom - ratio < t1 ? kBrightFrom - ratio : t1;
                k = (t1 - d) * 1000 / t1;
            }
        } else {
            k = 1000;
            if (t2 != 0) {
                const int32_t d = ratio - kBrightFrom < t2 ? ratio - kBrightFrom : t2;
                k = d * 1000 / t2;
            }
        }
        weight[ratio] = k;
    }
}

// The tone of gray value a whose local means are uu and ratio: the ratio
// taken modulo 2^16, where 0 keeps the gray value (as does a mean of 0).
uint32_t tone(uint32_t a, int32_t uu, int32_t ratio, const int32_t *weight) {
    if (ratio == LocalMeans::kNoRatio) return a;
    const int32_t q = ratio & 0xFFFF;
    if (q == 0) return a;
    const int32_t k = weight[q < kBins ? q : kBins - 1];
    const int32_t v = q < kBrightFrom ? uu * k / 1000 : 255 - (255 - uu) * (1000 - k) / 1000;
    return static_cast<uint32_t>(v < 0 ? 0 : (v > 255 ? 255 : v));
}

// Gray pixels of a row of the result, opaque; 32-bit pixels take their alpha
// from `alpha` instead where it is given (a source row apart from the result).
template <class F> void store_gray(typename F::Row out, const uint8_t *gray, int32_t w, const uint8_t *alpha) {
    if constexpr (F::kBitCount == 32) {
        if (alpha != nullptr) {
            for (int32_t x = 0; x < w; ++x) {
                out[4 * x] = out[4 * x + 1] = out[4 * x + 2] = gray[x];
                out[4 * x + 3] = alpha[4 * x + 3];
            }
            return;
        }
    }
    for (int32_t x = 0; x < w; ++x)
        F::store(out, x, pack(gray[x], gray[x], gray[x], 255));
}

// Two passes over the rows: the first counts the ratios, the second sets the
// thresholds from them and writes the result, working the local means out
// again rather than keeping planes of them. With `alpha` (32-bit pixels of a
// source apart from the result) the result takes the source's alpha.
template <class F> bool photocopy(const View &dst, const uint8_t *g, int32_t w, int32_t h, const View *alpha) {
    LocalMeans means(w);
    Buffer<uint8_t> u = alloc_buffer<uint8_t>(static_cast<size_t>(w));
    Buffer<int32_t> ratio = alloc_buffer<int32_t>(static_cast<size_t>(w));
    Buffer<uint8_t> toned = alloc_buffer<uint8_t>(static_cast<size_t>(w));
    if (!means.ok() || !u || !ratio || !toned) return false;
    Stats st;
    for (int32_t y = 2; y + 2 < h && w > 4; ++y) {
        means.row(g, y, u.get(), ratio.get());
        st.count(ratio.get(), w - 4);
    }
    const int32_t t1 = dark_threshold(st), t2 = bright_threshold(st);
    int32_t weight[kBins];
    tone_weights(t1, t2, weight);
    const vec::PhotocopyTone toneVector = vec::photocopy_tone();
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *gray = g + static_cast<size_t>(y) * w;
        if (y >= 2 && y + 2 < h && w > 4) {
            means.row(g, y, u.get(), ratio.get());
            uint8_t *t = toned.get();
            t[0] = gray[0];
            t[1] = gray[1];
            const size_t n = static_cast<size_t>(w - 4);
            const auto done = static_cast<int32_t>(
                toneVector != nullptr ? toneVector(gray + 2, u.get(), ratio.get(), n, t1, t2, t + 2) : 0);
            for (int32_t x = 2 + done; x + 2 < w; ++x)
                t[x] = static_cast<uint8_t>(tone(gray[x], u[x - 2], ratio[x - 2], weight));
            t[w - 2] = gray[w - 2];
            t[w - 1] = gray[w - 1];
            gray = t;
        }
        store_gray<F>(F::row(dst, y), gray, w, alpha != nullptr ? alpha->row(y) : nullptr);
    }
    return true;
}

} // namespace

extern "C" uint32_t PX_IMG_Photocopy(Image *src, Image **dst) {
    if (src == nullptr) return 0;
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const int32_t w = src->width, h = src->height;
    if (w <= 0 || h <= 0) {
        // Nothing to draw, but the call still stands or falls with a work
        // buffer of 5 x stride x height + 8000 bytes (the stride being the
        // width rounded up to a multiple of 4): when that size is not
        // positive it cannot be had, and the result is released.
        const int64_t plane = ((int64_t{w} + 3) & ~int64_t{3}) * h;
        if (buffer_size_ok(block_size(plane, 5, 1) + 8000)) return 1;
        free_Image(dst, 0);
        return 0;
    }
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    Buffer<uint8_t> g = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!g) {
        free_Image(dst, 0);
        return 0;
    }
    drawing_gray_plane(from, g.get());
    // 32-bit results take the source's alpha: as the rows are written when
    // the two blocks are apart, else (one block) opaque first and then copied.
    const View *alpha = to->bitCount == 32 && blocks_apart(from, *to) ? &from : nullptr;
    if (!with_format(to->bitCount, [&](auto f) { return photocopy<decltype(f)>(*to, g.get(), w, h, alpha); })) {
        free_Image(dst, 0);
        return 0;
    }
    if (alpha == nullptr) PX_Img_CopyAlpha(out, src);
    return 1;
}
