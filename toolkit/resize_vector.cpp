// The bilinear blends of toolkit/resize.cpp in vectors: the same single
// precision products and sums, in the same order, as the plain loops (the
// build never fuses multiply-add), so the same results.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/resize_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

size_t blend_rows(const float *top, const float *bottom, float omwy, float wy, size_t n, uint8_t *out) {
    const hn::ScalableTag<float> df;
    const hn::RebindToSigned<decltype(df)> di;
    const hn::Rebind<uint8_t, decltype(df)> d8;
    const size_t lanes = hn::Lanes(df), whole = n / lanes * lanes;
    const auto a = hn::Set(df, omwy), b = hn::Set(df, wy);
    const auto zero = hn::Zero(di), low = hn::Set(di, 0xFF);
    for (size_t j = 0; j < whole; j += lanes) {
        const auto v = hn::Add(hn::Mul(a, hn::LoadU(df, top + j)), hn::Mul(b, hn::LoadU(df, bottom + j)));
        // Truncated, held at 0 and cut to its low byte, as the plain loop casts.
        const auto i = hn::And(hn::Max(hn::ConvertTo(di, v), zero), low);
        hn::StoreU(hn::DemoteTo(d8, i), d8, out + j);
    }
    return whole;
}

size_t blend_columns(const float *f, const int32_t *i0, const int32_t *i1, const float *w, const float *omw, size_t n,
                     float *h) {
    const hn::ScalableTag<float> df;
    const hn::RebindToSigned<decltype(df)> di;
    const size_t lanes = hn::Lanes(df), whole = n / lanes * lanes;
    for (size_t j = 0; j < whole; j += lanes) {
        const auto f0 = hn::GatherIndex(df, f, hn::LoadU(di, i0 + j));
        const auto f1 = hn::GatherIndex(df, f, hn::LoadU(di, i1 + j));
        hn::StoreU(hn::Add(hn::Mul(hn::LoadU(df, omw + j), f0), hn::Mul(hn::LoadU(df, w + j), f1)), df, h + j);
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
HWY_EXPORT(blend_rows);
HWY_EXPORT(blend_columns);
} // namespace

vec::BlendRows vec::blend_rows() { return PXFX_VECTOR_COPY(blend_rows); }
vec::BlendColumns vec::blend_columns() { return PXFX_VECTOR_COPY(blend_columns); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
