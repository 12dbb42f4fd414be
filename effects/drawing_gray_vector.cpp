// The drawing gray (117 R + 601 G + 306 B) >> 10 in vectors of 16-bit lanes.
// The sum is 4 s + t with s = 29 R + 150 G + 76 B <= 65025 and
// t = R + G + 2 B, so the gray is (s + (t >> 2)) >> 8: the two bits t drops
// add less than 1 to an integer that is then divided, and s + (t >> 2) stays
// below 2^16.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effects/drawing_gray_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET == HWY_SCALAR
// Never chosen (core/cpu.cpp), and lacks the halves of a vector.
template <int C> size_t gray(const uint8_t *, size_t, uint8_t *) { return 0; }
#else
template <int C> size_t gray(const uint8_t *in, size_t pixels, uint8_t *out) {
    const hn::ScalableTag<uint8_t> d8;
    const hn::Half<decltype(d8)> dh;
    const hn::Rebind<uint16_t, decltype(dh)> d16;
    const hn::RebindToSigned<decltype(d16)> ds;
    using V = hn::Vec<decltype(d8)>;
    using W = hn::Vec<decltype(d16)>;
    const size_t lanes = hn::Lanes(d8), whole = pixels / lanes * lanes;
    const W kR = hn::Set(d16, 29), kG = hn::Set(d16, 150), kB = hn::Set(d16, 76);
    auto half_gray = [&](W b, W g, W r) {
        const W s = hn::Add(hn::Add(hn::Mul(r, kR), hn::Mul(g, kG)), hn::Mul(b, kB));
        const W t = hn::Add(hn::Add(r, g), hn::Add(b, b));
        return hn::DemoteTo(dh, hn::BitCast(ds, hn::ShiftRight<8>(hn::Add(s, hn::ShiftRight<2>(t)))));
    };
    for (size_t i = 0; i < whole; i += lanes) {
        V b, g, r;
        if constexpr (C == 3) {
            hn::LoadInterleaved3(d8, in + 3 * i, b, g, r);
        } else {
            V a;
            hn::LoadInterleaved4(d8, in + 4 * i, b, g, r, a);
        }
        auto lower = [&](V v) { return hn::PromoteTo(d16, hn::LowerHalf(dh, v)); };
        auto upper = [&](V v) { return hn::PromoteTo(d16, hn::UpperHalf(dh, v)); };
        const auto lo = half_gray(lower(b), lower(g), lower(r));
        const auto hi = half_gray(upper(b), upper(g), upper(r));
        hn::StoreU(hn::Combine(d8, hi, lo), d8, out + i);
    }
    return whole;
}
#endif

size_t gray3(const uint8_t *in, size_t pixels, uint8_t *out) { return gray<3>(in, pixels, out); }
size_t gray4(const uint8_t *in, size_t pixels, uint8_t *out) { return gray<4>(in, pixels, out); }

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(gray3);
HWY_EXPORT(gray4);
} // namespace

vec::DrawingGray vec::drawing_gray(int channels) {
    return channels == 3 ? PXFX_VECTOR_COPY(gray3) : PXFX_VECTOR_COPY(gray4);
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
