// Skin smoothing: small dark spots inside the skin mask are brightened by the
// gap to their window's second largest mask value, then the brightening curve
// and a blend of identity and the filter curve give the skin tone.
#include <pxfx/retouch.h>
#include <pxfx/toolkit.h>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kSpotHalf = 2;     // 5 x 5 window
constexpr uint32_t kMinBrighter = 3; // neighbours brighter than the centre
constexpr double kSpotBlue = 0.8, kSpotGreen = 0.8, kSpotRed = 0.7;

// Spot map of the skin mask: the second largest value of the window minus
// the centre, where at least kMinBrighter values exceed a non-zero centre.
bool spot_map(const Image *mask, uint8_t *spots) {
    const int32_t w = mask->width;
    return for_each_window(mask->bits, mask->pitch, w, mask->height, -kSpotHalf, kSpotHalf,
                           [&](int32_t x, int32_t y, uint8_t c, const RankHist &hist) {
                               if (c == 0 || hist.count_above(c) < kMinBrighter) return;
                               spots[static_cast<size_t>(y) * w + x] =
                                   static_cast<uint8_t>((hist.kth_largest(1) - c) & 255u);
                           });
}

} // namespace

extern "C" {

int32_t alg_Img_smooth_1(const Image *src, Image **dst) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    const int32_t w = src->width, h = src->height;
    Buffer<uint8_t> spots = alloc_zeroed<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!spots) return 0;
    // Without a mask no pixel is skin and the source is copied unchanged.
    Image *mask = nullptr;
    const bool ok = !CreateFaceMaskImg(src, &mask) || spot_map(mask, spots.get());
    free_Image(&mask, 0);
    if (!ok) return 0;
    with_formats(src, out, [&](auto fs, auto fd) {
        lift_pixels<decltype(fs), decltype(fd)>(src, out, spots.get(), static_cast<size_t>(w), kSpotBlue, kSpotGreen,
                                                kSpotRed);
    });
    return 1;
}

void alg_Img_smooth(const Image *src, Image **dst) {
    alg_Img_smooth_1(src, dst);
    if (dst != nullptr && *dst != nullptr) LightUP(*dst);
}

int32_t alg_Img_Skin(const Image *src, Image **dst, int32_t lighten) {
    if (!has_pixels(src) || dst == nullptr) return 0;
    uint8_t tone[256];
    for (int32_t i = 0; i < 256; ++i)
        tone[i] = static_cast<uint8_t>((52 * i + 75 * ZANTOFILTER[i] + 63) / 127);
    alg_Img_smooth(src, dst);
    if (!has_pixels(*dst)) return 0;
    if (lighten != 0) LightUP(*dst);
    map_channels(*dst, tone);
    return 1;
}

int32_t LightUP(Image *img) {
    if (!has_pixels(img)) return 0;
    map_channels(img, ZANTOMOPI);
    return 1;
}

} // extern "C"
