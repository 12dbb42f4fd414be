// One row of box means of byte samples in vectors of 16-bit sums: the column
// sums take the entering row and give up the leaving one, then every box sum
// is added up from its columns, which leaves no running sum along the row to
// wait on. The mean divides by size^2 through the multiply-shift of
// byte_sum_divisor and narrows with saturation, which is the clamp to 0..255.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "color/box_filter_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include <algorithm>
#include <cstring>

#include "core/internal/math.hpp"
#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;
using DU = hn::ScalableTag<uint16_t>;
using DI = hn::RebindToSigned<DU>;
using D8 = hn::Rebind<uint8_t, DU>;

void box_row(const uint8_t *in, const uint8_t *gone, uint16_t *cols, size_t n, int32_t size, int32_t channels,
             int32_t offset, uint8_t *out) {
    const DU d;
    const DI di;
    const D8 d8;
    const size_t lanes = hn::Lanes(d);
    const auto c = static_cast<size_t>(channels);
    const size_t lead = static_cast<size_t>(size / 2) * c, trail = static_cast<size_t>(size - 1) * c - lead;
    uint16_t *own = cols + lead;
    if (in != nullptr) {
        size_t j = 0;
        for (; j + lanes <= n; j += lanes) {
            const auto s = hn::Add(hn::LoadU(d, own + j), hn::PromoteTo(d, hn::LoadU(d8, in + j)));
            hn::StoreU(hn::Sub(s, hn::PromoteTo(d, hn::LoadU(d8, gone + j))), d, own + j);
        }
        for (; j < n; ++j)
            own[j] = static_cast<uint16_t>(own[j] + in[j] - gone[j]);
    }
    for (size_t k = 0; k < lead; ++k)
        cols[k] = own[k % c];
    for (size_t k = 0; k < trail; ++k)
        own[n + k] = own[n - c + k % c];

    // Exact over the box sums: areas of 4 .. 121.
    const ByteSumDivisor div = byte_sum_divisor(static_cast<uint32_t>(size * size));
    // Quotients are at most 255: offsets beyond +-256 clamp alike.
    const auto off = hn::Set(di, static_cast<int16_t>(std::clamp(offset, -256, 256)));
    const auto mul = hn::Set(d, div.m);
    auto store = [&](hn::Vec<DU> s, uint8_t *to) {
        const auto q = hn::BitCast(di, hn::ShiftRightSame(hn::MulHigh(s, mul), div.p));
        hn::StoreU(hn::DemoteTo(d8, hn::Add(q, off)), d8, to);
    };
    auto mean = [&](const uint16_t *col, uint8_t *to) {
        auto s = hn::LoadU(d, col);
        for (int32_t t = 1; t < size; ++t)
            s = hn::Add(s, hn::LoadU(d, col + static_cast<size_t>(t) * c));
        store(s, to);
    };
    size_t i = 0;
    // Four vectors per walk over the box's columns.
    for (; i + 4 * lanes <= n; i += 4 * lanes) {
        const uint16_t *col = cols + i;
        auto s0 = hn::LoadU(d, col), s1 = hn::LoadU(d, col + lanes);
        auto s2 = hn::LoadU(d, col + 2 * lanes), s3 = hn::LoadU(d, col + 3 * lanes);
        for (int32_t t = 1; t < size; ++t) {
            col += c;
            s0 = hn::Add(s0, hn::LoadU(d, col));
            s1 = hn::Add(s1, hn::LoadU(d, col + lanes));
            s2 = hn::Add(s2, hn::LoadU(d, col + 2 * lanes));
            s3 = hn::Add(s3, hn::LoadU(d, col + 3 * lanes));
        }
        store(s0, out + i);
        store(s1, out + i + lanes);
        store(s2, out + i + 2 * lanes);
        store(s3, out + i + 3 * lanes);
    }
    for (; i + lanes <= n; i += lanes)
        mean(cols + i, out + i);
    if (i < n) {
        // The last samples through copies: whole vectors neither read past
        // the column sums nor write past the row.
        const size_t rest = n - i, span = rest + lead + trail;
        HWY_ALIGN uint16_t col[HWY_MAX_BYTES / 2 + 10 * 4] = {};
        HWY_ALIGN uint8_t row[HWY_MAX_BYTES / 2];
        std::memcpy(col, cols + i, span * sizeof(uint16_t));
        mean(col, row);
        std::memcpy(out + i, row, rest);
    }
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(box_row);
} // namespace

vec::BoxBytes vec::box_bytes() { return PXFX_VECTOR_COPY(box_row); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
