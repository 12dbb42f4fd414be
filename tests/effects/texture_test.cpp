// Mosaic, watercolour jitter, oil painting and plane quantisation.
#include <gtest/gtest.h>

#include <cstdlib>

#include "effect_check.hpp"

using namespace pxtest;

namespace {

Owned ref_mosaic(const Image *src, int n) {
    const int w = src->width, h = src->height, half = n / 2;
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int y = 0; y < h; ++y) {
        const int by = y - y % n;
        const int sy = by + half < h ? by + half : (by + h) >> 1;
        for (int x = 0; x < w; ++x) {
            const int bx = x - x % n;
            const int sx = bx + half < w ? bx + half : (w - half + bx + half) >> 1;
            SetPixelColor(out.get(), x, y, GetPixelColor(src, sx, sy));
        }
    }
    return out;
}

Owned ref_aquarelle(const Image *src, int range) {
    return per_pixel(src, [&](uint32_t, int x, int y) {
        int a = PX_rand(range);
        const int b = PX_rand(range);
        if (a < 0 || b < 0) a = 0;
        return GetPixelColor(src, x + a, y + b);
    });
}

// Rescans the whole window for every interior pixel; interior alpha is the
// source pixel's.
Owned ref_oil(const Image *src, int r) {
    const int w = src->width, h = src->height;
    return per_pixel(src, [&](uint32_t c, int x, int y) {
        if (x < r || x >= w - r || y < r || y >= h - r) return c;
        long n[8] = {}, sr[8] = {}, sg[8] = {}, sb[8] = {};
        for (int yy = y - r; yy <= y + r; ++yy)
            for (int xx = x - r; xx <= x + r; ++xx) {
                const uint32_t p = GetPixelColor(src, xx, yy);
                const int k = (306 * chan(p, 16) + 601 * chan(p, 8) + 117 * chan(p, 0)) >> 15;
                ++n[k], sr[k] += chan(p, 16), sg[k] += chan(p, 8), sb[k] += chan(p, 0);
            }
        int k = 0;
        for (int i = 1; i < 8; ++i)
            if (n[i] > n[k]) k = i;
        return rgba(int(sb[k] / n[k]), int(sg[k] / n[k]), int(sr[k] / n[k]), chan(c, 24));
    });
}

} // namespace

TEST(Mosaic, MatchesBlockCentreSampling) {
    for (int n : {1, 2, 3, 4, 7, 40})
        expect_like_reference([n](Image *s, Image **d) { return PX_IMG_Mosaic(s, d, n); },
                              [n](const Image *s) { return ref_mosaic(s, n); }, 10u * n);
}

TEST(Mosaic, PartialBlocksSampleHalfwayToTheEdge) {
    Owned src = make(10, 6, 32);
    for (int y = 0; y < 6; ++y)
        for (int x = 0; x < 10; ++x)
            SetPixelColor(src.get(), x, y, rgba(x, y, 0, 255));
    Slot dst;
    ASSERT_EQ(PX_IMG_Mosaic(src.get(), &dst, 4), 1u);
    // Columns sample 2, 6 and (10 - 2 + 10) >> 1 = 9; rows 2 and (4 + 6) >> 1 = 5.
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(2, 2, 0, 255));
    EXPECT_EQ(GetPixelColor(dst.get(), 7, 3), rgba(6, 2, 0, 255));
    EXPECT_EQ(GetPixelColor(dst.get(), 8, 4), rgba(9, 5, 0, 255));
    ASSERT_EQ(PX_IMG_Mosaic(src.get(), &dst, INT32_MAX), 1u); // one block sampling (5, 3)
    EXPECT_EQ(GetPixelColor(dst.get(), 9, 5), rgba(5, 3, 0, 255));
    ASSERT_EQ(PX_IMG_Mosaic(src.get(), &dst, 1), 1u);
    EXPECT_EQ(diff(dst.get(), src.get()), "");
    Image *kept = dst.get();
    EXPECT_EQ(PX_IMG_Mosaic(src.get(), &dst, 0), 0u);
    EXPECT_EQ(PX_IMG_Mosaic(src.get(), &dst, INT32_MIN), 0u);
    EXPECT_EQ(PX_IMG_Mosaic(nullptr, &dst, 4), 0u);
    EXPECT_EQ(dst.get(), kept);
}

