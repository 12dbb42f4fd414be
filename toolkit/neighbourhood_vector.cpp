// Window filters of byte samples in vectors of 16-bit sums, narrowed with
// saturation, which is the clamp to 0..255. The convolution widens each
// sample once per tap, adds and subtracts the taps of weight 1 and -1 and
// multiplies the others. The box sums go through strips of column sums on
// the stack, each box added up from its columns.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/neighbourhood_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include <algorithm>

#include "core/internal/math.hpp"
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

// Samples per strip of box column sums, with room for the box's reach (3
// pixels of at most 3 channels each side).
constexpr size_t kStrip = 1024;
constexpr size_t kStripColumns = kStrip + 2 * 3 * 3;

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

bool window_box(const uint8_t *const *rows, int32_t size, int32_t channels, size_t n, int32_t centre, uint8_t *out) {
    const D16 d;
    const D8 d8;
    using DU = hn::RebindToUnsigned<D16>;
    const DU du;
    const size_t lanes = hn::Lanes(d);
    if (n < lanes) return false;
    const auto c = static_cast<size_t>(channels);
    const size_t reach = static_cast<size_t>(size / 2) * c;
    const ByteSumDivisor div = byte_sum_divisor(static_cast<uint32_t>(size * size));
    HWY_ALIGN uint16_t cols[kStripColumns];
    // Whole vectors from `first` to `end`, the last one ending at `end`
    // (end - first >= lanes); vectors written twice get the same values.
    auto each_vector = [lanes](size_t first, size_t end, auto body) {
        size_t i = first;
        for (; i + lanes <= end; i += lanes)
            body(i);
        if (i < end) body(end - lanes);
    };
    for (size_t start = 0; start < n; start += kStrip) {
        // A short last strip starts earlier, so that it holds a vector.
        const size_t first = n - start < lanes ? n - lanes : start, len = std::min(kStrip, n - first);
        // cols[k] = the column sum of sample first - reach + k.
        each_vector(0, len + 2 * reach, [&](size_t k) {
            const ptrdiff_t at = static_cast<ptrdiff_t>(first + k) - static_cast<ptrdiff_t>(reach);
            auto s = hn::PromoteTo(du, hn::LoadU(d8, rows[0] + at));
            for (int32_t ky = 1; ky < size; ++ky)
                s = hn::Add(s, hn::PromoteTo(du, hn::LoadU(d8, rows[ky] + at)));
            hn::StoreU(s, du, cols + k);
        });
        each_vector(0, len, [&](size_t k) {
            auto box = hn::LoadU(du, cols + k);
            for (int32_t kx = 1; kx < size; ++kx)
                box = hn::Add(box, hn::LoadU(du, cols + k + static_cast<size_t>(kx) * c));
            const auto r = [&] {
                if (centre == 0) return hn::BitCast(d, hn::ShiftRightSame(hn::MulHigh(box, hn::Set(du, div.m)), div.p));
                const auto mid = hn::PromoteTo(d, hn::LoadU(d8, rows[size / 2] + first + k));
                return hn::Sub(hn::Mul(hn::Set(d, static_cast<int16_t>(centre)), mid), hn::BitCast(d, box));
            }();
            hn::StoreU(hn::DemoteTo(d8, r), d8, out + first + k);
        });
    }
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
HWY_EXPORT(window_box);
} // namespace

vec::ConvolveBytes vec::convolve_bytes() { return PXFX_VECTOR_COPY(convolve); }
vec::WindowBoxBytes vec::window_box_bytes() { return PXFX_VECTOR_COPY(window_box); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
