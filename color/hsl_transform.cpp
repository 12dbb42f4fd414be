// Hue, saturation and lightness shifts: the plane operations BaseTran_Hue and
// BaseTran_LS, and PX_IMG_Transform, which applies one of them to a picture
// through HSL. The picture pass converts, shifts and converts back, which
// equals splitting into planes, shifting a plane, combining them (32 bits)
// and copying that into the result, without the planes and, for results of
// 24 or 32 bits, without the 32-bit image: byte pixels a piece of a row at a
// time in vectors, the rest pixel by pixel.
#include <pxfx/color.h>

#include <algorithm>
#include <cstdint>
#include <optional>

#include "color/colorspace.hpp"
#include "core/internal/byte_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/vector_kernels.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;
using namespace pxfx::colour;

namespace {

using Map = uint8_t[256];

// Step of a slider amount (100 = none); exact for any amount.
int64_t step_of(int32_t amount) { return (static_cast<int64_t>(amount) * 255 - 25500) / 100; }

// Hue turns by 255 per full circle: past either end it wraps by 255.
void hue_map(int32_t amount, Map &m) {
    const int64_t delta = step_of(amount);
    for (int64_t v = 0; v < 256; ++v) {
        const int64_t s = v + delta;
        const int64_t t = s > 255 ? s + 1 : (s < 0 ? s - 1 : s);
        m[v] = static_cast<uint8_t>(static_cast<uint64_t>(t) & 255);
    }
}

void linear_map(int32_t amount, Map &m) {
    const int64_t delta = step_of(amount);
    for (int64_t v = 0; v < 256; ++v) {
        const int64_t s = v + delta;
        m[v] = static_cast<uint8_t>(s < 0 ? 0 : (s > 255 ? 255 : s));
    }
}

int32_t map_plane(const View &plane, const Map &m) {
    for (int32_t y = 0; y < plane.height; ++y) {
        uint8_t *row = plane.row(y);
        for (int32_t x = 0; x < plane.width; ++x)
            row[x] = m[row[x]];
    }
    return 1;
}

// Pixels per piece of a row that the vector copies convert through
// hue, saturation, lightness and alpha rows on the stack.
constexpr size_t kPiece = 1024;

// maps[0] is applied to hue, maps[1] to saturation, maps[2] to lightness;
// only maps[moved] differs from the identity (none when moved is -1). The
// result O is Bgr24 or Bgra32, the source's alpha kept in the latter.
template <class F, class O> void transform_rows(const View &src, const View &dst, const Map *maps, int moved) {
    constexpr size_t kBytes = F::kBitCount == 24 || F::kBitCount == 32 ? F::kBitCount / 8 : 0;
    vec::SplitPlanes split = nullptr;
    vec::CombinePlanes combine = nullptr;
    if constexpr (kBytes != 0) {
        split = vec::split_planes(kHsl, kBytes);
        combine = vec::combine_planes(kHsl, O::kBitCount / 8);
    }
    uint8_t planes[4][kPiece];
    const uint8_t *map = moved >= 0 ? maps[moved] : nullptr;
    const auto w = static_cast<size_t>(src.width);
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        uint8_t *out = dst.row(y);
        // The vector copies take whole vectors of each piece, which they read
        // before writing it (the result may be the source); the plain loop
        // finishes the row.
        size_t x = 0;
        if constexpr (kBytes != 0)
            while (split != nullptr && x < w) {
                const size_t n =
                    split(in + kBytes * x, std::min(kPiece, w - x), planes[0], planes[1], planes[2], planes[3]);
                if (n == 0) break;
                if (map != nullptr) map_bytes(planes[moved], planes[moved], n, 1, &map);
                combine(planes[0], planes[1], planes[2], planes[3], n, out + O::kBitCount / 8 * x);
                x += n;
            }
        for (; x < w; ++x) {
            const auto i = static_cast<int32_t>(x);
            const uint32_t hsl = rgb_to_hsl(F::load(in, i));
            const uint32_t moved_hsl =
                pack(maps[2][blue_of(hsl)], maps[1][green_of(hsl)], maps[0][red_of(hsl)], 0) | keep_alpha(hsl);
            O::store(out, i, hsl_to_rgb(moved_hsl));
        }
    }
}

