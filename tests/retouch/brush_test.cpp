// Brush pastes, the cached brushes and their slot rules, blemish removal and
// the Bezier helpers.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>

#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

uint8_t *px(Image *im, int32_t x, int32_t y, int32_t bpp) { return im->bits + size_t(y) * im->pitch + size_t(x) * bpp; }

Owned ref_paste(const Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r, bool lighten, int64_t level) {
    Owned out = clone(dst);
    const int32_t w = dst->width, h = dst->height;
    if (uint32_t(cx) >= uint32_t(w)) cx = w - 1;
    if (uint32_t(cy) >= uint32_t(h)) cy = h - 1;
    int64_t ri = int32_t((lighten ? 0.1 : 0.6) * r), rw = r - ri;
    if (rw < 2) ri = 0, rw = r;
    const int32_t ds = int32_t(dst->bitCount / 8), ss = ds == 4 && src->bitCount != 32 ? 3 : ds;
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            if (std::llabs(int64_t(x) - cx) > r || std::llabs(int64_t(y) - cy) > r) continue;
            const int64_t d = distance(x - cx, y - cy);
            if (d > r) continue;
            uint8_t *o = px(out.get(), x, y, ds);
            const uint8_t *s = px(const_cast<Image *>(src), x, y, ss);
            for (int c = 0; c < (ds == 1 ? 1 : 3); ++c) {
                if (d < ri) {
                    o[c] = s[c];
                } else if (!lighten) {
                    o[c] = uint8_t(((d - ri) * o[c] + (r - d) * s[c]) / rw);
                } else {
                    const uint8_t v = uint8_t(((d - ri) * (s[c] - level) + s[c] * (r - d)) / rw);
                    if (v > o[c] || o[c] + level == s[c]) o[c] = v;
                }
            }
            if (ds == 4 && ss == 4) o[3] = s[3];
        }
    return out;
}

Owned tinted(const Image *pic, uint8_t lr, uint8_t lg, uint8_t lb) {
    Image *r = nullptr, *g = nullptr, *b = nullptr, *a = nullptr;
    Split(pic, &r, &g, &b, pic->bitCount == 32 ? &a : nullptr, 0);
    ColorFilter_zanto(r, lr), ColorFilter_zanto(g, lg), ColorFilter_zanto(b, lb);
    Owned out(Combine(r, g, b, a, 0));
    free_Image(&r, 0), free_Image(&g, 0), free_Image(&b, 0), free_Image(&a, 0);
    return out;
}

Owned brightened(const Image *pic, int level) {
    Owned out = clone(pic);
    for (int32_t y = 0; y < pic->height; ++y)
        for (int32_t x = 0; x < pic->width; ++x) {
            const uint32_t c = GetPixelColor(pic, x, y);
            uint32_t o = c & 0xFF000000u;
            for (int s : {0, 8, 16})
                o |= uint32_t(std::min(ch(c, s) + level, 255)) << s;
            SetPixelColor(out.get(), x, y, o);
        }
    return out;
}

} // namespace

TEST(Paste, SoftAndLightenPastesMatchStraightVersion) {
    const int32_t pairs[][2] = {{24, 24}, {32, 32}, {32, 24}, {8, 8}};
    const int32_t brushes[][3] = {{5, 6, 1},   {5, 6, 2},   {9, 4, 7},         {0, 0, 12},   {-3, 2, 5},
                                  {30, -1, 9}, {17, 11, 3}, {8, 8, INT32_MAX}, {2, 100, 40}, {4, 4, -6}};
    uint32_t seed = 1;
    for (auto [db, sb] : pairs)
        for (auto [cx, cy, r] : brushes)
            for (int32_t level : {0, 40, 255}) {
                Owned dst = random_image(19, 13, db, seed++), src = random_image(19, 13, sb, seed++);
                Owned soft = clone(dst.get()), light = clone(dst.get());
                EXPECT_EQ(PointArea_Copy(soft.get(), src.get(), cx, cy, r), 1);
                EXPECT_EQ(diff(soft.get(), ref_paste(dst.get(), src.get(), cx, cy, r, false, 0).get()), "")
                    << db << "/" << sb << " " << cx << "," << cy << " r" << r;
                EXPECT_EQ(PointArea_Copy_Alph(light.get(), src.get(), cx, cy, r, level), 1);
                EXPECT_EQ(diff(light.get(), ref_paste(dst.get(), src.get(), cx, cy, r, true, level).get()), "")
                    << db << "/" << sb << " " << cx << "," << cy << " r" << r << " L" << level;
            }
}

