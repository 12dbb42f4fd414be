// Round brush pastes: a soft-edged copy of a prepared picture into the
// picture, and a lighten-only variant whose rim fades toward a darker value.
// Only the brush's bounding rectangle is visited, on raw pixel rows.
#include <pxfx/retouch.h>

#include <algorithm>
#include <cstdlib>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

// Ring of the soft edge in the integer type of its arithmetic: 32 bits while
// every product fits (the usual brush), 64 bits otherwise.
template <class T> struct Ring { T r, ri, rw; };

// Blend of the ring: the source at the inner edge, the destination at the rim.
struct SoftRule {
    template <class T> static uint8_t ring(const Ring<T> &g, T d, uint8_t o, uint8_t s, T) {
        return static_cast<uint8_t>(((d - g.ri) * o + (g.r - d) * s) / g.rw);
    }
};

// Fades from s to s - level across the ring and only ever brightens (or
// writes when the destination plus the level equals the source exactly).
struct LightenRule {
    template <class T> static uint8_t ring(const Ring<T> &g, T d, uint8_t o, uint8_t s, T level) {
        const uint8_t v = static_cast<uint8_t>(((d - g.ri) * (s - level) + s * (g.r - d)) / g.rw);
        return v > o || o + level == s ? v : o;
    }
};

// Radii and levels up to which the ring arithmetic fits 32 bits:
// 2e6 * (255 + 255) + 255 * 2e6 < 2^31.
constexpr int64_t kNarrowRadius = 2000000;
constexpr int64_t kNarrowLevel = 255;

// Distance2D along a row without a square root per pixel: the rounded root
// of n is the smallest k with k * k + k >= n, so it moves by a step or two
// between neighbours. Valid while dx * dx + dy * dy does not wrap 32 bits.
struct RowDistance {
    uint64_t k = 0;
    uint32_t next(uint64_t n) {
        while (k * k + k < n)
            ++k;
        while (k > 0 && (k - 1) * (k - 1) + (k - 1) >= n)
            --k;
        return static_cast<uint32_t>(k);
    }
};

constexpr int64_t kMaxSteppedOffset = 46340; // 2 * 46340^2 < 2^32

// Pixel layout of a paste: bytes per destination and source pixel, colour
// bytes, and whether the alpha byte follows the source inside the brush.
template <int DS, int SS, int NC, bool Alpha, class Rule, class T>
void paste_rect(const View &dst, const View &src, int32_t cx, int32_t cy, int32_t x0, int32_t x1, int32_t y0,
                int32_t y1, const Ring<T> &g, T level) {
    const bool stepped = std::max<int64_t>(std::abs(x0 - cx), std::abs(x1 - cx)) <= kMaxSteppedOffset &&
                         std::max<int64_t>(std::abs(y0 - cy), std::abs(y1 - cy)) <= kMaxSteppedOffset;
    for (int32_t y = y0; y <= y1; ++y) {
        uint8_t *o = dst.row(y);
        const uint8_t *s = src.row(y);
        const int32_t dy = std::abs(y - cy);
        RowDistance root{distance2d(std::abs(x0 - cx), dy)};
        for (int32_t x = x0; x <= x1; ++x) {
            const int64_t dx = std::abs(x - cx);
            const T d = static_cast<T>(stepped ? root.next(static_cast<uint64_t>(dx * dx + int64_t(dy) * dy))
                                               : distance2d(static_cast<int32_t>(dx), dy));
            if (d > g.r) continue;
            uint8_t *op = o + static_cast<size_t>(x) * DS;
            const uint8_t *sp = s + static_cast<size_t>(x) * SS;
            if (d < g.ri)
                for (int c = 0; c < NC; ++c)
                    op[c] = sp[c];
            else
                for (int c = 0; c < NC; ++c)
                    op[c] = Rule::ring(g, d, op[c], sp[c], level);
            if constexpr (Alpha) op[3] = sp[3];
        }
    }
}

