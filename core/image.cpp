// The Image record: creation, release, per-pixel accessors and copies.
#include <pxfx/core.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

bool inside(const View &v, int32_t x, int32_t y) { return x >= 0 && y >= 0 && x < v.width && y < v.height; }

// Converting copy: walks dst, reading src with clamping. A 32-bit destination
// keeps its own alpha bytes.
template <class S, class D> void copy_convert(const View &dst, const View &src) {
    const int32_t sw = src.width, sh = src.height;
    const int32_t dw = dst.width, dh = dst.height;
    const int32_t direct = dw < sw ? dw : sw;
    for (int32_t y = 0; y < dh; ++y) {
        const typename S::CRow s = S::crow(src, y < sh ? y : sh - 1);
        const typename D::Row d = D::row(dst, y);
        const uint32_t last = S::load(s, sw - 1);
        for (int32_t x = 0; x < dw; ++x) {
            const uint32_t c = x < direct ? S::load(s, x) : last;
            if constexpr (D::kBitCount == 32) {
                uint8_t *p = d + 4 * x;
                p[0] = static_cast<uint8_t>(c);
                p[1] = static_cast<uint8_t>(c >> 8);
                p[2] = static_cast<uint8_t>(c >> 16);
            } else {
                D::store(d, x, c);
            }
        }
    }
}

} // namespace

extern "C" {

Image *malloc_Image(int32_t width, int32_t height, int32_t bitCount) {
    if (width <= 0 || height <= 0) return nullptr;
    const uint32_t stored = stored_bit_count(bitCount);
    const uint64_t pitch = fresh_pitch(width, bitCount);
    const uint64_t bytes = pitch * static_cast<uint64_t>(height);
    if (bytes > kMaxBlockBytes) return nullptr;

    Image *im = static_cast<Image *>(PX_malloc(sizeof(Image)));
    if (im == nullptr) return nullptr;
    im->bits = static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(bytes)));
    if (im->bits == nullptr) {
        PX_free(im);
        return nullptr;
    }
    prefault(im->bits, static_cast<size_t>(bytes));
    std::memset(im->bits, 255, static_cast<size_t>(bytes));
    im->width = width;
    im->height = height;
    im->bitCount = stored;
    im->pitch = static_cast<uint32_t>(pitch);
    im->tag = 0;
    return im;
}

void free_Image(Image **image, int32_t keepRecord) {
    if (image == nullptr || *image == nullptr) return;
    if ((*image)->bits != nullptr) {
        PX_free((*image)->bits);
        (*image)->bits = nullptr;
    }
    if (keepRecord == 0) {
        PX_free(*image);
        *image = nullptr;
    }
}

uint8_t GetPixelIndex(const Image *image, int32_t x, int32_t y) {
    const std::optional<View> v = view_of(image);
    if (!v || static_cast<int32_t>(v->bitCount) > 8) return 0;
    x = clamp_coord(x, v->width);
    const uint8_t *row = v->row(clamp_coord(y, v->height));
    switch (v->bitCount) {
    case 8: return row[x];
    case 4: return (row[x / 2] >> ((1 - x % 2) * 4)) & 15;
    case 1: return (row[x / 8] >> (7 - x % 8)) & 1;
    default: return 0;
    }
}

uint32_t GetPixelColor(const Image *image, int32_t x, int32_t y) {
    const std::optional<View> v = view_of(image);
    if (!v) return 0;
    const int32_t cx = clamp_coord(x, v->width);
    const int32_t cy = clamp_coord(y, v->height);
    switch (v->bitCount) {
    case 24: return Bgr24::load(v->row(cy), cx);
    case 32: return Bgra32::load(v->row(cy), cx);
    case 16: return Word16::load(v->row(cy), cx);
    default: {
        const uint32_t i = GetPixelIndex(image, cx, cy);
        return pack(i, i, i, 255);
    }
    }
}