TEST(Paste, EdgeRules) {
    Owned dst = filled(100, 9, 24, 0x101010), src = filled(100, 9, 24, 0xF0F0F0);
    EXPECT_EQ(PointArea_Copy(dst.get(), src.get(), 50, 4, 0), 0);
    EXPECT_EQ(PointArea_Copy(nullptr, src.get(), 50, 4, 3), 0);
    EXPECT_EQ(GetPixelColor(dst.get(), 50, 4), 0xFF101010u);
    // r = 1: the centre takes the source, the ring at distance 1 keeps the destination.
    EXPECT_EQ(PointArea_Copy(dst.get(), src.get(), 50, 4, 1), 1);
    EXPECT_EQ(GetPixelColor(dst.get(), 50, 4), 0xFFF0F0F0u);
    EXPECT_EQ(GetPixelColor(dst.get(), 51, 4), 0xFF101010u);
    // A negative centre lands on the far edge.
    EXPECT_EQ(PointArea_Copy(dst.get(), src.get(), -3, 4, 2), 1);
    EXPECT_EQ(GetPixelColor(dst.get(), 99, 4), 0xFFF0F0F0u);
    // Lighten-only with level 0: a darker source never wins.
    Owned bright = filled(20, 20, 32, 0xFF808080), dark = filled(20, 20, 32, 0x40404040);
    EXPECT_EQ(PointArea_Copy_Alph(bright.get(), dark.get(), 10, 10, 8, 0), 1);
    EXPECT_EQ(GetPixelColor(bright.get(), 13, 10) & 0xFFFFFF, 0x808080u);
}

TEST(CachedBrushes, TintBrushBuildsOnceAndRebuildsOnChange) {
    Owned pic = load_fixture("portrait-128.bmp");
    Slot cache;
    const PXTint tint{150, 128, 90};
    ASSERT_EQ(alg_Blending(pic.get(), nullptr, 0, 0, tint, 0, &cache), 1);
    Image *first = cache.get();
    EXPECT_EQ(first->tag, 150u | 128u << 8 | 90u << 16);
    const Owned expected = tinted(pic.get(), 150, 128, 90);
    EXPECT_EQ(diff(first, expected.get()), "");
    // Later dabs of the stroke paste the same copy, even though the picture changed.
    Owned before = clone(pic.get());
    ASSERT_EQ(alg_Blending(pic.get(), nullptr, 40, 50, tint, 12, &cache), 1);
    ASSERT_EQ(alg_Blending(pic.get(), nullptr, 60, 50, tint, 12, &cache), 1);
    EXPECT_EQ(cache.get(), first);
    Owned painted = ref_paste(before.get(), expected.get(), 40, 50, 12, false, 0);
    painted = ref_paste(painted.get(), expected.get(), 60, 50, 12, false, 0);
    EXPECT_EQ(diff(pic.get(), painted.get()), "");
    // A new colour rebuilds from the picture as it is now.
    ASSERT_EQ(alg_Blending(pic.get(), nullptr, 0, 0, PXTint{128, 128, 200}, 0, &cache), 1);
    EXPECT_EQ(diff(cache.get(), tinted(pic.get(), 128, 128, 200).get()), "");
    Owned gray = random_image(8, 8, 8, 1);
    EXPECT_EQ(alg_Blending(gray.get(), nullptr, 0, 0, tint, 3, &cache), 0);
    // The whole-picture tint, into a slot and in place.
    Slot out;
    ASSERT_EQ(alg_Img_Blending(before.get(), &out), 1);
    EXPECT_EQ(diff(out.get(), tinted(before.get(), 201, 189, 203).get()), "");
    ASSERT_EQ(alg_Img_Blending(before.get(), nullptr), 1);
    EXPECT_EQ(diff(before.get(), out.get()), "");
}

