// Colour tones: negative, warm yellow, cold purple, old photograph,
// restoration (tinted gray), line rows, and the bare result preparation.
#include <pxfx/effects.h>

#include <algorithm>
#include <cstring>

#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "effects/pixel_maps.hpp"
#include "effects/tone_tables.hpp"

using namespace pxfx;

namespace {

template <class F> void negative(const Image *src, Image *dst) {
    const int32_t w = src->width;
    for (int32_t y = 0; y < src->height; ++y) {
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
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    with_format(src->bitCount, [&](auto f) { map_pixels<decltype(f)>(src, out, fn); });
    return 1;
}

// warm and cold on the bytes of 24- and 32-bit rows (blue, green, red, then
// alpha, which is kept), written so that the compiler can vectorise them.
template <int Bpp, bool Warm> void tone_rows(const Image *src, Image *dst) {
    const int32_t w = src->width;
    for (int32_t y = 0; y < src->height; ++y) {
        const uint8_t *in = row_ptr(src, y);
        uint8_t *out = row_ptr(dst, y);
        for (int32_t x = 0; x < w; ++x) {
            // Byte arithmetic throughout (sums saturate, differences cannot
            // go below 0), so each step maps to one vector byte operation.
            const uint8_t b = in[Bpp * x], g = in[Bpp * x + 1], r = in[Bpp * x + 2];
            uint8_t b2, g2, r2;
            if constexpr (Warm) {
                const uint8_t rq = static_cast<uint8_t>(r >> 2);
                r2 = static_cast<uint8_t>(std::min(r + rq, 255));
                const uint8_t gd = static_cast<uint8_t>(r2 >> 3);
                g2 = g > gd ? static_cast<uint8_t>(g - gd) : 0;
                b2 = static_cast<uint8_t>(b - (b >> 4));
            } else {
                r2 = static_cast<uint8_t>(r - (r >> 2));
                const uint8_t gd = static_cast<uint8_t>(r2 >> 4), bq = static_cast<uint8_t>(b >> 2);
                g2 = static_cast<uint8_t>(std::min(g + gd, 255));
                b2 = static_cast<uint8_t>(std::min(b + bq, 255));
            }
            out[Bpp * x] = b2;
            out[Bpp * x + 1] = g2;
            out[Bpp * x + 2] = r2;
            if constexpr (Bpp == 4) out[Bpp * x + 3] = in[Bpp * x + 3];
        }
    }
}

template <bool Warm, class Fn> uint32_t tone_effect(Image *src, Image **dst, Fn fn) {
    if (src == nullptr || (src->bitCount != 24 && src->bitCount != 32)) return point_effect(src, dst, fn);
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    if (src->bitCount == 24)
        tone_rows<3, Warm>(src, out);
    else
        tone_rows<4, Warm>(src, out);
    return 1;
}

} // namespace

extern "C" {

uint32_t PX_IMG_Negative(Image *src, Image **dst) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    with_format(src->bitCount, [&](auto f) { negative<decltype(f)>(src, out); });
    return 1;
}

uint32_t PX_IMG_WARM_YELLOW(Image *src, Image **dst) { return tone_effect<true>(src, dst, warm); }

uint32_t PX_IMG_COLD_PUPRLE(Image *src, Image **dst) { return tone_effect<false>(src, dst, cold); }

uint32_t PX_IMG_Repristination(Image *src, Image **dst) { return point_effect(src, dst, restored); }

uint32_t PX_IMG_Classical_Photograph(Image *src, Image **dst) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    map_channels(src, out, old_photo_tables());
    return 1;
}

uint32_t PX_IMG_Line(Image *src, Image **dst) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    ChannelTables dark, same;
    for (int i = 0; i < 256; ++i) {
        dark.b[i] = dark.g[i] = dark.r[i] = static_cast<uint8_t>(i > 128 ? i - 128 : 0);
        same.b[i] = same.g[i] = same.r[i] = static_cast<uint8_t>(i);
    }
    // Rows 2, 5, 8, ... are copied; all others are darkened.
    with_format(src->bitCount, [&](auto f) {
        map_rows<decltype(f)>(src, out, [&](int32_t y) { return y % 3 == 2 ? &same : &dark; });
    });
    return 1;
}

uint32_t my(Image *src, Image **dst) { return acquire_result(src, dst) != nullptr ? 1 : 0; }

} // extern "C"
