// RGB to HSL and back over vectors of byte pixels: rgb_to_hsl and hsl_to_rgb
// of color/colorspace.hpp, byte for byte. The channels are split into byte
// vectors; the arithmetic runs in 16-bit lanes, and the two divisions of
// rgb_to_hsl, whose divisors change from pixel to pixel, in 32-bit lanes
// through float division. hsl_to_rgb picks each channel by the hue's sixth
// rather than reading weight tables.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "color/planes_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET == HWY_SCALAR
// Single lanes never run (core/cpu.cpp leaves them out): the plain loops do.
template <int C> size_t split_hsl(const uint8_t *, size_t, uint8_t *, uint8_t *, uint8_t *, uint8_t *) { return 0; }
template <int C>
size_t combine_hsl(const uint8_t *, const uint8_t *, const uint8_t *, const uint8_t *, size_t, uint8_t *) {
    return 0;
}
#else
using D8 = hn::ScalableTag<uint8_t>;
using V8 = hn::Vec<D8>;
using D16 = hn::Repartition<uint16_t, D8>;
using V16 = hn::Vec<D16>;
using DI16 = hn::RebindToSigned<D16>;
using VI16 = hn::Vec<DI16>;
using D32 = hn::Repartition<int32_t, D8>;
using V32 = hn::Vec<D32>;
using DF = hn::Repartition<float, D8>;

HWY_INLINE V16 lower16(V8 v) { return hn::PromoteTo(D16(), hn::LowerHalf(hn::Half<D8>(), v)); }
HWY_INLINE V16 upper16(V8 v) { return hn::PromoteTo(D16(), hn::UpperHalf(hn::Half<D8>(), v)); }
HWY_INLINE V32 lower32(V16 v) { return hn::PromoteTo(D32(), hn::LowerHalf(hn::Half<D16>(), v)); }
HWY_INLINE V32 upper32(V16 v) { return hn::PromoteTo(D32(), hn::UpperHalf(hn::Half<D16>(), v)); }

// The low byte of each 16-bit lane of lo, then of hi: the & 255 of the plain
// code.
HWY_INLINE V8 low_bytes(V16 lo, V16 hi) {
    const D8 d;
    return hn::ConcatEven(d, hn::BitCast(d, hi), hn::BitCast(d, lo));
}

HWY_INLINE VI16 as_signed(V16 v) { return hn::BitCast(DI16(), v); }
HWY_INLINE V16 as_unsigned(VI16 v) { return hn::BitCast(D16(), v); }

// floor(n / d) in the low 16 bits of each lane, for 0 <= n < 2^16 and
// 1 <= d <= 510. Float holds n and d exactly. With k = floor(n / d), a
// correctly rounded division gives k when d divides n; otherwise
// k + 1 - n / d >= 1 / d, while rounding moves n / d by at most
// 2^-24 (k + 1) < 1 / d (as d (k + 1) <= n + d < 2^24), so the quotient stays
// in [k, k + 1) and truncates to k; adding 2^23 then puts k in the low bits
// (cheaper than a conversion, which checks for overflow). 32-bit ARM has no
// division instruction and divides through a refined reciprocal estimate,
// which lands within one of n / d: there the remainder n - q d moves q onto k.
constexpr bool kDivisionRounds = !HWY_ARCH_ARM_V7;

HWY_INLINE V32 divide32(V32 n, V32 d) {
    const D32 di;
    const DF df;
    const auto quotient = hn::Div(hn::ConvertTo(df, n), hn::ConvertTo(df, d));
    if constexpr (kDivisionRounds) {
        return hn::BitCast(di, hn::Add(hn::Trunc(quotient), hn::Set(df, 8388608.0f)));
    } else {
        V32 q = hn::ConvertTo(di, quotient);
        const V32 r = hn::Sub(n, hn::Mul(q, d));
        q = hn::Sub(q, hn::VecFromMask(di, hn::Lt(d, hn::Add(r, hn::Set(di, 1)))));
        return hn::Add(q, hn::VecFromMask(di, hn::Lt(r, hn::Zero(di))));
    }
}

HWY_INLINE V16 divide(V16 n, V16 d) {
    const D16 dw;
    const V32 lo = divide32(lower32(n), lower32(d)), hi = divide32(upper32(n), upper32(d));
    return hn::ConcatEven(dw, hn::BitCast(dw, hi), hn::BitCast(dw, lo));
}

