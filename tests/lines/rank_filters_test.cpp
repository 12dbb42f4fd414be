// Medians and the edge marker against straightforward versions on random
// planes, and the red/blue exchange.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// Median of the 5 x 5 box, or of the cross of the 15 pixels of the row and
// 4 more of the column, for rows 3 .. h - 4 and the columns the filter
// visits; 255 elsewhere.
template <bool cross> Owned reference_median(const Image *src) {
    const int32_t left = cross ? 7 : 2, right = cross ? 8 : 4;
    Owned out = make(src->width, src->height, 8);
    for (int32_t y = 3; y <= src->height - 4; ++y)
        for (int32_t x = left; x < src->width - right; ++x) {
            std::vector<uint8_t> v;
            for (int32_t dy = -2; dy <= 2; ++dy)
                for (int32_t dx = -7; dx <= 7; ++dx)
                    if (cross ? dx == 0 || dy == 0 : dx >= -2 && dx <= 2)
                        v.push_back(GetPixelIndex(src, x + dx, y + dy));
            std::sort(v.begin(), v.end());
            SetPixelIndex(out.get(), x, y, v[v.size() / 2]);
        }
    return out;
}

Owned reference_edge(const Image *src) {
    Owned out = make(src->width, src->height, 8);
    for (int32_t y = 0; y + 2 < src->height; ++y)
        for (int32_t x = 1; x < src->width - 1; ++x) {
            const int32_t a = GetPixelIndex(src, x, y), b = GetPixelIndex(src, x, y + 2);
            SetPixelIndex(out.get(), x, y, a > b + 9 ? 0 : (b > a + 9 ? 255 : a));
        }
    return out;
}

// Every size around the windows, on random planes; odd seeds keep eight
// levels (0..3, 8..11) so that ranks fall on ties and differences straddle
// the edge marker's step of 9.
void check(int32_t (*filter)(Image *, Image **), Owned (*reference)(const Image *), int32_t minHeight) {
    const int32_t sizes[][2] = {{1, 5}, {6, 7}, {7, 9}, {15, 8}, {16, 8}, {17, 5}, {19, 6}, {23, 11}, {45, 33}};
    uint32_t seed = 1;
    for (auto [w, h] : sizes) {
        Owned src = random_image(w, h, 8, seed++);
        for (size_t i = 0; seed % 2 == 0 && i < size_t(src->pitch) * h; ++i)
            src->bits[i] &= 0x0B;
        Owned want = reference(src.get());
        Slot handed;
        ASSERT_EQ(filter(src.get(), &handed), 1);
        EXPECT_EQ(diff(handed.get(), want.get()), "") << w << "x" << h;
    }
    EXPECT_EQ(minHeight > 1 ? filter(random_image(30, minHeight - 1, 8, 9).get(), nullptr) : 0, 0);
}

} // namespace

TEST(RankFilters, MediansAndEdgeMarkerMatchStraightforwardVersions) {
    check(MyFliter, reference_median<true>, 5);
    check(MyFliter1, reference_median<false>, 5);
    check(MyEdge, reference_edge, 1);
}

TEST(RGB_Reverse, SwapsRedAndBlueOfColourPixelsOnly) {
    for (int32_t bc : kBitCounts) {
        Owned im = filled(3, 2, bc, 0x80112233u);
        ASSERT_EQ(RGB_Reverse(im.get()), 1);
        EXPECT_EQ(diff(im.get(), filled(3, 2, bc, bc < 24 ? 0x80112233u : 0x80332211u).get()), "") << bc;
    }
}
