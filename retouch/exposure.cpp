// Exposure control: a shift of the HSL lightness plane.
#include <pxfx/color.h>
#include <pxfx/retouch.h>

#include <utility>

#include "core/internal/byte_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kHsl = 1;

void shift_plane(const View &plane, int32_t delta) {
    uint8_t table[256];
    for (int32_t i = 0; i < 256; ++i) {
        const int64_t v = static_cast<int64_t>(i) + delta;
        table[i] = v > 255 ? 255 : (v < 0 ? 0 : static_cast<uint8_t>(v));
    }
    const uint8_t *const tables[1] = {table};
    const auto w = static_cast<size_t>(plane.width);
    const ByteMap map(1, tables, w * static_cast<size_t>(plane.height), true);
    for (int32_t y = 0; y < plane.height; ++y)
        map(plane.row(y), plane.row(y), w);
}

} // namespace

extern "C" {

int32_t ImageExposure(const Image *src, Image **dst, int32_t delta) {
    if (!has_pixels(src) || dst == nullptr) return 0;
    Image *h = nullptr, *s = nullptr, *l = nullptr, *a = nullptr;
    if (!Split(src, &h, &s, &l, src->bitCount == 32 ? &a : nullptr, kHsl)) return 0;
    if (const std::optional<View> lightness = view_of(l)) shift_plane(*lightness, delta);
    ImagePtr combined(Combine(h, s, l, a, kHsl));
    free_Image(&h, 0);
    free_Image(&s, 0);
    free_Image(&l, 0);
    free_Image(&a, 0);
    if (!combined) return 0;
    // An empty slot receives the result in the source's format.
    if (*dst == nullptr && combined->bitCount != src->bitCount) {
        ImagePtr converted(malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount)));
        if (!converted) return 0;
        PX_Img_Copy(converted.get(), combined.get());
        combined = std::move(converted);
    }
    return InPlaceOrSlot(const_cast<Image *>(src), dst).deliver(std::move(combined));
}

} // extern "C"
