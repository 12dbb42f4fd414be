// Thresholds with and without spread, band binarisation and dot removal.
#include <gtest/gtest.h>

#include <cstring>

#include "lines/lines_internal.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

TEST(Threshold, SmallSpreadGivesWhite) {
    uint32_t h[256] = {};
    for (int v = 100; v < 170; ++v)
        h[v] = 10;
    h[0] = 10, h[255] = 10; // tails inside the outer 1/32 do not count as spread
    EXPECT_EQ(GetMaxHtoThrod2(h, 0), 255);
    uint32_t empty[256] = {};
    EXPECT_EQ(GetMaxHtoThrod2(empty, 0), 255);
    EXPECT_EQ(GetMaxHtoThrod2(h, -5), 255);
    EXPECT_EQ(GetMaxHtoThrod2(nullptr, 0), 255);
}

TEST(Threshold, OtsuTiesGoToTheLaterLevelAndFloorIs60) {
    uint32_t two[256] = {};
    two[30] = 1000, two[220] = 1000;
    EXPECT_EQ(GetMaxHtoThrod2(two, 0), 219);
    EXPECT_EQ(GetMaxHtoThrod2(two, 2000), 219);
    uint32_t three[256] = {};
    three[0] = 1000, three[40] = 1000, three[120] = 100; // best split is at 39
    EXPECT_EQ(GetMaxHtoThrod2(three, 0), 60);
}

TEST(BandThreshold, EachBandOfThirtySevenRowsHasItsOwnLevel) {
    Owned im = make(20, 80, 8);
    for (int32_t y = 0; y < 80; ++y)
        for (int32_t x = 0; x < 20; ++x) {
            uint8_t v;
            if (y < 37)
                v = x < 10 ? 30 : 220; // spread: split between
            else if (y < 74)
                v = x == 3 ? 129 : 128; // no spread: all dark
            else
                v = x < 5 ? 0 : 250; // last, short band
            im->bits[y * im->pitch + x] = v;
        }
    Owned out = make(20, 80, 8);
    pxfx::lines::band_threshold(im.get(), out.get());
    for (int32_t y = 0; y < 80; ++y)
        for (int32_t x = 0; x < 20; ++x) {
            const bool dark = y < 37 ? x < 10 : (y < 74 ? true : x < 5);
            ASSERT_EQ(out->bits[y * out->pitch + x], dark ? 1 : 255) << x << "," << y;
        }
}

TEST(BandThreshold, IsolatedDotsAreCleared) {
    Owned im = make(8, 1, 8);
    const uint8_t row[8] = {1, 255, 1, 255, 1, 1, 255, 1};
    const uint8_t want[8] = {1, 255, 255, 255, 1, 1, 255, 1};
    std::memcpy(im->bits, row, 8);
    pxfx::lines::remove_isolated_dots(im.get());
    EXPECT_EQ(std::memcmp(im->bits, want, 8), 0);
}

TEST(BinImg, SlotGetsAFreshImageAndTheInputStays) {
    Owned src = random_image(30, 40, 8, 7);
    Owned keep = clone(src.get());
    Slot slot;
    slot.image = malloc_Image(3, 3, 24);
    ASSERT_EQ(BinImg(src.get(), &slot), 1);
    ASSERT_NE(slot.get(), nullptr);
    EXPECT_EQ(slot->width, 30);
    EXPECT_EQ(slot->height, 40);
    EXPECT_EQ(diff(src.get(), keep.get()), "");
    ASSERT_EQ(BinImg(keep.get(), nullptr), 1);
    EXPECT_EQ(diff(slot.get(), keep.get()), "");
    // The input itself in the slot is worked on in place, not released.
    Image *self = src.get();
    ASSERT_EQ(BinImg(src.get(), &self), 1);
    EXPECT_EQ(self, src.get());
    EXPECT_EQ(diff(src.get(), keep.get()), "");
    EXPECT_EQ(BinImg(random_image(4, 4, 24, 1).get(), nullptr), 0);
    EXPECT_EQ(BinImg(nullptr, nullptr), 0);
}