uint8_t GetPixelGray(const Image *image, int32_t x, int32_t y) {
    const uint32_t c = GetPixelColor(image, x, y);
    return static_cast<uint8_t>((306 * red_of(c) + 601 * green_of(c) + 117 * blue_of(c)) >> 10);
}

void SetPixelIndex(Image *image, int32_t x, int32_t y, int32_t index) {
    const std::optional<View> v = view_of(image);
    if (!v || !inside(*v, x, y)) return;
    uint8_t *row = v->row(y);
    switch (v->bitCount) {
    case 8: row[x] = static_cast<uint8_t>(index); break;
    case 4: {
        const int shift = (1 - x % 2) * 4;
        row[x / 2] = static_cast<uint8_t>((row[x / 2] & ~(15 << shift)) | ((index & 15) << shift));
        break;
    }
    case 1: {
        const int shift = 7 - x % 8;
        row[x / 8] = static_cast<uint8_t>((row[x / 8] & ~(1 << shift)) | ((index & 1) << shift));
        break;
    }
    default: break;
    }
}

void SetPixelColor(Image *image, int32_t x, int32_t y, uint32_t colour) {
    const std::optional<View> v = view_of(image);
    if (!v || !inside(*v, x, y)) return;
    if (static_cast<int32_t>(v->bitCount) <= 8) {
        SetPixelIndex(image, x, y, static_cast<int32_t>(green_of(colour)));
        return;
    }
    switch (v->bitCount) {
    case 16: Word16::store(v->row(y), x, colour); break;
    case 24: Bgr24::store(v->row(y), x, colour); break;
    case 32: Bgra32::store(v->row(y), x, colour); break;
    default: break;
    }
}

int32_t PX_Img_Copy(Image *dst, const Image *src) {
    if (dst == nullptr || src == nullptr || !block_claim_ok(dst) || !block_claim_ok(src)) return 0;
    if (dst->pitch == src->pitch && dst->height == src->height && dst->bitCount == src->bitCount) {
        // The whole block, pitch x height bytes, which both records claim. A
        // missing source block reads as zeros, as the pixel readers read it.
        const size_t bytes = dst->height > 0 ? static_cast<size_t>(dst->pitch) * static_cast<size_t>(dst->height) : 0;
        if (bytes == 0 || dst->bits == nullptr) return 1;
        if (src->bits == nullptr)
            std::memset(dst->bits, 0, bytes);
        else
            std::memmove(dst->bits, src->bits, bytes);
        return 1;
    }
    // The converting walk writes only where the destination has pixels; a
    // source without them reads as 0 everywhere.
    const std::optional<View> to = view_of(dst);
    if (!to) return 1;
    with_format(to->bitCount, [&](auto d) {
        if (const std::optional<View> from = view_of(src))
            with_format(from->bitCount, [&](auto s) { copy_convert<decltype(s), decltype(d)>(*to, *from); });
        else
            copy_convert<AnyFormat, decltype(d)>(
                *to, View{nullptr, 0, src->width, src->height, src->bitCount, const_cast<Image *>(src)});
    });
    return 1;
}

int32_t PX_Img_CopyAlpha(Image *dst, const Image *src) {
    if (dst == nullptr || src == nullptr) return 0;
    if (dst->bitCount != 32 || src->bitCount != 32 || dst->height != src->height || dst->width != src->width) return 0;
    if (dst->width <= 0 || dst->height <= 0) return 1;
    if (!rows_inside(dst) || !rows_inside(src)) return 0;
    const std::optional<View> to = view_of(dst);
    if (!to) return 1;
    const std::optional<View> from = view_of(src);
    for (int32_t y = 0; y < to->height; ++y) {
        const uint8_t *s = from ? from->row(y) : nullptr;
        uint8_t *d = to->row(y);
        for (int32_t x = 0; x < to->width; ++x)
            d[4 * x + 3] = s != nullptr ? s[4 * x + 3] : 0;
    }
    return 1;
}

} // extern "C"
