// The framed-photo clip effect and the two-tone paint effect with its
// contrast-stretch curves.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cstring>

#include "core/internal/byte_map.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "toolkit/otsu.hpp"
#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

// The frame's window: 514 rows from row 50, 678 columns from column 40.
constexpr int32_t kWindowTop = 50, kWindowRows = 514;
constexpr int32_t kWindowLeft = 40, kWindowCols = 678;
// Frame pixels whose byte 2 is below this are holes showing the photo.
constexpr uint8_t kHoleLevel = 7;

// Stretch curve shared by both workers: below T the levels lo..hi spread as
// (j - lo)(hi - lo) / T, from T up a ramp of `span` above `base`.
void stretch_plane(uint8_t *plane, size_t n, int32_t t, int32_t lo, int32_t hi, double base, double span) {
    uint8_t table[256];
    for (int32_t j = 0; j < t; ++j)
        table[j] = clamp_u8(trunc_sat<int32_t>(static_cast<double>((j - lo) * (hi - lo)) / t));
    for (int32_t k = 0; k <= 255 - t; ++k)
        table[t + k] = clamp_u8(trunc_sat<int32_t>(static_cast<double>(k) * span / (256 - t) + base));
    const uint8_t *const tables[1] = {table};
    map_bytes(plane, plane, n, 1, tables);
}

// Histogram, Otsu level T and the count S below T of a plane; false when S
// is 0 or the plane is unusable.
struct PlaneStats {
    uint32_t hist[256];
    int32_t t;
    uint64_t below;
};

bool plane_stats(const uint8_t *plane, int32_t width, int32_t height, PlaneStats &s) {
    if (plane == nullptr || width <= 0 || height <= 0) return false;
    if (checked_size(static_cast<uint64_t>(width), static_cast<uint64_t>(height)) == 0) return false;
    const size_t n = static_cast<size_t>(width) * static_cast<size_t>(height);
    count_levels(n, s.hist, [plane](size_t i) { return plane[i]; });
    s.t = otsu_threshold(s.hist);
    s.below = 0;
    for (int32_t i = 0; i < s.t; ++i)
        s.below += s.hist[i];
    return s.below != 0;
}

int32_t gray_stretch(uint8_t *plane, int32_t width, int32_t height) {
    PlaneStats s;
    if (!plane_stats(plane, width, height, s)) return 0;
    const auto total = static_cast<double>(s.below);
    auto share = [&](int32_t i) { return static_cast<double>(s.hist[i]) / total > 0.01; };
    int32_t lo = 0;
    for (int32_t i = 0; i < s.t; ++i)
        if (share(i)) {
            lo = i;
            break;
        }
    int32_t hi = -1;
    for (int32_t i = s.t - 1; i > lo; --i)
        if (share(i)) {
            hi = i;
            break;
        }
    if (hi < 0) return 0;
    stretch_plane(plane, static_cast<size_t>(width) * static_cast<size_t>(height), s.t, lo, hi, 210.0, 45.0);
    return 1;
}

int32_t blue_stretch(uint8_t *plane, int32_t width, int32_t height) {
    PlaneStats s;
    if (!plane_stats(plane, width, height, s)) return 0;
    const auto total = static_cast<double>(s.below);
    uint64_t cum = 0;
    int32_t lo = -1;
    for (int32_t i = 0; i < s.t; ++i) {
        cum += s.hist[i];
        if (static_cast<double>(cum) > 0.01 * total) {
            lo = i;
            break;
        }
    }
    if (lo < 0) return 0;
    // The running sum continues from lo itself, so H[lo] counts twice.
    int32_t hi = -1;
    for (int32_t i = lo; i < s.t; ++i) {
        cum += s.hist[i];
        if (static_cast<double>(cum) > 0.98 * total) {
            hi = i;
            break;
        }
    }
    if (hi <= lo) return 0;
    stretch_plane(plane, static_cast<size_t>(width) * static_cast<size_t>(height), s.t, lo, hi, 250.0, 5.0);
    return 1;
}

} // namespace

extern "C" {

PXImage *PXImage_Effect_Clip(const PXImage *photo, const PXImage *frame) {
    if (photo == nullptr || !px_rows_inside(photo) || (photo->bitcount != 8 && photo->bitcount != 24)) return nullptr;
    const std::optional<View> fv = view_of(frame);
    if (!fv || fv->bitCount != 24 || fv->width < kWindowLeft + kWindowCols || fv->height < kWindowTop + kWindowRows)
        return nullptr;
    PXImage *out = px_new(fv->width, fv->height, 24);
    const std::optional<View> ov = view_of(out);
    if (!ov) return nullptr;
    std::memcpy(ov->bits, fv->bits, fv->block_bytes());
    // A photo without data or pixel rows has no pixel to show: the frame stays.
    const std::optional<View> pv = view_of(photo);
    if (!pv) return out;
    const int32_t pb = px_bytes(photo->bitcount);
    const size_t photoPixels = pv->block_bytes() / static_cast<size_t>(pb);
    for (int32_t r = 0; r < kWindowRows; ++r) {
        uint8_t *row = ov->row(kWindowTop + r) + static_cast<size_t>(kWindowLeft) * 3;
        const size_t photoRow = static_cast<size_t>(r) * static_cast<size_t>(pv->width);
        for (int32_t c = 0; c < kWindowCols; ++c) {
            uint8_t *px = row + static_cast<size_t>(c) * 3;
            const size_t p = photoRow + static_cast<size_t>(c);
            if (px[2] >= kHoleLevel || p >= photoPixels) continue;
            const uint8_t *from = pv->bits + p * pb;
            if (pb == 1) {
                px[0] = px[1] = px[2] = from[0];
            } else {
                px[0] = from[0];
                px[1] = from[1];
                px[2] = from[2];
            }
        }
    }
    return out;
}

int32_t PXImage_Effect_Paint(PXImage *img) {
    const std::optional<View> v = view_of(img);
    if (!v) return 0;
    if (v->bitCount == 8) {
        gray_stretch(v->bits, v->width, v->height);
        return 0;
    }
    if (v->bitCount != 24) return 0;
    const size_t pixels = static_cast<size_t>(v->width) * static_cast<size_t>(v->height);
    Buffer<uint8_t> green = alloc_buffer<uint8_t>(pixels);
    if (!green) return 0;
    uint8_t *d = v->bits;
    for (size_t i = 0; i < pixels; ++i)
        green[i] = d[3 * i + 1];
    gray_stretch(green.get(), v->width, v->height);
    for (size_t i = 0; i < pixels; ++i) {
        const int32_t g = green[i];
        d[3 * i] = static_cast<uint8_t>(g == 0 ? 0 : g - 1);
        d[3 * i + 1] = static_cast<uint8_t>(g);
        d[3 * i + 2] = static_cast<uint8_t>(60 <= g && g <= 128 ? std::min(g + 18, 255) : std::min(g + 2, 255));
    }
    return 0;
}

int32_t EffectPaint_GrayRowData(uint8_t *plane, int32_t width, int32_t height) {
    return gray_stretch(plane, width, height);
}

int32_t EffectPaint_BlueRowData(uint8_t *plane, int32_t width, int32_t height) {
    return blue_stretch(plane, width, height);
}

} // extern "C"
