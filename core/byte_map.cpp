// Byte-table maps over interleaved rows, with vector lookups where the
// machine has them: 128-byte two-register permutes on x86-64 with AVX-512
// VBMI, four-register table lookups on arm64 (cpu::Wide::kBytePermute, chosen
// through cpu::pick). Other machines, builds configured with PXFX_SIMD=OFF
// and runs with the plain code forced use the plain loop.
#include "core/internal/byte_map.hpp"

#include "core/internal/cpu.hpp"

#if PXFX_X86_DISPATCH
#include <immintrin.h>
#elif PXFX_ARM_NEON
#include <arm_neon.h>
#endif

namespace pxfx {

namespace {

// The table pointers are copied first: byte stores may alias them, and the
// copies stay in registers.
template <int C> void plain(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *tables) {
    const uint8_t *t[C];
    for (int k = 0; k < C; ++k)
        t[k] = tables[k];
    for (size_t i = 0; i < pixels; ++i)
        for (int k = 0; k < C; ++k)
            out[C * i + k] = t[k][in[C * i + k]];
}

template <int C> void plain_tone(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &tables) {
    const ToneTables t = tables;
    for (size_t i = 0; i < pixels; ++i) {
        const uint8_t *p = in + C * i;
        uint8_t *q = out + C * i;
        const uint32_t g = p[1], d = t.q[p[2]];
        q[0] = t.b[p[0]];
        q[1] = static_cast<uint8_t>(t.lower ? (g > d ? g - d : 0) : (g + d > 255 ? 255 : g + d));
        q[2] = t.r[p[2]];
        if constexpr (C == 4) q[3] = p[3];
    }
}

using MapFn = void (*)(const uint8_t *, uint8_t *, size_t, const uint8_t *const *);
using ToneFn = void (*)(const uint8_t *, uint8_t *, size_t, const ToneTables &);

#if PXFX_X86_DISPATCH

#define PXFX_VBMI __attribute__((target("avx512f,avx512bw,avx512vbmi")))

// A 256-entry table in four registers; lookups take the low seven index
// bits from each half and pick the half by the top bit.
struct Table512 {
    __m512i lo0, lo1, hi0, hi1;
};

PXFX_VBMI inline Table512 load_table(const uint8_t *t) {
    return {_mm512_loadu_si512(t), _mm512_loadu_si512(t + 64), _mm512_loadu_si512(t + 128),
            _mm512_loadu_si512(t + 192)};
}

PXFX_VBMI inline __m512i lookup(const Table512 &t, __m512i v) {
    const __m512i lo = _mm512_permutex2var_epi8(t.lo0, v, t.lo1);
    const __m512i hi = _mm512_permutex2var_epi8(t.hi0, v, t.hi1);
    return _mm512_mask_blend_epi8(_mm512_movepi8_mask(v), lo, hi);
}

// Bits j of a 64-byte block whose byte j belongs to channel k, for blocks
// starting at a byte offset of `phase` modulo `period`.
constexpr uint64_t lanes(int period, int phase, int k) {
    uint64_t m = 0;
    for (int j = 0; j < 64; ++j)
        if ((phase + j) % period == k) m |= uint64_t{1} << j;
    return m;
}

// One 64-byte block of 3-byte pixels: channel 0 everywhere, then channels 1
// and 2 where m1 and m2 say.
PXFX_VBMI inline void block3(const uint8_t *in, uint8_t *out, const Table512 &t0, const Table512 &t1,
                             const Table512 &t2, uint64_t m1, uint64_t m2) {
    const __m512i v = _mm512_loadu_si512(in);
    __m512i r = lookup(t0, v);
    r = _mm512_mask_mov_epi8(r, m1, lookup(t1, v));
    r = _mm512_mask_mov_epi8(r, m2, lookup(t2, v));
    _mm512_storeu_si512(out, r);
}

template <int C> PXFX_VBMI void vbmi(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *t) {
    // Blocks of C * 64 bytes: the channel pattern repeats in every block.
    const size_t blocks = pixels / 64, bytes = blocks * 64 * C;
    if constexpr (C == 1) {
        const Table512 t0 = load_table(t[0]);
        for (size_t i = 0; i < bytes; i += 64)
            _mm512_storeu_si512(out + i, lookup(t0, _mm512_loadu_si512(in + i)));
    } else if constexpr (C == 4) {
        const Table512 t0 = load_table(t[0]), t1 = load_table(t[1]), t2 = load_table(t[2]), t3 = load_table(t[3]);
        for (size_t i = 0; i < bytes; i += 64) {
            const __m512i v = _mm512_loadu_si512(in + i);
            __m512i r = lookup(t0, v);
            r = _mm512_mask_mov_epi8(r, lanes(4, 0, 1), lookup(t1, v));
            r = _mm512_mask_mov_epi8(r, lanes(4, 0, 2), lookup(t2, v));
            r = _mm512_mask_mov_epi8(r, lanes(4, 0, 3), lookup(t3, v));
            _mm512_storeu_si512(out + i, r);
        }
    } else {
        static_assert(C == 3);
        const Table512 t0 = load_table(t[0]), t1 = load_table(t[1]), t2 = load_table(t[2]);
        for (size_t i = 0; i < bytes; i += 192) {
            block3(in + i, out + i, t0, t1, t2, lanes(3, 0, 1), lanes(3, 0, 2));
            block3(in + i + 64, out + i + 64, t0, t1, t2, lanes(3, 1, 1), lanes(3, 1, 2));
            block3(in + i + 128, out + i + 128, t0, t1, t2, lanes(3, 2, 1), lanes(3, 2, 2));
        }
    }
    plain<C>(in + bytes, out + bytes, pixels - blocks * 64, t);
}

// A 64-byte block v of a tone map; next holds the bytes one further on, so
// green lanes find their red there.
template <bool Lower>
PXFX_VBMI inline __m512i tone_block(__m512i v, __m512i next, const Table512 &tb, const Table512 &tr, const Table512 &tq,
                                    uint64_t mb, uint64_t mg, uint64_t mr) {
    const __m512i d = lookup(tq, next);
    __m512i r = _mm512_mask_mov_epi8(v, mb, lookup(tb, v));
    r = _mm512_mask_mov_epi8(r, mr, lookup(tr, v));
    return _mm512_mask_mov_epi8(r, mg, Lower ? _mm512_subs_epu8(v, d) : _mm512_adds_epu8(v, d));
}

template <int C, bool Lower>
PXFX_VBMI void vbmi_tone_rows(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    // Groups of C blocks (the channel pattern repeats in each), as long as a
    // byte follows the group: that byte alone is read, and each block's bytes
    // one further on are its own shifted by one lane with the next block's
    // first byte moved in.
    const size_t groups = pixels == 0 ? 0 : (C * pixels - 1) / (64 * C), bytes = groups * 64 * C;
    const Table512 tb = load_table(t.b), tr = load_table(t.r), tq = load_table(t.q);
    uint64_t mb[C], mg[C], mr[C];
    for (int k = 0; k < C; ++k) {
        const int phase = (64 * k) % C;
        mb[k] = lanes(C, phase, 0), mg[k] = lanes(C, phase, 1), mr[k] = lanes(C, phase, 2);
    }
    alignas(64) uint8_t shift[64];
    for (int j = 0; j < 64; ++j)
        shift[j] = static_cast<uint8_t>(j + 1);
    const __m512i byOne = _mm512_load_si512(shift);
    for (size_t i = 0; i < bytes; i += 64 * C) {
        __m512i v[C + 1];
        for (int k = 0; k < C; ++k)
            v[k] = _mm512_loadu_si512(in + i + 64 * k);
        v[C] = _mm512_castsi128_si512(_mm_cvtsi32_si128(in[i + 64 * C]));
        for (int k = 0; k < C; ++k) {
            const __m512i next = _mm512_permutex2var_epi8(v[k], byOne, v[k + 1]);
            _mm512_storeu_si512(out + i + 64 * k, tone_block<Lower>(v[k], next, tb, tr, tq, mb[k], mg[k], mr[k]));
        }
    }
    plain_tone<C>(in + bytes, out + bytes, pixels - groups * 64, t);
}

template <int C> PXFX_VBMI void vbmi_tone(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    if (t.lower)
        vbmi_tone_rows<C, true>(in, out, pixels, t);
    else
        vbmi_tone_rows<C, false>(in, out, pixels, t);
}

template <int C> constexpr MapFn kVectorMap = &vbmi<C>;
template <int C> constexpr ToneFn kVectorTone = &vbmi_tone<C>;

#elif PXFX_ARM_NEON

// A 256-entry table in four groups of four registers; each group answers the
// indices of its 64 entries and leaves the others as they are.
struct Table128 {
    uint8x16x4_t q[4];
};

inline Table128 load_table(const uint8_t *t) {
    return {{vld1q_u8_x4(t), vld1q_u8_x4(t + 64), vld1q_u8_x4(t + 128), vld1q_u8_x4(t + 192)}};
}

inline uint8x16_t lookup(const Table128 &t, uint8x16_t v) {
    const uint8x16_t step = vdupq_n_u8(64);
    uint8x16_t r = vqtbl4q_u8(t.q[0], v);
    v = vsubq_u8(v, step);
    r = vqtbx4q_u8(r, t.q[1], v);
    v = vsubq_u8(v, step);
    r = vqtbx4q_u8(r, t.q[2], v);
    v = vsubq_u8(v, step);
    return vqtbx4q_u8(r, t.q[3], v);
}

template <int C> void neon(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *t) {
    const size_t blocks = pixels / 16, bytes = blocks * 16 * C;
    if constexpr (C == 1) {
        const Table128 t0 = load_table(t[0]);
        for (size_t i = 0; i < bytes; i += 16)
            vst1q_u8(out + i, lookup(t0, vld1q_u8(in + i)));
    } else if constexpr (C == 3) {
        const Table128 t0 = load_table(t[0]), t1 = load_table(t[1]), t2 = load_table(t[2]);
        for (size_t i = 0; i < bytes; i += 48) {
            uint8x16x3_t v = vld3q_u8(in + i);
            v.val[0] = lookup(t0, v.val[0]);
            v.val[1] = lookup(t1, v.val[1]);
            v.val[2] = lookup(t2, v.val[2]);
            vst3q_u8(out + i, v);
        }
    } else {
        static_assert(C == 4);
        const Table128 t0 = load_table(t[0]), t1 = load_table(t[1]), t2 = load_table(t[2]), t3 = load_table(t[3]);
        for (size_t i = 0; i < bytes; i += 64) {
            uint8x16x4_t v = vld4q_u8(in + i);
            v.val[0] = lookup(t0, v.val[0]);
            v.val[1] = lookup(t1, v.val[1]);
            v.val[2] = lookup(t2, v.val[2]);
            v.val[3] = lookup(t3, v.val[3]);
            vst4q_u8(out + i, v);
        }
    }
    plain<C>(in + bytes, out + bytes, pixels - blocks * 16, t);
}

template <int C> void neon_tone(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t) {
    const size_t blocks = pixels / 16, bytes = blocks * 16 * C;
    const Table128 tb = load_table(t.b), tr = load_table(t.r), tq = load_table(t.q);
    for (size_t i = 0; i < bytes; i += 16 * C) {
        if constexpr (C == 3) {
            uint8x16x3_t v = vld3q_u8(in + i);
            const uint8x16_t d = lookup(tq, v.val[2]);
            v.val[0] = lookup(tb, v.val[0]);
            v.val[1] = t.lower ? vqsubq_u8(v.val[1], d) : vqaddq_u8(v.val[1], d);
            v.val[2] = lookup(tr, v.val[2]);
            vst3q_u8(out + i, v);
        } else {
            uint8x16x4_t v = vld4q_u8(in + i);
            const uint8x16_t d = lookup(tq, v.val[2]);
            v.val[0] = lookup(tb, v.val[0]);
            v.val[1] = t.lower ? vqsubq_u8(v.val[1], d) : vqaddq_u8(v.val[1], d);
            v.val[2] = lookup(tr, v.val[2]);
            vst4q_u8(out + i, v);
        }
    }
    plain_tone<C>(in + bytes, out + bytes, pixels - blocks * 16, t);
}

template <int C> constexpr MapFn kVectorMap = &neon<C>;
template <int C> constexpr ToneFn kVectorTone = &neon_tone<C>;

#else

// No vector copy in this build: both choices are the plain loop.
template <int C> constexpr MapFn kVectorMap = &plain<C>;
template <int C> constexpr ToneFn kVectorTone = &plain_tone<C>;

#endif

template <int C> MapFn map_fn() { return cpu::pick<cpu::Wide::kBytePermute>(MapFn{&plain<C>}, kVectorMap<C>); }
template <int C> ToneFn tone_fn() { return cpu::pick<cpu::Wide::kBytePermute>(ToneFn{&plain_tone<C>}, kVectorTone<C>); }

} // namespace

const uint8_t kIdentityMap[256] = {
#define PXFX_ROW(n)                                                                                                    \
    n, n + 1, n + 2, n + 3, n + 4, n + 5, n + 6, n + 7, n + 8, n + 9, n + 10, n + 11, n + 12, n + 13, n + 14, n + 15
    PXFX_ROW(0),   PXFX_ROW(16),  PXFX_ROW(32),  PXFX_ROW(48),  PXFX_ROW(64),  PXFX_ROW(80),
    PXFX_ROW(96),  PXFX_ROW(112), PXFX_ROW(128), PXFX_ROW(144), PXFX_ROW(160), PXFX_ROW(176),
    PXFX_ROW(192), PXFX_ROW(208), PXFX_ROW(224), PXFX_ROW(240),
#undef PXFX_ROW
};

void map_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const uint8_t *const *tables) {
    switch (channels) {
    case 1: map_fn<1>()(in, out, pixels, tables); break;
    case 3: map_fn<3>()(in, out, pixels, tables); break;
    default: map_fn<4>()(in, out, pixels, tables); break;
    }
}

void tone_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const ToneTables &t) {
    if (channels == 3)
        tone_fn<3>()(in, out, pixels, t);
    else
        tone_fn<4>()(in, out, pixels, t);
}

} // namespace pxfx
