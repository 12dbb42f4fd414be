// Oil's windows along a row in 16-bit lanes: the window is four vectors of
// eight lanes, two classes each (count, red, green and blue sums), slid by
// one column histogram in and one out per pixel. Counts are kept times 8,
// and while the window slides its count lanes also hold 7 - class, so each
// holds the key count * 8 + 7 - class: the most populated class has the
// largest key, the lowest class winning a tie as in the plain loop. Counts
// stay below 2^13 (windows of at most 257 pixels), so the keys fit their
// lanes.
//
// The column histograms move down a row with the pixels' classes and bin
// words found in vectors and the words added one column at a time. The class
// (306 R + 601 G + 117 B) >> 15 is (4 s + t) >> 15 with s = 76 R + 150 G +
// 29 B <= 65025 and t = 2 R + G + B, that is (s + (t >> 2)) >> 13 in 16-bit
// lanes: the two bits t drops add less than 1 to an integer that is then
// divided, and s + (t >> 2) stays below 2^16.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effects/oil_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include <cstring>

#include "core/internal/math.hpp"
#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET == HWY_SCALAR
// Never chosen (core/cpu.cpp), and lacks vectors of eight lanes.
void oil_windows(const uint16_t *, size_t, size_t, size_t, uint16_t *, const ExactDivisor *, uint32_t *) {}
template <int C> size_t moves(const uint8_t *, const uint8_t *, size_t, uint16_t *) { return 0; }
#else
void oil_windows(const uint16_t *cols, size_t r, size_t first, size_t end, uint16_t *win,
                 const ExactDivisor *reciprocal, uint32_t *colours) {
    const hn::FixedTag<uint16_t, 8> d;
    using V = hn::Vec<decltype(d)>;
    constexpr size_t kHist = vec::kOilBins;
    static_assert(vec::kOilCount == 8);
    // Lane 0 of vector j counts class 2j, lane 4 class 2j + 1.
    HWY_ALIGN static constexpr uint16_t kRanks[4][8] = {
        {7, 0, 0, 0, 6, 0, 0, 0}, {5, 0, 0, 0, 4, 0, 0, 0}, {3, 0, 0, 0, 2, 0, 0, 0}, {1, 0, 0, 0, 0, 0, 0, 0}};
    HWY_ALIGN static constexpr uint16_t kCountLanes[8] = {0xFFFF, 0, 0, 0, 0xFFFF, 0, 0, 0};
    const V counts = hn::Load(d, kCountLanes);
    V v[4];
    for (size_t j = 0; j < 4; ++j)
        v[j] = hn::Add(hn::LoadU(d, win + 8 * j), hn::Load(d, kRanks[j]));
    HWY_ALIGN uint16_t sums[kHist];
    for (size_t x = first; x < end; ++x) {
        const uint16_t *in = cols + kHist * (x + r), *out = cols + kHist * (x - r - 1);
        V top = hn::Zero(d);
        for (size_t j = 0; j < 4; ++j) {
            v[j] = hn::Add(v[j], hn::Sub(hn::LoadU(d, in + 8 * j), hn::LoadU(d, out + 8 * j)));
            top = hn::Max(top, hn::And(v[j], counts));
            hn::Store(v[j], d, sums + 8 * j);
        }
        const uint32_t key = hn::GetLane(hn::MaxOfLanes(d, top));
        uint64_t bins;
        std::memcpy(&bins, sums + 4 * (7 - (key & 7)), 8);
        const ExactDivisor div = reciprocal[key >> 3];
        colours[x - first] = div.divide(static_cast<uint32_t>(bins >> 48)) |
                             div.divide(static_cast<uint32_t>(bins >> 32) & 0xFFFF) << 8 |
                             div.divide(static_cast<uint32_t>(bins >> 16) & 0xFFFF) << 16;
    }
    for (size_t j = 0; j < 4; ++j)
        hn::StoreU(hn::Sub(v[j], hn::Load(d, kRanks[j])), d, win + 8 * j);
}

