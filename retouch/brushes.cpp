// Cached brushes: each keeps a prepared whole-picture image in a caller's
// slot, so a stroke of many dabs prepares it once and then only pastes it
// with the soft round paste.
#include <pxfx/color.h>
#include <pxfx/retouch.h>
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cstring>
#include <type_traits>

#include "color/box_filter.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

bool same_size(const Image *a, const Image *b) { return a->height == b->height && a->width == b->width; }

// Pixels of the picture shifted by (dx, dy) into the clone copy, where the
// source pixel lies in the picture.
template <class FS, class FD> void shift_into(const View &pic, const View &copy, int64_t dx, int64_t dy) {
    const int64_t xa = std::max<int64_t>(0, -dx), xb = std::min<int64_t>(copy.width, pic.width - dx);
    if (xa >= xb) return;
    for (int32_t y = 0; y < copy.height; ++y) {
        const int64_t sy = y + dy;
        if (sy < 0 || sy >= pic.height) continue;
        const typename FS::CRow in = FS::crow(pic, static_cast<int32_t>(sy));
        const typename FD::Row out = FD::row(copy, y);
        if constexpr (FS::kDirect && std::is_same_v<FS, FD>) {
            constexpr size_t bpp = FS::kBitCount / 8;
            std::memcpy(out + static_cast<size_t>(xa) * bpp, in + static_cast<size_t>(xa + dx) * bpp,
                        static_cast<size_t>(xb - xa) * bpp);
        } else {
            for (int64_t x = xa; x < xb; ++x)
                FD::store(out, static_cast<int32_t>(x), FS::load(in, static_cast<int32_t>(x + dx)));
        }
    }
}

// A picture with a pixel block of a brush's bit counts. Its size may be
// empty: the prepared copy then cannot be made, unless the slot holds one.
bool brushable(const Image *img) {
    return img != nullptr && img->bits != nullptr && (img->bitCount == 24 || img->bitCount == 32) && rows_inside(img);
}

// Whether the slot holds a prepared image for the picture made with `tag`.
bool cache_matches(Image **cache, const Image *picture, uint32_t tag) {
    return cache != nullptr && *cache != nullptr && same_size(*cache, picture) && (*cache)->tag == tag;
}

// The picture with its red, green and blue planes passed through the zanto
// curves of their levels; null when a plane cannot be made.
Image *tinted_copy(const Image *picture, const PXTint &tint) {
    constexpr int32_t kRgb = 0;
    Image *red = nullptr, *green = nullptr, *blue = nullptr, *alpha = nullptr;
    if (!Split(picture, &red, &green, &blue, picture->bitCount == 32 ? &alpha : nullptr, kRgb)) return nullptr;
    ColorFilter_zanto(red, tint.red);
    ColorFilter_zanto(green, tint.green);
    ColorFilter_zanto(blue, tint.blue);
    Image *out = Combine(red, green, blue, alpha, kRgb);
    free_Image(&red, 0);
    free_Image(&green, 0);
    free_Image(&blue, 0);
    free_Image(&alpha, 0);
    return out;
}

// Uses the slot's image when it matches `tag`, else releases it and stores a
// freshly prepared one (kept in `temp` when there is no slot); pastes it
// softly at (cx, cy) when r is non-zero.
template <class Prepare>
int32_t cached_brush(Image *picture, Image **cache, uint32_t tag, int32_t cx, int32_t cy, int32_t r, Prepare prepare) {
    ImagePtr temp;
    Image *prepared = nullptr;
    if (cache_matches(cache, picture, tag)) {
        prepared = *cache;
    } else {
        if (cache != nullptr) free_Image(cache, 0);
        prepared = prepare();
        if (prepared == nullptr) return 0;
        if (cache != nullptr)
            *cache = prepared;
        else
            temp.reset(prepared);
    }
    prepared->tag = tag;
    if (r != 0) PointArea_Copy(picture, prepared, cx, cy, r);
    return 1;
}

// A copy of the picture box-smoothed with side `size`; null when it cannot be made.
Image *smoothed_copy(const Image *picture, int32_t size) {
    ImagePtr copy = make_image(picture->width, picture->height, static_cast<int32_t>(picture->bitCount));
    if (!copy) return nullptr;
    PX_Img_Copy(copy.get(), picture);
    // Sizes the box filter refuses leave the copy as it is; any other
    // refusal is its working memory failing.
    if (Filter_fast(copy.get(), size, 0) == 0 && size <= kMaxBoxSize) return nullptr;
    return copy.release();
}

} // namespace

extern "C" {

int32_t PX_Mimic(Image *picture, int32_t srcX, int32_t srcY, const Image *reference, int32_t dstX, int32_t dstY,
                 int32_t cx, int32_t cy, int32_t r, int32_t reload, Image **cache) {
    if (picture == nullptr || picture->bits == nullptr || cache == nullptr || !rows_inside(picture)) return 0;
    // A reference without pixels reads as zeros, as PX_Img_Copy reads it.
    const Image *base = reference != nullptr ? reference : picture;
    Image *copy = *cache;
    if (copy != nullptr && reload == 0 && same_size(copy, base) && copy->bitCount == base->bitCount) {
        if (r != 0) PointArea_Copy(picture, copy, cx, cy, r);
        return 1;
    }
    free_Image(cache, 0);
    *cache = malloc_Image(base->width, base->height, static_cast<int32_t>(base->bitCount));
    copy = *cache;
    if (copy == nullptr) return 0;
    PX_Img_Copy(copy, base);
    // A picture without pixel rows has no pixel to shift in.
    const std::optional<View> from = view_of(picture), to = view_of(copy);
    if (reload != 0 && from && to) {
        const int64_t dx = static_cast<int64_t>(srcX) - dstX, dy = static_cast<int64_t>(srcY) - dstY;
        with_formats(*from, *to, [&](auto fs, auto fd) { shift_into<decltype(fs), decltype(fd)>(*from, *to, dx, dy); });
    }
    if (r != 0) PointArea_Copy(picture, copy, cx, cy, r);
    return 1;
}

int32_t alg_Blending(Image *picture, void *, int32_t cx, int32_t cy, PXTint tint, int32_t r, Image **cache) {
    if (!brushable(picture)) return 0;
    const uint32_t tag = tint.red | static_cast<uint32_t>(tint.green) << 8 | static_cast<uint32_t>(tint.blue) << 16;
    return cached_brush(picture, cache, tag, cx, cy, r, [&] { return tinted_copy(picture, tint); });
}

int32_t alg_Img_Blending(Image *src, Image **out) {
    Image *tinted = nullptr;
    alg_Blending(src, nullptr, 0, 0, PXTint{201, 189, 203}, 0, &tinted);
    ImagePtr owned(tinted);
    // The output slot is prepared from the source whether or not the tint
    // could be made.
    Image *target = src;
    if (out != nullptr) target = src != nullptr ? prepare_slot(src, out) : nullptr;
    if (target == nullptr || !owned) return 0;
    PX_Img_Copy(target, owned.get());
    return 1;
}

int32_t alg_smooth(Image *picture, int32_t, int32_t cx, int32_t cy, int32_t r, int32_t strength, Image **cache) {
    if (!brushable(picture)) return 0;
    const int32_t size = strength > 2 ? strength : 3;
    return cached_brush(picture, cache, static_cast<uint32_t>(strength), cx, cy, r,
                        [&] { return smoothed_copy(picture, size); });
}

} // extern "C"
