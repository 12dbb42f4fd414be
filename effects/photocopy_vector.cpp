// Photocopy's local means in vectors of 16-bit sums: a column of five gray
// samples sums to at most 1275 (2550 weighted), a window to 6375 (25500
// weighted). The means divide by 25 and 100 as a multiply-high and a shift,
// exact over those ranges: floor(s / 25) = (s * 10486) >> 18 while
// s * 6 < 2^18, floor(s / 100) = (s * 41944) >> 22 while s * 96 < 2^22. The
// ratio 1000 u / m is a float division: 1000 u < 2^24 and m are exact floats,
// and a quotient that is not an integer lies at least 1 / m below the next
// one, more than its rounding error, so truncation gives the integer
// quotient. The tone divides in floats the same way, every dividend below
// 1009 * 1000.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effects/photocopy_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET == HWY_SCALAR
// Never chosen (core/cpu.cpp), and lacks the halves of a vector.
size_t photocopy_means(const uint8_t *const *, size_t, uint16_t *, uint8_t *, int32_t *) { return 0; }
#else
size_t photocopy_means(const uint8_t *const *rows, size_t n, uint16_t *cols, uint8_t *u, int32_t *ratio) {
    const hn::ScalableTag<uint16_t> d;
    const hn::Rebind<uint8_t, decltype(d)> d8;
    const hn::Half<decltype(d)> dh;
    const hn::RebindToSigned<decltype(d)> ds;
    const hn::Repartition<int32_t, decltype(d)> di;
    const hn::Repartition<float, decltype(d)> df;
    using V = hn::Vec<decltype(d)>;
    const size_t lanes = hn::Lanes(d), whole = n / lanes * lanes, width = n + 4;
    if (whole == 0) return 0;
    uint16_t *colSum = cols, *colWeighted = cols + width;
    // Column sums of every column; the last vector overlaps the one before.
    for (size_t x = 0;; x += lanes) {
        if (x + lanes > width) x = width - lanes;
        V v[5];
        for (int k = 0; k < 5; ++k)
            v[k] = hn::PromoteTo(d, hn::LoadU(d8, rows[k] + x));
        const V outer = hn::Add(v[0], v[4]), inner = hn::Add(v[1], v[3]);
        hn::StoreU(hn::Add(hn::Add(outer, inner), v[2]), d, colSum + x);
        hn::StoreU(hn::Add(hn::Add(outer, hn::ShiftLeft<1>(inner)), hn::ShiftLeft<2>(v[2])), d, colWeighted + x);
        if (x + lanes == width) break;
    }
    const V by25 = hn::Set(d, 10486), by100 = hn::Set(d, 41944);
    const auto thousand = hn::Set(df, 1000.0f);
    const auto none = hn::Set(di, vec::kNoRatio);
    const auto zero = hn::Zero(di), one = hn::Set(di, 1);
    for (size_t i = 0; i < whole; i += lanes) {
        auto at = [&](const uint16_t *p, size_t k) { return hn::LoadU(d, p + i + k); };
        const V sum = hn::Add(hn::Add(hn::Add(at(colSum, 0), at(colSum, 1)), hn::Add(at(colSum, 3), at(colSum, 4))),
                              at(colSum, 2));
        const V weighted = hn::Add(hn::Add(hn::Add(at(colWeighted, 0), at(colWeighted, 4)),
                                           hn::ShiftLeft<1>(hn::Add(at(colWeighted, 1), at(colWeighted, 3)))),
                                   hn::ShiftLeft<2>(at(colWeighted, 2)));
        const V m = hn::ShiftRight<2>(hn::MulHigh(sum, by25));
        const V uu = hn::ShiftRight<6>(hn::MulHigh(weighted, by100));
        hn::StoreU(hn::DemoteTo(d8, hn::BitCast(ds, uu)), d8, u + i);
        const auto halves = [&](auto half, size_t at) {
            const auto mi = hn::PromoteTo(di, half(dh, m));
            const auto num = hn::Mul(hn::ConvertTo(df, hn::PromoteTo(di, half(dh, uu))), thousand);
            const auto q = hn::ConvertTo(di, hn::Div(num, hn::ConvertTo(df, hn::Max(mi, one))));
            hn::StoreU(hn::IfThenElse(hn::Eq(mi, zero), none, q), di, ratio + i + at);
        };
        halves([](auto h, V v) { return hn::LowerHalf(h, v); }, 0);
        halves([](auto h, V v) { return hn::UpperHalf(h, v); }, lanes / 2);
    }
    return whole;
}
#endif

