// Dark circles under the eyes: a shaped lightening of the crescent under an
// eye centre, and a lightening brush that pastes a brightened copy of the
// picture with a lighten-only soft edge.
#include <pxfx/retouch.h>

#include <algorithm>

#include "core/internal/channel_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

uint32_t abs_diff(int64_t a, int64_t b) { return static_cast<uint32_t>(a > b ? a - b : b - a); }

uint32_t luminance(uint32_t c) { return (117 * blue_of(c) + 601 * green_of(c) + 306 * red_of(c)) >> 10; }

struct Crescent {
    int64_t cx, u, yA, yB, yr, q;
    // Sum of the distances from (x, y) to the foci (cx - u, row) and (cx + u, row).
    int64_t foci_sum(int64_t x, int64_t y, int64_t row) const {
        const int32_t dy = static_cast<int32_t>(abs_diff(y, row));
        return static_cast<int64_t>(distance2d(static_cast<int32_t>(abs_diff(x, cx - u)), dy)) +
               distance2d(static_cast<int32_t>(abs_diff(x, cx + u)), dy);
    }
    // The amount added to each channel of a pixel of luminance y at (x, row).
    int64_t lift(int64_t x, int64_t row, int64_t lum) const {
        const int64_t eA = foci_sum(x, row, yA), eB = foci_sum(x, row, yB);
        if (eA > 4 * u || eB < 4 * u || lum >= yr) return 0;
        const int64_t d = yr - lum;
        const int64_t p = std::min(4 * u - eA, 2 * u), b = std::min(eB - 4 * u, 3 * u);
        int64_t v = std::min((d * b / u) / 3, d * p / (2 * u));
        const int64_t dx = x > cx ? x - cx : cx - x;
        const int64_t c = d * (2 * u - dx) / (4 * u);
        if (c < v) v = (c + v) / 2;
        v = static_cast<int64_t>(static_cast<double>(v) * (static_cast<double>(q) + 1.0));
        return std::min(v, d);
    }
};

template <class F> void lighten_crescent(const View &img, const Crescent &k, int64_t cy) {
    const int64_t y0 = std::max<int64_t>(cy - 3 * k.u, 0), y1 = std::min<int64_t>(cy, img.height - 1);
    const int64_t x0 = std::max<int64_t>(k.cx - 2 * k.u, 0), x1 = std::min<int64_t>(k.cx + 2 * k.u, img.width - 1);
    for (int64_t y = y1; y >= y0; --y) {
        const typename F::CRow in = F::crow(img, static_cast<int32_t>(y));
        const typename F::Row out = F::row(img, static_cast<int32_t>(y));
        for (int64_t x = x0; x <= x1; ++x) {
            const int32_t xi = static_cast<int32_t>(x);
            const uint32_t c = F::load(in, xi);
            const int64_t v = k.lift(x, y, luminance(c));
            if (v == 0) continue;
            const uint32_t add = static_cast<uint32_t>(v);
            F::store(out, xi,
                     pack((blue_of(c) + add) & 255, (green_of(c) + add) & 255, (red_of(c) + add) & 255, alpha_of(c)));
        }
    }
}

// Raises blue, green and red of every pixel by level, capped at 255 (a
// negative level keeps the low byte).
void brighten(const View &img, int32_t level) {
    uint8_t table[256];
    for (int32_t i = 0; i < 256; ++i) {
        const int64_t v = static_cast<int64_t>(i) + level;
        table[i] = v > 255 ? 255 : static_cast<uint8_t>(v);
    }
    map_channels(img, img, {table, table, table});
}

// A picture with a pixel block of the brush's bit counts; an empty size
// leaves the lightened copy unmade, unless the slot holds one.
bool brushable(const Image *img) {
    return img != nullptr && img->bits != nullptr && (img->bitCount == 24 || img->bitCount == 32) && rows_inside(img);
}

// A new brightened copy of the picture tagged with level, or null.
Image *brightened_copy(const Image *img, int32_t level) {
    ImagePtr copy = make_image(img->width, img->height, static_cast<int32_t>(img->bitCount));
    const std::optional<View> v = view_of(copy.get());
    if (!v) return nullptr;
    PX_Img_Copy(copy.get(), img);
    brighten(*v, level);
    copy->tag = static_cast<uint32_t>(level);
    return copy.release();
}

} // namespace

extern "C" {

void alg_Img_quheiyanquan_ellipse(Image *img, int32_t cx, int32_t cy, int32_t strength) {
    const std::optional<View> v = view_of(img);
    if (!v) return;
    const int64_t s = clamp_to(strength, 0, 10);
    const int64_t u = std::max<int64_t>(v->width / 24, 4);
    Crescent k{cx, u, static_cast<int64_t>(cy) - u, static_cast<int64_t>(cy) + u, 0, s / 10};
    const int64_t refRow = k.yA - u - u / 2;
    const int32_t rx = static_cast<int32_t>(std::clamp<int64_t>(cx, 0, v->width - 1));
    const int32_t ry = static_cast<int32_t>(std::clamp<int64_t>(refRow, 0, v->height - 1));
    with_format(v->bitCount, [&](auto fmt) {
        using F = decltype(fmt);
        k.yr = luminance(F::load(F::crow(*v, ry), rx));
        lighten_crescent<F>(*v, k, cy);
    });
}

int32_t alg_QuHeiYanQuan(Image *img, int32_t cx, int32_t cy, int32_t r, int32_t level, Image **cache, int32_t refresh) {
    if (!brushable(img)) return 0;
    ImagePtr temp;
    Image *copy = nullptr;
    if (cache != nullptr && *cache != nullptr && (*cache)->height == img->height && (*cache)->width == img->width &&
        (*cache)->tag == static_cast<uint32_t>(level)) {
        copy = *cache;
        if (refresh != 0) {
            PX_Img_Copy(copy, img);
            if (const std::optional<View> v = view_of(copy)) brighten(*v, level);
        }
    } else {
        if (cache != nullptr) free_Image(cache, 0);
        copy = brightened_copy(img, level);
        if (copy == nullptr) return 0;
        if (cache != nullptr)
            *cache = copy;
        else
            temp.reset(copy);
    }
    copy->tag = static_cast<uint32_t>(level);
    if (r != 0) PointArea_Copy_Alph(img, copy, cx, cy, r, level);
    return 1;
}

int32_t alg_QuHeiYanQuan_1(Image *img, const int32_t *xs, const int32_t *ys, int32_t count, int32_t r, int32_t level) {
    if (!brushable(img) || xs == nullptr || ys == nullptr || count < 1) return 0;
    ImagePtr copy(brightened_copy(img, level));
    if (!copy) return 0;
    for (int32_t i = 0; i < count; ++i)
        PointArea_Copy_Alph(img, copy.get(), xs[i], ys[i], r, level);
    return 1;
}

} // extern "C"