// Saturation and the hue's quotient of rgb_to_hsl in 16-bit lanes for
// pixels that are not gray: sum = mx + mn and d = mx - mn, num = x - y as
// picked by the largest channel. The lightness is at most 127 when
// sum <= 254.
HWY_INLINE void sat_hue(V16 sum, V16 d, V16 x, V16 y, V16 &s, V16 &q) {
    const D16 dw;
    const DI16 di;
    const auto dark = hn::RebindMask(dw, hn::Lt(as_signed(sum), hn::Set(di, 255)));
    const V16 den = hn::Max(hn::IfThenElse(dark, sum, hn::Sub(hn::Set(dw, 510), sum)), hn::Set(dw, 1));
    s = divide(hn::Add(hn::Mul(d, hn::Set(dw, 255)), hn::ShiftRight<1>(den)), den);
    // num * 255 / 6 truncated = sign(num) (42 |num| + |num| / 2), as 255 = 6 * 42 + 3.
    const VI16 num = hn::Sub(as_signed(x), as_signed(y));
    const VI16 mag = hn::Abs(num);
    const VI16 part = hn::Add(hn::Mul(mag, hn::Set(di, 42)), hn::ShiftRight<1>(mag));
    const V16 dd = hn::Max(d, hn::Set(dw, 1));
    const VI16 half = as_signed(hn::ShiftRight<1>(dd));
    const VI16 t = hn::IfThenElse(hn::Lt(num, hn::Zero(di)), hn::Sub(half, part), hn::Add(half, part));
    // The quotient truncates toward zero, as div_small does.
    const VI16 quotient = as_signed(divide(as_unsigned(hn::Abs(t)), dd));
    q = as_unsigned(hn::IfThenElse(hn::Lt(t, hn::Zero(di)), hn::Neg(quotient), quotient));
}

// The hue is quotient + turn, whose clamp to 0..255 never acts: |t| <= 43 d
// keeps |quotient| <= 43; turn 0 comes with num >= 0 and turn 255 with
// num < 0, where t < d / 2 - 42 leaves quotient <= 0. So the byte sum of the
// quotient's low byte and turn is the hue.
HWY_INLINE void to_hsl(V8 r, V8 g, V8 b, V8 &h, V8 &s, V8 &l) {
    const D8 d;
    const V8 mx = hn::Max(hn::Max(r, g), b), mn = hn::Min(hn::Min(r, g), b);
    l = hn::AverageRound(mx, mn);
    const V8 dist = hn::Sub(mx, mn);
    const auto red_max = hn::Eq(r, mx), green_max = hn::Eq(g, mx);
    const V8 x = hn::IfThenElse(red_max, g, hn::IfThenElse(green_max, b, r));
    const V8 y = hn::IfThenElse(red_max, b, hn::IfThenElse(green_max, r, g));
    const V8 turn = hn::IfThenElse(red_max, hn::IfThenElseZero(hn::Lt(x, y), hn::Set(d, 255)),
                                   hn::IfThenElse(green_max, hn::Set(d, 85), hn::Set(d, 170)));
    V16 s_lo, s_hi, q_lo, q_hi;
    sat_hue(hn::Add(lower16(mx), lower16(mn)), lower16(dist), lower16(x), lower16(y), s_lo, q_lo);
    sat_hue(hn::Add(upper16(mx), upper16(mn)), upper16(dist), upper16(x), upper16(y), s_hi, q_hi);
    const auto gray = hn::Eq(dist, hn::Zero(d));
    s = hn::IfThenZeroElse(gray, low_bytes(s_lo, s_hi));
    h = hn::IfThenElse(gray, hn::Set(d, 170), hn::Add(low_bytes(q_lo, q_hi), turn));
}

// v / 255 for any 16-bit v: (v * 32897) >> 23.
HWY_INLINE V16 by255(V16 v) { return hn::ShiftRight<7>(hn::MulHigh(v, hn::Set(D16(), 32897))); }

// hsl_to_rgb in 16-bit lanes. A weight of 255 gives m2 and one of 0 gives m1,
// and every hue leaves at most one channel on a slope of hue_weight: the
// hue's sixth picks which channel takes m2, m1 or the sloped value. With
// e = 6 hue - 510 p, p the hue's third (below 85, below 170, above), the
// slope rises as e up to 246 and falls as 510 - e from 258.
//
// The span m2 - m1 = 2 (m2 - l) is even, so (span w + 126) / 255 =
// 2 (hs w + 63) / 255 with hs = m2 - l <= 127: the product stays below 2^15
// although w reaches 258, and (v * 32897) >> 22 gives 2 v / 255 exactly for
// v < 33026.
HWY_INLINE void from_hsl(V16 h, V16 s, V16 l, V16 &r, V16 &g, V16 &b) {
    const D16 dw;
    const DI16 di;
    const V16 low = by255(hn::Add(hn::Mul(l, hn::Add(s, hn::Set(dw, 255))), hn::Set(dw, 127)));
    const V16 high = hn::Sub(hn::Add(l, s), by255(hn::Add(hn::Mul(l, s), hn::Set(dw, 127))));
    const V16 m2 = hn::IfThenElse(hn::RebindMask(dw, hn::Lt(as_signed(l), hn::Set(di, 128))), low, high);
    const V16 hs = hn::Sub(m2, l), m1 = hn::Sub(l, hs);
    const VI16 hue = as_signed(h);
    const auto first = hn::RebindMask(dw, hn::Lt(hue, hn::Set(di, 85)));
    const auto second = hn::RebindMask(dw, hn::Lt(hue, hn::Set(di, 170)));
    const V16 third =
        hn::Add(hn::IfThenElseZero(first, hn::Set(dw, 510)), hn::IfThenElseZero(second, hn::Set(dw, 510)));
    const V16 e = hn::Sub(hn::Add(hn::Mul(h, hn::Set(dw, 6)), third), hn::Set(dw, 1020));
    const auto rising = hn::RebindMask(dw, hn::Lt(as_signed(e), hn::Set(di, 252)));
    const V16 w = hn::IfThenElse(rising, e, hn::Sub(hn::Set(dw, 510), e));
    const V16 v = hn::Add(hn::Mul(hs, w), hn::Set(dw, 63));
    const V16 slope = hn::Add(m1, hn::ShiftRight<6>(hn::MulHigh(v, hn::Set(dw, 32897))));
    const V16 up = hn::IfThenElse(rising, slope, m2), down = hn::IfThenElse(rising, m2, slope);
    g = hn::IfThenElse(first, up, hn::IfThenElse(second, down, m1));
    r = hn::IfThenElse(first, down, hn::IfThenElse(second, m1, up));
    b = hn::IfThenElse(first, m1, hn::IfThenElse(second, up, down));
}

