// Curve tables and the curve-table colour filters, checked against
// straightforward per-pixel versions on random pictures.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

int64_t weighted_sum(const uint8_t *t) {
    int64_t s = 0;
    for (int i = 0; i < 256; ++i)
        s += int64_t(i + 1) * t[i];
    return s;
}

std::vector<int> drops(const uint8_t *t) {
    std::vector<int> at;
    for (int i = 1; i < 256; ++i)
        if (t[i] < t[i - 1]) at.push_back(i);
    return at;
}

// Level map of ColorFilter1, straight from the circle construction.
std::vector<int> arc_map(int level) {
    const int a = (std::abs(level - 128) >> 1) + 128;
    const int r = int(std::sqrt(double(a * a / 2)));
    const int s = 255 - r, k = (s * s + r * r - 512 * s) / 510, c = 255 - k;
    std::vector<int> t(256);
    for (int i = 0; i < 256; ++i) {
        const double q = double(k * k + c * c - (i - c) * (i - c));
        const int v = q < 0 ? 0 : int(std::sqrt(q) - std::abs(k));
        t[i] = std::min(255, std::max(0, v));
    }
    if (level < 128) {
        std::vector<int> inv(256, 0);
        for (int j = 0; j < 256; ++j)
            inv[t[j]] = j;
        for (int v = 255, last = 0; v >= 0; --v)
            t[v] = last = inv[v] ? inv[v] : last;
    }
    return t;
}

} // namespace

TEST(CurveTables, ListedValuesAndShape) {
    EXPECT_EQ(weighted_sum(ZANTOMOPI) - 6011043 - 36556, 0);
    EXPECT_EQ(weighted_sum(ZANTOFILTERBK) - 4124480 - 21455, 0);
    EXPECT_EQ(weighted_sum(ZANTOFILTER) - 6887388 - 43066, 0);
    EXPECT_EQ(ZANTOMOPI[64], 87);
    EXPECT_EQ(ZANTOMOPI[65], 87);
    EXPECT_EQ(ZANTOMOPI[255], 255);
    EXPECT_TRUE(drops(ZANTOMOPI).empty());
    // The dips are part of the tone and must survive.
    EXPECT_EQ(drops(ZANTOFILTERBK), (std::vector<int>{35, 253, 254, 255}));
    EXPECT_EQ(ZANTOFILTERBK[252], 246);
    EXPECT_EQ(ZANTOFILTERBK[255], 228);
    EXPECT_EQ(drops(ZANTOFILTER), (std::vector<int>{248, 249, 250, 254, 255}));
    EXPECT_EQ(ZANTOFILTER[247], 254);
    EXPECT_EQ(ZANTOFILTER[253], 255);
    EXPECT_EQ(ZANTOFILTER[255], 246);
}

TEST(ColorFilter, ShiftByLuminanceWithAndWithoutMask) {
    // colour (R bits 0-7) -> expected shift
    const std::pair<uint32_t, int> cases[] = {{0x000000, -44}, {0xFFFFFF, 47},  {0x0000FF, -17}, {0x00FF00, 8},
                                              {0xFF0000, -33}, {0x404040, -21}, {0xC0C0C0, 23}};
    uint32_t seed = 1;
    for (auto [colour, delta] : cases)
        for (bool masked : {false, true}) {
            Owned img = random_image(13, 9, 8, seed++);
            Owned mask = random_image(7, 11, 8, seed++);
            Owned before = clone(img.get());
            ASSERT_EQ(ColorFilter(img.get(), colour, masked ? mask.get() : nullptr), 1);
            for (int y = 0; y < 9; ++y)
                for (int x = 0; x < 13; ++x) {
                    const int v = GetPixelIndex(before.get(), x, y);
                    const bool sel = !masked || (x < 7 && GetPixelIndex(mask.get(), x, y) != 0);
                    const int want = sel ? std::min(255, std::max(0, v + delta)) : v;
                    ASSERT_EQ(GetPixelIndex(img.get(), x, y), want) << colour << " " << x << "," << y;
                }
        }
}

