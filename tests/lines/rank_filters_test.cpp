// Medians and the edge marker against straightforward sorting versions on
// random planes, and the red/blue exchange.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

uint8_t px(const Image *im, int32_t x, int32_t y) { return GetPixelIndex(im, x, y); }

Owned reference_cross(const Image *src) {
    Owned out = make(src->width, src->height, 8);
    for (int32_t y = 3; y <= src->height - 4; ++y)
        for (int32_t x = 7; x <= src->width - 9; ++x) {
            std::vector<uint8_t> v;
            for (int32_t d = -2; d <= 2; ++d)
                v.push_back(px(src, x, y + d));
            for (int32_t d = -7; d <= 7; ++d)
                if (d != 0) v.push_back(px(src, x + d, y));
            std::sort(v.begin(), v.end());
            SetPixelIndex(out.get(), x, y, v[9]);
        }
    return out;
}

Owned reference_box(const Image *src) {
    Owned out = make(src->width, src->height, 8);
    for (int32_t y = 3; y <= src->height - 4; ++y)
        for (int32_t x = 2; x <= src->width - 5; ++x) {
            std::vector<uint8_t> v;
            for (int32_t dy = -2; dy <= 2; ++dy)
                for (int32_t dx = -2; dx <= 2; ++dx)
                    v.push_back(px(src, x + dx, y + dy));
            std::sort(v.begin(), v.end());
            SetPixelIndex(out.get(), x, y, v[12]);
        }
    return out;
}

Owned reference_edge(const Image *src) {
    Owned out = make(src->width, src->height, 8);
    for (int32_t y = 0; y + 2 < src->height; ++y)
        for (int32_t x = 1; x < src->width - 1; ++x) {
            const int32_t a = px(src, x, y), b = px(src, x, y + 2);
            SetPixelIndex(out.get(), x, y, a > b + 9 ? 0 : (b > a + 9 ? 255 : a));
        }
    return out;
}

// Random planes, half of them with few levels so that ranks fall on ties.
Owned plane(int32_t w, int32_t h, uint32_t seed) {
    Owned im = random_image(w, h, 8, seed);
    if (seed % 2 == 0)
        for (int32_t y = 0; y < h; ++y)
            for (int32_t x = 0; x < w; ++x)
                im->bits[y * im->pitch + x] &= 0x31;
    return im;
}

using Filter = int32_t (*)(Image *, Image **);
using Reference = Owned (*)(const Image *);

void check(Filter filter, Reference reference, int32_t minHeight) {
    const int32_t sizes[][2] = {{1, 5}, {6, 7}, {7, 9}, {15, 8}, {16, 8}, {17, 5}, {19, 6}, {23, 11}, {45, 33}};
    uint32_t seed = 1;
    for (auto [w, h] : sizes) {
        Owned src = plane(w, h, seed++);
        Owned want = reference(src.get());
        Slot handed;
        ASSERT_EQ(filter(src.get(), &handed), 1) << w << "x" << h;
        EXPECT_EQ(diff(handed.get(), want.get()), "") << w << "x" << h;
        ASSERT_EQ(filter(src.get(), nullptr), 1);
        EXPECT_EQ(diff(src.get(), want.get()), "") << w << "x" << h;
    }
    if (minHeight > 1) {
        EXPECT_EQ(filter(plane(30, minHeight - 1, 9).get(), nullptr), 0);
    }
    EXPECT_EQ(filter(make(30, 30, 24).get(), nullptr), 0);
    EXPECT_EQ(filter(nullptr, nullptr), 0);
}

} // namespace

TEST(RankFilters, CrossMedianMatchesSorting) { check(MyFliter, reference_cross, 5); }

TEST(RankFilters, BoxMedianMatchesSorting) { check(MyFliter1, reference_box, 5); }

TEST(RankFilters, EdgeMarkerMatchesItsRule) { check(MyEdge, reference_edge, 1); }

TEST(RGB_Reverse, SwapsRedAndBlueOfColourPixelsOnly) {
    for (int32_t bc : kBitCounts) {
        Owned im = random_image(5, 3, bc, 11);
        Owned before = clone(im.get());
        ASSERT_EQ(RGB_Reverse(im.get()), 1);
        for (int32_t y = 0; y < 3; ++y)
            for (int32_t x = 0; x < 5; ++x) {
                const uint32_t a = GetPixelColor(before.get(), x, y), b = GetPixelColor(im.get(), x, y);
                const uint32_t swapped =
                    (bc == 24 || bc == 32) ? (a & 0xFF00FF00u) | (a >> 16 & 0xFF) | (a & 0xFF) << 16 : a;
                ASSERT_EQ(b, swapped) << bc;
            }
    }
    EXPECT_EQ(RGB_Reverse(nullptr), 0);
}
