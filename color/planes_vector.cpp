// Colour modes over vectors of byte pixels: rgb_to_hsl, rgb_to_yuv,
// rgb_to_yiq and their inverses of color/colorspace.hpp, byte for byte. The
// channels are split into byte vectors. HSL runs in 16-bit lanes, and the two
// divisions of rgb_to_hsl, whose divisors change from pixel to pixel, in
// 32-bit lanes through float division; hsl_to_rgb picks each channel by the
// hue's sixth rather than reading weight tables. YUV and YIQ run in float
// lanes with the plain code's products and sums, in its order.
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
template <class M, int C> size_t split_row(const uint8_t *, size_t, uint8_t *, uint8_t *, uint8_t *, uint8_t *) {
    return 0;
}
template <class M, int C>
size_t combine_row(const uint8_t *, const uint8_t *, const uint8_t *, const uint8_t *, size_t, uint8_t *) {
    return 0;
}
struct Hsl {};
struct Yuv {};
struct Yiq {};
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

struct Hsl {
    static void forward(V8 r, V8 g, V8 b, V8 &h, V8 &s, V8 &l) { to_hsl(r, g, b, h, s, l); }
    static void back(V8 h, V8 s, V8 l, V8 &r, V8 &g, V8 &b) { to_rgb(h, s, l, r, g, b); }
};

// The float modes work on 32-bit lanes, a quarter of the byte vectors at a
// time: f(a, b, c, x, y, z) takes the three components as integers and gives
// three integers, which are clamped to bytes as clamp_u8 does.
template <class Fn> HWY_INLINE void by_quarters(V8 a, V8 b, V8 c, V8 &x, V8 &y, V8 &z, Fn f) {
    const D32 di;
    const V16 a16[2] = {lower16(a), upper16(a)}, b16[2] = {lower16(b), upper16(b)}, c16[2] = {lower16(c), upper16(c)};
    V32 out[3][4];
    for (int i = 0; i < 4; ++i) {
        const auto quarter = [&](V16 v) { return i % 2 == 0 ? lower32(v) : upper32(v); };
        f(quarter(a16[i / 2]), quarter(b16[i / 2]), quarter(c16[i / 2]), out[0][i], out[1][i], out[2][i]);
    }
    V8 *const to[3] = {&x, &y, &z};
    const D16 dw;
    for (int k = 0; k < 3; ++k) {
        V16 half[2];
        for (int j = 0; j < 2; ++j) {
            const auto clamp = [&](V32 v) {
                return hn::BitCast(dw, hn::Min(hn::Max(v, hn::Zero(di)), hn::Set(di, 255)));
            };
            half[j] = hn::ConcatEven(dw, clamp(out[k][2 * j + 1]), clamp(out[k][2 * j]));
        }
        *to[k] = low_bytes(half[0], half[1]);
    }
}

HWY_INLINE hn::Vec<DF> fl(V32 v) { return hn::ConvertTo(DF(), v); }
HWY_INLINE V32 trunc_i(hn::Vec<DF> v) { return hn::ConvertTo(D32(), v); }
HWY_INLINE hn::Vec<DF> k(float c) { return hn::Set(DF(), c); }

// rgb_to_yuv and yuv_to_rgb: products first, then the sums in their order.
struct Yuv {
    static void forward(V8 r, V8 g, V8 b, V8 &y, V8 &u, V8 &v) {
        by_quarters(r, g, b, y, u, v, [](V32 ri, V32 gi, V32 bi, V32 &yo, V32 &uo, V32 &vo) {
            yo = trunc_i(
                hn::Add(hn::Add(hn::Mul(k(0.299f), fl(ri)), hn::Mul(k(0.587f), fl(gi))), hn::Mul(k(0.114f), fl(bi))));
            uo = trunc_i(hn::Add(hn::Mul(fl(hn::Sub(bi, yo)), k(0.565f)), k(128.0f)));
            vo = trunc_i(hn::Add(hn::Mul(fl(hn::Sub(ri, yo)), k(0.713f)), k(128.0f)));
        });
    }
    static void back(V8 y, V8 u, V8 v, V8 &r, V8 &g, V8 &b) {
        by_quarters(y, u, v, r, g, b, [](V32 yi, V32 ui, V32 vi, V32 &ro, V32 &go, V32 &bo) {
            const D32 di;
            const auto yf = fl(yi), uf = fl(hn::Sub(ui, hn::Set(di, 128))), vf = fl(hn::Sub(vi, hn::Set(di, 128)));
            ro = trunc_i(hn::Add(yf, hn::Mul(k(1.403f), vf)));
            go = trunc_i(hn::Sub(hn::Sub(yf, hn::Mul(k(0.344f), uf)), hn::Mul(k(0.714f), vf)));
            bo = trunc_i(hn::Add(yf, hn::Mul(k(1.77f), uf)));
        });
    }
};