TEST(ColorFilter, NeutralColoursAndRefusals) {
    Owned img = random_image(5, 5, 8, 3);
    Owned before = clone(img.get());
    EXPECT_EQ(ColorFilter(img.get(), 0x7F7F7F, nullptr), 1); // luminance 127
    EXPECT_EQ(ColorFilter(img.get(), 0x808080, nullptr), 1); // luminance 128
    EXPECT_EQ(diff(img.get(), before.get()), "");
    Owned rgb = random_image(5, 5, 24, 4);
    Owned wide = random_image(5, 5, 24, 5);
    EXPECT_EQ(ColorFilter(rgb.get(), 0, nullptr), 0);
    EXPECT_EQ(ColorFilter(nullptr, 0, nullptr), 0);
    EXPECT_EQ(ColorFilter(img.get(), 0, wide.get()), 0);
    EXPECT_EQ(ColorFilter24(img.get(), 0, nullptr), 0);
    EXPECT_EQ(ColorFilter24(rgb.get(), 0, wide.get()), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
}

TEST(ColorFilter24, TintTowardColour) {
    uint32_t seed = 10;
    for (uint32_t colour : {0x000000u, 0xFFFFFFu, 0x123456u, 0xFF0080u})
        for (bool masked : {false, true}) {
            Owned img = random_image(11, 6, 24, seed++);
            Owned mask = random_image(4, 9, 8, seed++);
            Owned before = clone(img.get());
            ASSERT_EQ(ColorFilter24(img.get(), colour, masked ? mask.get() : nullptr), 1);
            const uint32_t b = (colour >> 16) & 255, g = (colour >> 8) & 255, r = colour & 255;
            for (int y = 0; y < 6; ++y)
                for (int x = 0; x < 11; ++x) {
                    const uint32_t c = GetPixelColor(before.get(), x, y);
                    uint32_t want = c;
                    if (!masked || (x < 4 && GetPixelIndex(mask.get(), x, y) != 0))
                        want = 0xFF000000u | (210 * (c & 255) + 45 * b) / 255 |
                               (210 * ((c >> 8) & 255) + 45 * g) / 255 << 8 |
                               (210 * ((c >> 16) & 255) + 45 * r) / 255 << 16;
                    ASSERT_EQ(GetPixelColor(img.get(), x, y), want) << x << "," << y;
                }
        }
}

TEST(ColorFilter1, ArcCurveBothWays) {
    uint32_t seed = 30;
    for (int level : {0, 1, 60, 127, 129, 200, 254, 255}) {
        Owned img = random_image(17, 5, 8, seed++);
        Owned before = clone(img.get());
        ASSERT_EQ(ColorFilter1(img.get(), level), 1);
        const std::vector<int> t = arc_map(level);
        for (int y = 0; y < 5; ++y)
            for (int x = 0; x < 17; ++x)
                ASSERT_EQ(GetPixelIndex(img.get(), x, y), t[GetPixelIndex(before.get(), x, y)]) << level;
    }
    // Brightening lifts the middle and keeps the ends.
    const std::vector<int> up = arc_map(255);
    EXPECT_EQ(up[0], 0);
    EXPECT_EQ(up[255], 255);
    EXPECT_GT(up[128], 128);
}

TEST(ColorFilterZanto, BlendOfIdentityAndCurve) {
    uint32_t seed = 50;
    for (int level : {0, 1, 64, 127, 129, 192, 255}) {
        Owned img = random_image(9, 7, 8, seed++);
        Owned before = clone(img.get());
        ASSERT_EQ(ColorFilter_zanto(img.get(), level), 1);
        const int d = std::abs(level - 128), e = 127 - d;
        const uint8_t *curve = level > 128 ? ZANTOFILTER : ZANTOFILTERBK;
        for (int y = 0; y < 7; ++y)
            for (int x = 0; x < 9; ++x) {
                const int v = GetPixelIndex(before.get(), x, y);
                ASSERT_EQ(GetPixelIndex(img.get(), x, y), ((e * v + d * curve[v] + 63) / 127) & 255) << level;
            }
    }
    Owned ramp = make(256, 1, 8);
    for (int v = 0; v < 256; ++v)
        ramp->bits[v] = uint8_t(v);
    ASSERT_EQ(ColorFilter_zanto(ramp.get(), 255), 1);
    EXPECT_EQ(0, std::memcmp(ramp->bits, ZANTOFILTER, 256));
}

TEST(ColorFilterLevels, NeutralAndOutOfRangeRefused) {
    Owned img = random_image(6, 6, 8, 70);
    Owned before = clone(img.get());
    Owned rgb = random_image(6, 6, 24, 71);
    for (int level : {128, -1, 256, INT32_MIN, INT32_MAX}) {
        EXPECT_EQ(ColorFilter1(img.get(), level), 0);
        EXPECT_EQ(ColorFilter_zanto(img.get(), level), 0);
    }
    EXPECT_EQ(ColorFilter1(rgb.get(), 200), 0);
    EXPECT_EQ(ColorFilter_zanto(rgb.get(), 200), 0);
    EXPECT_EQ(ColorFilter_zanto(nullptr, 200), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
}
