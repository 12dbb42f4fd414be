// Channel shift: red, green and blue moved by signed amounts and, in every
// mode but 0, passed through curves blended from the exported curve tables.
#include <pxfx/effects.h>
#include <pxfx/toolkit.h>

#include <optional>

#include "core/internal/channel_map.hpp"
#include "core/internal/curve_blend.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// v + d clamped to 0..255; the sum wraps modulo 2^32, as 32-bit arithmetic does.
uint8_t shifted(uint32_t v, int32_t d) { return clamp_u8(static_cast<int32_t>(v + static_cast<uint32_t>(d))); }

// curve[i] = ((127 - w) i + w T[i] + 63) / 127 with w = |d|, low 8 bits kept;
// shifts beyond +-127 give wrapped curves rather than errors.
void blend_curve(const uint8_t *table, int32_t d, uint8_t *curve) {
    const uint32_t w = d < 0 ? 0u - static_cast<uint32_t>(d) : static_cast<uint32_t>(d);
    for (uint32_t i = 0; i < 256; ++i)
        curve[i] = curve_blend<127>(i, table[i], w);
}

// Table of one channel: the curve indexed by the shifted value.
void channel_table(uint32_t mode, int32_t d, uint8_t *out) {
    uint8_t curve[256];
    switch (mode) {
    case 0:
        for (int i = 0; i < 256; ++i)
            curve[i] = static_cast<uint8_t>(i);
        break;
    case 1: blend_curve(ZANTOFILTERBK, d, curve); break;
    case 2: blend_curve(ZANTOFILTER, d, curve); break;
    case 3:
        for (int i = 0; i < 256; ++i)
            curve[i] = ZANTOFILTER[i];
        break;
    case 4:
        for (int i = 0; i < 256; ++i)
            curve[i] = ZANTOFILTERBK[i];
        break;
    case 5: blend_curve(d > 0 ? ZANTOFILTER : ZANTOFILTERBK, d, curve); break;
    default: blend_curve(d < 0 ? ZANTOFILTER : ZANTOFILTERBK, d, curve); break;
    }
    for (uint32_t v = 0; v < 256; ++v)
        out[v] = curve[shifted(v, d)];
}

} // namespace

extern "C" uint32_t PX_IMG_Alter(Image *src, Image **dst, int32_t dR, int32_t dG, int32_t dB, uint32_t mode) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        ChannelTables t;
        channel_table(mode, dR, t.r);
        channel_table(mode, dG, t.g);
        channel_table(mode, dB, t.b);
        map_channels(from, to, t.map());
    });
}
