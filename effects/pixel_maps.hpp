// Point-wise passes shared by the effects whose result pixel depends only on
// the source pixel at the same place: per-channel byte tables and per-pixel
// colour functions, specialised per pixel format.
//
// The source and result must have the same width and height. For the direct
// formats (8, 16, 24, 32 bits) they also share the bit count (the result-image
// rule guarantees it); any other source format goes through the accessors, so
// the result may then have any format.
#pragma once

#include <pxfx/core.h>

#include <cstdint>

#include "core/internal/byte_map.hpp"
#include "core/internal/pixel.hpp"

namespace pxfx {

// One 256-entry map per colour channel; alpha is always kept.
struct ChannelTables {
    uint8_t b[256], g[256], r[256];
};

// Writes every pixel of rows y with pick(y) != null through the tables that
// pick returns; rows with null are left alone.
template <class F, class Pick> void map_rows(const Image *src, Image *dst, Pick pick) {
    const int32_t w = src->width;
    for (int32_t y = 0; y < src->height; ++y) {
        const ChannelTables *t = pick(y);
        if (t == nullptr) continue;
        const typename F::CRow in = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        if constexpr (F::kBitCount == 32) {
            const uint8_t *tables[4] = {t->b, t->g, t->r, kIdentityMap};
            map_bytes(in, out, static_cast<size_t>(w), 4, tables);
        } else if constexpr (F::kBitCount == 24) {
            const uint8_t *tables[3] = {t->b, t->g, t->r};
            map_bytes(in, out, static_cast<size_t>(w), 3, tables);
        } else if constexpr (F::kBitCount == 8) {
            // A gray pixel reads as three equal channels and stores its green.
            const uint8_t *tables[1] = {t->g};
            map_bytes(in, out, static_cast<size_t>(w), 1, tables);
        } else {
            for (int32_t x = 0; x < w; ++x) {
                const uint32_t c = F::load(in, x);
                F::store(out, x, pack(t->b[blue_of(c)], t->g[green_of(c)], t->r[red_of(c)], alpha_of(c)));
            }
        }
    }
}

// Every pixel through the same tables.
inline void map_channels(const Image *src, Image *dst, const ChannelTables &t) {
    with_format(src->bitCount, [&](auto f) { map_rows<decltype(f)>(src, dst, [&](int32_t) { return &t; }); });
}

// Every pixel through fn(packed colour) -> packed colour.
template <class F, class Fn> void map_pixels(const Image *src, Image *dst, Fn fn) {
    const int32_t w = src->width;
    for (int32_t y = 0; y < src->height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < w; ++x)
            F::store(out, x, fn(F::load(in, x)));
    }
}

} // namespace pxfx
