// Brush pastes, the cached brushes and their slot rules, blemish removal and
// the Bezier helpers (the whole-picture tint is pinned by the golden hashes).
#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

Owned ref_paste(const Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r, bool lighten, int64_t level) {
    Owned out = clone(dst);
    cx = uint32_t(cx) >= uint32_t(dst->width) ? dst->width - 1 : cx;
    cy = uint32_t(cy) >= uint32_t(dst->height) ? dst->height - 1 : cy;
    int64_t ri = int32_t((lighten ? 0.1 : 0.6) * r), rw = r - ri;
    if (rw < 2) ri = 0, rw = r;
    const int32_t ds = int32_t(dst->bitCount / 8), ss = ds == 4 && src->bitCount != 32 ? 3 : ds;
    for (int32_t y = 0; y < dst->height; ++y)
        for (int32_t x = 0; x < dst->width; ++x) {
            const int64_t d = distance(x - cx, y - cy);
            if (std::llabs(int64_t(x) - cx) > r || std::llabs(int64_t(y) - cy) > r || d > r) continue;
            uint8_t *o = out->bits + size_t(y) * out->pitch + size_t(x) * ds;
            const uint8_t *s = src->bits + size_t(y) * src->pitch + size_t(x) * ss;
            for (int c = 0; c < (ds == 1 ? 1 : 3); ++c) {
                const uint8_t v = uint8_t(d < ri    ? s[c]
                                          : lighten ? ((d - ri) * (s[c] - level) + s[c] * (r - d)) / rw
                                                    : ((d - ri) * o[c] + (r - d) * s[c]) / rw);
                if (!lighten || d < ri || v > o[c] || o[c] + level == s[c]) o[c] = v;
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
    return mapped(pic, [&](int v) { return std::min(v + level, 255); });
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

// Two dabs through a slot: the first builds the copy (r = 0 paints nothing),
// later ones paste that same copy although the picture has changed.
template <class Brush>
void expect_stroke(Image *pic, Slot &cache, const Owned &prepared, Brush dab, bool lighten, int32_t level) {
    const Owned before = clone(pic);
    ASSERT_EQ(dab(0, 0, 0), 1);
    EXPECT_EQ(diff(pic, before.get()), "");
    EXPECT_EQ(diff(cache.get(), prepared.get()), "");
    Image *first = cache.get();
    ASSERT_EQ(dab(40, 50, 12), 1);
    ASSERT_EQ(dab(52, 50, 9), 1);
    EXPECT_EQ(cache.get(), first);
    Owned painted = ref_paste(before.get(), prepared.get(), 40, 50, 12, lighten, level);
    EXPECT_EQ(diff(pic, ref_paste(painted.get(), prepared.get(), 52, 50, 9, lighten, level).get()), "");
}

TEST(CachedBrushes, TintBrushKeysOnItsLevels) {
    Owned pic = load_fixture("portrait-128.bmp");
    Slot cache;
    const PXTint tint{150, 128, 90};
    expect_stroke(
        pic.get(), cache, tinted(pic.get(), 150, 128, 90),
        [&](int32_t x, int32_t y, int32_t r) { return alg_Blending(pic.get(), nullptr, x, y, tint, r, &cache); }, false,
        0);
    EXPECT_EQ(cache->tag, 150u | 128u << 8 | 90u << 16);
    ASSERT_EQ(alg_Blending(pic.get(), nullptr, 0, 0, PXTint{128, 128, 200}, 0, &cache), 1);
    EXPECT_EQ(diff(cache.get(), tinted(pic.get(), 128, 128, 200).get()), "");
}

TEST(CachedBrushes, SmoothingBrushKeysOnStrength) {
    Owned pic = random_image(90, 70, 32, 8);
    auto smoothed = [](const Image *im, int32_t size) {
        Owned s = clone(im);
        Filter_fast(s.get(), size, 0);
        return s;
    };
    Slot cache;
    expect_stroke(
        pic.get(), cache, smoothed(pic.get(), 3),
        [&](int32_t x, int32_t y, int32_t r) { return alg_smooth(pic.get(), 0, x, y, r, 2, &cache); }, false, 0);
    EXPECT_EQ(cache->tag, 2u);
    ASSERT_EQ(alg_smooth(pic.get(), 0, 0, 0, 0, 5, &cache), 1);
    EXPECT_EQ(diff(cache.get(), smoothed(pic.get(), 5).get()), "");
}

TEST(CachedBrushes, UnderEyeBrushKeepsItsLevel) {
    Owned pic = load_fixture("portrait-128.bmp");
    Owned original = clone(pic.get());
    Slot cache;
    expect_stroke(
        pic.get(), cache, brightened(pic.get(), 30),
        [&](int32_t x, int32_t y, int32_t r) { return alg_QuHeiYanQuan(pic.get(), x, y, r, 30, &cache, 0); }, true, 30);
    // Refresh takes the painted picture and lightens it once.
    ASSERT_EQ(alg_QuHeiYanQuan(pic.get(), 0, 0, 0, 30, &cache, 1), 1);
    EXPECT_EQ(diff(cache.get(), brightened(pic.get(), 30).get()), "");
    const int32_t xs[] = {20, 90, -5}, ys[] = {30, 100, 60};
    ASSERT_EQ(alg_QuHeiYanQuan_1(original.get(), xs, ys, 3, 11, 25), 1);
    Owned expected = load_fixture("portrait-128.bmp");
    const Owned l25 = brightened(expected.get(), 25);
    for (int i = 0; i < 3; ++i)
        expected = ref_paste(expected.get(), l25.get(), xs[i], ys[i], 11, true, 25);
    EXPECT_EQ(diff(original.get(), expected.get()), "");
}

TEST(CachedBrushes, CloneBrushShiftsAndReloads) {
    Owned pic = random_image(30, 20, 24, 5), original = clone(pic.get());
    Slot cache;
    ASSERT_EQ(PX_Mimic(pic.get(), 10, 4, nullptr, 3, 6, 0, 0, 0, 1, &cache), 1);
    for (int32_t y = 0; y < 20; ++y)
        for (int32_t x = 0; x < 30; ++x) {
            const bool inside = x + 7 < 30 && y >= 2;
            ASSERT_EQ(GetPixelColor(cache.get(), x, y),
                      GetPixelColor(original.get(), inside ? x + 7 : x, inside ? y - 2 : y));
        }
    Image *first = cache.get();
    ASSERT_EQ(PX_Mimic(pic.get(), 0, 0, nullptr, 0, 0, 15, 10, 6, 0, &cache), 1);
    EXPECT_EQ(cache.get(), first);
    EXPECT_EQ(diff(pic.get(), ref_paste(original.get(), first, 15, 10, 6, false, 0).get()), "");
    Owned ref32 = random_image(30, 20, 32, 6); // another format replaces the copy
    ASSERT_EQ(PX_Mimic(pic.get(), 0, 0, ref32.get(), 0, 0, 0, 0, 0, 0, &cache), 1);
    EXPECT_EQ(diff(cache.get(), ref32.get()), "");
}

TEST(Eradicate, PullsDarkPixelsTowardTheSurroundings) {
    // Gray 200 surroundings, a dark spot of radius 3 with one bright pixel.
    Owned pic = filled(21, 15, 24, 0xC8C8C8);
    for (int32_t y = 0; y < 15; ++y)
        for (int32_t x = 0; x < 21; ++x)
            if (distance(x - 10, y - 8) <= 3) SetPixelColor(pic.get(), x, y, 0x204060);
    SetPixelColor(pic.get(), 11, 8, 0xF0F0F0);
    Owned before = clone(pic.get());
    alg_Img_Eradicate(pic.get(), 10, 8, 5);
    EXPECT_EQ(GetPixelColor(pic.get(), 10, 8), 0xFFC8C8C8u); // the centre reaches the mean
    EXPECT_EQ(GetPixelColor(pic.get(), 11, 8), 0xFFF0F0F0u); // brighter in green: kept
    EXPECT_EQ(GetPixelColor(pic.get(), 13, 8), 0xFF637689u); // w = 2: red 32 + 2 (200 - 32) / 5
    for (int32_t y = 0; y < 15; ++y)
        EXPECT_EQ(GetPixelColor(pic.get(), 15, y), GetPixelColor(before.get(), 15, y)); // column cx + r
    // A disc that covers its whole rectangle has no surroundings.
    Owned small = random_image(3, 3, 24, 4);
    before = clone(small.get());
    alg_Img_Eradicate(small.get(), 1, 1, 2);
    EXPECT_EQ(diff(small.get(), before.get()), "");
}

TEST(Bezier, PointsAlongTheCurve) {
    const PXPoint c[4] = {{0, 0}, {10, 30}, {20, 30}, {30, 0}};
    PXPoint out[5];
    ComputeBezier(c, 1, out);
    EXPECT_EQ(out[0].x, 0);
    ComputeBezier(c, 5, out);
    EXPECT_EQ(std::vector<int32_t>({out[2].x, out[2].y, out[4].x, out[4].y}), std::vector<int32_t>({15, 22, 30, 0}));
}