// For the pixels of one vector at p: words[4 i .. 4 i + 3] = kOilCount, red,
// green and blue of pixel i, the bins that pixel adds to its class, and first[i] =
// its class's first bin.
template <int C, class D8> HWY_INLINE void describe(D8 d8, const uint8_t *p, uint16_t *words, uint16_t *first) {
    const hn::Half<D8> dh;
    const hn::Rebind<uint16_t, decltype(dh)> d16;
    using V = hn::Vec<D8>;
    using W = hn::Vec<decltype(d16)>;
    V b, g, r;
    if constexpr (C == 3) {
        hn::LoadInterleaved3(d8, p, b, g, r);
    } else {
        V a;
        hn::LoadInterleaved4(d8, p, b, g, r, a);
    }
    const size_t half = hn::Lanes(d16);
    auto store = [&](W bh, W gh, W rh, size_t at) {
        const W s = hn::Add(hn::Add(hn::Mul(rh, hn::Set(d16, 76)), hn::Mul(gh, hn::Set(d16, 150))),
                            hn::Mul(bh, hn::Set(d16, 29)));
        const W t = hn::Add(hn::Add(rh, rh), hn::Add(gh, bh));
        const W cls = hn::ShiftRight<13>(hn::Add(s, hn::ShiftRight<2>(t)));
        hn::StoreU(hn::ShiftLeft<2>(cls), d16, first + at);
        hn::StoreInterleaved4(hn::Set(d16, vec::kOilCount), rh, gh, bh, d16, words + 4 * at);
    };
    auto lower = [&](V v) { return hn::PromoteTo(d16, hn::LowerHalf(dh, v)); };
    auto upper = [&](V v) { return hn::PromoteTo(d16, hn::UpperHalf(dh, v)); };
    store(lower(b), lower(g), lower(r), 0);
    store(upper(b), upper(g), upper(r), half);
}

template <int C> size_t moves(const uint8_t *leave, const uint8_t *enter, size_t n, uint16_t *cols) {
    const hn::ScalableTag<uint8_t> d8;
    const size_t lanes = hn::Lanes(d8), whole = n / lanes * lanes;
    HWY_ALIGN uint16_t outWords[4 * HWY_MAX_BYTES], inWords[4 * HWY_MAX_BYTES];
    HWY_ALIGN uint16_t outFirst[HWY_MAX_BYTES], inFirst[HWY_MAX_BYTES];
    // The bins of a class lie together and never leave 0 .. 2^16 - 1, so a
    // pixel moves all four with one 64-bit add or subtract.
    auto move = [](uint16_t *bins, const uint16_t *word, bool add) {
        uint64_t sum, w;
        std::memcpy(&sum, bins, 8);
        std::memcpy(&w, word, 8);
        sum = add ? sum + w : sum - w;
        std::memcpy(bins, &sum, 8);
    };
    for (size_t i = 0; i < whole; i += lanes) {
        describe<C>(d8, leave + C * i, outWords, outFirst);
        describe<C>(d8, enter + C * i, inWords, inFirst);
        uint16_t *col = cols + vec::kOilBins * i;
        for (size_t k = 0; k < lanes; ++k, col += vec::kOilBins) {
            move(col + outFirst[k], outWords + 4 * k, false);
            move(col + inFirst[k], inWords + 4 * k, true);
        }
    }
    return whole;
}
#endif

size_t moves3(const uint8_t *leave, const uint8_t *enter, size_t n, uint16_t *cols) {
    return moves<3>(leave, enter, n, cols);
}
size_t moves4(const uint8_t *leave, const uint8_t *enter, size_t n, uint16_t *cols) {
    return moves<4>(leave, enter, n, cols);
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(oil_windows);
HWY_EXPORT(moves3);
HWY_EXPORT(moves4);
} // namespace

vec::OilWindows vec::oil_windows() { return PXFX_VECTOR_COPY(oil_windows); }
vec::OilMoves vec::oil_moves(int channels) {
    return channels == 3 ? PXFX_VECTOR_COPY(moves3) : PXFX_VECTOR_COPY(moves4);
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