// The source block as a paste reads it, in the destination's layout: its
// rows of `pitch` bytes hold pitch / bytes pixels of `bytes` bytes, whatever
// the source's own width and bit count. Nothing for a source without a block
// or without rows. The block claim must have been checked (block_claim_ok).
std::optional<View> layout_view(const Image *src, int32_t bytes) {
    if (src->bits == nullptr || src->height <= 0) return std::nullopt;
    return View{src->bits,
                src->pitch,
                static_cast<int32_t>(src->pitch / static_cast<uint32_t>(bytes)),
                src->height,
                static_cast<uint32_t>(bytes) * 8,
                nullptr};
}

template <class Rule>
int32_t paste(Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r, double innerFactor, int64_t level) {
    if (dst == nullptr || src == nullptr || r == 0) return 0;
    // A destination whose rows overrun its block, or a source claiming a block
    // beyond what the library handles, is refused.
    if (!rows_inside(dst) || !block_claim_ok(src)) return 0;
    const int32_t w = dst->width, h = dst->height;
    if (w <= 0 || h <= 0) return 1; // no pixel to paste into
    if (static_cast<uint32_t>(cx) >= static_cast<uint32_t>(w)) cx = w - 1;
    if (static_cast<uint32_t>(cy) >= static_cast<uint32_t>(h)) cy = h - 1;
    int32_t ss = 0;
    switch (dst->bitCount) {
    case 8: ss = 1; break;
    case 24: ss = 3; break;
    case 32: ss = src->bitCount == 32 ? 4 : 3; break;
    default: return 1;
    }
    // The source is read in the destination's layout; rows and columns it
    // does not hold (none without a pixel block) are left unchanged, and a
    // destination without a block takes nothing.
    const std::optional<View> to = view_of(dst), from = layout_view(src, ss);
    if (!to || !from) return 1;
    const int64_t x0 = std::max<int64_t>(static_cast<int64_t>(cx) - r, 0);
    const int64_t x1 = std::min<int64_t>({static_cast<int64_t>(cx) + r, w - 1, from->width - 1});
    const int64_t y0 = std::max<int64_t>(static_cast<int64_t>(cy) - r, 0);
    const int64_t y1 = std::min<int64_t>({static_cast<int64_t>(cy) + r, h - 1, from->height - 1});
    if (x0 > x1 || y0 > y1) return 1;
    int64_t ri = static_cast<int32_t>(innerFactor * r), rw = r - ri;
    if (rw < 2) {
        ri = 0;
        rw = r;
    }
    const int32_t a = static_cast<int32_t>(x0), b = static_cast<int32_t>(x1), c = static_cast<int32_t>(y0),
                  e = static_cast<int32_t>(y1);
    auto run = [&](auto zero) {
        using T = decltype(zero);
        const Ring<T> g{static_cast<T>(r), static_cast<T>(ri), static_cast<T>(rw)};
        const T lv = static_cast<T>(level);
        if (to->bitCount == 8)
            paste_rect<1, 1, 1, false, Rule>(*to, *from, cx, cy, a, b, c, e, g, lv);
        else if (to->bitCount == 24)
            paste_rect<3, 3, 3, false, Rule>(*to, *from, cx, cy, a, b, c, e, g, lv);
        else if (ss == 4)
            paste_rect<4, 4, 3, true, Rule>(*to, *from, cx, cy, a, b, c, e, g, lv);
        else
            paste_rect<4, 3, 3, false, Rule>(*to, *from, cx, cy, a, b, c, e, g, lv);
    };
    if (r <= kNarrowRadius && level >= -kNarrowLevel && level <= kNarrowLevel)
        run(int32_t{0});
    else
        run(int64_t{0});
    return 1;
}

} // namespace

extern "C" {

int32_t PointArea_Copy(Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r) {
    return paste<SoftRule>(dst, src, cx, cy, r, 0.6, 0);
}

int32_t PointArea_Copy_Alph(Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r, int32_t level) {
    return paste<LightenRule>(dst, src, cx, cy, r, 0.1, level);
}

} // extern "C"