TEST(CachedBrushes, CloneBrushShiftsAndReloads) {
    Owned pic = random_image(30, 20, 24, 5);
    Owned original = clone(pic.get());
    Slot cache;
    ASSERT_EQ(PX_Mimic(pic.get(), 10, 4, nullptr, 3, 6, 0, 0, 0, 1, &cache), 1);
    for (int32_t y = 0; y < 20; ++y)
        for (int32_t x = 0; x < 30; ++x) {
            const int32_t sx = x + 7, sy = y - 2;
            const bool inside = sx < 30 && sy >= 0;
            ASSERT_EQ(GetPixelColor(cache.get(), x, y), GetPixelColor(original.get(), inside ? sx : x, inside ? sy : y))
                << x << "," << y;
        }
    Image *first = cache.get();
    const Owned shifted = clone(first);
    ASSERT_EQ(PX_Mimic(pic.get(), 0, 0, nullptr, 0, 0, 15, 10, 6, 0, &cache), 1);
    EXPECT_EQ(cache.get(), first);
    EXPECT_EQ(diff(pic.get(), ref_paste(original.get(), shifted.get(), 15, 10, 6, false, 0).get()), "");
    // A reference of another format replaces the copy.
    Owned ref32 = random_image(30, 20, 32, 6);
    ASSERT_EQ(PX_Mimic(pic.get(), 0, 0, ref32.get(), 0, 0, 0, 0, 0, 0, &cache), 1);
    EXPECT_EQ(cache->bitCount, 32u);
    EXPECT_EQ(diff(cache.get(), ref32.get()), "");
    EXPECT_EQ(PX_Mimic(pic.get(), 0, 0, nullptr, 0, 0, 0, 0, 0, 0, nullptr), 0);
}

TEST(CachedBrushes, UnderEyeBrushKeepsItsLevel) {
    Owned pic = load_fixture("portrait-128.bmp");
    Owned original = clone(pic.get());
    Slot cache;
    ASSERT_EQ(alg_QuHeiYanQuan(pic.get(), 40, 40, 0, 30, &cache, 0), 1);
    EXPECT_EQ(diff(pic.get(), original.get()), "");
    EXPECT_EQ(cache->tag, 30u);
    const Owned light = brightened(original.get(), 30);
    EXPECT_EQ(diff(cache.get(), light.get()), "");
    Image *first = cache.get();
    ASSERT_EQ(alg_QuHeiYanQuan(pic.get(), 40, 40, 9, 30, &cache, 0), 1);
    EXPECT_EQ(cache.get(), first);
    EXPECT_EQ(diff(cache.get(), light.get()), "");
    EXPECT_EQ(diff(pic.get(), ref_paste(original.get(), light.get(), 40, 40, 9, true, 30).get()), "");
    // Refresh takes the painted picture and lightens it once.
    ASSERT_EQ(alg_QuHeiYanQuan(pic.get(), 0, 0, 0, 30, &cache, 1), 1);
    EXPECT_EQ(diff(cache.get(), brightened(pic.get(), 30).get()), "");
    // Several centres in one call.
    Owned multi = clone(original.get());
    const int32_t xs[] = {20, 90, -5}, ys[] = {30, 100, 60};
    ASSERT_EQ(alg_QuHeiYanQuan_1(multi.get(), xs, ys, 3, 11, 25), 1);
    const Owned l25 = brightened(original.get(), 25);
    Owned expected = clone(original.get());
    for (int i = 0; i < 3; ++i)
        expected = ref_paste(expected.get(), l25.get(), xs[i], ys[i], 11, true, 25);
    EXPECT_EQ(diff(multi.get(), expected.get()), "");
    EXPECT_EQ(alg_QuHeiYanQuan_1(multi.get(), nullptr, ys, 3, 11, 25), 0);
    EXPECT_EQ(alg_QuHeiYanQuan_1(multi.get(), xs, ys, 0, 11, 25), 0);
}

