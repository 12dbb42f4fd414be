// Thresholds with and without spread, band binarisation and dot removal.
#include <gtest/gtest.h>

#include "lines/lines_internal.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

TEST(Threshold, SpreadTestOtsuAndFloor) {
    uint32_t h[256] = {};
    std::fill(h + 100, h + 170, 10u);
    h[0] = h[255] = 10; // tails within the outer 1/32 are no spread
    const uint32_t empty[256] = {};
    EXPECT_EQ(GetMaxHtoThrod2(h, -5) & GetMaxHtoThrod2(empty, 0), 255);
    // Otsu: ties go to the later level, and the level is at least 60.
    uint32_t two[256] = {};
    two[30] = two[220] = 1000;
    EXPECT_EQ(GetMaxHtoThrod2(two, 0) + GetMaxHtoThrod2(two, 2000), 2 * 219);
    uint32_t three[256] = {};
    three[0] = three[40] = 1000, three[120] = 100; // best split at 39
    EXPECT_EQ(GetMaxHtoThrod2(three, 0), 60);
}

TEST(BandThreshold, EachBandOfThirtySevenRowsHasItsOwnLevel) {
    // Rows 0..36 spread (split between 30 and 220), rows 37..73 without
    // spread (all dark), rows 74..79 the short last band.
    Owned im = make(20, 80, 8), out = make(20, 80, 8), want = make(20, 80, 8);
    for (int32_t y = 0; y < 80; ++y)
        for (int32_t x = 0; x < 20; ++x) {
            im->bits[y * im->pitch + x] = y < 37 ? (x < 10 ? 30 : 220) : y < 74 ? 128 + (x == 3) : (x < 5 ? 0 : 250);
            want->bits[y * want->pitch + x] = (y < 37 ? x < 10 : y < 74 || x < 5) ? 1 : 255;
        }
    pxfx::lines::band_threshold(im.get(), out.get());
    EXPECT_EQ(diff(out.get(), want.get()), "");

    // Dots are judged on the row as it was, across the 64-pixel chunks.
    auto one = [](int32_t x) { return x % 3 == 0 || x % 5 == 0; };
    Owned dots = make(70, 1, 8), kept = make(70, 1, 8);
    for (int32_t x = 0; x < 70; ++x) {
        dots->bits[x] = one(x) ? 1 : 255;
        kept->bits[x] = one(x) && !(x > 0 && x < 69 && !one(x - 1) && !one(x + 1)) ? 1 : 255;
    }
    pxfx::lines::remove_isolated_dots(dots.get());
    EXPECT_EQ(diff(dots.get(), kept.get()), "");
}

TEST(BinImg, SlotGetsAFreshImageAndTheInputStays) {
    Owned src = random_image(30, 40, 8, 7), inPlace = clone(src.get());
    Slot slot;
    slot.image = malloc_Image(3, 3, 24);
    ASSERT_EQ(BinImg(src.get(), &slot) + BinImg(inPlace.get(), nullptr), 2);
    EXPECT_EQ(diff(slot.get(), inPlace.get()), "");
    Image *self = src.get(); // the input in its own slot is worked in place
    ASSERT_EQ(BinImg(src.get(), &self), 1);
    EXPECT_EQ(diff(self, inPlace.get()), "");
    EXPECT_EQ(BinImg(random_image(4, 4, 24, 1).get(), nullptr), 0);
}
