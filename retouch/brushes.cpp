// Cached brushes: each keeps a prepared whole-picture image in a caller's
// slot, so a stroke of many dabs prepares it once and then only pastes it
// with the soft round paste.
#include <pxfx/retouch.h>

#include <algorithm>
#include <cstring>
#include <type_traits>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

bool same_geometry(const Image *a, const Image *b) {
    return has_pixels(a) && a->height == b->height && a->width == b->width;
}

// Pixels of the picture shifted by (dx, dy) into the clone copy, where the
// source pixel lies in the picture.
template <class FS, class FD> void shift_into(const Image *pic, Image *copy, int64_t dx, int64_t dy) {
    const int64_t xa = std::max<int64_t>(0, -dx), xb = std::min<int64_t>(copy->width, pic->width - dx);
    if (xa >= xb) return;
    for (int32_t y = 0; y < copy->height; ++y) {
        const int64_t sy = y + dy;
        if (sy < 0 || sy >= pic->height) continue;
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

} // namespace

extern "C" {

int32_t PX_Mimic(Image *picture, int32_t srcX, int32_t srcY, const Image *reference, int32_t dstX, int32_t dstY,
                 int32_t cx, int32_t cy, int32_t r, int32_t reload, Image **cache) {
    if (!has_pixels(picture) || cache == nullptr) return 0;
    const Image *base = reference != nullptr ? reference : picture;
    if (!has_pixels(base)) return 0;
    Image *copy = *cache;
    if (copy != nullptr && reload == 0 && same_geometry(copy, base) && copy->bitCount == base->bitCount) {
        if (r != 0) PointArea_Copy(picture, copy, cx, cy, r);
        return 1;
    }
    free_Image(cache, 0);
    *cache = malloc_Image(base->width, base->height, static_cast<int32_t>(base->bitCount));
    copy = *cache;
    if (copy == nullptr) return 0;
    PX_Img_Copy(copy, base);
    if (reload != 0) {
        const int64_t dx = static_cast<int64_t>(srcX) - dstX, dy = static_cast<int64_t>(srcY) - dstY;
        with_formats(picture, copy,
                     [&](auto fs, auto fd) { shift_into<decltype(fs), decltype(fd)>(picture, copy, dx, dy); });
    }
    if (r != 0) PointArea_Copy(picture, copy, cx, cy, r);
    return 1;
}

} // extern "C"
