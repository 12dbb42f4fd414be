// Colour tones: negative, warm yellow, cold purple, old photograph,
// restoration (tinted gray), line rows, and the bare result preparation.
#include <pxfx/effects.h>

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/internal/byte_map.hpp"
#include "core/internal/channel_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"
#include "effects/tone_tables.hpp"

using namespace pxfx;

namespace {

template <class F> void negative(const View &src, const View &dst) {
    const int32_t w = src.width;
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        if constexpr (F::kBitCount == 24) {
            // 255 - v is ~v on every colour byte.
            for (int32_t i = 0; i < 3 * w; ++i)
                out[i] = static_cast<uint8_t>(~in[i]);
        } else if constexpr (F::kBitCount == 32) {
            // One word per pixel, XORed with a mask whose alpha byte is 0
            // (built from bytes, so it fits either byte order).
            const uint8_t maskBytes[4] = {0xFF, 0xFF, 0xFF, 0};
            uint32_t mask;
            std::memcpy(&mask, maskBytes, 4);
            for (int32_t x = 0; x < w; ++x) {
                uint32_t v;
                std::memcpy(&v, in + 4 * x, 4);
                v ^= mask;
                std::memcpy(out + 4 * x, &v, 4);
            }
        } else {
            for (int32_t x = 0; x < w; ++x)
                F::store(out, x, F::load(in, x) ^ 0x00FFFFFFu);
        }
    }
}

// Red gains a quarter and green loses an eighth of the new red.
uint32_t warm(uint32_t c) {
    const uint32_t b = blue_of(c), g = green_of(c), r = red_of(c);
    const uint32_t r2 = r + (r >> 2) > 255 ? 255 : r + (r >> 2);
    const uint32_t g2 = g > (r2 >> 3) ? g - (r2 >> 3) : 0;
    return pack(b - (b >> 4), g2, r2, alpha_of(c));
}

// Red loses a quarter; green gains a sixteenth of the new red, blue a quarter.
uint32_t cold(uint32_t c) {
    const uint32_t b = blue_of(c), g = green_of(c), r = red_of(c);
    const uint32_t r2 = r - (r >> 2);
    const uint32_t g2 = g + (r2 >> 4) > 255 ? 255 : g + (r2 >> 4);
    const uint32_t b2 = b + (b >> 2) > 255 ? 255 : b + (b >> 2);
    return pack(b2, g2, r2, alpha_of(c));
}

// The channel mean, tinted toward blue.
uint32_t restored(uint32_t c) {
    const int32_t m = static_cast<int32_t>((blue_of(c) + green_of(c) + red_of(c)) / 3);
    return pack(clamp_u8(m + 20), clamp_u8(m), clamp_u8(m - 20), alpha_of(c));
}

// Red sums are clamped, green and blue sums wrap modulo 256.
ChannelTables old_photo_tables() {
    ChannelTables t;
    for (int i = 0; i < 256; ++i) {
        t.r[i] = clamp_u8(i + kOldPhotoRed[i]);
        t.g[i] = static_cast<uint8_t>(i + kOldPhotoGreen[i]);
        t.b[i] = static_cast<uint8_t>(i + kOldPhotoBlue[i]);
    }
    return t;
}

template <class Fn> uint32_t point_effect(Image *src, Image **dst, Fn fn) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        with_format(from.bitCount, [&](auto f) { map_pixels<decltype(f)>(from, to, fn); });
    });
}

// warm and cold on 24- and 32-bit rows as byte tables: blue and red through
// their own maps, green moved by a map of the pixel's red, alpha kept.
ToneTables tone_tables(bool warm) {
    static const auto tables = [] {
        struct {
            uint8_t b[2][256], r[2][256], q[2][256];
        } t;
        for (uint32_t v = 0; v < 256; ++v) {
            const uint32_t warmRed = std::min(v + (v >> 2), 255u), coldRed = v - (v >> 2);
            t.b[0][v] = static_cast<uint8_t>(std::min(v + (v >> 2), 255u)),
            t.b[1][v] = static_cast<uint8_t>(v - (v >> 4));
            t.r[0][v] = static_cast<uint8_t>(coldRed), t.r[1][v] = static_cast<uint8_t>(warmRed);
            t.q[0][v] = static_cast<uint8_t>(coldRed >> 4), t.q[1][v] = static_cast<uint8_t>(warmRed >> 3);
        }
        return t;
    }();
    return {tables.b[warm], tables.r[warm], tables.q[warm], warm};
}

template <bool Warm> void tone_rows(const View &src, const View &dst) {
    const int channels = static_cast<int>(src.bitCount / 8);
    const ByteMap map(channels, tone_tables(Warm), static_cast<size_t>(src.width) * static_cast<size_t>(src.height));
    for (int32_t y = 0; y < src.height; ++y)
        map(src.row(y), dst.row(y), static_cast<size_t>(src.width));
}

template <bool Warm, class Fn> uint32_t tone_effect(Image *src, Image **dst, Fn fn) {
    if (src == nullptr || (src->bitCount != 24 && src->bitCount != 32)) return point_effect(src, dst, fn);
    return draw_result(src, dst, [&](const View &from, const View &to) { tone_rows<Warm>(from, to); });
}

} // namespace

extern "C" {

uint32_t PX_IMG_Negative(Image *src, Image **dst) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        with_format(from.bitCount, [&](auto f) { negative<decltype(f)>(from, to); });
    });
}

uint32_t PX_IMG_WARM_YELLOW(Image *src, Image **dst) { return tone_effect<true>(src, dst, warm); }

uint32_t PX_IMG_COLD_PUPRLE(Image *src, Image **dst) { return tone_effect<false>(src, dst, cold); }

uint32_t PX_IMG_Repristination(Image *src, Image **dst) { return point_effect(src, dst, restored); }

uint32_t PX_IMG_Classical_Photograph(Image *src, Image **dst) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        const ChannelTables t = old_photo_tables();
        map_channels(from, to, t.map());
    });
}

uint32_t PX_IMG_Line(Image *src, Image **dst) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    uint8_t darker[256];
    for (int i = 0; i < 256; ++i)
        darker[i] = static_cast<uint8_t>(i > 128 ? i - 128 : 0);
    const ChannelMap dark{darker, darker, darker}, same{kIdentityMap, kIdentityMap, kIdentityMap};
    // Rows 2, 5, 8, ... are copied; all others are darkened.
    map_channel_rows(from, *to, [&](int32_t y) { return y % 3 == 2 ? &same : &dark; });
    return 1;
}

uint32_t my(Image *src, Image **dst) { return acquire_result(src, dst) != nullptr ? 1 : 0; }

} // extern "C"
