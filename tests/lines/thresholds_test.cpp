// Thresholds with and without spread, band binarisation, dot removal, and
// the band codes written on synthetic binarised pages of horizontal lines.
#include "lines/lines_internal.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

TEST(Threshold, SpreadTestOtsuAndFloor) {
    uint32_t h[256] = {}, empty[256] = {}, two[256] = {}, three[256] = {};
    std::fill(h + 100, h + 170, 10u);
    h[0] = h[255] = 10; // tails within the outer 1/32 are no spread
    EXPECT_EQ(GetMaxHtoThrod2(h, -5) + GetMaxHtoThrod2(empty, 0) + GetMaxHtoThrod2(empty, 50), 3 * 255);
    // Otsu: ties go to the later level, and the level is at least 60.
    two[30] = two[220] = 1000;
    EXPECT_EQ(GetMaxHtoThrod2(two, 0) + GetMaxHtoThrod2(two, 2000), 2 * 219);
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
    pxfx::lines::band_threshold(*pxfx::view_of(im.get()), *pxfx::view_of(out.get()));
    EXPECT_EQ(diff(out.get(), want.get()), "");

    // Dots are judged on the row as it was, across the 64-pixel chunks.
    auto one = [](int32_t x) { return x % 3 == 0 || x % 5 == 0; };
    Owned dots = make(70, 1, 8), kept = make(70, 1, 8);
    for (int32_t x = 0; x < 70; ++x) {
        dots->bits[x] = one(x) ? 1 : 255;
        kept->bits[x] = one(x) && !(x > 0 && x < 69 && !one(x - 1) && !one(x + 1)) ? 1 : 255;
    }
    pxfx::lines::remove_isolated_dots(*pxfx::view_of(dots.get()));
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
}

namespace {

// DetectLines on a white 100 x 120 page (255) with one-row dark lines (1),
// checked against triples (first row, last row, value); the last row and the
// last 10 columns are never marked.
void check_page(std::initializer_list<int32_t> lineRows, const std::vector<int32_t> &bands, bool dash = false) {
    Owned im = make(100, 120, 8);
    for (int32_t y : lineRows)
        std::fill_n(im->bits + y * im->pitch, 100, 1);
    if (dash) std::fill_n(im->bits + 10 * im->pitch + 30, 4, 1);
    Owned want = clone(im.get());
    for (size_t k = 0; k < bands.size(); k += 3)
        for (int32_t y = bands[k]; y <= bands[k + 1]; ++y)
            std::fill_n(want->bits + y * want->pitch, 90, uint8_t(bands[k + 2]));
    ASSERT_EQ(DetectLines(im.get()), 1);
    EXPECT_EQ(diff(im.get(), want.get()), "");
}

} // namespace

TEST(DetectLines, MarksLineBandsOnSyntheticPagesAndSurvivesTinyOnes) {
    // Line rows and their neighbours become 0; the row after a short run of
    // busy rows never starts a band; codes go 25, 75, 125, 175, 225, 25.
    check_page({20, 40, 60, 80, 100}, {0,  18, 25,  19, 21, 0, 22, 38, 75,  39, 41,  0, 42,  58,  125, 59,  61,  0,
                                       62, 78, 175, 79, 81, 0, 82, 98, 225, 99, 101, 0, 102, 117, 25,  118, 118, 0});
    // A long calm margin (rows 1..38) is excluded; the rows after it form one
    // run of label 0, which marks white.
    check_page({40, 60, 80, 100}, {0,   1,  0,  2, 40, 255, 41,  41, 0,   42, 58,  75,  59,  61,  0,   62, 78,
                                   125, 79, 81, 0, 82, 98,  175, 99, 101, 0,  102, 117, 225, 118, 118, 0});
    // A dash of 4 pixels on row 10 gives rows 9 and 10 exactly the chosen
    // level of 4 changes: calm while the level is sought, busy for the bands.
    check_page({20, 40, 60, 80, 100}, {0,  8,  25,  9,  21, 0, 22, 38, 125, 39, 41,  0, 42,  58,  175, 59,  61,  0,
                                       62, 78, 225, 79, 81, 0, 82, 98, 25,  99, 101, 0, 102, 117, 75,  118, 118, 0},
               true);
    // Tiny planes that are marked.
    for (auto [w, h] : {std::pair{12, 3}, {11, 40}, {40, 2}})
        EXPECT_EQ(DetectLines(random_image(w, h, 8, 5).get()), 1) << w << "x" << h;
}
