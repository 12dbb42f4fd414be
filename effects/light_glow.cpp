// Brightness effects: channel scaling by a percentage, contrast about
// mid-gray, and the soft glow built from both.
#include <pxfx/color.h>
#include <pxfx/effects.h>

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/internal/channel_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

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

// trunc((v - 128) * f + 128) clamped to 0..255, f = (contrast + 100) / 100,
// all in single precision: the sum rounds products just below a whole number
// up (60 * 1.05f = 62.9999962, plus 128 gives 191).
void contrast_table(int32_t contrast, uint8_t *t) {
    const float f = static_cast<float>(static_cast<int64_t>(contrast) + 100) / 100.0f;
    for (int32_t i = 0; i < 256; ++i) {
        const float v = static_cast<float>(i - 128) * f + 128.0f;
        t[i] = v >= 255.0f ? 255 : (v < 0.0f ? 0 : static_cast<uint8_t>(v));
    }
}

// Colour after a store into and a load from a pixel of format TF.
template <class TF> uint32_t round_trip(uint32_t c) {
    uint8_t px[4] = {};
    TF::store(px, 0, c);
    return TF::load(px, 0);
}

// Glow of a blurred channel value: halved (50 %), contrast +5 %, each step
// stored in the working format TF as the intermediate images would hold it.
// Channels map independently in every format (an 8-bit picture has three
// equal channels), so one table per channel covers the whole chain.
template <class TF> ChannelTables glow_tables() {
    uint8_t contrast[256];
    contrast_table(5, contrast);
    ChannelTables t;
    for (uint32_t v = 0; v < 256; ++v) {
        const uint32_t half = round_trip<TF>(pack(v / 2, v / 2, v / 2, 255));
        const uint32_t c =
            round_trip<TF>(pack(contrast[blue_of(half)], contrast[green_of(half)], contrast[red_of(half)], 255));
        t.b[v] = static_cast<uint8_t>(blue_of(c));
        t.g[v] = static_cast<uint8_t>(green_of(c));
        t.r[v] = static_cast<uint8_t>(red_of(c));
    }
    return t;
}

// Screen blend a + b - ab / 256, capped at 255.
inline uint32_t screen(uint32_t a, uint32_t b) {
    const uint32_t s = a + b - ((a * b) >> 8);
    return s > 255 ? 255 : s;
}

// Screen-blends the glow of the blurred picture `blur` (format TF) over the
// source (format F) into dst; alpha is the source's.
template <class F, class TF> void glow(const View &src, const View &blur, const View &dst) {
    const ChannelTables t = glow_tables<TF>();
    const int32_t w = src.width;
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        const typename TF::CRow soft = TF::crow(blur, y);
        const typename F::Row out = F::row(dst, y);
        if constexpr (F::kBitCount == 24 || F::kBitCount == 32) {
            constexpr int32_t step = F::kBitCount / 8;
            for (int32_t x = 0; x < w; ++x) {
                const uint8_t *p = in + step * x, *q = soft + step * x;
                uint8_t *o = out + step * x;
                o[0] = static_cast<uint8_t>(screen(p[0], t.b[q[0]]));
                o[1] = static_cast<uint8_t>(screen(p[1], t.g[q[1]]));
                o[2] = static_cast<uint8_t>(screen(p[2], t.r[q[2]]));
                if constexpr (step == 4) o[3] = p[3];
            }
        } else {
            for (int32_t x = 0; x < w; ++x) {
                const uint32_t a = F::load(in, x), b = TF::load(soft, x);
                F::store(out, x,
                         pack(screen(blue_of(a), t.b[blue_of(b)]), screen(green_of(a), t.g[green_of(b)]),
                              screen(red_of(a), t.r[red_of(b)]), alpha_of(a)));
            }
        }
    }
}

constexpr int32_t kGlowKernel[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};

// Bytes of the block a record claims, pitch x height: none without a pixel
// block or for a height below 1, and none for a claim above the largest block
// the library handles. A reused result of an empty size may still claim rows.
size_t claimed_bytes(const Image *im) {
    return im->bits != nullptr && im->height > 0 && block_claim_ok(im) ? block_bytes(im) : 0;
}

} // namespace

extern "C" {

uint32_t PX_IMG_Light_Alter(Image *src, Image **dst, uint32_t percent, uint32_t channel) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    // The copy and the clearing work on whole blocks, which a result of an
    // empty size may have.
    if (percent == 100) {
        PX_Img_Copy(out, src);
    } else if (percent == 0) {
        if (const size_t n = claimed_bytes(out); n > 0) std::memset(out->bits, 0, n);
    } else if (const std::optional<View> to = view_of(out)) {
        const ChannelTables t = light_tables(percent, channel);
        map_channels(*view_of(src), *to, t.map()); // the result's size: the source has pixels too
    }
    return 1;
}

uint32_t PX_IMG_Ballance(Image *src, Image **dst, int32_t contrast) {
    uint8_t table[256];
    contrast_table(contrast, table);
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    if (contrast == 0) {
        // A plain byte copy of the blocks, also of records of an empty size
        // that claim rows; a result with a larger block than the source's
        // keeps its bytes beyond the source's block.
        const size_t n = std::min(claimed_bytes(out), claimed_bytes(src));
        if (n > 0) std::memmove(out->bits, src->bits, n);
        return 1;
    }
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    map_channels(from, *to, {table, table, table});
    return 1;
}

uint32_t PX_IMG_Lambency(Image *src, Image **dst) {
    if (dst == nullptr) return 0;
    const std::optional<View> from = view_of(src);
    if (!from) return 0;
    ImagePtr blur = make_image(from->width, from->height, static_cast<int32_t>(from->bitCount));
    // Blurred first: when its working memory cannot be had, nothing is touched.
    if (!blur || Filter(src, kGlowKernel, 3, 16, 0, nullptr, blur.get(), 0) == 0) return 0;
    const View soft = *view_of(blur.get());
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    // The blurred image has the source's format, or 8 bits for a source of
    // any other bit count (as malloc_Image makes it).
    with_format(from->bitCount, [&](auto f) {
        using F = decltype(f);
        if constexpr (F::kDirect) {
            glow<F, F>(*from, soft, *to);
        } else {
            glow<AnyFormat, Gray8>(*from, soft, *to);
        }
    });
    return 1;
}

} // extern "C"
