// Brightness effects: channel scaling by a percentage, contrast about
// mid-gray, and the soft glow built from both.
#include <pxfx/effects.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "effects/pixel_maps.hpp"

using namespace pxfx;

namespace {

// (percent * v) / 100 capped at 255, for the selected channel (0 red, 1 green,
// 2 blue, other all three); the other channels map to themselves.
ChannelTables light_tables(uint32_t percent, uint32_t channel) {
    ChannelTables t;
    for (uint32_t v = 0; v < 256; ++v) {
        const uint64_t scaled = static_cast<uint64_t>(percent) * v / 100;
        const uint8_t s = scaled > 255 ? 255 : static_cast<uint8_t>(scaled);
        t.r[v] = channel == 0 || channel > 2 ? s : static_cast<uint8_t>(v);
        t.g[v] = channel == 1 || channel > 2 ? s : static_cast<uint8_t>(v);
        t.b[v] = channel == 2 || channel > 2 ? s : static_cast<uint8_t>(v);
    }
    return t;
}

// trunc((v - 128) * f + 128.0) clamped to 0..255, f = (contrast + 100) / 100.
// f and the product are single precision; the literal 128.0 makes the sum a
// double, which decides products just below a whole number (60 * 1.05f =
// 62.9999962 gives 190, where a single-precision sum would round to 191).
void contrast_table(int32_t contrast, uint8_t *t) {
    const float f = static_cast<float>(static_cast<float>(static_cast<int64_t>(contrast) + 100) / 100.0);
    for (int32_t i = 0; i < 256; ++i) {
        const double v = static_cast<double>(static_cast<float>(i - 128) * f) + 128.0;
        t[i] = v >= 255.0 ? 255 : (v < 0.0 ? 0 : static_cast<uint8_t>(v));
    }
}

} // namespace

extern "C" {

uint32_t PX_IMG_Light_Alter(Image *src, Image **dst, uint32_t percent, uint32_t channel) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    if (percent == 100) {
        PX_Img_Copy(out, src);
    } else if (percent == 0) {
        std::memset(out->bits, 0, block_bytes(out));
    } else {
        map_channels(src, out, light_tables(percent, channel));
    }
    return 1;
}

uint32_t PX_IMG_Ballance(Image *src, Image **dst, int32_t contrast) {
    ChannelTables t;
    contrast_table(contrast, t.b);
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    if (contrast == 0) {
        // A plain byte copy of the blocks; a result with a larger block than
        // the source's keeps its bytes beyond the source's block.
        const size_t n = block_bytes(out) < block_bytes(src) ? block_bytes(out) : block_bytes(src);
        std::memcpy(out->bits, src->bits, n);
        return 1;
    }
    std::memcpy(t.g, t.b, 256);
    std::memcpy(t.r, t.b, 256);
    map_channels(src, out, t);
    return 1;
}

} // extern "C"
