// Per-channel byte tables over pictures: blue, green and red of every pixel
// through a 256-entry table each, alpha kept; the result is what loading the
// colour, mapping its channels and storing it gives. Rows of 8-, 24- and
// 32-bit records go through ByteMap and so its fast lookups (a gray
// pixel reads as three equal channels and stores its green, so it maps
// through the green table). 16-bit words, whose fields straddle their bytes,
// go through one small table per field; any other bit count, or a source and
// result of different bit counts, through the pixel accessors.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>

#include "core/internal/byte_map.hpp"
#include "core/internal/pixel.hpp"

namespace pxfx {

struct ChannelMap {
    const uint8_t *b, *g, *r;
};

// Tables a caller fills in, and the map through them.
struct ChannelTables {
    uint8_t b[256], g[256], r[256];
    ChannelMap map() const { return {b, g, r}; }
};

namespace detail {

// A map on the fields of a 16-bit word (blue in bits 11-15, green 5-10, red
// 0-4), each field widened, mapped and narrowed as Word16 loads and stores
// it, and placed back in its bits.
struct WordFieldMap {
    uint16_t b[32], g[64], r[32];
    explicit WordFieldMap(const ChannelMap &m) {
        for (uint32_t v = 0; v < 32; ++v) {
            b[v] = static_cast<uint16_t>((m.b[v * 8] >> 3) << 11);
            r[v] = static_cast<uint16_t>(m.r[v * 8] >> 3);
        }
        for (uint32_t v = 0; v < 64; ++v)
            g[v] = static_cast<uint16_t>((m.g[v * 4] >> 2) << 5);
    }
};

template <class F, class Pick> void map_channel_rows(const View &src, const View &dst, Pick &pick) {
    const int32_t w = src.width;
    if constexpr (F::kBitCount == 8 || F::kBitCount == 24 || F::kBitCount == 32) {
        constexpr int channels = static_cast<int>(F::kBitCount / 8);
        // One ByteMap per run of rows with the same tables.
        for (int32_t y = 0; y < src.height;) {
            const ChannelMap &m = *pick(y);
            int32_t end = y + 1;
            while (end < src.height && pick(end) == &m)
                ++end;
            const uint8_t *tables[4] = {channels == 1 ? m.g : m.b, m.g, m.r, kIdentityMap};
            const ByteMap map(channels, tables, static_cast<size_t>(w) * static_cast<size_t>(end - y),
                              src.bits == dst.bits);
            for (; y < end; ++y)
                map(src.row(y), dst.row(y), static_cast<size_t>(w));
        }
    } else if constexpr (F::kBitCount == 16) {
        const ChannelMap *built = pick(0);
        WordFieldMap f(*built);
        for (int32_t y = 0; y < src.height; ++y) {
            if (const ChannelMap *m = pick(y); m != built) f = WordFieldMap(*(built = m));
            const uint8_t *in = src.row(y);
            uint8_t *out = dst.row(y);
            for (int32_t x = 0; x < w; ++x) {
                const uint32_t v = in[2 * x] | static_cast<uint32_t>(in[2 * x + 1]) << 8;
                const uint32_t o = f.b[v >> 11] | f.g[(v >> 5) & 63] | f.r[v & 31];
                out[2 * x] = static_cast<uint8_t>(o);
                out[2 * x + 1] = static_cast<uint8_t>(o >> 8);
            }
        }
    } else {
        for (int32_t y = 0; y < src.height; ++y) {
            const ChannelMap &m = *pick(y);
            const typename F::CRow in = F::crow(src, y);
            const typename F::Row out = F::row(dst, y);
            for (int32_t x = 0; x < w; ++x) {
                const uint32_t c = F::load(in, x);
                F::store(out, x, pack(m.b[blue_of(c)], m.g[green_of(c)], m.r[red_of(c)], alpha_of(c)));
            }
        }
    }
}

} // namespace detail

// Maps every row y of src through the tables *pick(y) into row y of dst,
// which is src itself or a view of the same size.
template <class Pick> void map_channel_rows(const View &src, const View &dst, Pick pick) {
    with_formats(src, dst, [&](auto f, auto) { detail::map_channel_rows<decltype(f)>(src, dst, pick); });
}

// Every pixel of src through the same tables into dst (as above).
inline void map_channels(const View &src, const View &dst, const ChannelMap &m) {
    map_channel_rows(src, dst, [&](int32_t) { return &m; });
}

} // namespace pxfx