// Whether the result image takes the rows directly, with the bytes the copy
// from a 32-bit image would give it: the source's size, 24 bits, or 32 bits
// with rows as a new image has them (the copy then moves the whole block,
// alpha included; into other rows it keeps their alpha). It is the source
// itself or shares no memory with it.
bool takes_rows(const Image *dst, const View &src) {
    const std::optional<View> to = view_of(dst);
    if (!to || to->width != src.width || to->height != src.height || !block_claim_ok(dst)) return false;
    if (to->bitCount != 24 && !(to->bitCount == 32 && to->pitch == fresh_pitch(src.width, 32))) return false;
    if (dst == src.record) return true;
    const auto d = reinterpret_cast<uintptr_t>(to->bits), s = reinterpret_cast<uintptr_t>(src.bits);
    return d + block_bytes(dst) <= s || s + block_bytes(src.record) <= d;
}

// An 8-bit plane with a pixel block whose rows it holds; its size may be empty.
bool shiftable(const Image *plane) {
    return plane != nullptr && plane->bits != nullptr && plane->bitCount == 8 && rows_inside(plane);
}

} // namespace

extern "C" {

int32_t BaseTran_Hue(Image *plane, int32_t amount) {
    if (!shiftable(plane)) return 0;
    // A shiftable plane has pixels unless its size is empty.
    const std::optional<View> v = view_of(plane);
    if (!v) return 1;
    Map m;
    hue_map(amount, m);
    return map_plane(*v, m);
}

int32_t BaseTran_LS(Image *plane, int32_t amount) {
    if (!shiftable(plane)) return 0;
    const std::optional<View> v = view_of(plane);
    if (!v) return 1;
    Map m;
    linear_map(amount, m);
    return map_plane(*v, m);
}

int32_t PX_IMG_Transform(const Image *src, Image **out, int32_t amount, int32_t component) {
    if (out == nullptr) return 0;
    const std::optional<View> from = view_of(src);
    if (!from) return 0;
    Map maps[3];
    for (int i = 0; i < 3; ++i)
        for (int v = 0; v < 256; ++v)
            maps[i][v] = static_cast<uint8_t>(v);
    int moved = -1;
    if (component == 0) hue_map(amount, maps[0]);
    if (component == 1 || component == 2) linear_map(amount, maps[component]);
    if (component >= 0 && component <= 2) moved = component;
    // A new result of 24 or 32 bits, and a slot image that takes them, get
    // the rows directly; any other goes through a 32-bit image and a copy.
    ImagePtr made;
    if (*out == nullptr && (from->bitCount == 24 || from->bitCount == 32)) {
        made = make_image(from->width, from->height, static_cast<int32_t>(from->bitCount));
        if (!made) return 0;
    }
    Image *direct = made ? made.get() : *out;
    if (direct != nullptr && takes_rows(direct, *from)) {
        const View to = *view_of(direct);
        with_format(from->bitCount, [&](auto f) {
            if (to.bitCount == 24)
                transform_rows<decltype(f), Bgr24>(*from, to, maps, moved);
            else
                transform_rows<decltype(f), Bgra32>(*from, to, maps, moved);
        });
        if (made) *out = made.release();
        return 1;
    }
    ImagePtr combined = make_image(from->width, from->height, 32);
    if (!combined) return 0;
    const View to = *view_of(combined.get());
    with_format(from->bitCount, [&](auto f) { transform_rows<decltype(f), Bgra32>(*from, to, maps, moved); });
    if (*out == nullptr) {
        *out = malloc_Image(from->width, from->height, static_cast<int32_t>(from->bitCount));
        if (*out == nullptr) return 0;
    }
    PX_Img_Copy(*out, combined.get());
    return 1;
}

} // extern "C"
