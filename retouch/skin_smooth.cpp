// Skin smoothing: small dark spots inside the skin mask are brightened by the
// gap to their window's second largest mask value, then the brightening curve
// and a blend of identity and the filter curve give the skin tone.
#include <pxfx/retouch.h>
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cstring>

#include "core/internal/channel_map.hpp"
#include "core/internal/curve_blend.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kSpotHalf = 2;     // 5 x 5 window
constexpr uint32_t kMinBrighter = 3; // neighbours brighter than the centre
constexpr double kSpotBlue = 0.8, kSpotGreen = 0.8, kSpotRed = 0.7;

// Spot map of the skin mask: the second largest value of the 5 x 5 window
// minus the centre where at least kMinBrighter values exceed a non-zero
// centre, else 0 (every byte is written). Rows are gathered offset by offset
// on an edge-padded copy, so the inner loops run over whole rows of bytes.
bool spot_map(const View &mask, uint8_t *spots) {
    constexpr int32_t side = 2 * kSpotHalf + 1;
    const int32_t w = mask.width, h = mask.height;
    const size_t pw = static_cast<size_t>(w) + side - 1;
    Buffer<uint8_t> pad = padded_plane(mask.bits, mask.pitch, w, h, -kSpotHalf, side);
    Buffer<uint8_t> rows = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), 3));
    if (!pad || !rows) return false;
    uint8_t *first = rows.get(), *second = first + w, *above = second + w;
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *centre = mask.row(y);
        std::memset(rows.get(), 0, static_cast<size_t>(w) * 3);
        for_each_window_offset(pad.get(), pw, y, side, [&](const uint8_t *p) {
            for (int32_t x = 0; x < w; ++x) {
                const uint8_t v = p[x];
                above[x] = static_cast<uint8_t>(above[x] + (v > centre[x]));
                second[x] = std::max(second[x], std::min(first[x], v));
                first[x] = std::max(first[x], v);
            }
        });
        uint8_t *out = spots + static_cast<size_t>(y) * w;
        for (int32_t x = 0; x < w; ++x)
            out[x] = centre[x] != 0 && above[x] >= kMinBrighter ? static_cast<uint8_t>(second[x] - centre[x]) : 0;
    }
    return true;
}

} // namespace

extern "C" {

int32_t alg_Img_smooth_1(const Image *src, Image **dst) {
    if (src == nullptr || dst == nullptr) return 0;
    Image *out = prepare_slot(src, dst);
    if (out == nullptr) return 0;
    const int32_t w = src->width, h = src->height;
    const size_t pixels = checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h));
    Buffer<uint8_t> spots = alloc_buffer<uint8_t>(pixels);
    if (!spots) return 0;
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    // A source without pixels has no mask: no spots, and it reads as 0. A
    // mask that cannot be made otherwise fails the call like the spot map:
    // left unchecked, it would read as no skin and pass the source off as
    // smoothed.
    const ReadView view(src);
    if (!view.ok()) return 0;
    if (view_of(src)) {
        Image *mask = nullptr;
        const std::optional<View> m = CreateFaceMaskImg(src, &mask) ? view_of(mask) : std::nullopt;
        const bool ok = m && spot_map(*m, spots.get());
        free_Image(&mask, 0);
        if (!ok) return 0;
    } else {
        std::memset(spots.get(), 0, pixels);
    }
    const View &in = view.view();
    with_formats(in, *to, [&](auto fs, auto fd) {
        lift_pixels<decltype(fs), decltype(fd)>(in, *to, spots.get(), static_cast<size_t>(w), kSpotBlue, kSpotGreen,
                                                kSpotRed);
    });
    return 1;
}

void alg_Img_smooth(const Image *src, Image **dst) {
    // A source the smoothing refuses outright leaves the slot's image as the
    // caller's, not to be brightened.
    if (src == nullptr || dst == nullptr || !rows_inside(src)) return;
    alg_Img_smooth_1(src, dst);
    if (*dst != nullptr) LightUP(*dst);
}

int32_t alg_Img_Skin(const Image *src, Image **dst, int32_t lighten) {
    if (src == nullptr || dst == nullptr || !rows_inside(src)) return 1;
    uint8_t tone[256];
    for (int32_t i = 0; i < 256; ++i)
        tone[i] = curve_blend<127>(i, ZANTOFILTER[i], 75);
    // The brightening passes and the tone curve run on whatever the smoothing
    // left in the slot, also a prepared image it could not write.
    alg_Img_smooth_1(src, dst);
    Image *out = *dst;
    const std::optional<View> v = view_of(out);
    if (!v) return 1;
    const int32_t lightUps = lighten != 0 ? 2 : 1;
    if (v->bitCount == 8 || v->bitCount == 24 || v->bitCount == 32) {
        // Byte channels store every intermediate value exactly, so the
        // brightening passes and the tone curve fold into one table.
        uint8_t table[256];
        for (int32_t i = 0; i < 256; ++i) {
            uint8_t v = static_cast<uint8_t>(i);
            for (int32_t k = 0; k < lightUps; ++k)
                v = ZANTOMOPI[v];
            table[i] = tone[v];
        }
        map_channels(*v, *v, {table, table, table});
        return 1;
    }
    for (int32_t k = 0; k < lightUps; ++k)
        LightUP(out);
    map_channels(*v, *v, {tone, tone, tone});
    return 1;
}

int32_t LightUP(Image *img) {
    if (img == nullptr || !rows_inside(img)) return 0;
    if (const std::optional<View> v = view_of(img)) map_channels(*v, *v, {ZANTOMOPI, ZANTOMOPI, ZANTOMOPI});
    return 1;
}

} // extern "C"