size_t photocopy_tone(const uint8_t *gray, const uint8_t *u, const int32_t *ratio, size_t n, int32_t t1, int32_t t2,
                      uint8_t *out) {
    const hn::ScalableTag<int32_t> d;
    const hn::Rebind<uint8_t, decltype(d)> d8;
    const hn::Rebind<float, decltype(d)> df;
    using V = hn::Vec<decltype(d)>;
    const size_t lanes = hn::Lanes(d), whole = n / lanes * lanes;
    const V from = hn::Set(d, 990), thousand = hn::Set(d, 1000), full = hn::Set(d, 255);
    const V dark1 = hn::Set(d, t1), bright2 = hn::Set(d, t2);
    // A threshold of 0 gives the weight 0 (dark) or 1000 (bright); the
    // divisor 1 keeps the division defined.
    const auto darkBy = hn::Set(df, static_cast<float>(t1 != 0 ? t1 : 1));
    const auto brightBy = hn::Set(df, static_cast<float>(t2 != 0 ? t2 : 1));
    const auto per1000 = hn::Set(df, 1000.0f);
    auto quotient = [&](V num, hn::Vec<decltype(df)> by) {
        return hn::ConvertTo(d, hn::Div(hn::ConvertTo(df, num), by));
    };
    for (size_t i = 0; i < whole; i += lanes) {
        const V r = hn::LoadU(d, ratio + i);
        const V a = hn::PromoteTo(d, hn::LoadU(d8, gray + i));
        const V uu = hn::PromoteTo(d, hn::LoadU(d8, u + i));
        const V q = hn::And(r, hn::Set(d, 0xFFFF));
        const auto keep = hn::Or(hn::Eq(r, hn::Set(d, vec::kNoRatio)), hn::Eq(q, hn::Zero(d)));
        const auto dark = hn::Lt(q, from);
        const V kDark = quotient(hn::Mul(hn::Sub(dark1, hn::Min(hn::Sub(from, q), dark1)), thousand), darkBy);
        V kBright = quotient(hn::Mul(hn::Min(hn::Sub(q, from), bright2), thousand), brightBy);
        if (t2 == 0) kBright = thousand;
        const V k = hn::IfThenElse(dark, kDark, kBright);
        const V num = hn::IfThenElse(dark, hn::Mul(uu, k), hn::Mul(hn::Sub(full, uu), hn::Sub(thousand, k)));
        const V part = quotient(num, per1000);
        const V v = hn::IfThenElse(keep, a, hn::IfThenElse(dark, part, hn::Sub(full, part)));
        hn::StoreU(hn::DemoteTo(d8, v), d8, out + i);
    }
    return whole;
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(photocopy_means);
HWY_EXPORT(photocopy_tone);
} // namespace

// 32-bit ARM divides floats through a refined reciprocal estimate, which is
// not correctly rounded, and the quotients above rely on that rounding: the
// plain loops run there.
vec::PhotocopyMeans vec::photocopy_means() { return HWY_ARCH_ARM_V7 ? nullptr : PXFX_VECTOR_COPY(photocopy_means); }
vec::PhotocopyTone vec::photocopy_tone() { return HWY_ARCH_ARM_V7 ? nullptr : PXFX_VECTOR_COPY(photocopy_tone); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
