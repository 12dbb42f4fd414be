// Byte-table maps in vectors: each vector of samples is looked up in a
// 256-entry table held in registers. The table is split into sixteen rows of
// sixteen entries; every row is looked up by the low four bits of each sample
// and the row the high four bits name is kept. On arm64, whose table lookups
// take 64 entries at once, four lookups cover the table. Pixels of three and
// four channels are split into channel vectors and joined again.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "core/byte_map_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include "core/internal/vector_kernels.hpp"

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;
using D = hn::ScalableTag<uint8_t>;
using V = hn::Vec<D>;

#if HWY_TARGET == HWY_NEON && HWY_ARCH_ARM_A64
struct Table {
    uint8x16x4_t q[4];
};

HWY_INLINE Table load_table(const uint8_t *t) {
    return {{vld1q_u8_x4(t), vld1q_u8_x4(t + 64), vld1q_u8_x4(t + 128), vld1q_u8_x4(t + 192)}};
}

// Each lookup answers the indices of its 64 entries and leaves the others.
HWY_INLINE V lookup(const Table &t, V v) {
    const uint8x16_t step = vdupq_n_u8(64);
    uint8x16_t i = v.raw;
    uint8x16_t r = vqtbl4q_u8(t.q[0], i);
    i = vsubq_u8(i, step);
    r = vqtbx4q_u8(r, t.q[1], i);
    i = vsubq_u8(i, step);
    r = vqtbx4q_u8(r, t.q[2], i);
    i = vsubq_u8(i, step);
    return V(vqtbx4q_u8(r, t.q[3], i));
}
#else
struct Table {
    V row[16]; // entries 16 k .. 16 k + 15 in every 16-byte block
};

HWY_INLINE Table load_table(const uint8_t *t) {
    const D d;
    Table out;
    for (int k = 0; k < 16; ++k)
        out.row[k] = hn::LoadDup128(d, t + 16 * k);
    return out;
}

HWY_INLINE V lookup(const Table &t, V v) {
    const D d;
    const V low = hn::And(v, hn::Set(d, 0x0F)), high = hn::ShiftRight<4>(v);
    V r = hn::TableLookupBytes(t.row[0], low);
    for (int k = 1; k < 16; ++k)
        r = hn::IfThenElse(hn::Eq(high, hn::Set(d, static_cast<uint8_t>(k))), hn::TableLookupBytes(t.row[k], low), r);
    return r;
}
#endif

// On x86 with 16-byte vectors, splitting and joining three or four channels
// costs what the lookups save: those maps stay with the plain loop there.
constexpr bool kSplitPays = HWY_TARGET != HWY_SSSE3 && HWY_TARGET != HWY_SSE4;

template <int C> size_t map(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *tables) {
    if constexpr (C != 1 && !kSplitPays) return 0;
    const D d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    if constexpr (C == 1) {
        const Table t = load_table(tables[0]);
        for (size_t i = 0; i < whole; i += lanes)
            hn::StoreU(lookup(t, hn::LoadU(d, in + i)), d, out + i);
    } else if constexpr (C == 3) {
        const Table t0 = load_table(tables[0]), t1 = load_table(tables[1]), t2 = load_table(tables[2]);
        for (size_t i = 0; i < whole; i += lanes) {
            V a, b, c;
            hn::LoadInterleaved3(d, in + 3 * i, a, b, c);
            hn::StoreInterleaved3(lookup(t0, a), lookup(t1, b), lookup(t2, c), d, out + 3 * i);
        }
    } else {
        const Table t0 = load_table(tables[0]), t1 = load_table(tables[1]), t2 = load_table(tables[2]),
                    t3 = load_table(tables[3]);
        for (size_t i = 0; i < whole; i += lanes) {
            V a, b, c, e;
            hn::LoadInterleaved4(d, in + 4 * i, a, b, c, e);
            hn::StoreInterleaved4(lookup(t0, a), lookup(t1, b), lookup(t2, c), lookup(t3, e), d, out + 4 * i);
        }
    }
    return whole;
}

template <int C, bool Lower> size_t tone_rows(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    const D d;
    const size_t lanes = hn::Lanes(d), whole = pixels / lanes * lanes;
    const Table tb = load_table(t.b), tr = load_table(t.r), tq = load_table(t.q);
    auto green = [](V g, V q) { return Lower ? hn::SaturatedSub(g, q) : hn::SaturatedAdd(g, q); };
    for (size_t i = 0; i < whole; i += lanes) {
        V b, g, r, a;
        if constexpr (C == 3) {
            hn::LoadInterleaved3(d, in + 3 * i, b, g, r);
            hn::StoreInterleaved3(lookup(tb, b), green(g, lookup(tq, r)), lookup(tr, r), d, out + 3 * i);
        } else {
            hn::LoadInterleaved4(d, in + 4 * i, b, g, r, a);
            hn::StoreInterleaved4(lookup(tb, b), green(g, lookup(tq, r)), lookup(tr, r), a, d, out + 4 * i);
        }
    }
    return whole;
}

template <int C> size_t tone(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    return t.lower ? tone_rows<C, true>(in, out, pixels, t) : tone_rows<C, false>(in, out, pixels, t);
}

size_t map1(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *t) {
    return map<1>(in, out, pixels, t);
}
size_t map3(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *t) {
    return map<3>(in, out, pixels, t);
}
size_t map4(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *t) {
    return map<4>(in, out, pixels, t);
}
size_t tone3(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    return tone<3>(in, out, pixels, t);
}
size_t tone4(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    return tone<4>(in, out, pixels, t);
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(map1);
HWY_EXPORT(map3);
HWY_EXPORT(map4);
HWY_EXPORT(tone3);
HWY_EXPORT(tone4);
} // namespace

vec::MapBytes vec::map_bytes(int channels) {
    return channels == 1 ? PXFX_VECTOR_COPY(map1) : (channels == 3 ? PXFX_VECTOR_COPY(map3) : PXFX_VECTOR_COPY(map4));
}

vec::ToneBytes vec::tone_bytes(int channels) {
    return channels == 3 ? PXFX_VECTOR_COPY(tone3) : PXFX_VECTOR_COPY(tone4);
}

bool vec::pair_tables_pay(int channels, bool tone, bool inPlace) {
    const int64_t t = cpu::target();
    return t == HWY_SSSE3 || t == HWY_SSE4 || (t == HWY_AVX2 && channels == 3 && !tone && inPlace);
}

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
