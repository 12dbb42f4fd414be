// Neon (doubled gradient magnitude) and emboss (gray diagonal relief).
#include <pxfx/effects.h>

#include <cstdlib>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// Doubled gradient magnitude of one channel, clamp_u8(2 isqrt_round(dx^2 +
// dy^2)), looked up by the squared length. From kNeonFull on the rounded root
// is at least 128, so the doubled value is capped at 255: the table stops there.
constexpr uint32_t kNeonFull = 128 * 128 - 128 + 1;

struct NeonTable {
    uint8_t level[kNeonFull + 1];
    NeonTable() {
        for (uint32_t s = 0; s <= kNeonFull; ++s)
            level[s] = clamp_u8(static_cast<int32_t>(2 * isqrt_round(s)));
    }
};

const NeonTable &neon_table() {
    static const NeonTable t;
    return t;
}

uint32_t neon_channel(const NeonTable &t, int32_t c, int32_t r, int32_t d) {
    const int32_t dx = c - r, dy = c - d;
    const auto s = static_cast<uint32_t>(dx * dx + dy * dy);
    return t.level[s < kNeonFull ? s : kNeonFull];
}

template <class F> void neon(const View &src, const View &dst) {
    const NeonTable &t = neon_table();
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y + 1 < h; ++y) {
        const typename F::CRow row = F::crow(src, y);
        const typename F::CRow below = F::crow(src, y + 1);
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x + 1 < w; ++x) {
            const uint32_t c = F::load(row, x), r = F::load(row, x + 1), d = F::load(below, x);
            const uint32_t b = neon_channel(t, blue_of(c), blue_of(r), blue_of(d));
            const uint32_t g = neon_channel(t, green_of(c), green_of(r), green_of(d));
            const uint32_t rr = neon_channel(t, red_of(c), red_of(r), red_of(d));
            F::store(out, x, pack(b, g, rr, alpha_of(c)));
        }
    }
}

// Gray value of the relief from the colours two pixels up-left (a) and
// two pixels down-right (b): the channel difference of largest magnitude
// (the smallest one on a tie), doubled and centred on 127.
uint32_t relief(uint32_t a, uint32_t b) {
    const int32_t dB = static_cast<int32_t>(blue_of(a)) - static_cast<int32_t>(blue_of(b));
    const int32_t dR = static_cast<int32_t>(red_of(a)) - static_cast<int32_t>(red_of(b));
    const int32_t dG = static_cast<int32_t>(green_of(a)) - static_cast<int32_t>(green_of(b));
    int32_t hi = dB, lo = dB;
    if (dR > hi) hi = dR;
    if (dR < lo) lo = dR;
    if (dG > hi) hi = dG;
    if (dG < lo) lo = dG;
    const int32_t d = std::abs(lo) < std::abs(hi) ? hi : lo;
    const int32_t e = 2 * d;
    const uint32_t v = e > 128 ? 255 : (e <= -128 ? 0 : static_cast<uint32_t>(e + 127));
    return pack(v, v, v, 255);
}

uint32_t green_gray(uint32_t c) {
    const uint32_t g = green_of(c);
    return pack(g, g, g, 255);
}

template <class F> void emboss(const View &src, const View &dst) {
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow row = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        // Border pixels: x < 2, y < 2, x == w - 2 or y == h - 2 (the last row
        // and column are not border; their far sample is clamped).
        if (y < 2 || y == h - 2) {
            for (int32_t x = 0; x < w; ++x)
                F::store(out, x, green_gray(F::load(row, x)));
            continue;
        }
        const typename F::CRow up = F::crow(src, y - 2);
        const typename F::CRow down = F::crow(src, y + 2 < h ? y + 2 : h - 1);
        const int32_t left = w < 2 ? w : 2;
        for (int32_t x = 0; x < left; ++x)
            F::store(out, x, green_gray(F::load(row, x)));
        for (int32_t x = 2; x <= w - 3; ++x)
            F::store(out, x, relief(F::load(up, x - 2), F::load(down, x + 2)));
        if (w - 2 >= 2) F::store(out, w - 2, green_gray(F::load(row, w - 2)));
        if (w - 1 >= 2) F::store(out, w - 1, relief(F::load(up, w - 3), F::load(down, w - 1)));
    }
}

} // namespace

extern "C" {

uint32_t PX_IMG_Neon(Image *src, Image **dst) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        with_format(from.bitCount, [&](auto f) { neon<decltype(f)>(from, to); });
    });
}

uint32_t PX_IMG_Emboss(Image *src, Image **dst) {
    return draw_result(src, dst, [&](const View &from, const View &to) {
        with_format(from.bitCount, [&](auto f) { emboss<decltype(f)>(from, to); });
    });
}
} // extern "C"