// rgb_to_yiq and yiq_to_rgb, in the same way.
struct Yiq {
    static void forward(V8 r, V8 g, V8 b, V8 &y, V8 &i, V8 &q) {
        by_quarters(r, g, b, y, i, q, [](V32 ri, V32 gi, V32 bi, V32 &yo, V32 &io, V32 &qo) {
            const auto rf = fl(ri), gf = fl(gi), bf = fl(bi);
            yo = trunc_i(hn::Add(hn::Add(hn::Mul(k(0.2992f), rf), hn::Mul(k(0.5868f), gf)), hn::Mul(k(0.114f), bf)));
            io = trunc_i(hn::Add(
                hn::Sub(hn::Sub(hn::Mul(k(0.596f), rf), hn::Mul(k(0.2742f), gf)), hn::Mul(k(0.3219f), bf)), k(128.0f)));
            qo = trunc_i(hn::Add(
                hn::Add(hn::Sub(hn::Mul(k(0.2109f), rf), hn::Mul(k(0.5229f), gf)), hn::Mul(k(0.312f), bf)), k(128.0f)));
        });
    }
    static void back(V8 y, V8 i, V8 q, V8 &r, V8 &g, V8 &b) {
        by_quarters(y, i, q, r, g, b, [](V32 yi, V32 ii, V32 qi, V32 &ro, V32 &go, V32 &bo) {
            const D32 di;
            const auto yf = fl(yi), if_ = fl(hn::Sub(ii, hn::Set(di, 128))), qf = fl(hn::Sub(qi, hn::Set(di, 128)));
            ro = trunc_i(hn::Add(hn::Add(yf, hn::Mul(k(0.956f), if_)), hn::Mul(k(0.621f), qf)));
            go = trunc_i(hn::Sub(hn::Sub(yf, hn::Mul(k(0.273f), if_)), hn::Mul(k(0.647f), qf)));
            bo = trunc_i(hn::Add(hn::Sub(yf, hn::Mul(k(1.104f), if_)), hn::Mul(k(1.701f), qf)));
        });
    }
};

template <class M, int C>
size_t split_row(const uint8_t *in, size_t pixels, uint8_t *p1, uint8_t *p2, uint8_t *p3, uint8_t *alpha) {
    const D8 d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    for (size_t i = 0; i < whole; i += lanes) {
        V8 b, g, r, a = hn::Set(d, 255);
        if constexpr (C == 3)
            hn::LoadInterleaved3(d, in + 3 * i, b, g, r);
        else
            hn::LoadInterleaved4(d, in + 4 * i, b, g, r, a);
        V8 c1, c2, c3;
        M::forward(r, g, b, c1, c2, c3);
        hn::StoreU(c1, d, p1 + i);
        hn::StoreU(c2, d, p2 + i);
        hn::StoreU(c3, d, p3 + i);
        if (alpha != nullptr) hn::StoreU(a, d, alpha + i);
    }
    return whole;
}

template <class M, int C>
size_t combine_row(const uint8_t *p1, const uint8_t *p2, const uint8_t *p3, const uint8_t *alpha, size_t pixels,
                   uint8_t *out) {
    const D8 d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    for (size_t i = 0; i < whole; i += lanes) {
        V8 r, g, b;
        M::back(hn::LoadU(d, p1 + i), hn::LoadU(d, p2 + i), hn::LoadU(d, p3 + i), r, g, b);
        if constexpr (C == 3)
            hn::StoreInterleaved3(b, g, r, d, out + 3 * i);
        else
            hn::StoreInterleaved4(b, g, r, hn::LoadU(d, alpha + i), d, out + 4 * i);
    }
    return whole;
}
#endif

#define PXFX_PLANE_ROWS(NAME, MODE, C)                                                                                 \
    size_t split_##NAME##C(const uint8_t *in, size_t n, uint8_t *p1, uint8_t *p2, uint8_t *p3, uint8_t *a) {           \
        return split_row<MODE, C>(in, n, p1, p2, p3, a);                                                               \
    }                                                                                                                  \
    size_t combine_##NAME##C(const uint8_t *p1, const uint8_t *p2, const uint8_t *p3, const uint8_t *a, size_t n,      \
                             uint8_t *out) {                                                                           \
        return combine_row<MODE, C>(p1, p2, p3, a, n, out);                                                            \
    }
PXFX_PLANE_ROWS(hsl, Hsl, 3)
PXFX_PLANE_ROWS(hsl, Hsl, 4)
PXFX_PLANE_ROWS(yuv, Yuv, 3)
PXFX_PLANE_ROWS(yuv, Yuv, 4)
PXFX_PLANE_ROWS(yiq, Yiq, 3)
PXFX_PLANE_ROWS(yiq, Yiq, 4)
#undef PXFX_PLANE_ROWS

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
HWY_EXPORT(split_yuv3);
HWY_EXPORT(split_yuv4);
HWY_EXPORT(combine_yuv3);
HWY_EXPORT(combine_yuv4);
HWY_EXPORT(split_yiq3);
HWY_EXPORT(split_yiq4);
HWY_EXPORT(combine_yiq3);
HWY_EXPORT(combine_yiq4);
} // namespace

// Modes 1 (HSL), 2 (YUV) and 3 (YIQ) of color/colorspace.hpp.
vec::SplitPlanes vec::split_planes(int mode, int channels) {
    const bool three = channels == 3;
    switch (mode) {
    case 1: return three ? PXFX_VECTOR_COPY(split_hsl3) : PXFX_VECTOR_COPY(split_hsl4);
    case 2: return three ? PXFX_VECTOR_COPY(split_yuv3) : PXFX_VECTOR_COPY(split_yuv4);
    case 3: return three ? PXFX_VECTOR_COPY(split_yiq3) : PXFX_VECTOR_COPY(split_yiq4);
    default: return nullptr;
    }
}

vec::CombinePlanes vec::combine_planes(int mode, int channels) {
    const bool three = channels == 3;
    switch (mode) {
    case 1: return three ? PXFX_VECTOR_COPY(combine_hsl3) : PXFX_VECTOR_COPY(combine_hsl4);
    case 2: return three ? PXFX_VECTOR_COPY(combine_yuv3) : PXFX_VECTOR_COPY(combine_yuv4);
    case 3: return three ? PXFX_VECTOR_COPY(combine_yiq3) : PXFX_VECTOR_COPY(combine_yiq4);
    default: return nullptr;
    }
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
