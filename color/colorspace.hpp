// Per-pixel conversions between packed RGB and HSL, YUV, YIQ and XYZ, inline
// for the plane loops. The exported functions of colorspace.cpp wrap these.
//
// Every conversion keeps alpha (bits 24-31) as it is. Float steps are single
// precision with the stated order of additions, except the Z term of the XYZ
// inverse, which is finished in double; float to integer truncates.
#pragma once

#include <cstdint>
#include <type_traits>

#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"

namespace pxfx::colour {

// Mode numbers shared by Split and Combine.
enum Mode : int32_t { kRgb = 0, kHsl = 1, kYuv = 2, kYiq = 3, kXyz = 4 };

constexpr Mode mode_of(int32_t mode) { return mode >= kHsl && mode <= kXyz ? static_cast<Mode>(mode) : kRgb; }

constexpr uint32_t keep_alpha(uint32_t c) { return c & 0xFF000000u; }

inline int32_t trunc_i(float v) { return static_cast<int32_t>(v); }
inline int32_t trunc_i(double v) { return static_cast<int32_t>(v); }
inline float f(int32_t v) { return static_cast<float>(v); }

// n / d truncated toward zero for |n| < 2^17 and 1 <= d <= 510, as a
// multiplication: with r = floor(2^31 / d) + 1 the error of |n| r / 2^31
// against |n| / d stays below 2^-14, less than the 1/d gap to the next integer.
struct Reciprocals {
    uint32_t r[511] = {};
    constexpr Reciprocals() {
        for (uint32_t d = 1; d < 511; ++d)
            r[d] = static_cast<uint32_t>((uint64_t{1} << 31) / d + 1);
    }
};
inline constexpr Reciprocals kReciprocals{};

inline int32_t div_small(int32_t n, int32_t d) {
    const uint32_t m = static_cast<uint32_t>(n < 0 ? -n : n);
    const int32_t q = static_cast<int32_t>((static_cast<uint64_t>(m) * kReciprocals.r[d]) >> 31);
    return n < 0 ? -q : q;
}

// Written with selects rather than branches: the channel that is largest
// changes from pixel to pixel. A tie goes to red, then to blue unless green is
// the largest; a gray (d = 0) has hue 170 and saturation 0.
inline uint32_t rgb_to_hsl(uint32_t c) {
    const int32_t r = static_cast<int32_t>(red_of(c)), g = static_cast<int32_t>(green_of(c)),
                  b = static_cast<int32_t>(blue_of(c));
    const int32_t mx = r > g ? (r > b ? r : b) : (g > b ? g : b);
    const int32_t mn = r < g ? (r < b ? r : b) : (g < b ? g : b);
    const int32_t sum = mx + mn, d = mx - mn;
    const uint32_t l = static_cast<uint32_t>((sum + 1) >> 1) & 255;
    const int32_t den = l <= 127 ? sum : 510 - sum;
    const int32_t num = r == mx ? g - b : (g != mx ? r - g : b - r);
    const int32_t turn = r == mx ? (g < b ? 255 : 0) : (g != mx ? 170 : 85);
    const int32_t dd = d != 0 ? d : 1;
    const uint32_t s = d != 0 ? static_cast<uint32_t>(div_small(d * 255 + den / 2, den != 0 ? den : 1)) & 255 : 0;
    uint32_t h = static_cast<uint32_t>(div_small(num * 255 / 6 + dd / 2, dd) + turn) & 0xFFFF;
    h = d != 0 ? (h > 255 ? 255 : h) : 170;
    return l | s << 8 | h << 16 | keep_alpha(c);
}

constexpr uint16_t hue_to_rgb(uint16_t lo, uint16_t hi, uint16_t hue) {
    int32_t h = hue;
    if (h > 255) h -= 255;
    const int32_t l = lo, span = static_cast<int32_t>(hi) - l;
    if (h <= 41) return static_cast<uint16_t>(l + (span * h * 6 + 126) / 255);
    if (h <= 126) return hi;
    if (h <= 169) return static_cast<uint16_t>(l + (span * (1020 - 6 * h) + 126) / 255);
    return lo;
}

// hue_to_rgb(lo, hi, hue) = lo + ((hi - lo) * w + 126) / 255 when lo <= hi,
// with w = 6 hue, 255, 1020 - 6 hue or 0 by the range of the (folded) hue: the
// ranges that return hi or lo give exactly that. HSLtoRGB always has
// 0 <= M1 <= M2 (M2 <= 2L), so its channels take their weights from tables
// indexed by the hue byte instead of branching (32-bit entries, which vector
// gathers read).
constexpr int32_t hue_weight(uint32_t hue) {
    const uint32_t h = hue > 255 ? (hue - 255) & 0xFFFF : hue;
    return h <= 41 ? static_cast<int32_t>(6 * h)
                   : (h <= 126 ? 255 : (h <= 169 ? static_cast<int32_t>(1020 - 6 * h) : 0));
}

struct HueWeights {
    int32_t red[256] = {}, green[256] = {}, blue[256] = {};
    constexpr HueWeights() {
        for (uint32_t h = 0; h < 256; ++h) {
            red[h] = hue_weight(h + 85);
            green[h] = hue_weight(h);
            blue[h] = hue_weight((h - 85) & 0xFFFF);
        }
    }
};
inline constexpr HueWeights kHueWeights{};

inline uint32_t hsl_to_rgb(uint32_t c) {
    const int32_t l = static_cast<int32_t>(blue_of(c)), s = static_cast<int32_t>(green_of(c));
    const uint32_t h = red_of(c);
    // A gray (s = 0) needs no case of its own: m2 = m1 = l and span = 0.
    // Every dividend is non-negative (m2 >= l, so span >= 0): unsigned
    // division by 255 is the same and cheaper.
    const auto by255 = [](int32_t v) { return static_cast<int32_t>(static_cast<uint32_t>(v) / 255u); };
    const int32_t m2 = l <= 127 ? by255(l * (s + 255) + 127) : l + s - by255(l * s + 127);
    const int32_t m1 = 2 * l - m2, span = m2 - m1;
    const uint32_t rr = static_cast<uint32_t>(m1 + by255(span * kHueWeights.red[h] + 126)) & 255u;
    const uint32_t gg = static_cast<uint32_t>(m1 + by255(span * kHueWeights.green[h] + 126)) & 255u;
    const uint32_t bb = static_cast<uint32_t>(m1 + by255(span * kHueWeights.blue[h] + 126)) & 255u;
    return pack(bb, gg, rr, 0) | keep_alpha(c);
}

inline uint32_t rgb_to_yuv(uint32_t c) {
    const int32_t r = static_cast<int32_t>(red_of(c)), g = static_cast<int32_t>(green_of(c)),
                  b = static_cast<int32_t>(blue_of(c));
    const int32_t y = trunc_i(0.299f * f(r) + 0.587f * f(g) + 0.114f * f(b));
    const int32_t u = trunc_i(f(b - y) * 0.565f + 128.0f);
    const int32_t v = trunc_i(f(r - y) * 0.713f + 128.0f);
    return pack(clamp_u8(v), clamp_u8(u), clamp_u8(y), 0) | keep_alpha(c);
}

inline uint32_t yuv_to_rgb(uint32_t c) {
    const float y = f(static_cast<int32_t>(red_of(c)));
    const float u = f(static_cast<int32_t>(green_of(c)) - 128), v = f(static_cast<int32_t>(blue_of(c)) - 128);
    const int32_t r = trunc_i(y + 1.403f * v);
    const int32_t g = trunc_i((y - 0.344f * u) - 0.714f * v);
    const int32_t b = trunc_i(y + 1.77f * u);
    return pack(clamp_u8(b), clamp_u8(g), clamp_u8(r), 0) | keep_alpha(c);
}

inline uint32_t rgb_to_yiq(uint32_t c) {
    const float r = f(static_cast<int32_t>(red_of(c))), g = f(static_cast<int32_t>(green_of(c))),
                b = f(static_cast<int32_t>(blue_of(c)));
    const int32_t y = trunc_i((0.2992f * r + 0.5868f * g) + 0.114f * b);
    const int32_t i = trunc_i(((0.596f * r - 0.2742f * g) - 0.3219f * b) + 128.0f);
    const int32_t q = trunc_i(((0.2109f * r - 0.5229f * g) + 0.312f * b) + 128.0f);
    return pack(clamp_u8(q), clamp_u8(i), clamp_u8(y), 0) | keep_alpha(c);
}

inline uint32_t yiq_to_rgb(uint32_t c) {
    const float y = f(static_cast<int32_t>(red_of(c)));
    const float i = f(static_cast<int32_t>(green_of(c)) - 128), q = f(static_cast<int32_t>(blue_of(c)) - 128);
    const int32_t r = trunc_i((y + 0.956f * i) + 0.621f * q);
    const int32_t g = trunc_i((y - 0.273f * i) - 0.647f * q);
    const int32_t b = trunc_i((y - 1.104f * i) + 1.701f * q);
    return pack(clamp_u8(b), clamp_u8(g), clamp_u8(r), 0) | keep_alpha(c);
}

inline uint32_t rgb_to_xyz(uint32_t c) {
    const float r = f(static_cast<int32_t>(red_of(c))), g = f(static_cast<int32_t>(green_of(c))),
                b = f(static_cast<int32_t>(blue_of(c)));
    const int32_t x = trunc_i((0.412453f * r + 0.35758f * g) + 0.180423f * b);
    const int32_t y = trunc_i((0.212671f * r + 0.71516f * g) + 0.072169f * b);
    const int32_t z = trunc_i(((0.019334f * r + 0.119193f * g) + 0.950227f * b) * 0.9184837f);
    return pack(static_cast<uint32_t>(z) & 255, static_cast<uint32_t>(y) & 255, static_cast<uint32_t>(x) & 255, 0) |
           keep_alpha(c);
}

// Inverse of the Z scaling, applied in double precision.
inline constexpr double kZUnscale = 1.088751;

inline uint32_t xyz_to_rgb(uint32_t c) {
    const float x = f(static_cast<int32_t>(red_of(c))), y = f(static_cast<int32_t>(green_of(c))),
                z = f(static_cast<int32_t>(blue_of(c)));
    const double zr = static_cast<double>(0.498535f * z) * kZUnscale;
    const double zg = static_cast<double>(0.041556f * z) * kZUnscale;
    const double zb = static_cast<double>(1.057311f * z) * kZUnscale;
    const int32_t r = trunc_i(static_cast<double>(3.240479f * x - 1.53715f * y) - zr);
    const int32_t g = trunc_i(static_cast<double>(-0.969256f * x + 1.875992f * y) + zg);
    const int32_t b = trunc_i(static_cast<double>(0.055648f * x - 0.204043f * y) + zb);
    return pack(clamp_u8(b), clamp_u8(g), clamp_u8(r), 0) | keep_alpha(c);
}

// Forward conversion of a mode (plain RGB passes through).
template <Mode M> inline uint32_t from_rgb(uint32_t c) {
    if constexpr (M == kHsl)
        return rgb_to_hsl(c);
    else if constexpr (M == kYuv)
        return rgb_to_yuv(c);
    else if constexpr (M == kYiq)
        return rgb_to_yiq(c);
    else if constexpr (M == kXyz)
        return rgb_to_xyz(c);
    else
        return c;
}

template <Mode M> inline uint32_t to_rgb(uint32_t c) {
    if constexpr (M == kHsl)
        return hsl_to_rgb(c);
    else if constexpr (M == kYuv)
        return yuv_to_rgb(c);
    else if constexpr (M == kYiq)
        return yiq_to_rgb(c);
    else if constexpr (M == kXyz)
        return xyz_to_rgb(c);
    else
        return c;
}

// Calls fn(std::integral_constant<Mode, M>{}) for the mode number.
template <class Fn> decltype(auto) with_mode(int32_t mode, Fn &&fn) {
    switch (mode_of(mode)) {
    case kHsl: return fn(std::integral_constant<Mode, kHsl>{});
    case kYuv: return fn(std::integral_constant<Mode, kYuv>{});
    case kYiq: return fn(std::integral_constant<Mode, kYiq>{});
    case kXyz: return fn(std::integral_constant<Mode, kXyz>{});
    default: return fn(std::integral_constant<Mode, kRgb>{});
    }
}

} // namespace pxfx::colour
