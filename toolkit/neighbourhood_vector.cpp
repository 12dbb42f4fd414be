// Convolution of byte samples with a small integer kernel in vectors of
// 16-bit sums: each sample is widened once per tap, the taps of weight 1 and
// -1 are added and subtracted, the others multiplied. The sums are shifted
// and narrowed with saturation, which is the clamp to 0..255.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/neighbourhood_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

#ifndef PXFX_NEIGHBOURHOOD_VECTOR_TAPS
#define PXFX_NEIGHBOURHOOD_VECTOR_TAPS

namespace pxfx {
namespace {

// The non-zero taps of a kernel of at most 7 x 7, as the first sample each
// reads, grouped by weight: 1, -1, any other.
struct Taps {
    const uint8_t *add[49], *sub[49], *mul[49];
    int16_t weight[49];
    int32_t adds = 0, subs = 0, muls = 0;

    Taps(const uint8_t *const *rows, const int32_t *kernel, int32_t size, int32_t channels) {
        const int32_t half = size / 2;
        for (int32_t ky = 0; ky < size; ++ky)
            for (int32_t kx = 0; kx < size; ++kx) {
                const int32_t k = kernel[ky * size + kx];
                const uint8_t *src = rows[ky] + static_cast<ptrdiff_t>(kx - half) * channels;
                if (k == 1) {
                    add[adds++] = src;
                } else if (k == -1) {
                    sub[subs++] = src;
                } else if (k != 0) {
                    weight[muls] = static_cast<int16_t>(k);
                    mul[muls++] = src;
                }
            }
    }
};

} // namespace
} // namespace pxfx

#endif // PXFX_NEIGHBOURHOOD_VECTOR_TAPS

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;
using D16 = hn::ScalableTag<int16_t>;
using D8 = hn::Rebind<uint8_t, D16>;

bool convolve(const uint8_t *const *rows, const int32_t *kernel, int32_t size, int32_t channels, size_t n,
              int32_t shift, uint8_t *out) {
    const D16 d;
    const D8 d8;
    const size_t lanes = hn::Lanes(d);
    if (n < lanes) return false;
    const Taps taps(rows, kernel, size, channels);
    auto at = [&](size_t i) {
        auto load = [&](const uint8_t *p) { return hn::PromoteTo(d, hn::LoadU(d8, p + i)); };
        auto acc = hn::Zero(d);
        for (int32_t t = 0; t < taps.muls; ++t)
            acc = hn::Add(acc, hn::Mul(hn::Set(d, taps.weight[t]), load(taps.mul[t])));
        for (int32_t t = 0; t < taps.adds; ++t)
            acc = hn::Add(acc, load(taps.add[t]));
        for (int32_t t = 0; t < taps.subs; ++t)
            acc = hn::Sub(acc, load(taps.sub[t]));
        hn::StoreU(hn::DemoteTo(d8, hn::ShiftRightSame(acc, shift)), d8, out + i);
    };
    size_t i = 0;
    for (; i + lanes <= n; i += lanes)
        at(i);
    // The last vector overlaps the one before: out is not among the rows.
    if (i < n) at(n - lanes);
    return true;
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(convolve);
} // namespace

vec::ConvolveBytes vec::convolve_bytes() { return PXFX_VECTOR_COPY(convolve); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
