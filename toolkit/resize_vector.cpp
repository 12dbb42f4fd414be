// The two blends of the bilinear resize in vectors. Across a row, each group
// of four result samples takes its source bytes from one 16-byte load through
// two byte shuffles that place every tap's byte in the low byte of a 32-bit
// lane; the bytes become floats exactly, so the products and sums are the
// plain loop's. Down the rows, whole vectors of both blended rows are mixed,
// truncated and held at 0 as the plain loop does, and their low bytes kept.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/resize_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include <cmath>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

void resize_across(const uint8_t *row, const vec::ResizeColumns &c, float *HWY_RESTRICT h) {
    const int32_t *HWY_RESTRICT i0 = c.i0, *HWY_RESTRICT i1 = c.i1;
    const float *HWY_RESTRICT w = c.w, *HWY_RESTRICT omw = c.omw;
    const size_t n = c.n;
    auto plain = [&](size_t k) {
        h[k] = omw[k] * static_cast<float>(row[i0[k]]) + w[k] * static_cast<float>(row[i1[k]]);
    };
    size_t k = 0;
#if HWY_TARGET != HWY_SCALAR
    // The shuffles work on 16 bytes whatever the target's vector size (single
    // lanes, never chosen by core/cpu.cpp, blend every sample plainly).
    const hn::FixedTag<uint8_t, 16> d8;
    const hn::FixedTag<int32_t, 4> di;
    const hn::FixedTag<float, 4> df;
    const int32_t *HWY_RESTRICT from = c.from;
    const vec::ResizeGroup *HWY_RESTRICT group = c.groups;
    HWY_UNROLL(2)
    for (const size_t whole = n / vec::kResizeGroup * vec::kResizeGroup; k < whole;
         k += vec::kResizeGroup, ++from, ++group) {
        if (*from < 0) {
            for (size_t s = k; s < k + vec::kResizeGroup; ++s)
                plain(s);
            continue;
        }
        const auto bytes = hn::LoadU(d8, row + *from);
        const auto a = hn::BitCast(di, hn::TableLookupBytesOr0(bytes, hn::Load(d8, group->first)));
        const auto b = hn::BitCast(di, hn::TableLookupBytesOr0(bytes, hn::Load(d8, group->second)));
        const auto left = hn::Mul(hn::Load(df, group->omw), hn::ConvertTo(df, a));
        const auto right = hn::Mul(hn::Load(df, group->w), hn::ConvertTo(df, b));
        hn::StoreU(hn::Add(left, right), df, h + k);
    }
#endif
    for (; k < n; ++k)
        plain(k);
}

// How the vertical blend turns its sums into bytes. kConvert: converted to
// int32 and held at 0. On x86 the conversion repairs out-of-range lanes in
// extra steps, which sums of known range skip: rounded toward zero and added
// to 2^23 (exactly), an integer in 0 .. 2^23 - 1 is the float's low mantissa
// bits. kSmall: the sums lie in 0..256 (blended rows in 0..255 under weights
// in 0..1); kBounded: they lie within +-2^23 and are held at 0 first.
enum class Truncation { kConvert, kSmall, kBounded };

// The vertical blend into bytes over whole vectors; returns how many samples
// it did. Weights 1 and 0 give the top row itself (0 times a finite sample is
// 0), which spares the products.
template <bool kTopOnly, Truncation kHow>
size_t down_vectors(const float *HWY_RESTRICT top, const float *HWY_RESTRICT bottom, float omw, float w, size_t n,
                    uint8_t *HWY_RESTRICT out) {
    const hn::ScalableTag<float> df;
    const hn::RebindToSigned<decltype(df)> di;
    const hn::RebindToUnsigned<decltype(df)> du;
    const hn::Rebind<uint8_t, decltype(df)> d8;
    const size_t lanes = hn::Lanes(df);
    const auto vomw = hn::Set(df, omw), vw = hn::Set(df, w);
    const auto mantissa = hn::Set(df, 8388608.0f);
    size_t k = 0;
    HWY_UNROLL(4)
    for (; k + lanes <= n; k += lanes) {
        const auto t = hn::LoadU(df, top + k);
        const auto sum = kTopOnly ? t : hn::Add(hn::Mul(vomw, t), hn::Mul(vw, hn::LoadU(df, bottom + k)));
        hn::Vec<decltype(di)> v;
        if constexpr (kHow == Truncation::kConvert) {
            v = hn::Max(hn::ConvertTo(di, sum), hn::Zero(di));
        } else {
            const auto held = kHow == Truncation::kBounded ? hn::Max(sum, hn::Zero(df)) : sum;
            v = hn::BitCast(di, hn::Add(hn::Trunc(held), mantissa));
        }
        hn::StoreU(hn::TruncateTo(d8, hn::BitCast(du, v)), d8, out + k);
    }
    return k;
}

size_t resize_down(const float *top, const float *bottom, float omw, float w, size_t n, uint8_t *out) {
    const bool topOnly = omw == 1.0f && w == 0.0f;
#if HWY_ARCH_X86 && HWY_TARGET <= HWY_SSE4
    if (w >= 0.0f && w <= 1.0f && omw >= 0.0f && omw <= 1.0f)
        return topOnly ? down_vectors<true, Truncation::kSmall>(top, bottom, omw, w, n, out)
                       : down_vectors<false, Truncation::kSmall>(top, bottom, omw, w, n, out);
    // Rows below 256 keep the sums below 256 (|omw| + |w|) in magnitude.
    if (std::fabs(omw) + std::fabs(w) < 32768.0f)
        return down_vectors<false, Truncation::kBounded>(top, bottom, omw, w, n, out);
#endif
    return topOnly ? down_vectors<true, Truncation::kConvert>(top, bottom, omw, w, n, out)
                   : down_vectors<false, Truncation::kConvert>(top, bottom, omw, w, n, out);
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(resize_across);
HWY_EXPORT(resize_down);
} // namespace

vec::ResizeAcross vec::resize_across() { return PXFX_VECTOR_COPY(resize_across); }
vec::ResizeDown vec::resize_down() { return PXFX_VECTOR_COPY(resize_down); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
