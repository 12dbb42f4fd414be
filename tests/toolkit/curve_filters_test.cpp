// Curve tables and the curve-table colour filters against per-sample maps
// written straight from their rules.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <functional>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// The level map an 8-bit filter applies, read off a picture of every level.
std::vector<int> map_of(const std::function<int32_t(Image *)> &fn) {
    Owned ramp = make(16, 16, 8);
    for (int v = 0; v < 256; ++v)
        ramp->bits[v / 16 * 16 + v % 16] = uint8_t(v);
    EXPECT_EQ(fn(ramp.get()), 1);
    return std::vector<int>(ramp->bits, ramp->bits + 256);
}

// Sum of (i + 1) * t[i] over 256 entries: a moved or changed entry shows.
template <class T> int64_t weighted_sum(const T *t) {
    int64_t sum = 0;
    for (int i = 0; i < 256; ++i)
        sum += int64_t(i + 1) * t[i];
    return sum;
}

} // namespace

TEST(CurveTables, WeightedSums) {
    const std::pair<const uint8_t *, int64_t> tables[] = {
        {ZANTOMOPI, 6047599}, {ZANTOFILTERBK, 4145935}, {ZANTOFILTER, 6930454}};
    for (auto [t, want] : tables)
        EXPECT_EQ(weighted_sum(t), want);
}

TEST(ColorFilter, LevelMaps) {
    // colour (R in bits 0-7) -> shift; luminance 127 and 128 change nothing
    const std::pair<uint32_t, int> shifts[] = {{0x000000, -44}, {0xFFFFFF, 47}, {0x0000FF, -17}, {0x00FF00, 8},
                                               {0xFF0000, -33}, {0x7F7F7F, 0},  {0x808080, 0}};
    for (auto [colour, delta] : shifts) {
        std::vector<int> want(256);
        for (int v = 0; v < 256; ++v)
            want[v] = std::min(255, std::max(0, v + delta));
        EXPECT_EQ(map_of([&](Image *i) { return ColorFilter(i, colour, nullptr); }), want) << colour;
    }
    // ColorFilter1 bows a circle through both ends by the strength and
    // inverts it when darkening: its maps as weighted sums.
    const std::pair<int, int64_t> bowed[] = {{0, 3625129},   {1, 3625129},   {60, 3821173}, {127, 3968242},
                                             {129, 6914945}, {200, 7016953}, {255, 7132103}};
    for (auto [level, want] : bowed) {
        const int d = std::abs(level - 128), e = 127 - d;
        const uint8_t *curve = level > 128 ? ZANTOFILTER : ZANTOFILTERBK;
        std::vector<int> blend(256);
        for (int i = 0; i < 256; ++i)
            blend[i] = ((e * i + d * curve[i] + 63) / 127) & 255;
        EXPECT_EQ(weighted_sum(map_of([&](Image *i) { return ColorFilter1(i, level); }).data()), want) << level;
        EXPECT_EQ(map_of([&](Image *i) { return ColorFilter_zanto(i, level); }), blend) << level;
    }
}

TEST(ColorFilter, TintAndMasks) {
    Owned mask = random_image(7, 11, 8, 99), gray = random_image(13, 9, 8, 1), rgb = random_image(13, 9, 24, 2);
    Owned gray0 = clone(gray.get()), rgb0 = clone(rgb.get());
    mask->bits[0] = 0;
    ASSERT_EQ(ColorFilter(gray.get(), 0, mask.get()) + ColorFilter24(rgb.get(), 0xFF0080, mask.get()), 2);
    for (int y = 0; y < 9; ++y)
        for (int x = 0; x < 13; ++x) {
            const bool sel = x < 7 && GetPixelIndex(mask.get(), x, y) != 0;
            const int v = GetPixelIndex(gray0.get(), x, y);
            EXPECT_EQ(GetPixelIndex(gray.get(), x, y), sel ? std::max(0, v - 44) : v);
            const uint32_t c = GetPixelColor(rgb0.get(), x, y), target[3] = {0xFF, 0x00, 0x80};
            for (int k = 0; k < 3; ++k) { // pixel bytes blue, green, red against colour bits 16-23, 8-15, 0-7
                const uint32_t b = (c >> 8 * k) & 255;
                EXPECT_EQ((GetPixelColor(rgb.get(), x, y) >> 8 * k) & 255, sel ? (210 * b + 45 * target[k]) / 255 : b);
            }
        }
}

TEST(ColorFilter, Refusals) {
    Owned img = random_image(6, 6, 8, 70), before = clone(img.get()), rgb = random_image(6, 6, 24, 71);
    for (int level : {128, -1, 256, INT32_MIN})
        EXPECT_EQ(ColorFilter1(img.get(), level) + ColorFilter_zanto(img.get(), level), 0);
    EXPECT_EQ(ColorFilter1(rgb.get(), 200) + ColorFilter_zanto(rgb.get(), 200) + ColorFilter_zanto(nullptr, 200), 0);
    EXPECT_EQ(ColorFilter(rgb.get(), 0, nullptr) + ColorFilter(img.get(), 0, rgb.get()), 0);
    EXPECT_EQ(ColorFilter24(img.get(), 0, nullptr) + ColorFilter24(rgb.get(), 0, rgb.get()), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
}