TEST(Aquarelle, FollowsTheSeededDrawOrder) {
    for (int range : {2, 5}) {
        expect_like_reference(
            [range](Image *s, Image **d) {
                srand48(range);
                return PX_IMG_Aquarelle(s, d, range);
            },
            [range](const Image *s) {
                srand48(range);
                return ref_aquarelle(s, range);
            },
            uint32_t(range));
    }
}

// A negative draw resets the horizontal jitter only: sources never lie to the
// left, sources to the right never lie above, and sources above do occur.
TEST(Aquarelle, NegativeDrawResetsOnlyTheHorizontalJitter) {
    Owned src = make(40, 40, 32);
    for (int y = 0; y < 40; ++y)
        for (int x = 0; x < 40; ++x)
            SetPixelColor(src.get(), x, y, rgba(x, y, 0, 255));
    srand48(11);
    Slot dst;
    ASSERT_EQ(PX_IMG_Aquarelle(src.get(), &dst, 4), 1u);
    int above = 0;
    for (int y = 0; y < 40; ++y)
        for (int x = 0; x < 40; ++x) {
            const uint32_t c = GetPixelColor(dst.get(), x, y);
            const int sx = chan(c, 0), sy = chan(c, 8);
            ASSERT_GE(sx, x);
            ASSERT_LE(sx - x, 3);
            if (sx > x) {
                ASSERT_GE(sy, y);
            }
            above += sy < y;
        }
    EXPECT_GT(above, 100);
    // Range 1 draws only zeros; other ranges stay inside the picture.
    ASSERT_EQ(PX_IMG_Aquarelle(src.get(), &dst, 1), 1u);
    EXPECT_EQ(diff(dst.get(), src.get()), "");
    for (int range : {0, -3, INT32_MIN, INT32_MAX})
        EXPECT_EQ(PX_IMG_Aquarelle(src.get(), &dst, range), 1u);
    EXPECT_EQ(PX_IMG_Aquarelle(nullptr, &dst, 3), 0u);
}

TEST(Oil, MatchesWindowRescan) {
    uint32_t seed = 900;
    for (int r : {0, 1, 2, 3})
        for (int32_t bc : kBitCounts)
            for (auto [w, h] : {kAwkwardSizes[0], kAwkwardSizes[3], kAwkwardSizes[4], kAwkwardSizes[6],
                                kAwkwardSizes[7], Size{6, 5}, Size{5, 9}, Size{21, 6}}) {
                Owned src = random_image(w, h, bc, seed++);
                Slot dst;
                if (2 * r >= w || 2 * r >= h) {
                    EXPECT_EQ(imOil(src.get(), &dst, r), 0u);
                    continue;
                }
                ASSERT_EQ(imOil(src.get(), &dst, r), 1u);
                EXPECT_EQ(diff(dst.get(), ref_oil(src.get(), r).get()), "") << w << "x" << h << "@" << bc << " r" << r;
            }
}

TEST(Oil, DominantClassAndBorder) {
    // Class 0 (dark) holds 5 of the 9 pixels around (1, 1): their mean wins.
    Owned src = filled(3, 3, 32, rgba(250, 250, 250, 9));
    const uint32_t dark[] = {rgba(10, 0, 0, 1), rgba(20, 0, 0, 2), rgba(30, 0, 4, 3), rgba(0, 0, 0, 4),
                             rgba(1, 0, 0, 5)};
    for (int i = 0; i < 5; ++i)
        SetPixelColor(src.get(), i % 3, i / 3, dark[i]);
    Slot dst;
    ASSERT_EQ(imOil(src.get(), &dst, 1), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 1, 1), rgba(12, 0, 0, 5)); // 61 / 5, 4 / 5; own alpha
    EXPECT_EQ(GetPixelColor(dst.get(), 2, 2), rgba(250, 250, 250, 9));
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), dark[0]);
}

TEST(Oil, RefusedRadii) {
    Owned src = random_image(6, 9, 24, 4);
    Slot dst;
    EXPECT_EQ(imOil(src.get(), &dst, -1), 0u);
    EXPECT_EQ(imOil(src.get(), &dst, INT32_MIN), 0u);
    EXPECT_EQ(dst.get(), nullptr);
    // Too large for the picture: the result is prepared but not written.
    EXPECT_EQ(imOil(src.get(), &dst, 3), 0u);
    ASSERT_NE(dst.get(), nullptr);
    EXPECT_EQ(GetPixelColor(dst.get(), 2, 2), 0xFFFFFFFFu);
    EXPECT_EQ(imOil(src.get(), &dst, INT32_MAX), 0u);
    EXPECT_EQ(imOil(nullptr, &dst, 1), 0u);
    EXPECT_EQ(imOil(src.get(), nullptr, 1), 0u);
}

