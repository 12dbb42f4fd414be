// Box smoothing against full box sums read through the accessors, the
// running sums against full sums at large sizes, and PX_IMG_Smooth.
#include <gtest/gtest.h>

#include <algorithm>
#include <climits>

#include "color/box_filter.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// Full box sums into a white working image that is copied over the picture.
Owned reference_box(const Image *src, int32_t size, int32_t offset) {
    const int32_t w = src->width, h = src->height, half = size / 2, bc = int32_t(src->bitCount);
    Owned work = make(w, h, bc), result = clone(src);
    for (int32_t y = 0; y < h && bc != 16; ++y)
        for (int32_t x = 0; x < w; ++x) {
            int64_t s[4] = {0, 0, 0, 0};
            for (int32_t dx = -half; dx < size - half; ++dx)
                for (int32_t dy = -half; dy < size - half; ++dy)
                    for (int k = 0; k < 4; ++k)
                        s[k] += (GetPixelColor(src, x + dx, y + dy) >> (8 * k)) & 255;
            uint32_t out = 0;
            for (int k = 0; k < 4; ++k)
                out |= uint32_t(std::clamp<int64_t>(s[k] / (int64_t(size) * size) + offset, 0, 255)) << (8 * k);
            SetPixelColor(work.get(), x, y, bc == 8 ? out << 8 : out);
        }
    PX_Img_Copy(result.get(), work.get());
    return result;
}

} // namespace

TEST(FilterFast, MatchesFullBoxSumsAndRefusesBadSizes) {
    const int32_t sizes[][2] = {{1, 1}, {1, 7}, {7, 1}, {2, 2}, {5, 4}, {11, 13}};
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : sizes)
            for (int32_t size : {1, 2, 3, 4, 5, 8, 15}) {
                const int32_t offset = int32_t(seed % 3) * 25 - 25;
                Owned img = random_image(w, h, bc, seed++);
                Owned want = reference_box(img.get(), size, offset);
                ASSERT_EQ(Filter_fast(img.get(), size, offset), 1);
                ASSERT_EQ(diff(img.get(), want.get()), "") << bc << " " << w << "x" << h << " size " << size;
            }
    // Large sizes (64-bit sums above 2901): the running sums against full sums.
    for (int32_t bc : {8, 24, 32})
        for (int32_t size : {31, 2901, 2902, 100000}) {
            Owned a = random_image(9, 7, bc, seed++), b = clone(a.get());
            ASSERT_EQ(pxfx::box_filter(a.get(), size, 3, true) + pxfx::box_filter(b.get(), size, 3, false), 2);
            EXPECT_EQ(diff(a.get(), b.get()), "") << bc << " size " << size;
        }
    Owned ramp = make(2, 1, 8);
    ramp->bits[0] = 0;
    ramp->bits[1] = 200;
    ASSERT_EQ(Filter_fast(ramp.get(), 4000, 0), 1); // columns -2000..1999: 1999 read 200
    EXPECT_EQ(ramp->bits[0], 200 * 1999 / 4000);
    Owned img = random_image(6, 5, 24, 3), before = clone(img.get());
    for (int32_t size : {0, -3, INT32_MIN, pxfx::kMaxBoxSize + 1})
        EXPECT_EQ(Filter_fast(img.get(), size, 0) + Filter_fast(nullptr, 3, 0), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
}

TEST(Smooth, StrengthSlotsAndInPlace) {
    Owned src = random_image(9, 8, 32, 5);
    Slot out, gray;
    ASSERT_EQ(PX_IMG_Smooth(src.get(), &out, 5), 1); // size 0: a plain copy
    EXPECT_EQ(diff(out.get(), src.get()), "");
    Image *kept = gray.image = malloc_Image(3, 3, 8); // an existing result is used as it stands
    ASSERT_EQ(PX_IMG_Smooth(src.get(), &gray, 30), 1);
    EXPECT_EQ(gray.get(), kept);
    Owned want = reference_box(src.get(), 10, 0);
    ASSERT_EQ(PX_IMG_Smooth(src.get(), nullptr, 150), 1); // in place
    EXPECT_EQ(diff(src.get(), want.get()), "");
    Image hollow = *src, *hp = &hollow;
    hollow.bits = nullptr;
    EXPECT_EQ(PX_IMG_Smooth(&hollow, &out, 50) + PX_IMG_Smooth(src.get(), &hp, 50), 0);
}
