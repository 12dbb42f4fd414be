// Medians and the edge marker against straightforward versions on random
// planes.
#include <tuple>

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
void check(int32_t (*filter)(Image *, Image **), Owned (*reference)(const Image *)) {
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
}

} // namespace

TEST(RankFilters, MediansAndEdgeMarkerMatchStraightforwardVersions) {
    check(MyFliter, reference_median<true>);
    check(MyFliter1, reference_median<false>);
    check(MyEdge, reference_edge);
}

// A filter whose windows fit no column or row reads nothing (the registry's
// contracts pin the sizes and the new white plane); worked in place, such a
// plane becomes white too.
TEST(RankFilters, SmallPlanesInPlaceBecomeWhite) {
    const std::tuple<int32_t (*)(Image *, Image **), int32_t, int32_t> cases[] = {
        {MyFliter, 15, 1}, {MyFliter1, 6, 2}, {MyEdge, 9, 2}};
    for (const auto &[filter, w, h] : cases) {
        Owned im = random_image(w, h, 8, 40);
        EXPECT_EQ(filter(im.get(), nullptr), 1);
        EXPECT_EQ(diff(im.get(), make(w, h, 8).get()), "") << w << "x" << h;
    }
}

// An image already in the slot receives the result through PX_Img_Copy,
// clamped to its size and converted to its bit count; a slot record without
// pixels is left as it is. 1 in both cases.
TEST(RankFilters, DeliveryIntoTheSlotsImage) {
    Owned src = random_image(6, 5, 8, 4), edges = reference_edge(src.get()), want = make(8, 3, 24);
    for (int32_t y = 0; y < 3; ++y)
        for (int32_t x = 0; x < 8; ++x)
            SetPixelColor(want.get(), x, y, GetPixelColor(edges.get(), x, y));
    Slot wider;
    wider.image = malloc_Image(8, 3, 24);
    ASSERT_EQ(MyEdge(src.get(), &wider), 1);
    EXPECT_EQ(diff(wider.get(), want.get()), "");
    for (Image hollow : {Image{6, 5, 8, nullptr, 8, 0}, Image{2, 9, 24, nullptr, 8, 3}}) {
        const Image kept = hollow;
        Image *slot = &hollow;
        EXPECT_EQ(MyEdge(src.get(), &slot), 1);
        EXPECT_TRUE(slot == &hollow && hollow.bits == nullptr && hollow.width == kept.width &&
                    hollow.height == kept.height && hollow.bitCount == kept.bitCount && hollow.pitch == kept.pitch &&
                    hollow.tag == kept.tag);
    }
}
