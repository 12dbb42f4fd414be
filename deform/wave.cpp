// Concentric wave: a height map of integer sine displacements around the
// centre, fading toward the farthest corner, and the render that moves each
// pixel by the mean of its neighbours' map values.
#include <pxfx/deform.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// Entries per map row: the width rounded up to a multiple of 4.
size_t map_stride(int32_t width) { return (static_cast<size_t>(width) + 3) / 4 * 4; }

// a - b modulo 2^32, the way coordinate differences reach Distance2D.
int32_t wrap_sub(int32_t a, int32_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) - static_cast<uint32_t>(b));
}

// Displacement at distance d from the centre. The product (w * amplitude) *
// (maxd - d) and the divisor maxd * 100000 are 32-bit values that wrap
// silently; the quotient truncates toward zero and keeps its low 16 bits.
struct WaveProfile {
    int32_t amplitude;
    int32_t maxd;
    int32_t divisor;

    WaveProfile(int32_t amp, uint32_t farthest)
        : amplitude(amp), maxd(static_cast<int32_t>(farthest)), divisor(static_cast<int32_t>(farthest * 100000u)) {}

    int16_t at(uint32_t d) const {
        const int32_t w = table_sin(static_cast<int32_t>(d * 360u) >> 5);
        const uint32_t span = static_cast<uint32_t>(maxd - static_cast<int32_t>(d));
        const int32_t num = static_cast<int32_t>(static_cast<uint32_t>(w) * static_cast<uint32_t>(amplitude) * span);
        // The divisor is a multiple of 32 (never -1, so the quotient fits); it is
        // 0 only for a centre far outside the picture, which gives no displacement.
        const int32_t q = divisor != 0 ? num / divisor : 0;
        return static_cast<int16_t>(static_cast<uint16_t>(static_cast<uint32_t>(q)));
    }
};

// Straight per-pixel evaluation, with Distance2D's wrapping squares.
void fill_direct(int16_t *map, size_t stride, int32_t width, int32_t height, int32_t cx, int32_t cy,
                 const WaveProfile &p) {
    for (int32_t y = 0; y < height; ++y) {
        int16_t *row = map + static_cast<size_t>(y) * stride;
        const int32_t dy = wrap_sub(y, cy);
        for (int32_t x = 0; x < width; ++x)
            row[x] = p.at(distance2d(wrap_sub(x, cx), dy));
    }
}

// The same values when no square wraps: the displacement is tabulated per
// distance, and the rounded root is followed along the row. The rounded root
// of n is the d with (d - 1) d < n <= d (d + 1), and it moves by at most one
// step per column.
bool fill_tabulated(int16_t *map, size_t stride, int32_t width, int32_t height, int32_t cx, int32_t cy,
                    const WaveProfile &p) {
    const int64_t mx = std::max<int64_t>(std::abs(static_cast<int64_t>(cx)), std::abs(int64_t{width} - 1 - cx));
    const int64_t my = std::max<int64_t>(std::abs(static_cast<int64_t>(cy)), std::abs(int64_t{height} - 1 - cy));
    if (mx > 65535 || my > 65535) return false;
    const uint64_t far2 = static_cast<uint64_t>(mx * mx) + static_cast<uint64_t>(my * my);
    if (far2 > UINT32_MAX) return false;
    const uint32_t dmax = isqrt_round(static_cast<uint32_t>(far2));
    Buffer<int16_t> table = alloc_buffer<int16_t>(static_cast<size_t>(dmax) + 1);
    if (!table) return false;
    for (uint32_t d = 0; d <= dmax; ++d)
        table[d] = p.at(d);
    for (int32_t y = 0; y < height; ++y) {
        int16_t *row = map + static_cast<size_t>(y) * stride;
        const int64_t dy = int64_t{y} - cy;
        const uint64_t dy2 = static_cast<uint64_t>(dy * dy);
        uint64_t d = isqrt_round(static_cast<uint32_t>(static_cast<uint64_t>(int64_t{cx} * cx) + dy2));
        for (int32_t x = 0; x < width; ++x) {
            const int64_t dx = int64_t{x} - cx;
            const uint64_t n = static_cast<uint64_t>(dx * dx) + dy2;
            while (d * (d + 1) < n)
                ++d;
            while (d > 0 && (d - 1) * d >= n)
                --d;
            row[x] = table[d];
        }
    }
    return true;
}

