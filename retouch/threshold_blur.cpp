// Blur of near-black values with a tone curve. A channel of a pixel becomes
// black when any tap of its horizontal Gaussian window holds a value of at
// most 10 (those taps carry weight but no value); otherwise it keeps its value
// in the window's last tap. Each channel then goes through its own blend of
// identity and the brightened filter curve.
#include <pxfx/color.h>
#include <pxfx/retouch.h>
#include <pxfx/toolkit.h>

#include "core/internal/curve_blend.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

constexpr uint32_t kNearBlack = 10;

struct Curves {
    uint8_t b[256], g[256], r[256];
};

Curves make_curves(int32_t amount) {
    Curves c;
    const int32_t ar = amount * 73 / 100, ag = amount * 61 / 100, ab = amount * 75 / 100;
    for (int32_t i = 0; i < 256; ++i) {
        const int32_t t = ZANTOMOPI[ZANTOFILTER[i]];
        c.r[i] = curve_blend<100>(i, t, ar);
        c.g[i] = curve_blend<100>(i, t, ag);
        c.b[i] = curve_blend<100>(i, t, ab);
    }
    return c;
}

// taps: offsets (from -size) of the non-zero kernel weights, in order;
// colours and dark: room for a row padded by size on both sides.
template <class FS, class FD>
void blur_rows(const View &src, const View &out, int32_t size, const int32_t *taps, int32_t ntaps, const Curves &cv,
               uint32_t *colours, uint8_t *dark) {
    const int32_t w = src.width, h = src.height;
    const size_t padded = static_cast<size_t>(w) + 2 * static_cast<size_t>(size);
    for (int32_t y = 0; y < h; ++y) {
        const typename FS::CRow in = FS::crow(src, y);
        for (size_t i = 0; i < padded; ++i) {
            const int64_t x = static_cast<int64_t>(i) - size;
            const uint32_t c = FS::load(in, static_cast<int32_t>(x < 0 ? 0 : (x >= w ? w - 1 : x)));
            colours[i] = c;
            dark[i] = static_cast<uint8_t>((blue_of(c) <= kNearBlack) | (green_of(c) <= kNearBlack) << 1 |
                                           (red_of(c) <= kNearBlack) << 2);
        }
        const typename FD::Row o = FD::row(out, y);
        for (int32_t x = 0; x < w; ++x) {
            uint8_t any = 0;
            for (int32_t k = 0; k < ntaps; ++k)
                any |= dark[static_cast<size_t>(x) + taps[k]];
            const uint32_t last = colours[static_cast<size_t>(x) + taps[ntaps - 1]];
            const uint32_t b = any & 1 ? 0 : blue_of(last), g = any & 2 ? 0 : green_of(last),
                           r = any & 4 ? 0 : red_of(last);
            FD::store(o, x, pack(cv.b[b], cv.g[g], cv.r[r], alpha_of(last)));
        }
    }
}

} // namespace

extern "C" {

void thresholdBlur(int32_t, int32_t, int32_t size, int32_t amount, const Image *src, Image **dst) {
    size = clamp_to(size, 1, 10);
    amount = clamp_to(amount, 0, 100);
    if (src == nullptr || dst == nullptr || !rows_inside(src)) return;
    if (src->width <= 0 || src->height <= 0) {
        prepare_slot(src, dst); // no pixel to write
        return;
    }
    // Working rows first: a call short of memory leaves the slot as it was.
    const ReadView view(src);
    const size_t padded = static_cast<size_t>(src->width) + 2 * static_cast<size_t>(size);
    Buffer<uint32_t> colours = alloc_buffer<uint32_t>(padded);
    Buffer<uint8_t> dark = alloc_buffer<uint8_t>(padded);
    if (!view.ok() || !colours || !dark) return;
    const std::optional<View> out = view_of(prepare_slot(src, dst));
    if (!out) return;
    int32_t taps[21], ntaps = 0;
    for (int32_t k = 0; k <= 2 * size; ++k)
        if (matrixX[size - 1][k] != 0.0f) taps[ntaps++] = k;
    const Curves cv = make_curves(amount);
    if (ntaps == 0) return;
    const View &in = view.view();
    with_formats(in, *out, [&](auto fs, auto fd) {
        blur_rows<decltype(fs), decltype(fd)>(in, *out, size, taps, ntaps, cv, colours.get(), dark.get());
    });
}

} // extern "C"