TEST(Eradicate, PullsDarkPixelsTowardTheSurroundings) {
    uint32_t seed = 9;
    for (int32_t bc : kBitCounts)
        for (auto [cx, cy, r] : {std::array{10, 8, 5}, {0, 0, 4}, {18, 3, 9}, {-2, 5, 4}, {9, 9, 1}}) {
            Owned pic = random_image(21, 15, bc, seed++);
            Owned expected = clone(pic.get());
            const int32_t x0 = std::max(cx - r, 0), x1 = std::min(cx + r, 20);
            const int32_t y0 = std::max(cy - r, 0), y1 = std::min(cy + r, 14);
            int64_t sum[3] = {}, n = 0;
            for (int32_t y = y0; y <= y1; ++y)
                for (int32_t x = x0; x < x1; ++x)
                    if (int32_t(distance(x - cx, y - cy)) >= r) {
                        const uint32_t c = GetPixelColor(pic.get(), x, y);
                        sum[0] += ch(c, 0), sum[1] += ch(c, 8), sum[2] += ch(c, 16), ++n;
                    }
            for (int32_t y = y0; y <= y1 && n > 0; ++y)
                for (int32_t x = x0; x < x1; ++x) {
                    const int32_t d = int32_t(distance(x - cx, y - cy));
                    const uint32_t c = GetPixelColor(pic.get(), x, y);
                    if (d > r || sum[1] / n - ch(c, 8) <= 1) continue;
                    uint32_t o = c & 0xFF000000u;
                    for (int i = 0; i < 3; ++i) {
                        const int64_t v = ch(c, 8 * i) + (r - d) * (sum[i] / n - ch(c, 8 * i)) / r;
                        o |= uint32_t(std::min<int64_t>(v, 255)) << 8 * i;
                    }
                    SetPixelColor(expected.get(), x, y, o);
                }
            alg_Img_Eradicate(pic.get(), cx, cy, r);
            EXPECT_EQ(diff(pic.get(), expected.get()), "") << bc << " " << cx << "," << cy << " r" << r;
        }
    // A disc that covers its whole rectangle has no surroundings.
    Owned small = random_image(3, 3, 24, 4), before = clone(small.get());
    alg_Img_Eradicate(small.get(), 1, 1, 2);
    EXPECT_EQ(diff(small.get(), before.get()), "");
}

TEST(Bezier, PointsAlongTheCurve) {
    const PXPoint c[4] = {{0, 0}, {10, 30}, {20, 30}, {30, 0}};
    PXPoint out[5] = {};
    ComputeBezier(c, 1, out);
    EXPECT_EQ(out[0].x, 0);
    ComputeBezier(c, 2, out);
    EXPECT_EQ(out[0].x, 0);
    EXPECT_EQ(out[1].x, 30);
    EXPECT_EQ(out[1].y, 0);
    ComputeBezier(c, 5, out);
    EXPECT_EQ(out[2].x, 15);
    EXPECT_EQ(out[2].y, 22); // 0.75 * 30 = 22.5, truncated
    PXPoint r{-1, -1};
    const PXPoint p = PointOnCubicBezier(&r, c, 0.5f);
    EXPECT_EQ(p.x, r.x);
    EXPECT_EQ(r.y, 22);
    PXPoint untouched[2] = {{7, 7}, {7, 7}};
    ComputeBezier(c, 0, untouched);
    ComputeBezier(nullptr, 2, untouched);
    EXPECT_EQ(untouched[0].x, 7);
}

TEST(CachedBrushes, SmoothingBrushKeysOnStrength) {
    Owned pic = random_image(40, 30, 32, 8);
    Owned original = clone(pic.get());
    auto smoothed = [](const Image *im, int32_t size) {
        Owned s = clone(im);
        Filter_fast(s.get(), size, 0);
        return s;
    };
    Slot cache;
    ASSERT_EQ(alg_smooth(pic.get(), 0, 10, 10, 0, 2, &cache), 1);
    EXPECT_EQ(cache->tag, 2u);
    EXPECT_EQ(diff(cache.get(), smoothed(original.get(), 3).get()), "");
    Image *first = cache.get();
    ASSERT_EQ(alg_smooth(pic.get(), 0, 10, 10, 7, 2, &cache), 1);
    ASSERT_EQ(alg_smooth(pic.get(), 0, 20, 12, 7, 2, &cache), 1);
    EXPECT_EQ(cache.get(), first);
    Owned painted = ref_paste(original.get(), first, 10, 10, 7, false, 0);
    painted = ref_paste(painted.get(), first, 20, 12, 7, false, 0);
    EXPECT_EQ(diff(pic.get(), painted.get()), "");
    ASSERT_EQ(alg_smooth(pic.get(), 0, 0, 0, 0, 5, &cache), 1);
    EXPECT_EQ(cache->tag, 5u);
    EXPECT_EQ(diff(cache.get(), smoothed(pic.get(), 5).get()), "");
    // A cache of another size is replaced.
    Owned wide = random_image(41, 30, 32, 9);
    ASSERT_EQ(alg_smooth(wide.get(), 0, 0, 0, 0, 5, &cache), 1);
    EXPECT_EQ(cache->width, 41);
    // Without a slot the copy lives for one dab only.
    Owned once = clone(original.get());
    ASSERT_EQ(alg_smooth(once.get(), 0, 15, 15, 9, 4, nullptr), 1);
    EXPECT_EQ(diff(once.get(), ref_paste(original.get(), smoothed(original.get(), 4).get(), 15, 15, 9, false, 0).get()),
              "");
}
