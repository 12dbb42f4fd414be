// Adaptive thresholds: the spread-tested Otsu level of a histogram and the
// band binarisation built on it.
#include <pxfx/lines.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/pixel.hpp"
#include "lines/lines_internal.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kBandRows = 37;
// Marks a level that the running count never reaches.
constexpr int32_t kNotReached = 256;

} // namespace

namespace pxfx::lines {

void band_threshold(const View &src, const View &dst) {
    const int32_t w = src.width, h = src.height;
    // Four interleaved partial histograms keep runs of equal levels from
    // serialising on one counter.
    uint32_t part[4][256] = {};
    uint32_t hist[256];
    int32_t bandStart = 0;
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *row = src.row(y);
        int32_t x = 0;
        for (; x + 4 <= w; x += 4) {
            ++part[0][row[x]];
            ++part[1][row[x + 1]];
            ++part[2][row[x + 2]];
            ++part[3][row[x + 3]];
        }
        for (; x < w; ++x)
            ++part[0][row[x]];
        if (y - bandStart != kBandRows - 1 && y != h - 1) continue;
        for (int32_t v = 0; v < 256; ++v)
            hist[v] = part[0][v] + part[1][v] + part[2][v] + part[3][v];
        const int32_t t = GetMaxHtoThrod2(hist, 0);
        for (int32_t r = bandStart; r <= y; ++r) {
            const uint8_t *in = src.row(r);
            uint8_t *out = dst.row(r);
            for (int32_t i = 0; i < w; ++i)
                out[i] = in[i] <= t ? 1 : 255;
        }
        std::memset(part, 0, sizeof part);
        bandStart = y + 1;
    }
}

// Judging a chunk of pixels on its values before any of them is cleared gives
// the same result as a strict left-to-right scan: a pixel is only cleared
// when its right neighbour is not 1, and that neighbour then stays as it is
// whatever its left neighbour has become.
void remove_isolated_dots(const View &img) {
    constexpr int32_t kChunk = 64;
    const int32_t w = img.width, h = img.height;
    uint8_t judged[kChunk];
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *row = img.row(y);
        for (int32_t x = 1; x < w - 1; x += kChunk) {
            const int32_t n = w - 1 - x < kChunk ? w - 1 - x : kChunk;
            for (int32_t i = 0; i < n; ++i) {
                const uint8_t *p = row + x + i;
                judged[i] = ((p[0] == 1) & (p[-1] != 1) & (p[1] != 1)) != 0 ? 255 : p[0];
            }
            std::memcpy(row + x, judged, static_cast<size_t>(n));
        }
    }
}

} // namespace pxfx::lines

extern "C" {

int32_t GetMaxHtoThrod2(const uint32_t hist[256], int32_t total) {
    if (hist == nullptr) return 255;
    if (total == 0) {
        uint32_t sum = 0;
        for (int32_t i = 0; i < 256; ++i)
            sum += hist[i];
        total = static_cast<int32_t>(sum);
    }
    // Running counts are kept as 32-bit values, so counts whose sum exceeds
    // 2^31 behave as in a plain int accumulator.
    const int32_t low = total >> 5, high = total - low;
    int32_t a = kNotReached, b = kNotReached;
    uint32_t running = 0;
    for (int32_t i = 0; i < 256 && b == kNotReached; ++i) {
        running += hist[i];
        const int32_t r = static_cast<int32_t>(running);
        if (a == kNotReached && r > low) a = i;
        if (r >= high) b = i;
    }
    // A positive total always reaches both levels; for total <= 0 the spread
    // is never 80 or more, so no division by zero happens below.
    if (b - a < 80) return 255;

    const double n = total;
    double muT = 0.0;
    for (uint32_t i = 0; i < 256; ++i)
        muT += static_cast<double>(i * hist[i]) / n;
    double w = 0.0, mu = 0.0, best = 0.0;
    int32_t level = 255;
    for (uint32_t t = 0; t < 256; ++t) {
        w += static_cast<double>(hist[t]) / n;
        mu += static_cast<double>(t * hist[t]) / n;
        const double d = w * (1.0 - w);
        if (d >= 1e-9) {
            const double e = muT * w - mu;
            const double s = e * e / d;
            if (s >= best) {
                best = s;
                level = static_cast<int32_t>(t);
            }
        }
    }
    return level > 59 ? level : 60;
}

int32_t BinImg(Image *img, Image **out) {
    if (!lines::markable(img)) return 0;
    // Without columns there is nothing to read or write; otherwise the
    // thresholding reads every pixel, which needs a block.
    const bool empty = img->width <= 0;
    const std::optional<View> in = view_of(img);
    if (!empty && !in) return 0;
    // The marking's scratch comes first, so that a failure touches nothing.
    Buffer<int32_t> scratch;
    if (!lines::marks_nothing(img)) {
        scratch = lines::line_scratch(*in);
        if (!scratch) return 0;
    }
    // The slot's image is replaced even when the new one cannot be made (an
    // empty width makes none): the work then goes into the input.
    std::optional<View> dst = in;
    if (out != nullptr && *out != img) {
        free_Image(out, 0);
        *out = malloc_Image(img->width, img->height, static_cast<int32_t>(img->bitCount));
        if (const std::optional<View> made = view_of(*out)) dst = made;
    }
    if (empty) return 1;
    lines::band_threshold(*in, *dst);
    lines::remove_isolated_dots(*dst);
    if (scratch) lines::mark_line_bands(*dst, scratch.get());
    return 1;
}

} // extern "C"
