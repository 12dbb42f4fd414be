// White balance against the colour around a picked point, and the Otsu
// threshold of an 8-bit plane that gates it.
#include <pxfx/toolkit.h>

#include "core/internal/byte_map.hpp"
#include "core/internal/memory.hpp"
#include "toolkit/otsu.hpp"
#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

constexpr int32_t kNoThreshold = 120;
constexpr int32_t kWhiteLevel = 250;

// Rounded mean of nine samples, (2 sum + 9) / 18, whatever the number of
// samples visited: three rows from y - 1 and a column walk from x - 1 while
// the column is at most x + 1, each index clamped and the next one the
// clamped index + 1. The walk stops after three columns, which ends it at the
// right edge where the clamped column would stay at or below x + 1 for ever.
// `at(row, column)` returns the sample, 0 outside the picture's block.
template <class At> int32_t reference(int64_t x, int64_t y, int32_t w, int32_t h, At at) {
    int32_t sum = 0;
    int64_t r = y - 1;
    for (int32_t i = 0; i < 3; ++i) {
        const int64_t R = clamp_coord(r, h);
        int64_t c = x - 1;
        for (int32_t j = 0; j < 3 && c <= x + 1; ++j) {
            const int64_t C = clamp_coord(c, w);
            sum += at(R, C);
            c = C + 1;
        }
        r = R + 1;
    }
    const int32_t ref = (2 * sum + 9) / 18;
    return ref < 1 ? 1 : (ref > 255 ? 255 : ref);
}

// Levels scaled so that the reference becomes 250 when `scale` holds, else
// unchanged; capped at 250.
void balance_table(uint8_t *table, int32_t ref, bool scale) {
    for (int32_t i = 0; i < 256; ++i) {
        const int32_t v = scale ? (2 * kWhiteLevel * i + ref) / (2 * ref) : i;
        table[i] = static_cast<uint8_t>(v > kWhiteLevel ? kWhiteLevel : v);
    }
}

int32_t balance_colour(const View &v, const PXPoint *pt) {
    const int64_t w = v.width, h = v.height;
    const size_t pixels = static_cast<size_t>(w * h);
    uint8_t *d = v.bits;
    Buffer<uint8_t> plane = alloc_buffer<uint8_t>(pixels);
    if (!plane) return 0;
    uint8_t table[3][256];
    for (int32_t b = 0; b < 3; ++b) {
        const int32_t ref =
            reference(pt->x, pt->y, v.width, v.height, [&](int64_t r, int64_t c) { return d[(r * w + c) * 3 + b]; });
        for (size_t i = 0; i < pixels; ++i)
            plane[i] = d[3 * i + b];
        const int32_t threshold =
            ProbabilityDensityValue(plane.get(), static_cast<int32_t>(w), static_cast<int32_t>(h)) & 0xFF;
        balance_table(table[b], ref, ref < kWhiteLevel && threshold < ref);
    }
    const uint8_t *const tables[3] = {table[0], table[1], table[2]};
    map_bytes(d, d, pixels, 3, tables);
    return 1;
}

// 8-bit images take their reference with the 24-bit green addressing
// (row * width + column * 3 + 1); bytes that lands beyond the block read as 0.
int32_t balance_gray(const View &v, const PXPoint *pt) {
    const int64_t w = v.width, h = v.height, n = w * h;
    uint8_t *d = v.bits;
    const int32_t ref = reference(pt->x, pt->y, v.width, v.height, [&](int64_t r, int64_t c) {
        const int64_t k = r * w + c * 3 + 1;
        return k < n ? d[k] : 0;
    });
    uint8_t table[256];
    balance_table(table, ref, 128 < ref && ref < kWhiteLevel);
    const uint8_t *const tables[1] = {table};
    map_bytes(d, d, static_cast<size_t>(n), 1, tables);
    return 1;
}

} // namespace

int32_t pxfx::packed::otsu_threshold(const uint32_t (&hist)[256]) {
    uint64_t total = 0;
    for (uint32_t c : hist)
        total += c;
    if (total == 0 || total == uint64_t{hist[0]} + hist[255]) return kNoThreshold;
    const auto ftotal = static_cast<float>(total);
    // Each level's term (hist[i] / total) * i, summed in level order below.
    float term[256];
    for (int32_t i = 0; i < 256; ++i)
        term[i] = static_cast<float>(hist[i]) / ftotal * static_cast<float>(i);
    int32_t best = 0, bestT = kNoThreshold;
    uint64_t below = 0;
    for (int32_t t = 0; t < 255; ++t) {
        below += hist[t];
        const float w0 = static_cast<float>(below) / ftotal;
        const float w1 = 1.0f - w0;
        float m0 = 0.0f, m1 = 0.0f;
        for (int32_t i = 0; i <= t; ++i)
            m0 += term[i];
        if (m0 != 0.0f) m0 /= w0;
        for (int32_t i = t + 1; i < 255; ++i)
            m1 += term[i];
        if (m1 != 0.0f) m1 /= w1;
        const float d = m0 - m1;
        const int32_t score = trunc_sat<int32_t>(w0 * w1 * (d * d));
        if (score > best) {
            best = score;
            bestT = t;
        }
    }
    return bestT;
}

extern "C" {

int32_t ProbabilityDensityValue(const uint8_t *plane, int32_t width, int32_t height) {
    if (plane == nullptr || width <= 0 || height <= 0) return kNoThreshold;
    uint32_t hist[256];
    count_levels(static_cast<size_t>(width) * static_cast<size_t>(height), hist,
                 [plane](size_t i) { return plane[i]; });
    return otsu_threshold(hist);
}

int32_t PXImage_AutoWhiteBalance(PXImage *img, const PXPoint *pt) {
    if (img == nullptr || pt == nullptr || img->data == nullptr || !px_rows_inside(img)) return 0;
    if (img->bitcount != 8 && img->bitcount != 24) return 0;
    // Without pixel rows: the scratch plane of width x height bytes gets no
    // block for a count of 0 or below (0). With both sizes negative it would,
    // and then no sample is mapped (1).
    const std::optional<View> v = view_of(img);
    if (!v) return buffer_size_ok(block_size(img->width, img->height, 1)) ? 1 : 0;
    return v->bitCount == 24 ? balance_colour(*v, pt) : balance_gray(*v, pt);
}

} // extern "C"