TEST(ColorCompress, GroupsMapToTheirMostFrequentMember) {
    Owned plane = make(4, 3, 8);
    const uint8_t values[12] = {0, 85, 85, 40, 86, 171, 171, 90, 172, 255, 200, 200};
    for (int i = 0; i < 12; ++i)
        SetPixelIndex(plane.get(), i % 4, i / 4, values[i]);
    ASSERT_EQ(ColorCompress(plane.get(), 3), 1); // groups of 86: 0..85, 86..171, 172..255
    const uint8_t expect[12] = {85, 85, 85, 85, 171, 171, 171, 171, 200, 200, 200, 200};
    for (int i = 0; i < 12; ++i)
        EXPECT_EQ(GetPixelIndex(plane.get(), i % 4, i / 4), expect[i]) << i;
    // A tie keeps the first value; 12 levels make groups of 22, the last 14 wide.
    Owned two = make(2, 1, 8);
    SetPixelIndex(two.get(), 0, 0, 250);
    SetPixelIndex(two.get(), 1, 0, 243);
    ASSERT_EQ(ColorCompress(two.get(), 12), 1);
    EXPECT_EQ(GetPixelIndex(two.get(), 0, 0), 243);
    EXPECT_EQ(GetPixelIndex(two.get(), 1, 0), 243);
    // Padding bytes are not part of the plane.
    EXPECT_EQ(two->bits[2], 255);
    Owned rgb = make(2, 2, 24);
    EXPECT_EQ(ColorCompress(rgb.get(), 3), 0);
    EXPECT_EQ(ColorCompress(plane.get(), 0), 0);
    EXPECT_EQ(ColorCompress(plane.get(), -4), 0);
    EXPECT_EQ(ColorCompress(nullptr, 3), 0);
    ASSERT_EQ(ColorCompress(plane.get(), 1000), 1); // groups of one value
    EXPECT_EQ(GetPixelIndex(plane.get(), 0, 0), 85);
}

namespace {

// Groups of ceil(256 / levels) values map to their most frequent member.
void ref_compress(Image *plane, int levels) {
    const int g = (256 + levels - 1) / levels;
    int count[256] = {};
    for (int y = 0; y < plane->height; ++y)
        for (int x = 0; x < plane->width; ++x)
            ++count[GetPixelIndex(plane, x, y)];
    int map[256];
    for (int v = 0; v < 256; ++v) {
        const int first = v - v % g;
        int rep = first;
        for (int u = first; u < std::min(first + g, 256); ++u)
            if (count[u] > count[rep]) rep = u;
        map[v] = rep;
    }
    for (int y = 0; y < plane->height; ++y)
        for (int x = 0; x < plane->width; ++x)
            SetPixelIndex(plane, x, y, map[GetPixelIndex(plane, x, y)]);
}

} // namespace

TEST(Oil1, QuantisedHueAndLightnessPlanes) {
    uint32_t seed = 70;
    for (int32_t bc : {24, 32})
        for (auto [w, h] : kAwkwardSizes) {
            Owned src = random_image(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(imOil_1(src.get(), &dst), 1u);
            Slot p1, p2, p3, pa;
            ASSERT_EQ(Split(src.get(), &p1, &p2, &p3, bc == 32 ? &pa : nullptr, 1), 1);
            ref_compress(p1.get(), 3);
            ref_compress(p3.get(), 12);
            Owned expect(Combine(p1.get(), p2.get(), p3.get(), pa.get(), 1));
            EXPECT_EQ(diff(dst.get(), expect.get()), "") << w << "x" << h << "@" << bc;
        }
    Owned gray = random_image(4, 4, 8, 1), words = random_image(4, 4, 16, 1), rgb = random_image(4, 4, 24, 1);
    Slot dst;
    EXPECT_EQ(imOil_1(gray.get(), &dst), 0u);
    EXPECT_EQ(imOil_1(words.get(), &dst), 0u);
    EXPECT_EQ(imOil_1(nullptr, &dst), 0u);
    EXPECT_EQ(imOil_1(rgb.get(), nullptr), 0u);
    EXPECT_EQ(dst.get(), nullptr);
}
