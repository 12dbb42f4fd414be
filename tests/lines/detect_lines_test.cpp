// Band codes written on synthetic binarised pages of horizontal lines.
#include <gtest/gtest.h>

#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

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
    // Tiny and wrong planes.
    for (auto [w, h] : {std::pair{1, 1}, {3, 2}, {12, 3}, {11, 40}, {40, 2}})
        EXPECT_EQ(DetectLines(random_image(w, h, 8, 5).get()), 1) << w << "x" << h;
    EXPECT_EQ(DetectLines(make(20, 20, 24).get()), 0);
    EXPECT_EQ(DetectLines(nullptr), 0);
}
