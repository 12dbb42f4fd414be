// Byte-table maps over interleaved rows: whole vectors through the vector
// copy of the chosen target (core/byte_map_vector.cpp), where one runs, and
// the rest in the plain loop.
#include "core/internal/byte_map.hpp"

#include "core/internal/vector_kernels.hpp"

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
    if (const vec::MapBytes vector = vec::map_bytes(channels)) {
        const size_t done = vector(in, out, pixels, tables);
        const size_t bytes = done * static_cast<size_t>(channels == 1 || channels == 3 ? channels : 4);
        in += bytes, out += bytes, pixels -= done;
    }
    switch (channels) {
    case 1: plain<1>(in, out, pixels, tables); break;
    case 3: plain<3>(in, out, pixels, tables); break;
    default: plain<4>(in, out, pixels, tables); break;
    }
}

void tone_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const ToneTables &t) {
    if (const vec::ToneBytes vector = vec::tone_bytes(channels)) {
        const size_t done = vector(in, out, pixels, t);
        const size_t bytes = done * static_cast<size_t>(channels == 3 ? 3 : 4);
        in += bytes, out += bytes, pixels -= done;
    }
    if (channels == 3)
        plain_tone<3>(in, out, pixels, t);
    else
        plain_tone<4>(in, out, pixels, t);
}

} // namespace pxfx
