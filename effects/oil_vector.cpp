// Oil's windows along a row in 16-bit lanes: the window is four vectors of
// eight lanes, two classes each (count, red, green and blue sums), slid by
// one column histogram in and one out per pixel. The most populated class is
// the largest of the keys count * 8 + 7 - class in the count lanes, so the
// lowest class wins a tie as in the plain loop; counts stay below 2^13
// (windows of at most 257 pixels), so the keys fit their lanes.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effects/oil_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/math.hpp"
#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET == HWY_SCALAR
// Never chosen (core/cpu.cpp), and lacks vectors of eight lanes.
void oil_windows(const uint16_t *, size_t, size_t, size_t, uint16_t *, const ExactDivisor *, uint32_t *) {}
#else
void oil_windows(const uint16_t *cols, size_t r, size_t first, size_t end, uint16_t *win,
                 const ExactDivisor *reciprocal, uint32_t *colours) {
    const hn::FixedTag<uint16_t, 8> d;
    using V = hn::Vec<decltype(d)>;
    constexpr size_t kHist = vec::kOilBins;
    V v[4];
    for (size_t j = 0; j < 4; ++j)
        v[j] = hn::LoadU(d, win + 8 * j);
    // Lane 0 of vector j counts class 2j, lane 4 class 2j + 1.
    HWY_ALIGN static constexpr uint16_t kRanks[4][8] = {
        {7, 0, 0, 0, 6, 0, 0, 0}, {5, 0, 0, 0, 4, 0, 0, 0}, {3, 0, 0, 0, 2, 0, 0, 0}, {1, 0, 0, 0, 0, 0, 0, 0}};
    HWY_ALIGN static constexpr uint16_t kCountLanes[8] = {0xFFFF, 0, 0, 0, 0xFFFF, 0, 0, 0};
    const V counts = hn::Load(d, kCountLanes);
    HWY_ALIGN uint16_t sums[kHist];
    for (size_t x = first; x < end; ++x) {
        const uint16_t *in = cols + kHist * (x + r), *out = cols + kHist * (x - r - 1);
        V top = hn::Zero(d);
        for (size_t j = 0; j < 4; ++j) {
            v[j] = hn::Add(v[j], hn::Sub(hn::LoadU(d, in + 8 * j), hn::LoadU(d, out + 8 * j)));
            top = hn::Max(top, hn::Or(hn::And(hn::ShiftLeft<3>(v[j]), counts), hn::Load(d, kRanks[j])));
            hn::Store(v[j], d, sums + 8 * j);
        }
        const uint32_t key = hn::GetLane(hn::MaxOfLanes(d, top));
        const uint16_t *bins = sums + 4 * (7 - (key & 7));
        const ExactDivisor div = reciprocal[key >> 3];
        colours[x - first] = div.divide(bins[3]) | div.divide(bins[2]) << 8 | div.divide(bins[1]) << 16;
    }
    for (size_t j = 0; j < 4; ++j)
        hn::StoreU(v[j], d, win + 8 * j);
}
#endif

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(oil_windows);
} // namespace

vec::OilWindows vec::oil_windows() { return PXFX_VECTOR_COPY(oil_windows); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
