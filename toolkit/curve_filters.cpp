// Curve-table colour filters: luminance shift and tint toward a colour, the
// circular-arc tone curve and the blend with the stored tone curves. Each one
// builds a 256-entry map per call and runs it over the rows.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>

#include "core/internal/byte_map.hpp"
#include "core/internal/curve_blend.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

using Map = uint8_t[256];

// Colour argument of the filters: red in bits 0-7, blue in bits 16-23.
constexpr int32_t arg_red(uint32_t c) { return static_cast<int32_t>(c & 255); }
constexpr int32_t arg_green(uint32_t c) { return static_cast<int32_t>((c >> 8) & 255); }
constexpr int32_t arg_blue(uint32_t c) { return static_cast<int32_t>((c >> 16) & 255); }

// Images the filters take: a pixel block of the bit count whose rows stay
// inside it. Images of an empty or negative size have no samples to map.
bool target_ok(const Image *img, uint32_t bitCount) {
    return img != nullptr && img->bits != nullptr && img->bitCount == bitCount && rows_inside(img);
}

// The masked filters accept no mask, or an 8-bit one whose rows stay inside
// its block. A mask without a pixel block reads as 0 everywhere and so
// selects nothing; one of an empty or negative size leaves no area to visit.
bool mask_usable(const Image *mask) { return mask == nullptr || (mask->bitCount == 8 && rows_inside(mask)); }

// Maps the first `bpp * width` bytes of every row through m (bytes of one pixel
// through m[0], m[1], ... in turn); with a mask, only the pixels of the
// top-left area common to both views whose mask byte is non-zero.
template <int Bpp> void apply(const View &img, const Map *m, const View *mask) {
    const int32_t w = mask ? std::min(mask->width, img.width) : img.width;
    const int32_t h = mask ? std::min(mask->height, img.height) : img.height;
    if (mask == nullptr) {
        const uint8_t *tables[Bpp];
        for (int k = 0; k < Bpp; ++k)
            tables[k] = m[k];
        const ByteMap map(Bpp, tables, static_cast<size_t>(w) * static_cast<size_t>(h), true);
        for (int32_t y = 0; y < h; ++y)
            map(img.row(y), img.row(y), static_cast<size_t>(w));
        return;
    }
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *row = img.row(y);
        const uint8_t *sel = mask->row(y);
        for (int32_t x = 0; x < w; ++x)
            if (sel[x] != 0)
                for (int k = 0; k < Bpp; ++k)
                    row[Bpp * x + k] = m[k][row[Bpp * x + k]];
    }
}

void apply_plane(const View &img, const Map &m) { apply<1>(img, &m, nullptr); }

// Levels outside 0..255 and the neutral 128 are refused.
bool level_usable(const Image *img, int32_t level) {
    return level >= 0 && level <= 255 && level != 128 && target_ok(img, 8);
}

// Circular-arc curve through (0, 0) and (255, 255) bowed by the strength.
void arc_curve(int32_t level, Map &table) {
    const int32_t a = (std::abs(level - 128) >> 1) + 128;
    const int32_t r = static_cast<int32_t>(std::sqrt(static_cast<double>(a * a / 2)));
    const int32_t s = 255 - r;
    const int32_t k = (s * s + r * r - 512 * s) / 510;
    const int32_t c = 255 - k;
    const int32_t r2 = k * k + c * c;
    for (int32_t i = 0; i < 256; ++i) {
        const int32_t m = std::abs(i - c);
        const int32_t radicand = r2 - m * m;
        int32_t t = 0;
        if (radicand >= 0) {
            const double v = std::sqrt(static_cast<double>(radicand)) - std::abs(k);
            t = v > 0.0 ? static_cast<int32_t>(v) : 0;
        }
        table[i] = clamp_u8(t);
    }
}

// Darkening: the curve mirrored about the diagonal. Levels no entry maps to
// take the input of the next higher level that has one (0 above the top).
void invert_curve(Map &table) {
    uint8_t inverse[256] = {};
    for (int32_t j = 0; j < 256; ++j)
        inverse[table[j]] = static_cast<uint8_t>(j);
    uint8_t last = 0;
    for (int32_t v = 255; v >= 0; --v) {
        if (inverse[v] != 0) last = inverse[v];
        table[v] = last;
    }
}

} // namespace

extern "C" {

int32_t ColorFilter(Image *img, uint32_t colour, const Image *mask) {
    if (!target_ok(img, 8) || !mask_usable(mask)) return 0;
    // Images and masks without samples leave nothing to map.
    const std::optional<View> v = view_of(img), sel = view_of(mask);
    if (!v || (mask != nullptr && !sel)) return 1;
    const float lumf = static_cast<float>(arg_red(colour)) * 0.2992f + static_cast<float>(arg_green(colour)) * 0.5868f +
                       static_cast<float>(arg_blue(colour)) * 0.114f;
    int32_t lum = static_cast<int32_t>(lumf);
    if (lum == 127 || lum == 128) return 1;
    if (lum > 255) lum = 255;
    const int32_t delta = lum < 127 ? (lum - 127) * 44 / 127 : ((lum - 127) * 47) >> 7;
    Map m;
    for (int32_t v = 0; v < 256; ++v)
        m[v] = clamp_u8(v + delta);
    apply<1>(*v, &m, sel ? &*sel : nullptr);
    return 1;
}

int32_t ColorFilter24(Image *img, uint32_t colour, const Image *mask) {
    if (!target_ok(img, 24) || !mask_usable(mask)) return 0;
    // Images and masks without samples leave nothing to map.
    const std::optional<View> v = view_of(img), sel = view_of(mask);
    if (!v || (mask != nullptr && !sel)) return 1;
    const uint32_t target[3] = {static_cast<uint32_t>(arg_blue(colour)), static_cast<uint32_t>(arg_green(colour)),
                                static_cast<uint32_t>(arg_red(colour))};
    Map m[3];
    for (int k = 0; k < 3; ++k)
        for (uint32_t v = 0; v < 256; ++v)
            m[k][v] = static_cast<uint8_t>((210 * v + 45 * target[k]) / 255);
    apply<3>(*v, m, sel ? &*sel : nullptr);
    return 1;
}

int32_t ColorFilter1(Image *img, int32_t level) {
    if (!level_usable(img, level)) return 0;
    const std::optional<View> v = view_of(img);
    if (!v) return 1; // no samples to map
    Map table;
    arc_curve(level, table);
    if ((level & 128) == 0) invert_curve(table);
    apply_plane(*v, table);
    return 1;
}

int32_t ColorFilter_zanto(Image *img, int32_t level) {
    if (!level_usable(img, level)) return 0;
    const std::optional<View> v = view_of(img);
    if (!v) return 1; // no samples to map
    const int32_t d = std::abs(level - 128);
    const uint8_t *curve = (level & 128) != 0 ? ZANTOFILTER : ZANTOFILTERBK;
    Map table;
    for (int32_t i = 0; i < 256; ++i)
        table[i] = curve_blend<127>(i, curve[i], d);
    apply_plane(*v, table);
    return 1;
}

} // extern "C"
