// Box smoothing against full box sums read through the accessors, the
// running sums against full sums at large sizes, and PX_IMG_Smooth.
#include <gtest/gtest.h>

#include <algorithm>
#include <climits>

#include "color/box_filter.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// Filter_fast pixel by pixel: full box sums into a white working image that
// is then copied over the picture.
Owned reference_box(const Image *src, int32_t size, int32_t offset) {
    const int32_t w = src->width, h = src->height, half = size / 2, bc = int32_t(src->bitCount);
    Owned work = make(w, h, bc);
    for (int32_t y = 0; y < h && bc != 16; ++y)
        for (int32_t x = 0; x < w; ++x) {
            int64_t s[4] = {0, 0, 0, 0};
            for (int32_t dx = -half; dx < size - half; ++dx)
                for (int32_t dy = -half; dy < size - half; ++dy) {
                    const uint32_t c =
                        bc == 8 ? GetPixelIndex(src, x + dx, y + dy) : GetPixelColor(src, x + dx, y + dy);
                    for (int k = 0; k < 4; ++k)
                        s[k] += (c >> (8 * k)) & 255;
                }
            uint32_t out = 0;
            for (int k = 0; k < 4; ++k)
                out |= uint32_t(std::clamp<int64_t>(s[k] / (int64_t(size) * size) + offset, 0, 255)) << (8 * k);
            if (bc == 8)
                SetPixelIndex(work.get(), x, y, int32_t(out & 255));
            else
                SetPixelColor(work.get(), x, y, out);
        }
    Owned result = clone(src);
    PX_Img_Copy(result.get(), work.get());
    return result;
}

const int32_t kSizes[][2] = {{1, 1}, {1, 7}, {7, 1}, {2, 2}, {5, 4}, {11, 13}, {16, 3}};

} // namespace

TEST(FilterFast, MatchesFullBoxSums) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t size : {1, 2, 3, 4, 5, 8, 15})
                for (int32_t offset : {0, 21, -30}) {
                    Owned img = random_image(w, h, bc, seed++);
                    Owned want = reference_box(img.get(), size, offset);
                    ASSERT_EQ(Filter_fast(img.get(), size, offset), 1);
                    ASSERT_EQ(diff(img.get(), want.get()), "")
                        << bc << " " << w << "x" << h << " size " << size << " offset " << offset;
                }
}

TEST(FilterFast, RunningSumsEqualFullSumsAtEverySize) {
    uint32_t seed = 900;
    for (int32_t bc : {8, 24, 32})
        for (int32_t size : {6, 31, 2901, 2902, 100000}) {
            Owned a = random_image(9, 7, bc, seed++);
            Owned b = clone(a.get());
            ASSERT_EQ(pxfx::box_filter(a.get(), size, 3, true), 1);
            ASSERT_EQ(pxfx::box_filter(b.get(), size, 3, false), 1);
            EXPECT_EQ(diff(a.get(), b.get()), "") << bc << " size " << size;
        }
    // A box far larger than the picture weighs the edge pixels by their reach.
    Owned ramp = make(2, 1, 8);
    ramp->bits[0] = 0;
    ramp->bits[1] = 200;
    ASSERT_EQ(Filter_fast(ramp.get(), 4000, 0), 1); // columns -2000..1999: 1999 of them read 200
    EXPECT_EQ(ramp->bits[0], 200 * 1999 / 4000);
}

TEST(FilterFast, NamedBehaviours) {
    Owned img = random_image(6, 5, 24, 3);
    Owned want = clone(img.get());
    for (int i = 0; i < 5 * int(want->pitch); ++i)
        want->bits[i] = uint8_t(std::min(255, want->bits[i] + 40));
    ASSERT_EQ(Filter_fast(img.get(), 1, 40), 1);
    EXPECT_EQ(diff(img.get(), want.get()), "");
    Owned flat = filled(7, 6, 32, 0xFF405060), same = clone(flat.get());
    ASSERT_EQ(Filter_fast(flat.get(), 5, 0), 1);
    EXPECT_EQ(diff(flat.get(), same.get()), "");
    ASSERT_EQ(Filter_fast(flat.get(), 3, 10), 1);
    EXPECT_EQ(GetPixelColor(flat.get(), 2, 2), 0xFF4A5A6Au); // alpha offset too, clamped at 255
    Owned w16 = random_image(4, 4, 16, 4);
    ASSERT_EQ(Filter_fast(w16.get(), 3, 0), 1);
    EXPECT_EQ(GetPixelColor(w16.get(), 1, 1), 0x00F8FCF8u);
    Owned before = clone(img.get());
    for (int32_t size : {0, -3, INT32_MIN, pxfx::kMaxBoxSize + 1})
        EXPECT_EQ(Filter_fast(img.get(), size, 0), 0);
    EXPECT_EQ(Filter_fast(nullptr, 3, 0), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
}

TEST(Smooth, StrengthSlotsAndInPlace) {
    Owned src = random_image(9, 8, 32, 5);
    Slot out;
    ASSERT_EQ(PX_IMG_Smooth(src.get(), &out, 5), 1); // size 0: a plain copy
    EXPECT_EQ(diff(out.get(), src.get()), "");
    for (int32_t strength : {25, 150}) {
        Owned want = reference_box(src.get(), std::min(strength, 100) / 10, 0);
        ASSERT_EQ(PX_IMG_Smooth(src.get(), &out, strength), 1);
        EXPECT_EQ(diff(out.get(), want.get()), "") << strength;
    }
    // An existing result of another format is used as it stands.
    Slot gray;
    gray.image = malloc_Image(3, 3, 8);
    Image *kept = gray.get();
    ASSERT_EQ(PX_IMG_Smooth(src.get(), &gray, 30), 1);
    EXPECT_EQ(gray.get(), kept);
    EXPECT_EQ(gray->width, 3);
    // Without a slot the source itself is smoothed.
    Owned want = reference_box(src.get(), 4, 0);
    ASSERT_EQ(PX_IMG_Smooth(src.get(), nullptr, 45), 1);
    EXPECT_EQ(diff(src.get(), want.get()), "");
    Image hollow = *src;
    hollow.bits = nullptr;
    Image *hp = &hollow;
    EXPECT_EQ(PX_IMG_Smooth(&hollow, &out, 50), 0);
    EXPECT_EQ(PX_IMG_Smooth(src.get(), &hp, 50), 0);
}