template <class S, class D> void render(const View &src, const View &dst, const int16_t *map) {
    const int32_t w = src.width, h = src.height;
    const size_t stride = map_stride(w);
    for (int32_t y = 1; y + 1 < h; ++y) {
        const int16_t *up = map + static_cast<size_t>(y - 1) * stride;
        const int16_t *mid = up + stride;
        const int16_t *down = mid + stride;
        const typename S::CRow in = S::crow(src, y);
        const typename D::Row out = D::row(dst, y);
        for (int32_t x = 1; x + 1 < w; ++x) {
            const int32_t sx = x + ((mid[x - 1] + mid[x + 1]) >> 1);
            const int32_t sy = y + ((up[x] + down[x]) >> 1);
            uint32_t c;
            if (sx >= 0 && sx < w && sy >= 0 && sy < h)
                c = S::load(S::crow(src, sy), sx);
            else
                c = S::load(in, x);
            D::store(out, x, c);
        }
    }
    for (int32_t y = 1; y + 1 < h; ++y) {
        const typename S::CRow in = S::crow(src, y);
        const typename D::Row out = D::row(dst, y);
        D::store(out, 0, S::load(in, 0));
        D::store(out, w - 1, S::load(in, w - 1));
    }
    const typename S::CRow top = S::crow(src, 0);
    const typename S::CRow bottom = S::crow(src, h - 1);
    const typename D::Row outTop = D::row(dst, 0);
    const typename D::Row outBottom = D::row(dst, h - 1);
    for (int32_t x = 0; x < w; ++x) {
        D::store(outTop, x, S::load(top, x));
        D::store(outBottom, x, S::load(bottom, x));
    }
}

// Renders src, moved by the map, into dst of the same size.
void render_views(const View &src, const View &dst, const int16_t *map) {
    with_formats(src, dst, [&](auto s, auto d) { render<decltype(s), decltype(d)>(src, dst, map); });
}

} // namespace

extern "C" {

int32_t create_wave(int16_t *map, int32_t width, int32_t height, int32_t cx, int32_t cy, int32_t amplitude) {
    if (map == nullptr || width <= 0 || height <= 0) return 1;
    const int32_t fx = std::max(wrap_sub(width, cx), cx), fy = std::max(wrap_sub(height, cy), cy);
    const WaveProfile profile(amplitude, distance2d(fx, fy));
    const size_t stride = map_stride(width);
    if (!fill_tabulated(map, stride, width, height, cx, cy, profile))
        fill_direct(map, stride, width, height, cx, cy, profile);
    return 1;
}

int32_t render_wave(Image *src, Image *dst, const int16_t *map, int32_t, int32_t) {
    if (map == nullptr || src == nullptr || !rows_inside(src)) return 1;
    const std::optional<View> to = view_of(dst);
    if (!to || src->width != to->width || src->height != to->height) return 1;
    // A source without pixels reads as 0 everywhere.
    const ReadView view(src);
    if (!view.ok()) return 1;
    render_views(view.view(), *to, map);
    return 1;
}

uint32_t Wave_Transform(Image *src, Image **dst, int32_t amplitude) {
    if (dst == nullptr || src == nullptr || src->bits == nullptr || !rows_inside(src)) return 0;
    const int32_t w = src->width, h = src->height;
    if (w <= 0 || h <= 0) {
        // Nothing to ripple, but the map of height x stride x 2 bytes comes
        // first (the stride being width + 3 rounded down to a multiple of 4):
        // it has a size only when both sizes are negative, and then the
        // result rule runs as usual.
        if (!buffer_size_ok(block_size((int64_t{w} + 3) & ~int64_t{3}, h, 2))) return 0;
        return acquire_result(src, dst) != nullptr ? 1 : 0;
    }
    Buffer<int16_t> map = alloc_zeroed<int16_t>(checked_size(static_cast<uint64_t>(h), map_stride(w)));
    if (!map) return 0;
    return draw_result(src, dst, [&](const View &from, const View &to) {
        const int32_t cx = w >> 1, cy = h >> 1;
        create_wave(map.get(), w, h, cx, cy, amplitude);
        render_views(from, to, map.get());
    });
}

} // extern "C"
