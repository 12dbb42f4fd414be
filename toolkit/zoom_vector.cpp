// The 2x zoom of a pair of source rows in 16-byte vectors. Each step loads
// the source pixels and their right neighbours, averages them (rounded, per
// byte or per 16-bit word as the samples are), and byte shuffles lay the
// pixels and the averages side by side in the two result rows; the odd row
// averages the even rows of both source rows the same way.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/zoom_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

// A step of pixels of P bytes: kStep source pixels give kOut result vectors
// per row; result vector v reads the source bytes from kFrom[v] on.
template <int P> struct Step {
    static constexpr size_t kStep = P == 1 ? 16 : 8;
    static constexpr size_t kOut = 2 * P * kStep / 16;
    static constexpr size_t kFrom[3] = {0, P == 3 ? 4 : 0, 8};
    // Result byte o shows pixel i = o / 2P: its first P bytes copy the
    // pixel's bytes, the next P its average's; the other shuffle leaves 0.
    struct Tables {
        uint8_t pixel[3][16], average[3][16];
    };
    static constexpr Tables tables() {
        Tables t{};
        for (size_t v = 0; v < kOut; ++v)
            for (size_t k = 0; k < 16; ++k) {
                const size_t o = 16 * v + k, i = o / (2 * P), j = o % (2 * P);
                const auto byte = static_cast<uint8_t>(P * i + j % P - kFrom[v]);
                t.pixel[v][k] = j < P ? byte : 0x80;
                t.average[v][k] = j < P ? 0x80 : byte;
            }
        return t;
    }
};

#if HWY_TARGET == HWY_SCALAR
// Never chosen (core/cpu.cpp), and lacks byte shuffles.
template <int P> size_t zoom(const uint8_t *, const uint8_t *, size_t, uint8_t *, uint8_t *) { return 0; }
#else
template <int P> size_t zoom(const uint8_t *a, const uint8_t *b, size_t pixels, uint8_t *even, uint8_t *odd) {
    using S = Step<P>;
    const hn::FixedTag<uint8_t, 16> d8;
    const hn::FixedTag<uint16_t, 8> d16;
    using V = hn::Vec<decltype(d8)>;
    static constexpr typename S::Tables kTables = S::tables();
    auto average = [&](V u, V w) {
        if constexpr (P == 2) {
            return hn::BitCast(d8, hn::AverageRound(hn::BitCast(d16, u), hn::BitCast(d16, w)));
        } else {
            return hn::AverageRound(u, w);
        }
    };
    size_t x = 0;
    // The last pixel read is pixel x + kStep, the right neighbour of the
    // step's last one.
    for (; x + S::kStep < pixels; x += S::kStep) {
        const uint8_t *pa = a + P * x, *pb = b + P * x;
        for (size_t v = 0; v < S::kOut; ++v) {
            const size_t from = S::kFrom[v];
            const V a0 = hn::LoadU(d8, pa + from), a1 = hn::LoadU(d8, pa + from + P);
            const V b0 = hn::LoadU(d8, pb + from), b1 = hn::LoadU(d8, pb + from + P);
            const V ma = average(a0, a1), mb = average(b0, b1);
            const V pixel = hn::LoadU(d8, kTables.pixel[v]), mean = hn::LoadU(d8, kTables.average[v]);
            const size_t at = 2 * P * x + 16 * v;
            hn::StoreU(hn::Or(hn::TableLookupBytesOr0(a0, pixel), hn::TableLookupBytesOr0(ma, mean)), d8, even + at);
            hn::StoreU(
                hn::Or(hn::TableLookupBytesOr0(average(a0, b0), pixel), hn::TableLookupBytesOr0(average(ma, mb), mean)),
                d8, odd + at);
        }
    }
    return x;
}
#endif

size_t zoom1(const uint8_t *a, const uint8_t *b, size_t pixels, uint8_t *even, uint8_t *odd) {
    return zoom<1>(a, b, pixels, even, odd);
}
size_t zoom2(const uint8_t *a, const uint8_t *b, size_t pixels, uint8_t *even, uint8_t *odd) {
    return zoom<2>(a, b, pixels, even, odd);
}
size_t zoom3(const uint8_t *a, const uint8_t *b, size_t pixels, uint8_t *even, uint8_t *odd) {
    return zoom<3>(a, b, pixels, even, odd);
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(zoom1);
HWY_EXPORT(zoom2);
HWY_EXPORT(zoom3);
} // namespace

vec::ZoomRows vec::zoom_rows(int bytes) {
    return bytes == 1 ? PXFX_VECTOR_COPY(zoom1) : bytes == 2 ? PXFX_VECTOR_COPY(zoom2) : PXFX_VECTOR_COPY(zoom3);
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