HWY_INLINE void to_rgb(V8 h, V8 s, V8 l, V8 &r, V8 &g, V8 &b) {
    V16 r_lo, g_lo, b_lo, r_hi, g_hi, b_hi;
    from_hsl(lower16(h), lower16(s), lower16(l), r_lo, g_lo, b_lo);
    from_hsl(upper16(h), upper16(s), upper16(l), r_hi, g_hi, b_hi);
    r = low_bytes(r_lo, r_hi);
    g = low_bytes(g_lo, g_hi);
    b = low_bytes(b_lo, b_hi);
}

template <int C>
size_t split_hsl(const uint8_t *in, size_t pixels, uint8_t *hue, uint8_t *sat, uint8_t *light, uint8_t *alpha) {
    const D8 d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    for (size_t i = 0; i < whole; i += lanes) {
        V8 b, g, r, a = hn::Set(d, 255);
        if constexpr (C == 3)
            hn::LoadInterleaved3(d, in + 3 * i, b, g, r);
        else
            hn::LoadInterleaved4(d, in + 4 * i, b, g, r, a);
        V8 h, s, l;
        to_hsl(r, g, b, h, s, l);
        hn::StoreU(h, d, hue + i);
        hn::StoreU(s, d, sat + i);
        hn::StoreU(l, d, light + i);
        if (alpha != nullptr) hn::StoreU(a, d, alpha + i);
    }
    return whole;
}

template <int C>
size_t combine_hsl(const uint8_t *hue, const uint8_t *sat, const uint8_t *light, const uint8_t *alpha, size_t pixels,
                   uint8_t *out) {
    const D8 d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    for (size_t i = 0; i < whole; i += lanes) {
        V8 r, g, b;
        to_rgb(hn::LoadU(d, hue + i), hn::LoadU(d, sat + i), hn::LoadU(d, light + i), r, g, b);
        if constexpr (C == 3)
            hn::StoreInterleaved3(b, g, r, d, out + 3 * i);
        else
            hn::StoreInterleaved4(b, g, r, hn::LoadU(d, alpha + i), d, out + 4 * i);
    }
    return whole;
}
#endif

size_t split_hsl3(const uint8_t *in, size_t pixels, uint8_t *h, uint8_t *s, uint8_t *l, uint8_t *a) {
    return split_hsl<3>(in, pixels, h, s, l, a);
}
size_t split_hsl4(const uint8_t *in, size_t pixels, uint8_t *h, uint8_t *s, uint8_t *l, uint8_t *a) {
    return split_hsl<4>(in, pixels, h, s, l, a);
}
size_t combine_hsl3(const uint8_t *h, const uint8_t *s, const uint8_t *l, const uint8_t *a, size_t pixels,
                    uint8_t *out) {
    return combine_hsl<3>(h, s, l, a, pixels, out);
}
size_t combine_hsl4(const uint8_t *h, const uint8_t *s, const uint8_t *l, const uint8_t *a, size_t pixels,
                    uint8_t *out) {
    return combine_hsl<4>(h, s, l, a, pixels, out);
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(split_hsl3);
HWY_EXPORT(split_hsl4);
HWY_EXPORT(combine_hsl3);
HWY_EXPORT(combine_hsl4);
} // namespace

vec::SplitHsl vec::split_hsl(int channels) {
    return channels == 3 ? PXFX_VECTOR_COPY(split_hsl3) : PXFX_VECTOR_COPY(split_hsl4);
}

vec::CombineHsl vec::combine_hsl(int channels) {
    return channels == 3 ? PXFX_VECTOR_COPY(combine_hsl3) : PXFX_VECTOR_COPY(combine_hsl4);
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
