// Automatic exposure: a percentile stretch with a 0.4 power curve, through
// per-channel tables (65,536 words for 16-bit images).
#include <pxfx/toolkit.h>

#include <cmath>

#include "core/internal/byte_map.hpp"
#include "core/internal/memory.hpp"
#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

constexpr double kLowShare = 0.005;
constexpr double kHighShare = 0.995;
// A channel whose 0.5 % point is at or above this level is not corrected.
constexpr int32_t kBrightLow = 201;

struct Percentiles {
    int32_t low, high;
};

// Low point: first level whose running share exceeds 0.5 % (0 if none). High
// point: continuing the same running sum from low + 1, the first level whose
// share exceeds 99.5 % (`noHigh` if none).
template <class Count> Percentiles percentiles(const Count *hist, int32_t levels, uint64_t total, int32_t noHigh) {
    const auto n = static_cast<double>(total);
    uint64_t cum = 0;
    int32_t v = 0, low = -1;
    for (; v < levels; ++v) {
        cum += hist[v];
        if (static_cast<double>(cum) / n > kLowShare) {
            low = v;
            break;
        }
    }
    if (low < 0) return {0, noHigh};
    for (v = low + 1; v < levels; ++v) {
        cum += hist[v];
        if (static_cast<double>(cum) / n > kHighShare) return {low, v};
    }
    return {low, noHigh};
}

// (int)(pow((i - low) / (high - low), 0.4) * top) clamped to 0..top; bases
// below 0 give NaN and so 0, and a zero span saturates.
int32_t stretch(int32_t i, int32_t low, int32_t high, double top) {
    const double base = static_cast<double>(i - low) / static_cast<double>(high - low);
    const int32_t v = trunc_sat<int32_t>(std::pow(base, 0.4) * top);
    return v < 0 ? 0 : (v > static_cast<int32_t>(top) ? static_cast<int32_t>(top) : v);
}

void stretch_table(uint8_t *table, Percentiles p) {
    for (int32_t i = 0; i < 256; ++i)
        table[i] = static_cast<uint8_t>(stretch(i, p.low, p.high, 255.0));
}

// The fixed curve of the 8-bit path of PXImage_AutoExposure_1.
struct FixedCurve {
    uint8_t table[256];
    FixedCurve() {
        for (int32_t i = 0; i < 256; ++i) {
            const int32_t v = static_cast<int32_t>(std::pow(i / 255.0, 0.4) * 255.0);
            table[i] = static_cast<uint8_t>(v > 255 ? 255 : v);
        }
    }
};

int32_t expose_gray(const View &v, bool fixedCurve) {
    const size_t n = v.block_bytes();
    uint8_t *d = v.bits;
    uint32_t hist[256] = {};
    for (size_t i = 0; i < n; ++i)
        ++hist[d[i]];
    const Percentiles p = percentiles(hist, 256, n, 255);
    if (p.low >= kBrightLow) return 0;
    uint8_t stretched[256];
    const uint8_t *table = stretched;
    if (fixedCurve) {
        static const FixedCurve curve;
        table = curve.table;
    } else {
        stretch_table(stretched, p);
    }
    map_bytes(d, d, n, 1, &table);
    return 1;
}

int32_t expose_colour(const View &v) {
    const size_t pixels = static_cast<size_t>(v.width) * static_cast<size_t>(v.height);
    uint32_t hist[3][256] = {};
    uint8_t *d = v.bits;
    for (size_t i = 0; i < pixels; ++i) {
        ++hist[0][d[3 * i]];
        ++hist[1][d[3 * i + 1]];
        ++hist[2][d[3 * i + 2]];
    }
    uint8_t table[3][256];
    const uint8_t *tables[3] = {table[0], table[1], table[2]};
    for (int32_t c = 0; c < 3; ++c) {
        const Percentiles p = percentiles(hist[c], 256, pixels, 255);
        if (p.low >= kBrightLow)
            for (int32_t i = 0; i < 256; ++i)
                table[c][i] = static_cast<uint8_t>(i);
        else
            stretch_table(table[c], p);
    }
    map_bytes(d, d, pixels, 3, tables);
    return 1;
}

// 16-bit path: 16-bit counters that wrap, percentiles over all 65,536 levels
// kept in their low 8 bits, and a word table whose entries from 256 on are 0.
int32_t expose_words(const View &v) {
    const size_t pixels = static_cast<size_t>(v.width) * static_cast<size_t>(v.height);
    Buffer<uint16_t> hist = alloc_zeroed<uint16_t>(65536);
    Buffer<uint16_t> table = alloc_zeroed<uint16_t>(65536);
    if (!hist || !table) return 0;
    uint8_t *d = v.bits;
    for (size_t i = 0; i < pixels; ++i)
        ++hist[load16(d + 2 * i)];
    Percentiles p = percentiles(hist.get(), 65536, pixels, 255);
    p.low &= 255;
    p.high &= 255;
    for (int32_t i = 0; i < 256; ++i)
        table[i] = static_cast<uint16_t>(stretch(i, p.low, p.high, 65535.0));
    for (size_t i = 0; i < pixels; ++i)
        store16(d + 2 * i, table[load16(d + 2 * i)]);
    return 1;
}

int32_t auto_exposure(PXImage *img, bool fixedCurve) {
    if (img == nullptr || img->data == nullptr || !px_rows_inside(img)) return 0;
    if (img->bitcount != 8 && img->bitcount != 16 && img->bitcount != 24) return 0;
    // Without pixel rows the histograms are empty: no running share exceeds
    // the thresholds, so low = 0 (below the bright limit) and there is
    // nothing to map.
    const std::optional<View> v = view_of(img);
    if (!v) return 1;
    switch (v->bitCount) {
    case 8: return expose_gray(*v, fixedCurve);
    case 16: return expose_words(*v);
    case 24: return expose_colour(*v);
    default: return 0;
    }
}

} // namespace

extern "C" {

int32_t PXImage_AutoExposure(PXImage *img) { return auto_exposure(img, false); }

int32_t PXImage_AutoExposure_1(PXImage *img) { return auto_exposure(img, true); }

} // extern "C"
