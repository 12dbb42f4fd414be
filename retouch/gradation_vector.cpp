// Auto levels blended with a local screen, in vectors of 16-bit lanes, one
// byte of a pixel per lane: the neighbours of a byte are the same channel of
// the pixels beside, above and below, so no channel is split from another.
// The tables of the plain loop are worked out instead: the screen
// 255 - x / 255 for x = (255 - n)(255 - m) <= 65025, where
// floor(x / 255) = (x * 32897) >> 23, and the blend y / 100 for y <= 25500,
// where floor(y / 100) = (y * 41944) >> 22, both exact over those ranges.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "retouch/gradation_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

size_t gradation_row(const uint8_t *cur, const uint8_t *mUp, const uint8_t *mCur, const uint8_t *mDown, size_t pixels,
                     int channels, int32_t amount, uint8_t *out) {
    const hn::ScalableTag<uint16_t> d;
    const hn::Rebind<uint8_t, decltype(d)> d8;
    const hn::RebindToSigned<decltype(d)> ds;
    using V = hn::Vec<decltype(d)>;
    const size_t lanes = hn::Lanes(d), c = static_cast<size_t>(channels);
    if (pixels < 2 || lanes % 4 != 0) return 0;
    // Pixels 1 .. pixels - 2 have both neighbours in the row.
    const size_t whole = (pixels - 2) / lanes * lanes;
    const V full = hn::Set(d, 255), two = hn::Set(d, 2), by255 = hn::Set(d, 32897), by100 = hn::Set(d, 41944);
    const V keep = hn::Set(d, static_cast<uint16_t>(amount)), rest = hn::Set(d, static_cast<uint16_t>(100 - amount));
    // Lanes of the alpha byte keep the source byte.
    const auto alpha = hn::Eq(hn::And(hn::Iota(d, 0), hn::Set(d, 3)), hn::Set(d, channels == 4 ? 3 : 4));
    auto at = [&](const uint8_t *p, size_t i) { return hn::PromoteTo(d, hn::LoadU(d8, p + i)); };
    for (size_t i = c, end = c + whole * c; i < end; i += lanes) {
        const V v = at(cur, i), m = at(mCur, i);
        const V n = hn::ShiftRight<2>(
            hn::Add(hn::Add(hn::Add(at(mCur, i - c), at(mCur, i + c)), hn::Add(at(mUp, i), at(mDown, i))), two));
        const V x = hn::Mul(hn::Sub(full, n), hn::Sub(full, m));
        const V s = hn::Sub(full, hn::ShiftRight<7>(hn::MulHigh(x, by255)));
        const V y = hn::Add(hn::Mul(keep, s), hn::Mul(rest, v));
        const V r = hn::IfThenElse(alpha, v, hn::ShiftRight<6>(hn::MulHigh(y, by100)));
        hn::StoreU(hn::DemoteTo(d8, hn::BitCast(ds, r)), d8, out + i);
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
HWY_EXPORT(gradation_row);
} // namespace

vec::GradationRow vec::gradation_row() { return PXFX_VECTOR_COPY(gradation_row); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
