// Band codes written on synthetic binarised pages of horizontal lines.
#include <gtest/gtest.h>

#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

struct Rows {
    int32_t first, last, value;
};

// A white page (255) of 100 x 120 with one-row dark lines (1).
Owned page(std::initializer_list<int32_t> lineRows) {
    Owned im = make(100, 120, 8);
    for (int32_t y : lineRows)
        for (int32_t x = 0; x < 100; ++x)
            im->bits[y * im->pitch + x] = 1;
    return im;
}

void expect_rows(const Image *marked, const Image *before, const std::vector<Rows> &want) {
    for (int32_t y = 0; y < marked->height; ++y) {
        int32_t value = -1;
        for (const Rows &r : want)
            if (y >= r.first && y <= r.last) value = r.value;
        for (int32_t x = 0; x < marked->width; ++x) {
            const uint8_t got = marked->bits[y * marked->pitch + x];
            // The last row and the last 10 columns are never marked.
            const int32_t expected = (value < 0 || x >= 90) ? before->bits[y * before->pitch + x] : value;
            ASSERT_EQ(got, expected) << "row " << y << " column " << x;
        }
    }
}

} // namespace

TEST(DetectLines, MarksBandsBetweenLinesWithCyclingCodes) {
    Owned im = page({20, 40, 60, 80, 100});
    Owned before = clone(im.get());
    ASSERT_EQ(DetectLines(im.get()), 1);
    // Line rows and their neighbours become 0; the row after a short run of
    // busy rows never starts a band; codes go 25, 75, 125, 175, 225, then 25.
    expect_rows(im.get(), before.get(),
                {{0, 18, 25},
                 {19, 21, 0},
                 {22, 38, 75},
                 {39, 41, 0},
                 {42, 58, 125},
                 {59, 61, 0},
                 {62, 78, 175},
                 {79, 81, 0},
                 {82, 98, 225},
                 {99, 101, 0},
                 {102, 117, 25},
                 {118, 118, 0}});
}

TEST(DetectLines, LongCalmMarginIsExcludedFromTheBands) {
    Owned im = page({40, 60, 80, 100});
    Owned before = clone(im.get());
    ASSERT_EQ(DetectLines(im.get()), 1);
    // The margin (rows 1..38) is excluded, so the rows after it form one run
    // of label 0, which marks white.
    expect_rows(im.get(), before.get(),
                {{0, 1, 0},
                 {2, 40, 255},
                 {41, 41, 0},
                 {42, 58, 75},
                 {59, 61, 0},
                 {62, 78, 125},
                 {79, 81, 0},
                 {82, 98, 175},
                 {99, 101, 0},
                 {102, 117, 225},
                 {118, 118, 0}});
}

TEST(DetectLines, TinyAndWrongPlanes) {
    for (auto [w, h] : {std::pair{1, 1}, {3, 2}, {12, 3}, {11, 40}, {40, 2}}) {
        Owned im = random_image(w, h, 8, static_cast<uint32_t>(w * h));
        EXPECT_EQ(DetectLines(im.get()), 1) << w << "x" << h;
    }
    EXPECT_EQ(DetectLines(make(20, 20, 24).get()), 0);
    EXPECT_EQ(DetectLines(nullptr), 0);
}
